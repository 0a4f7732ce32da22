#include "host/convert/CodecPlan.h"

#include "host/convert/Failure.h"
#include "host/convert/Formats.h"
#include "host/sentence/Say.h"
#include "media/FourCC.h"
#include "media/Limits.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <cmath>
#include <string>
#include <vector>

namespace movieconv {
namespace {

std::string NamesOf(const std::vector<uint32_t>& codes) {
    std::string names;
    for (const uint32_t code : codes)
        names += (names.empty() ? "" : ", ") + CodeName(code);
    return names;
}

/// What is asked for, or the first that is preferred, or the engine's where the format carries it, or the
/// format's first.
uint32_t ChooseCodec(const std::optional<uint32_t>& asked, const std::vector<uint32_t>& preferred,
                     const FileFormatInfo& format, bool forSound) {
    std::vector<uint32_t> wanted = asked ? std::vector{*asked} : preferred;
    const bool carriesAny = forSound ? format.bHasAudio != 0 : format.bHasVideo != 0;
    const bool isOpen = wanted.empty() || (!asked && !carriesAny);
    if (isOpen)
        wanted = {forSound ? kEngineAudioCodec : kEngineVideoCodec};
    for (const uint32_t code : wanted)
        if (const uint32_t carried = MWFindCodec(format.fccFormat, code, forSound ? 1 : 0); carried != 0)
            return carried;
    if (isOpen)
        return forSound ? format.fccAudioCodecs[0] : format.fccVideoCodecs[0];
    throw Failure(Category::kRequest,
                  forSound ? Say("{} cannot carry sound as \"{}\"", format.szName, NamesOf(wanted))
                           : Say("{} cannot carry pictures as \"{}\"", format.szName, NamesOf(wanted)),
                  Reason::kCodec);
}

/// The source's size made smaller, in its shape, until it fits; nothing when it fits.
std::optional<Size> FitWithin(const PictureStreamInfo& source, const Size& bounds) {
    const double factor = std::min(bounds.width / static_cast<double>(source.width),
                                   bounds.height / static_cast<double>(source.height));
    if (source.width <= 0 || source.height <= 0 || factor >= 1)
        return std::nullopt;
    const auto even = [](double length) {
        return std::max<int32_t>(2, static_cast<int32_t>(std::lround(length / 2)) * 2);
    };
    return Size{std::min(even(source.width * factor), bounds.width),
                std::min(even(source.height * factor), bounds.height)};
}

constexpr uint32_t kGif = FourCC("GIF ");

/// What a GIF takes by default, which holds every picture almost whole: a small one, and few of them.
Size GifSize() {
    return {480, 480};
}
double GifRate(double rate) {
    constexpr double kMost = 15;
    return rate / std::ceil(rate / kMost - 0.01); // every second, every third: what is left moves evenly
}

std::optional<double> PreferredQuality(const Preferences& preferences, uint32_t codec, int height) {
    const Steps<double>* qualities = QualityRangeOf(codec) ? preferences.QualitiesOf(codec) : nullptr;
    return qualities != nullptr ? qualities->At(height) : std::nullopt;
}

/// Throws Failure when the codec has no range or another one.
void RequireQuality(uint32_t codec, double quality) {
    const std::optional<QualityRange> range = QualityRangeOf(codec);
    if (!range) {
        throw Failure(Category::kRequest,
                      Say("\"{}\" has no constant quality; give it a bit rate", CodeName(codec)));
    }
    if (!(quality >= range->best && quality <= range->worst)) { // nor what is no number
        throw Failure(Category::kRequest, Say("the quality of \"{}\" goes from {} (best) to {}, not to {}",
                                              CodeName(codec), range->best, range->worst, quality));
    }
}

/// One of rate and quality, and whatever is asked for wins over what is preferred.
void PlanRate(PictureCoding& plan, const Request& request, int height) {
    const Preferences& preferences = request.preferences;
    plan.maxRate = request.videoMaxRate ? request.videoMaxRate : preferences.videoMaxRate;
    if (request.videoRate) {
        plan.rate = request.videoRate;
        if (plan.maxRate)
            plan.maxRate = std::max(*plan.maxRate, *plan.rate);
    } else {
        plan.quality = request.quality ? request.quality : PreferredQuality(preferences, plan.codec, height);
        if (plan.quality)
            RequireQuality(plan.codec, *plan.quality);
    }
    if (!plan.quality && !plan.rate)
        plan.rate = preferences.videoRate;
}

void PlanDepth(PictureCoding& plan, const Request& request, const FileFormatInfo& format,
               const PictureStreamInfo& source) {
    const int most = MostDepth(request, format);
    if (request.depth && *request.depth > most) {
        throw Failure(Category::kRequest,
                      Say("\"{}\" has pictures of {} bits; HEVC, VP90 and AV01 have some of 10",
                          CodeName(plan.codec), most));
    }
    if (request.hdr == Hdr::kKeep && IsHdr(source) && most <= 8) {
        throw Failure(Category::kRequest,
                      Say("HDR needs pictures of 10 bits; \"{}\" has 8 here", CodeName(plan.codec)));
    }
    plan.keepsHdr = IsHdr(source) && most > 8 && request.hdr != Hdr::kSdr;
    plan.depth = request.depth.value_or(source.depth > 8 || plan.keepsHdr ? most : 8);
}

} // namespace

int MostDepth(const Request& request, const FileFormatInfo& format) {
    const int codecs = MWGetPictureDepth(PictureCodecFor(request, format));
    return std::clamp(request.depth.value_or(codecs), 8, std::max(codecs, 8));
}

uint32_t PictureCodecFor(const Request& request, const FileFormatInfo& format) {
    return ChooseCodec(request.videoCodec, request.preferences.videoCodecs, format, false);
}

uint32_t SoundCodecFor(const Request& request, const FileFormatInfo& format) {
    if (request.copySound)
        return ChooseCodec({}, {}, format, true);
    return ChooseCodec(request.audioCodec, request.preferences.audioCodecs, format, true);
}

PictureCoding PlanPictures(const Request& request, const FileFormatInfo& format,
                           const PictureStreamInfo& source) {
    const Preferences& preferences = request.preferences;
    PictureCoding plan;
    plan.codec = PictureCodecFor(request, format);
    plan.size = request.size;
    if (!plan.size && preferences.fitWithin)
        plan.size = FitWithin(source, *preferences.fitWithin);
    const bool isGif = plan.codec == kGif;
    if (!plan.size && isGif)
        plan.size = FitWithin(source, GifSize());
    plan.frameRate = request.frameRate ? request.frameRate : preferences.frameRate;
    constexpr double kSameRate = 1.001;
    if (!plan.frameRate && preferences.maxFrameRate &&
        source.frameRate > *preferences.maxFrameRate * kSameRate)
        plan.frameRate = preferences.maxFrameRate;
    plan.steadyRate = plan.frameRate.has_value();
    if (!plan.frameRate && isGif && source.frameRate > 0)
        plan.frameRate = GifRate(source.frameRate);
    plan.speed = request.speed ? request.speed : preferences.speed;
    plan.profile = preferences.profile;
    PlanDepth(plan, request, format, source);
    PlanRate(plan, request, plan.size ? plan.size->height : source.height);
    return plan;
}

bool HasRates(const Request& request, const FileFormatInfo& format, const SourceInfo& source) {
    if (!source.pictures || format.bHasVideo == 0)
        return true;
    const PictureCoding plan = PlanPictures(request, format, *source.pictures);
    return !plan.quality && QualityRangeOf(plan.codec); // what has no range loses nothing
}

SoundCoding PlanSound(const Request& request, const FileFormatInfo& format, const SoundStreamInfo& source) {
    const Preferences& preferences = request.preferences;
    SoundCoding plan;
    plan.codec = SoundCodecFor(request, format);
    if (request.copySound)
        return plan;
    plan.channels = request.channels ? request.channels : preferences.channels;
    if (!plan.channels && preferences.maxChannels && source.channels > *preferences.maxChannels)
        plan.channels = preferences.maxChannels;
    plan.sampleRate = request.sampleRate ? request.sampleRate : preferences.sampleRate;
    plan.rate = request.audioRate ? request.audioRate
                                  : preferences.audioRate.At(plan.channels.value_or(source.channels));
    plan.maxRate = request.audioMaxRate;
    return plan;
}

} // namespace movieconv
