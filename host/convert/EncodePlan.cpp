#include "host/convert/EncodePlan.h"

#include "host/convert/Formats.h"
#include "host/terminal/ExitCode.h"
#include "media/FourCC.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <fmt/format.h>

namespace movieconv {
namespace {

constexpr double kHighestFrameRate = 200; // of the output: from a source of more the engine makes 30
constexpr uint32_t kSteadyRateFormat = FourCC("AVI "); // leaves out what comes faster than its one rate

uint32_t CodecCode(const std::string& text, const char* option) {
    const auto code = ParseCode(text);
    if (!code) {
        throw Failure(
            ExitCode::kUsage,
            fmt::format("{} takes a code of up to four characters; see \"movieconv --list-formats\"",
                        option));
    }
    return *code;
}

uint32_t FindCarried(const std::string& asked, const FileFormatInfo& format, bool forSound) {
    const char* option = forSound ? "--audio-codec" : "--video-codec";
    const uint32_t code = MWFindCodec(format.fccFormat, CodecCode(asked, option), forSound ? 1 : 0);
    if (code == 0) {
        throw Failure(ExitCode::kUsage,
                      fmt::format("{} cannot carry {} as \"{}\"; see \"movieconv --list-formats\"",
                                  format.szName, forSound ? "sound" : "pictures", asked));
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

const FileFormatInfo& ChooseFormat(const Options& options) {
    const FileFormatInfo* format =
        options.format ? FindFormat(*options.format) : FindFormatOfFile(options.output);
    if (format == nullptr) {
        throw Failure(ExitCode::kUsage,
                      options.format
                          ? fmt::format("there is no file format \"{}\"; see \"movieconv --list-formats\"",
                                        *options.format)
                          : fmt::format("the extension of \"{}\" tells no file format; use --format, see "
                                        "\"movieconv --list-formats\"",
                                        options.output));
    }
    if (options.videoCodec)
        FindCarried(*options.videoCodec, *format, false);
    if (options.audioCodec)
        FindCarried(*options.audioCodec, *format, true);
    return *format;
}

EncodeParam PlanEncoding(const EncodeParam& defaults, const FileFormatInfo& format, const Options& options,
                         const SourceInfo& source) {
    EncodeParam param = defaults;
    param.fccFileFormat = format.fccFormat;
    param.fccVideo = options.videoCodec ? FindCarried(*options.videoCodec, format, false)
                                        : UsualCodec(param.fccVideo, format.fccVideoCodecs);
    param.fccAudio = options.audioCodec ? FindCarried(*options.audioCodec, format, true)
                                        : UsualCodec(param.fccAudio, format.fccAudioCodecs);
    if (options.size) {
        param.nWidth = options.size->width;
        param.nHeight = options.size->height;
    }
    param.bResize = options.fit == Fit::kStretch ? 1 : 0;
    if (options.frameRate) // no reference to the record's double, which lies on a 4-byte boundary
        param.dFrameRate = *options.frameRate;
    else if (source.pictures && format.fccFormat == kSteadyRateFormat &&
             source.pictures->frameRate <= kHighestFrameRate)
        param.dFrameRate = std::min(source.pictures->peakRate, kHighestFrameRate);
    param.nVideoBitrate = options.videoRate.value_or(param.nVideoBitrate);
    param.nVideoMaxBitrate = options.videoMaxRate.value_or(0);
    param.nVideoRateMode = options.videoMaxRate ? 1 : 0;
    param.nChannels = options.channels.value_or(param.nChannels);
    param.nSampleRate = options.sampleRate.value_or(param.nSampleRate);
    param.nAudioBitrate = options.audioRate.value_or(param.nAudioBitrate);
    param.nAudioMaxBitrate = options.audioMaxRate.value_or(0);
    param.nAudioRateMode = options.audioMaxRate ? 1 : 0;
    if (source.sound)
        param.nBitsPerSample = source.sound->bitsPerSample;
    param.bNoVideo = source.pictures && format.bHasVideo != 0 ? 0 : 1;
    param.bNoAudio = source.sound && format.bHasAudio != 0 ? 0 : 1;
    if (param.bNoVideo != 0 && param.bNoAudio != 0) {
        throw Failure(ExitCode::kUsage,
                      fmt::format("{} carries nothing that \"{}\" holds; choose another format",
                                  format.szName, source.path));
    }
    return param;
}

double LengthToConvert(const Options& options, const SourceInfo& source) {
    const double rest = source.duration - options.begin;
    if (rest <= 0 && source.certainty == Certainty::kKnown) {
        throw Failure(ExitCode::kUsage,
                      fmt::format("--begin is not before the end of \"{}\", which is {:.3f} s long",
                                  source.path, source.duration));
    }
    if (!options.length)
        return std::max(rest, 0.0);
    return source.certainty == Certainty::kKnown ? std::min(*options.length, rest) : *options.length;
}

} // namespace movieconv
