#include "host/convert/Sources.h"

#include "host/convert/CodecPlan.h"
#include "host/convert/EncodePlan.h"
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

/// With the pictures as the output takes them.
SourceChoice ChoiceForOutput(const Request& request) {
    SourceChoice choice = ChoiceOf(request);
    if (request.output.empty())
        return choice;
    choice.deep = MostDepth(request, ChooseFormat(request)) > 8;
    choice.keepHdr = choice.deep && request.hdr != Hdr::kSdr;
    return choice;
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
    return Opened([&] { return Movie(request.input, ChoiceForOutput(request), std::move(interruption)); });
}

SourceInfo LookAtSource(const Request& request) {
    return Opened([&] { return Source(request.input, ChoiceOf(request)).Info(); });
}

} // namespace movieconv
