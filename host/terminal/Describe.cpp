#include "host/terminal/Describe.h"

#include "host/convert/Amounts.h"
#include "host/convert/Formats.h"
#include "media/MediaWriter.h"

#include <cmath>
#include <fmt/format.h>

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

std::string DescribePictures(const PictureStreamInfo& pictures, Certainty certainty) {
    std::string text = fmt::format("pictures:  {}, {} x {}, {:.3f} a second, {}, length {}", pictures.codec,
                                   pictures.width, pictures.height, pictures.frameRate, pictures.pixelFormat,
                                   DescribeLength(pictures.duration, certainty));
    if (pictures.pixelAspect.num != pictures.pixelAspect.den)
        text += fmt::format(", pixels {}:{}", pictures.pixelAspect.num, pictures.pixelAspect.den);
    if (pictures.quarterTurns != 0 || pictures.mirrored) {
        text += fmt::format(", {}turned by {} degrees", pictures.mirrored ? "mirrored, " : "",
                            pictures.quarterTurns * 90);
    }
    return text + (pictures.interlaced ? ", interlaced\n" : "\n");
}

template <std::size_t N>
std::string CodecList(const uint32_t (&codes)[N]) {
    std::string list;
    for (const uint32_t code : codes) {
        if (code == 0)
            break;
        list += (list.empty() ? "" : ", ") + CodeName(code);
    }
    return list.empty() ? "none" : list;
}

/// "mp4,m4v" as ".mp4, .m4v".
std::string ExtensionList(std::string list) {
    for (std::size_t comma = list.find(','); comma != std::string::npos; comma = list.find(',', comma + 1))
        list.replace(comma, 1, ", .");
    return "." + list;
}

} // namespace

std::string Describe(const SourceInfo& source) {
    std::string text = fmt::format("file:      {} ({})\ncontainer: {}\nlength:    {}\n", source.path,
                                   FormatBytes(source.bytes), source.container,
                                   DescribeLength(source.duration, source.certainty));
    text += source.pictures ? DescribePictures(*source.pictures, source.certainty) : "pictures:  none\n";
    if (source.sound) {
        const int channels = source.sound->channels;
        text +=
            fmt::format("sound:     {}, {} Hz, {} ({} channel{}), length {}\n", source.sound->codec,
                        source.sound->sampleRate, source.sound->layout, channels, channels == 1 ? "" : "s",
                        DescribeLength(source.sound->duration, source.certainty));
    } else {
        text += "sound:     none\n";
    }
    return text;
}

std::string ListFormats() {
    std::string text;
    for (const FileFormatInfo* format = MWGetFileFormatInfos(); format != nullptr && format->fccFormat != 0;
         ++format) {
        text += fmt::format("{:<5} {} ({})\n", CodeName(format->fccFormat), format->szName,
                            ExtensionList(format->szExtensions));
        if (format->bHasVideo != 0)
            text += fmt::format("      pictures: {}\n", CodecList(format->fccVideoCodecs));
        if (format->bHasAudio != 0)
            text += fmt::format("      sound:    {}\n", CodecList(format->fccAudioCodecs));
    }
    return text;
}

} // namespace movieconv
