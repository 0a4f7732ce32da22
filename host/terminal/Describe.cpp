#include "host/terminal/Describe.h"

#include "host/convert/Amounts.h"
#include "text/Printable.h"

#include <algorithm>
#include <cmath>
#include <fmt/format.h>
#include <string_view>
#include <utility>

namespace movieconv {
namespace {

std::string DescribeLength(double seconds, Certainty certainty) {
    switch (certainty) {
    case Certainty::kGuessed:
        return "unknown";
    case Certainty::kEstimated:
        return "about " + FormatTime(std::round(seconds));
    case Certainty::kKnown:
        break;
    }
    return FormatTime(seconds, true);
}

std::string DescribeColours(const PictureStreamInfo& pictures) {
    std::string text = pictures.colorTransfer == kPerceptualQuantizer ? ", HDR (PQ)"
                       : pictures.colorTransfer == kHybridLogGamma    ? ", HDR (HLG)"
                                                                      : "";
    if (pictures.dolbyVision)
        text += ", Dolby Vision";
    if (pictures.masteringDisplay) {
        text += fmt::format(", mastered for {:g} to {:g} cd/m2", pictures.masteringDisplay->darkest,
                            pictures.masteringDisplay->brightest);
    }
    if (pictures.lightLevel) {
        text += fmt::format(", at most {} cd/m2 ({} on average)", pictures.lightLevel->brightestPixel,
                            pictures.lightLevel->brightestPicture);
    }
    return text + (pictures.fullRange ? ", full range" : "");
}

std::string DescribePictures(const PictureStreamInfo& pictures) {
    std::string text = fmt::format(", {} x {}", pictures.width, pictures.height);
    if (pictures.frameRate > 0)
        text += fmt::format(", {:.3f} a second", pictures.frameRate);
    text += fmt::format(", {} ({} bits)", pictures.pixelFormat, pictures.depth);
    if (pictures.pixelAspect.num != pictures.pixelAspect.den)
        text += fmt::format(", pixels {}:{}", pictures.pixelAspect.num, pictures.pixelAspect.den);
    if (pictures.quarterTurns != 0 || pictures.mirrored) {
        text += fmt::format(", {}turned by {} degrees", pictures.mirrored ? "mirrored, " : "",
                            pictures.quarterTurns * 90);
    }
    if (pictures.interlaced)
        text += pictures.topFieldFirst ? ", interlaced (top field first)" : ", interlaced";
    return text + DescribeColours(pictures);
}

std::string DescribeFlags(const StreamFlags& flags) {
    std::string text;
    const std::pair<bool, const char*> names[] = {{flags.isDefault, "default"},
                                                  {flags.forced, "forced"},
                                                  {flags.original, "original language"},
                                                  {flags.dub, "dubbed"},
                                                  {flags.commentary, "commentary"},
                                                  {flags.hearingImpaired, "for the hard of hearing"},
                                                  {flags.visualImpaired, "for the visually impaired"}};
    for (const auto& [isSet, name] : names)
        text += isSet ? fmt::format(", {}", name) : "";
    return text;
}

std::string DescribeStream(const StreamInfo& stream, Certainty certainty) {
    const bool isKnown = stream.codec != "none";
    std::string text = fmt::format("{:>4}  {:<10} {}", stream.index, KindName(stream.kind),
                                   isKnown                   ? stream.codec
                                   : stream.fileName.empty() ? "unknown"
                                                             : stream.fileName);
    if (!stream.profile.empty())
        text += fmt::format(" ({})", stream.profile);
    if (!stream.fileName.empty() && isKnown)
        text += fmt::format(", {}", stream.fileName);
    if (!stream.mimeType.empty())
        text += fmt::format(", {}", stream.mimeType);
    if (stream.bytes > 0)
        text += fmt::format(", {}", FormatBytes(stream.bytes));
    if (stream.pictures)
        text += DescribePictures(*stream.pictures);
    if (stream.sound) {
        const int channels = stream.sound->channels;
        text += fmt::format(", {} Hz, {} ({} channel{})", stream.sound->sampleRate, stream.sound->layout,
                            channels, channels == 1 ? "" : "s");
    }
    if (stream.kind == StreamKind::kSubtitles && isKnown)
        text += stream.textual ? ", text" : ", bitmaps";
    if (!stream.language.empty())
        text += fmt::format(", {}", stream.languageTag.empty() ? stream.language : stream.languageTag);
    if (!stream.title.empty())
        text += fmt::format(", \"{}\"", stream.title);
    text += DescribeFlags(stream.flags);
    const double length = stream.kind == StreamKind::kPictures ? stream.pictures->duration
                          : stream.kind == StreamKind::kSound  ? stream.sound->duration
                                                               : 0;
    if (length > 0)
        text += fmt::format(", length {}", DescribeLength(length, certainty));
    return text::Printable(text) +
           (stream.decodable || stream.kind == StreamKind::kAttachment || stream.kind == StreamKind::kData
                ? "\n"
                : ", no decoder\n");
}

std::string DescribeConverted(const SourceInfo& source) {
    const auto number = [](const auto& stream) {
        return stream ? fmt::format("stream {}", stream->index) : std::string("none");
    };
    return fmt::format("pictures:  {}\nsound:     {}\n", number(source.pictures), number(source.sound));
}

/// Lines but for the first one stand further right than any others, so that they are not taken for these.
std::string Indented(const std::string& lines) {
    std::string text;
    for (std::size_t begin = 0; begin <= lines.size();) {
        const std::size_t end = std::min(lines.find('\n', begin), lines.size());
        const bool windows = end > begin && lines[end - 1] == '\r';
        text += begin == 0 ? "" : "\n          ";
        text += text::Printable(std::string_view(lines).substr(begin, end - begin - (windows ? 1 : 0)));
        begin = end + 1;
    }
    return text;
}

} // namespace

std::string Describe(const SourceInfo& source) {
    std::string text = fmt::format("file:      {} ({})\ncontainer: {}\nlength:    {}\n",
                                   text::Printable(source.path), FormatBytes(source.bytes), source.container,
                                   DescribeLength(source.duration, source.certainty));
    text += DescribeConverted(source) + "streams:\n";
    for (const StreamInfo& stream : source.streams)
        text += DescribeStream(stream, source.certainty);
    text += source.chapters.empty() ? "" : "chapters:\n";
    for (const Chapter& chapter : source.chapters)
        text +=
            fmt::format("      {}  {}\n", FormatTime(chapter.begin, true), text::Printable(chapter.title));
    text += source.tags.empty() ? "" : "tags:\n";
    for (const Tag& tag : source.tags)
        text += fmt::format("      {}: {}\n", text::Printable(tag.key), Indented(tag.value));
    return text;
}

} // namespace movieconv
