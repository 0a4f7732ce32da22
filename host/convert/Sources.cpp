#include "host/convert/Sources.h"

#include "host/convert/CodecPlan.h"
#include "host/convert/EncodePlan.h"
#include "host/convert/Failure.h"
#include "host/sentence/Say.h"
#include "host/source/CropDetection.h"
#include "host/source/MediaTime.h"
#include "host/source/StreamChoice.h"

#include <cstddef>
#include <utility>

namespace movieconv {
namespace {

SourceChoice ChoiceOf(const Request& request) {
    return {.pictures = !request.noVideo,
            .sound = !request.noAudio && !(request.piece && request.piece->pictures) &&
                     !(request.audioTracks && request.audioTracks->empty()),
            .soundTracks = request.audioTracks,
            .subtitles = request.subtitles,
            .deinterlace = request.deinterlace,
            .stampsOnly = request.piece && !request.piece->pictures,
            .fromStart = request.piece && request.piece->fromStart,
            .playlists = request.playlists,
            .untilNow = request.piece.has_value()};
}

/// ChoiceOf with what is to be cropped. Throws SourceError.
SourceChoice CroppedChoiceOf(const Request& request, const std::shared_ptr<Interruption>& interruption) {
    SourceChoice choice = ChoiceOf(request);
    choice.crop = request.crop;
    if (request.detectCrop && choice.pictures && CanBeLookedAtBefore(request.input)) {
        Source source(request.input, {.playlists = choice.playlists}, interruption);
        choice.crop = FindBorders(source).value_or(Crop{});
    }
    return choice;
}

/// Throws Failure when there are no pictures to draw them into.
BurnWish BurnOf(const Request& request) {
    if (request.noVideo || ChooseFormat(request).bHasVideo == 0)
        throw Failure(Category::kRequest, Say("there are no pictures in the output to draw subtitles into"));
    BurnWish wish{request.burnSubtitles, request.subtitleCharset, ToMediaTime(request.begin)};
    if (request.length)
        wish.end = ToMediaTime(request.begin + *request.length);
    if (request.piece && request.piece->pictures)
        wish.earliest = request.piece->drawnSince;
    return wish;
}

/// With the pictures as the output takes them.
SourceChoice ChoiceForOutput(const Request& request, const std::shared_ptr<Interruption>& interruption) {
    SourceChoice choice = CroppedChoiceOf(request, interruption);
    if (request.output.empty())
        return choice;
    choice.deep = MostDepth(request, ChooseFormat(request)) > 8;
    choice.keepHdr = choice.deep && request.hdr != Hdr::kSdr;
    if (!request.burnSubtitles.empty())
        choice.burn = BurnOf(request);
    return choice;
}

/// What `open` gives, with its errors as failures.
template <class Open>
auto Opened(Open open) {
    try {
        return open();
    } catch (const PlaylistError& error) {
        throw Failure(Category::kSource, error.Words(), Reason::kPlaylist);
    } catch (const TrackError& error) {
        throw Failure(Category::kRequest, error.Words());
    } catch (const CropError& error) {
        throw Failure(Category::kRequest, error.Words());
    } catch (const ScratchError& error) {
        throw Failure(Category::kOutput, error.Words());
    } catch (const SourceError& error) {
        throw Failure(Category::kSource, error.Words());
    }
}

} // namespace

Movie OpenMovie(const Request& request, std::shared_ptr<Interruption> interruption) {
    return Opened([&] { return Movie(request.input, ChoiceForOutput(request, interruption), interruption); });
}

SourceInfo LookAtSource(const Request& request) {
    const auto interruption = std::make_shared<Interruption>();
    return Opened(
        [&] { return Source(request.input, CroppedChoiceOf(request, interruption), interruption).Info(); });
}

Sentence TellCrop(const SourceInfo& source) {
    const PictureStreamInfo& pictures = *source.pictures;
    const Crop& crop = pictures.crop;
    if (!CanBeLookedAtBefore(source.path))
        return Say("black borders cannot be looked for in a pipe");
    if (crop.CutsNothing())
        return Say("no black borders were found");
    return Say("the pictures are cropped to {}x{}: {} above, {} below, {} left, {} right", pictures.width,
               pictures.height, crop.top, crop.bottom, crop.left, crop.right);
}

SourceInfo AsAskedFor(SourceInfo source, const Request& request) {
    const ChosenStreams chosen = Opened([&] {
        WantedTracks(source.streams, StreamKind::kSubtitles, request.subtitles);
        BurnWish wish;
        wish.what = request.burnSubtitles;
        if (NamesStream(wish))
            WantedTracks(source.streams, StreamKind::kSubtitles, {{request.burnSubtitles}});
        return ChooseStreams(source.streams, ChoiceOf(request));
    });
    const auto choose = [&](auto& now, int number, auto StreamInfo::*told) {
        if (number < 0)
            now.reset();
        else if (!now || now->index != number)
            now = source.streams[static_cast<std::size_t>(number)].*told;
    };
    choose(source.pictures, chosen.pictures, &StreamInfo::pictures);
    choose(source.sound, chosen.sound, &StreamInfo::sound);
    return source;
}

} // namespace movieconv
