#include "host/window/runner/Translation.h"

#include "host/convert/CodecPlan.h"
#include "host/convert/Failure.h"
#include "host/convert/Formats.h"
#include "host/window/runner/PresetShelf.h"

#include <algorithm>
#include <cmath>

namespace movieconv::window {
namespace {

constexpr int kNiceness = 10; // lest the window waits for a processor
constexpr int kWidest = 32768;
constexpr int kMiddle = 50; // of the window's scale of quality

/// In the shape of what is left when `cut` is cut off.
Size ScaledTo(int height, const MovieFacts& facts, const Margins& cut) {
    const int even = height / 2 * 2;
    const double width = static_cast<double>(facts.width - cut.left - cut.right) * even /
                         std::max(facts.height - cut.top - cut.bottom, 1);
    return {std::max(2, static_cast<int>(std::lround(width / 2)) * 2), even};
}

Deinterlace ToLibrary(Wishes::Deinterlace choice) {
    return choice == Wishes::Deinterlace::kOff   ? Deinterlace::kNone
           : choice == Wishes::Deinterlace::kAll ? Deinterlace::kAll
                                                 : Deinterlace::kFlagged;
}

Hdr ToLibrary(Wishes::Hdr choice) {
    return choice == Wishes::Hdr::kKeep ? Hdr::kKeep : choice == Wishes::Hdr::kUsual ? Hdr::kSdr : Hdr::kAuto;
}

TrackList ToLibrary(const std::optional<QList<int>>& numbers) {
    if (!numbers)
        return std::nullopt;
    std::vector<std::string> list;
    for (const int number : *numbers)
        list.push_back(std::to_string(number));
    return list;
}

void AskForTracksAndTexts(Request& request, const Wishes& wishes) {
    request.audioTracks = ToLibrary(wishes.sounds);
    request.subtitles = ToLibrary(wishes.subtitles);
    for (const SubtitleFile& file : wishes.subtitleFiles)
        request.subtitleFiles.push_back({file.path, file.language.toStdString()});
    request.subtitleCharset = wishes.subtitleCharset.toStdString();
    request.burnSubtitles =
        wishes.burning.track ? std::to_string(*wishes.burning.track) : wishes.burning.file;
    request.noChapters = !wishes.chapters;
    request.noMetadata = !wishes.texts;
    if (wishes.title)
        request.metadata.push_back({"title", wishes.title->toStdString()});
}

/// Bits a second that the sound takes, about.
double SoundRate(const Order& order, const Request& request) {
    constexpr double kUsual = 128'000;
    if (!request.copySound)
        return request.preferences.audioRate.At(request.channels.value_or(2)).value_or(kUsual);
    double bits = 0;
    for (const TrackFacts& track : order.facts.sounds)
        if (!order.wishes.sounds || order.wishes.sounds->contains(track.number))
            bits += track.bitRate > 0 ? static_cast<double>(track.bitRate) : kUsual;
    return bits;
}

void AskForSound(Request& request, const Wishes& wishes) {
    request.noAudio = !wishes.withSound;
    request.copySound = wishes.copySound.value_or(request.preferences.copySound);
    if (!request.copySound)
        request.channels = wishes.channels;
}

void AskForPictures(Request& request, const FileFormatInfo& format, const Preset& preset,
                    const Order& order) {
    const Wishes& wishes = order.wishes;
    const MovieFacts& facts = order.facts;
    const Margins cut = wishes.cut.value_or(Margins{});
    if (wishes.height && wishes.crop && !wishes.cut) // the shape is not known yet
        request.preferences.fitWithin = {kWidest, *wishes.height};
    else if (wishes.height && *wishes.height != facts.height - cut.top - cut.bottom)
        request.size = ScaledTo(*wishes.height, facts, cut);
    request.frameRate = wishes.rate;
    request.deinterlace = ToLibrary(wishes.deinterlace);
    request.detectCrop = wishes.crop && !wishes.cut;
    if (wishes.cut)
        request.crop = {wishes.cut->top, wishes.cut->bottom, wishes.cut->left, wishes.cut->right};
    request.hdr = ToLibrary(wishes.hdr);
    request.depth = wishes.depth;
    if (!wishes.quality)
        return;
    if (const std::optional<uint32_t> codec = CodecOf(preset, &format))
        request.quality = QualityOf(preset, *codec, wishes.height.value_or(facts.height), *wishes.quality);
}

} // namespace

Request ToRequest(const Order& order) {
    const Wishes& wishes = order.wishes;
    const Preset preset = movieconv::LoadPreset(wishes.preset.toStdString());
    Request request;
    request.input = order.source;
    request.output = order.target;
    request.preferences = preset.preferences;
    request.overwrite = order.replace;
    request.onFull = OnFull::kWait;
    request.niceness = kNiceness;
    request.begin = wishes.begin;
    if (wishes.end)
        request.length = *wishes.end - wishes.begin;
    request.split = wishes.clip;
    request.noVideo = !wishes.withPictures || order.facts.width == 0;
    AskForSound(request, wishes);
    AskForTracksAndTexts(request, wishes);
    const FileFormatInfo* format = FindFormatOfFile(order.target);
    if (format == nullptr && wishes.format)
        format = FindFormat(wishes.format->toStdString());
    if (format == nullptr)
        return request; // the preset's, or the library tells
    request.format = format->fccFormat;
    request.noVideo = request.noVideo || format->bHasVideo == 0;
    request.noAudio = request.noAudio || format->bHasAudio == 0;
    if (request.noVideo)
        request.burnSubtitles.clear();
    else
        AskForPictures(request, *format, preset, order);
    return request;
}

double EstimatedRate(const Order& order, const Request& request) {
    const Preferences& preferences = request.preferences;
    double bits = request.noAudio || preferences.noAudio ? 0 : SoundRate(order, request);
    if (request.noVideo || preferences.noVideo)
        return bits;
    if (preferences.videoRate)
        return bits + *preferences.videoRate;
    const Size size = request.size.value_or(Size{order.facts.width, order.facts.height});
    const double rate = std::clamp(request.frameRate.value_or(order.facts.rate), 1.0, 120.0);
    // Each 30 points of quality double it.
    const double bitsPerPixel = 0.025 * std::pow(2.0, order.wishes.quality.value_or(kMiddle) / 30.0);
    return bits + size.width * static_cast<double>(size.height) * rate * bitsPerPixel;
}

} // namespace movieconv::window
