#include "host/window/runner/Translation.h"

#include "host/convert/Formats.h"

#include <QCoreApplication>

#include <algorithm>
#include <array>
#include <cmath>
#include <string_view>

namespace movieconv::window {
namespace {

struct Preset {
    const char* name;
    const char* title;
    const char* description;
    const char* extension;
    int quality; // -1: nothing to choose
    std::string_view videoCodec;
    std::string_view audioCodec;
    int32_t audioRate;
    int mostHeight; // 0: none
};

constexpr std::array kPresets = {
    Preset{"standard", QT_TRANSLATE_NOOP("Presets", "Standard"),
           QT_TRANSLATE_NOOP("Presets", "Looks like the source and plays on nearly everything (H.264, AAC)."),
           "mp4", 65, "H264", "AAC", 160'000, 0},
    Preset{"small", QT_TRANSLATE_NOOP("Presets", "Small"),
           QT_TRANSLATE_NOOP("Presets", "Half the size at nearly the same quality, and slower (HEVC, AAC)."),
           "mp4", 50, "HEVC", "AAC", 128'000, 0},
    Preset{"web", QT_TRANSLATE_NOOP("Presets", "Web"),
           QT_TRANSLATE_NOOP("Presets", "For web pages, in formats that are free of patents (VP9, Opus)."),
           "webm", 55, "VP90", "OPUS", 128'000, 1080},
    Preset{"phone", QT_TRANSLATE_NOOP("Presets", "Phone"),
           QT_TRANSLATE_NOOP("Presets", "Small pictures for small screens (H.264 up to 720 lines, AAC)."),
           "mp4", 50, "H264", "AAC", 128'000, 720},
    Preset{"sound", QT_TRANSLATE_NOOP("Presets", "Sound alone"),
           QT_TRANSLATE_NOOP("Presets", "Leaves the pictures out (AAC)."), "m4a", -1, "", "AAC", 192'000, 0}};

const Preset& FindPreset(const QString& name) {
    const auto found = std::find_if(kPresets.begin(), kPresets.end(),
                                    [&](const Preset& preset) { return name == QLatin1String(preset.name); });
    return found == kPresets.end() ? kPresets.front() : *found;
}

bool Carries(const uint32_t (&codecs)[32], uint32_t code) {
    return std::find(std::begin(codecs), std::end(codecs), code) != std::end(codecs);
}

/// The preset's codec where the format takes it; nothing leaves it to the format.
std::optional<uint32_t> CodecFor(const uint32_t (&codecs)[32], std::string_view wanted) {
    const std::optional<uint32_t> code = ParseCode(wanted);
    return code && Carries(codecs, *code) ? code : std::nullopt;
}

/// Bits a second for pictures of that size. Each 30 points of quality double it.
int32_t RateFor(const Size& size, double rate, int quality, bool efficient) {
    const double bitsPerPixel = 0.025 * std::pow(2.0, quality / 30.0) * (efficient ? 0.6 : 1.0);
    const double bits =
        size.width * static_cast<double>(size.height) * std::clamp(rate, 1.0, 120.0) * bitsPerPixel;
    return static_cast<int32_t>(std::clamp(bits, 150'000.0, 120'000'000.0));
}

Size ScaledTo(int height, const MovieFacts& facts) {
    const int even = height / 2 * 2;
    const double width = static_cast<double>(facts.width) * even / std::max(facts.height, 1);
    return {std::max(2, static_cast<int>(std::lround(width / 2)) * 2), even};
}

void AskForPictures(Request& request, const FileFormatInfo& format, const Preset& preset,
                    const Wishes& wishes, const MovieFacts& facts) {
    Size size{facts.width, facts.height};
    const int height =
        wishes.height.value_or(preset.mostHeight > 0 ? std::min(preset.mostHeight, facts.height) : 0);
    if (height > 0 && height != facts.height) {
        size = ScaledTo(height, facts);
        request.size = size;
    }
    request.frameRate = wishes.rate;
    request.videoCodec = CodecFor(format.fccVideoCodecs, preset.videoCodec);
    const uint32_t codec = request.videoCodec.value_or(format.fccVideoCodecs[0]);
    const bool efficient = codec == ParseCode("HEVC") || codec == ParseCode("VP90");
    request.videoRate = RateFor(size, wishes.rate.value_or(facts.rate > 0 ? facts.rate : 25),
                                wishes.quality.value_or(std::max(preset.quality, 0)), efficient);
}

} // namespace

std::vector<PresetFacts> BuiltInPresets() {
    std::vector<PresetFacts> presets;
    for (const Preset& preset : kPresets) {
        presets.push_back({QLatin1String(preset.name), QCoreApplication::translate("Presets", preset.title),
                           QCoreApplication::translate("Presets", preset.description),
                           QLatin1String(preset.extension), preset.quality});
    }
    return presets;
}

Request ToRequest(const Order& order) {
    const Wishes& wishes = order.wishes;
    const MovieFacts& facts = order.facts;
    const Preset& preset = FindPreset(wishes.preset);
    Request request;
    request.input = order.source;
    request.output = order.target;
    request.overwrite = order.replace;
    request.onFull = OnFull::kWait;
    request.begin = wishes.begin;
    if (wishes.end)
        request.length = *wishes.end - wishes.begin;
    request.split = wishes.clip;
    request.noVideo = !wishes.withPictures || facts.width == 0;
    request.noAudio = !wishes.withSound;
    request.channels = wishes.channels;
    const QString extension = wishes.format.value_or(QLatin1String(preset.extension));
    const FileFormatInfo* format = FindFormatOfFile(order.target);
    if (format == nullptr)
        format = FindFormat(extension.toStdString());
    if (format == nullptr)
        return request; // the library tells
    request.format = format->fccFormat;
    request.noVideo = request.noVideo || format->bHasVideo == 0;
    request.noAudio = request.noAudio || format->bHasAudio == 0;
    request.audioCodec = CodecFor(format->fccAudioCodecs, preset.audioCodec);
    if (request.audioCodec && !request.noAudio)
        request.audioRate = preset.audioRate;
    if (!request.noVideo)
        AskForPictures(request, *format, preset, wishes, facts);
    return request;
}

} // namespace movieconv::window
