#include "host/convert/Sources.h"

#include "host/convert/Failure.h"

#include <utility>

namespace movieconv {
namespace {

SourceChoice ChoiceOf(const Request& request) {
    return {.pictures = !request.noVideo,
            .sound = !request.noAudio,
            .deinterlace = request.deinterlace,
            .playlists = request.playlists};
}

/// What `open` gives, with its errors as failures.
template <class Open>
auto Opened(Open open) {
    try {
        return open();
    } catch (const PlaylistError& error) {
        throw Failure(Category::kSource, error.what(), Reason::kPlaylist);
    } catch (const SourceError& error) {
        throw Failure(Category::kSource, error.what());
    }
}

} // namespace

Movie OpenMovie(const Request& request, std::shared_ptr<Interruption> interruption) {
    return Opened([&] { return Movie(request.input, ChoiceOf(request), std::move(interruption)); });
}

SourceInfo LookAtSource(const Request& request) {
    return Opened([&] { return Source(request.input, ChoiceOf(request)).Info(); });
}

} // namespace movieconv
