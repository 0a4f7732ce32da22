#include "host/terminal/OptionValues.h"

#include "host/convert/Formats.h"
#include "host/presets/Notation.h"
#include "host/source/Charset.h"

#include <algorithm>
#include <cctype>
#include <cstddef>
#include <utility>

namespace movieconv {

std::optional<uint32_t> ParseFormat(std::string_view name) {
    const FileFormatInfo* format = FindFormat(name);
    return format != nullptr ? std::optional(format->fccFormat) : std::nullopt;
}

std::optional<int> ParseJobs(std::string_view text) {
    return text == "auto" ? std::optional(0) : ParseWhole(text, 1, kMostJobs);
}

TrackList ParseTracks(const std::string& text) {
    if (text == "all")
        return std::nullopt;
    TrackList list(std::in_place);
    for (std::size_t at = 0; text != "none" && at <= text.size();) {
        const std::size_t end = std::min(text.find(',', at), text.size());
        if (end > at)
            list->push_back(text.substr(at, end - at));
        at = end + 1;
    }
    return list;
}

SubtitleFileWish ParseSubtitleFile(const std::string& text) {
    const std::size_t colon = text.rfind(':');
    const std::string language = colon == std::string::npos ? "" : text.substr(colon + 1);
    const std::string code = language.substr(0, language.find('-'));
    const bool isCode =
        (code.size() == 2 || code.size() == 3) &&
        std::all_of(code.begin(), code.end(), [](unsigned char letter) { return std::isalpha(letter) != 0; });
    return isCode ? SubtitleFileWish{text.substr(0, colon), language} : SubtitleFileWish{text, ""};
}

std::map<std::string, Speed> SpeedChoices() {
    std::map<std::string, Speed> choices;
    int number = 0;
    for (const std::string_view name : kSpeedNames)
        choices.emplace(name, static_cast<Speed>(++number));
    return choices;
}

bool ReadSoundCodec(const std::string& text, Request& request) {
    request.copySound = text == "copy";
    request.audioCodec = request.copySound ? std::nullopt : ParseCode(text);
    return request.copySound || request.audioCodec;
}

bool ReadCrop(const std::string& text, Request& request) {
    request.detectCrop = text == "auto";
    const std::optional<Crop> crop = request.detectCrop ? std::optional(Crop{}) : ParseCrop(text);
    request.crop = crop.value_or(Crop{});
    return crop.has_value();
}

bool ReadMetadata(const std::string& text, Request& request) {
    const std::size_t equals = text.find('=');
    if (equals == std::string::npos || equals == 0)
        return false;
    // From a terminal of another character set; containers hold UTF-8 only.
    request.metadata.push_back({Decoded(text.substr(0, equals)), Decoded(text.substr(equals + 1))});
    return true;
}

} // namespace movieconv
