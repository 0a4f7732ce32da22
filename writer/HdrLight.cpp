#include "writer/HdrLight.h"

extern "C" {
#include <libavutil/mastering_display_metadata.h>
}

#include <cmath>
#include <cstring>
#include <new>

namespace writer {
namespace {

constexpr int kPerUnit = 50000;      // of chromaticities
constexpr int kPerLuminance = 10000; // cd/m2

std::string Place(const double (&place)[2]) {
    return "(" + std::to_string(std::lround(place[0] * kPerUnit)) + "," +
           std::to_string(std::lround(place[1] * kPerUnit)) + ")";
}

void PutPlace(AVRational (&target)[2], const double (&place)[2]) {
    for (int axis = 0; axis < 2; ++axis)
        target[axis] = {static_cast<int>(std::lround(place[axis] * kPerUnit)), kPerUnit};
}

AVRational Luminance(double luminance) {
    return {static_cast<int>(std::lround(luminance * kPerLuminance)), kPerLuminance};
}

/// Gives the stream a copy of `size` bytes that FFmpeg allocated at `data`, which are freed.
void AddSideData(AVStream& stream, AVPacketSideDataType type, void* data, size_t size) {
    uint8_t* place = data != nullptr ? av_stream_new_side_data(&stream, type, size) : nullptr;
    if (place != nullptr)
        std::memcpy(place, data, size);
    av_free(data);
    if (place == nullptr)
        throw std::bad_alloc();
}

} // namespace

std::optional<HdrLight> LightOf(const WriterOptions& options) {
    HdrLight light;
    if (options.bMasteringDisplay != 0)
        light.display = options.masteringDisplay;
    light.brightestPixel = options.nBrightestPixel;
    light.brightestPicture = options.nBrightestPicture;
    if (!light.display && light.brightestPixel <= 0 && light.brightestPicture <= 0)
        return std::nullopt;
    return light;
}

std::string MasteringText(const WriterMasteringDisplay& display) {
    return "G" + Place(display.dGreen) + "B" + Place(display.dBlue) + "R" + Place(display.dRed) + "WP" +
           Place(display.dWhite) + "L(" + std::to_string(std::lround(display.dBrightest * kPerLuminance)) +
           "," + std::to_string(std::lround(display.dDarkest * kPerLuminance)) + ")";
}

void AddLight(AVStream& stream, const HdrLight& light) {
    if (light.display) {
        AVMasteringDisplayMetadata* display = av_mastering_display_metadata_alloc();
        if (display == nullptr)
            throw std::bad_alloc();
        PutPlace(display->display_primaries[0], light.display->dRed);
        PutPlace(display->display_primaries[1], light.display->dGreen);
        PutPlace(display->display_primaries[2], light.display->dBlue);
        PutPlace(display->white_point, light.display->dWhite);
        display->min_luminance = Luminance(light.display->dDarkest);
        display->max_luminance = Luminance(light.display->dBrightest);
        display->has_primaries = display->has_luminance = 1;
        AddSideData(stream, AV_PKT_DATA_MASTERING_DISPLAY_METADATA, display, sizeof *display);
    }
    if (light.brightestPixel > 0 || light.brightestPicture > 0) {
        size_t size = 0;
        AVContentLightMetadata* level = av_content_light_metadata_alloc(&size);
        if (level == nullptr)
            throw std::bad_alloc();
        level->MaxCLL = static_cast<unsigned>(light.brightestPixel);
        level->MaxFALL = static_cast<unsigned>(light.brightestPicture);
        AddSideData(stream, AV_PKT_DATA_CONTENT_LIGHT_LEVEL, level, size);
    }
}

} // namespace writer
