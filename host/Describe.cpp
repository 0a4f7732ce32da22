#include "host/Describe.h"

#include "host/Units.h"

#include <cmath>
#include <fmt/format.h>

namespace host {
namespace {

std::string DescribePictures(const PictureStreamInfo& pictures) {
    std::string text = fmt::format("pictures:  {}, {} x {}, {:.3f} a second, {}, {}", pictures.codec,
                                   pictures.width, pictures.height, pictures.frameRate, pictures.pixelFormat,
                                   FormatTime(pictures.duration, true));
    if (pictures.pixelAspect.num != pictures.pixelAspect.den)
        text += fmt::format(", pixels {}:{}", pictures.pixelAspect.num, pictures.pixelAspect.den);
    if (pictures.quarterTurns != 0 || pictures.mirrored) {
        text += fmt::format(", {}turned by {} degrees", pictures.mirrored ? "mirrored, " : "",
                            pictures.quarterTurns * 90);
    }
    return text + (pictures.interlaced ? ", interlaced\n" : "\n");
}

std::string DescribeLength(const SourceInfo& source) {
    switch (source.certainty) {
    case Certainty::kGuessed:
        return "unknown";
    case Certainty::kEstimated:
        return "about " + FormatTime(std::round(source.duration));
    case Certainty::kKnown:
        break;
    }
    return FormatTime(source.duration, true);
}

} // namespace

std::string Describe(const SourceInfo& source) {
    std::string text = fmt::format("file:      {} ({})\ncontainer: {}\nlength:    {}\n", source.path,
                                   FormatBytes(source.bytes), source.container, DescribeLength(source));
    text += source.pictures ? DescribePictures(*source.pictures) : "pictures:  none\n";
    if (source.sound) {
        const int channels = source.sound->channels;
        text += fmt::format("sound:     {}, {} Hz, {} ({} channel{}), {}\n", source.sound->codec,
                            source.sound->sampleRate, source.sound->layout, channels,
                            channels == 1 ? "" : "s", FormatTime(source.sound->duration, true));
    } else {
        text += "sound:     none\n";
    }
    return text;
}

} // namespace host
