#include "host/convert/EncodePlan.h"

#include "host/convert/CodecPlan.h"
#include "host/convert/Failure.h"
#include "host/convert/Formats.h"
#include "host/sentence/Say.h"
#include "media/FileFormats.h"
#include "media/Limits.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <cstdint>
#include <filesystem>
#include <optional>

namespace movieconv {
namespace {

/// Where nobody asked for a rate, an upper one limits the usual one.
int32_t RateWithin(const std::optional<int32_t>& most, int32_t rate) {
    return most ? std::min(*most, rate) : rate;
}

void PutPictures(EncodeParam& param, const FileFormatInfo& format, const Request& request,
                 const PictureStreamInfo& source) {
    const PictureCoding plan = PlanPictures(request, format, source);
    param.fccVideo = plan.codec;
    if (plan.size) {
        param.nWidth = plan.size->width;
        param.nHeight = plan.size->height;
    }
    param.bResize = request.fit == Fit::kStretch ? 1 : 0;
    if (plan.frameRate) // no reference to the record's double, which lies on a 4-byte boundary
        param.dFrameRate = *plan.frameRate;
    else if (Has(format, kWriterFormatSteadyRate))
        param.dFrameRate = std::min(source.peakRate, kHighestFrameRate);
    param.nVideoBitrate = RateWithin(plan.maxRate, plan.rate.value_or(param.nVideoBitrate));
    param.nVideoMaxBitrate = plan.maxRate.value_or(0);
    param.nVideoRateMode = plan.maxRate ? 1 : 0;
}

void PutSound(EncodeParam& param, const FileFormatInfo& format, const Request& request,
              const SoundStreamInfo& source) {
    const SoundCoding plan = PlanSound(request, format, source);
    param.fccAudio = plan.codec;
    param.nChannels = plan.channels.value_or(param.nChannels);
    param.nSampleRate = plan.sampleRate.value_or(param.nSampleRate);
    param.nAudioBitrate = RateWithin(plan.maxRate, plan.rate.value_or(param.nAudioBitrate));
    param.nAudioMaxBitrate = plan.maxRate.value_or(0);
    param.nAudioRateMode = plan.maxRate ? 1 : 0;
    param.nBitsPerSample = source.bitsPerSample;
}

/// Throws Failure where files of the format cannot hold the sound as it is coded.
void RequireCopyable(const FileFormatInfo& format, const Request& request, const StreamInfo& sound,
                     bool withPictures) {
    constexpr double kLate = 0.1; // seconds
    const std::string name = CodeName(format.fccFormat);
    if (MWCarriesPackets(format.fccFormat, sound.codec.c_str()) == 0) {
        std::string others;
        for (const FileFormatInfo& other : FileFormats())
            if (MWCarriesPackets(other.fccFormat, sound.codec.c_str()) != 0)
                others += (others.empty() ? "" : ", ") + CodeName(other.fccFormat);
        throw Failure(
            Category::kRequest,
            others.empty()
                ? Say("{} cannot hold \"{}\" sound as it is; no format can", name, SayCodec(sound.codec))
                : Say("{} cannot hold \"{}\" sound as it is; {} can", name, SayCodec(sound.codec), others));
    }
    const double late = sound.begin.value_or(0) - request.begin;
    if (withPictures && late > kLate && Has(format, kWriterFormatSteadyRate))
        throw Failure(
            Category::kRequest,
            Say("{} cannot begin the sound as it is {:.1f} s behind the pictures; MKV can", name, late));
}

} // namespace

const FileFormatInfo& ChooseFormat(const Request& request) {
    const FileFormatInfo* format =
        request.format ? FindFormat(CodeName(*request.format)) : FindFormatOfFile(request.output);
    const bool namesNone = !request.format && std::filesystem::path(request.output).extension().empty();
    if (namesNone && request.preferences.format)
        format = FindFormat(CodeName(*request.preferences.format));
    if (format == nullptr && request.format) {
        throw Failure(Category::kRequest, Say("there is no file format \"{}\"", CodeName(*request.format)),
                      Reason::kCodec);
    }
    if (format == nullptr) {
        throw Failure(Category::kRequest, Say("the extension of \"{}\" tells no file format", request.output),
                      Reason::kNoFormat);
    }
    PictureCodecFor(request, *format);
    SoundCodecFor(request, *format);
    return *format;
}

EncodeParam PlanEncoding(const EncodeParam& defaults, const FileFormatInfo& format, const Request& request,
                         const SourceInfo& source) {
    EncodeParam param = defaults;
    param.fccFileFormat = format.fccFormat;
    param.bNoVideo = source.pictures && format.bHasVideo != 0 ? 0 : 1;
    param.bNoAudio = source.sound && format.bHasAudio != 0 ? 0 : 1;
    if (param.bNoVideo == 0)
        PutPictures(param, format, request, *source.pictures);
    if (param.bNoAudio == 0)
        PutSound(param, format, request, *source.sound);
    if (param.bNoVideo != 0 && param.bNoAudio != 0) {
        throw Failure(Category::kRequest, Say("{} carries nothing that \"{}\" holds; choose another format",
                                              format.szName, source.path));
    }
    if (request.copySound && param.bNoAudio == 0) {
        const StreamInfo& sound = source.streams[static_cast<std::size_t>(source.sound->index)];
        RequireCopyable(format, request, sound, param.bNoVideo == 0);
    }
    return param;
}

Sentence TellRateLoss(const Request& request, const SourceInfo& source) {
    const FileFormatInfo& format = ChooseFormat(request);
    if (!source.pictures || format.bHasVideo == 0 || !Has(format, kWriterFormatSteadyRate) ||
        source.pictures->frameRate <= kHighestFrameRate ||
        PlanPictures(request, format, *source.pictures).frameRate)
        return {};
    return Say("its {:.0f} pictures a second got {:.0f}", source.pictures->frameRate, kHighestFrameRate);
}

double LengthToConvert(const Request& request, const SourceInfo& source) {
    const double rest = source.duration - request.begin;
    if (rest <= 0 && source.certainty == Certainty::kKnown) {
        throw Failure(Category::kRequest,
                      Say("the begin, {:.3f} s, is not before the end of \"{}\", which is {:.3f} s long",
                          request.begin, source.path, source.duration),
                      Reason::kBeginTooLate);
    }
    if (!request.length)
        return std::max(rest, 0.0);
    return source.certainty == Certainty::kKnown ? std::min(*request.length, rest) : *request.length;
}

} // namespace movieconv
