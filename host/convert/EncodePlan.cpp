#include "host/convert/EncodePlan.h"

#include "host/convert/Failure.h"
#include "host/convert/Formats.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <fmt/format.h>

namespace movieconv {
namespace {

constexpr double kHighestFrameRate = 200; // of the output: from a source of more the engine makes 30

uint32_t FindCarried(uint32_t asked, const FileFormatInfo& format, bool forSound) {
    const uint32_t code = MWFindCodec(format.fccFormat, asked, forSound ? 1 : 0);
    if (code == 0) {
        throw Failure(Category::kRequest,
                      fmt::format("{} cannot carry {} as \"{}\"", format.szName,
                                  forSound ? "sound" : "pictures", CodeName(asked)),
                      Reason::kCodec);
    }
    return code;
}

/// The usual codec if the format carries it, or the format's first.
template <std::size_t N>
uint32_t UsualCodec(uint32_t usual, const uint32_t (&carried)[N]) {
    const bool carriesUsual = std::find(std::begin(carried), std::end(carried), usual) != std::end(carried);
    return carriesUsual || carried[0] == 0 ? usual : carried[0];
}

} // namespace

const FileFormatInfo& ChooseFormat(const Request& request) {
    const FileFormatInfo* format =
        request.format ? FindFormat(CodeName(*request.format)) : FindFormatOfFile(request.output);
    if (format == nullptr && request.format) {
        throw Failure(Category::kRequest,
                      fmt::format("there is no file format \"{}\"", CodeName(*request.format)),
                      Reason::kCodec);
    }
    if (format == nullptr) {
        throw Failure(Category::kRequest,
                      fmt::format("the extension of \"{}\" tells no file format", request.output),
                      Reason::kNoFormat);
    }
    if (request.videoCodec)
        FindCarried(*request.videoCodec, *format, false);
    if (request.audioCodec)
        FindCarried(*request.audioCodec, *format, true);
    return *format;
}

EncodeParam PlanEncoding(const EncodeParam& defaults, const FileFormatInfo& format, const Request& request,
                         const SourceInfo& source) {
    EncodeParam param = defaults;
    param.fccFileFormat = format.fccFormat;
    param.fccVideo = request.videoCodec ? FindCarried(*request.videoCodec, format, false)
                                        : UsualCodec(param.fccVideo, format.fccVideoCodecs);
    param.fccAudio = request.audioCodec ? FindCarried(*request.audioCodec, format, true)
                                        : UsualCodec(param.fccAudio, format.fccAudioCodecs);
    if (request.size) {
        param.nWidth = request.size->width;
        param.nHeight = request.size->height;
    }
    param.bResize = request.fit == Fit::kStretch ? 1 : 0;
    if (request.frameRate) // no reference to the record's double, which lies on a 4-byte boundary
        param.dFrameRate = *request.frameRate;
    else if (source.pictures && (MWGetFormatTraits(format.fccFormat) & kWriterFormatSteadyRate) != 0 &&
             source.pictures->frameRate <= kHighestFrameRate)
        param.dFrameRate = std::min(source.pictures->peakRate, kHighestFrameRate);
    param.nVideoBitrate = request.videoRate.value_or(param.nVideoBitrate);
    param.nVideoMaxBitrate = request.videoMaxRate.value_or(0);
    param.nVideoRateMode = request.videoMaxRate ? 1 : 0;
    param.nChannels = request.channels.value_or(param.nChannels);
    param.nSampleRate = request.sampleRate.value_or(param.nSampleRate);
    param.nAudioBitrate = request.audioRate.value_or(param.nAudioBitrate);
    param.nAudioMaxBitrate = request.audioMaxRate.value_or(0);
    param.nAudioRateMode = request.audioMaxRate ? 1 : 0;
    if (source.sound)
        param.nBitsPerSample = source.sound->bitsPerSample;
    param.bNoVideo = source.pictures && format.bHasVideo != 0 ? 0 : 1;
    param.bNoAudio = source.sound && format.bHasAudio != 0 ? 0 : 1;
    if (param.bNoVideo != 0 && param.bNoAudio != 0) {
        throw Failure(Category::kRequest,
                      fmt::format("{} carries nothing that \"{}\" holds; choose another format",
                                  format.szName, source.path));
    }
    return param;
}

double LengthToConvert(const Request& request, const SourceInfo& source) {
    const double rest = source.duration - request.begin;
    if (rest <= 0 && source.certainty == Certainty::kKnown) {
        throw Failure(
            Category::kRequest,
            fmt::format("the begin, {:.3f} s, is not before the end of \"{}\", which is {:.3f} s long",
                        request.begin, source.path, source.duration),
            Reason::kBeginTooLate);
    }
    if (!request.length)
        return std::max(rest, 0.0);
    return source.certainty == Certainty::kKnown ? std::min(*request.length, rest) : *request.length;
}

} // namespace movieconv
