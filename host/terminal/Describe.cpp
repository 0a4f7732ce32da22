#include "host/terminal/Describe.h"

#include "host/terminal/Units.h"

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

} // namespace movieconv
