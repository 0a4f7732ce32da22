#include "host/terminal/Listings.h"

#include "host/convert/Formats.h"
#include "host/presets/Preset.h"
#include "host/terminal/JsonLine.h"
#include "media/FileFormats.h"
#include "text/Printable.h"

#include <algorithm>
#include <fmt/format.h>
#include <fmt/ranges.h>
#include <iterator>
#include <nlohmann/json.hpp>

namespace movieconv {
namespace {

using Json = nlohmann::ordered_json;

std::vector<std::string> Extensions(const FileFormatInfo& format) {
    std::vector<std::string> names;
    ForEachExtension(format, [&](std::string_view name) { names.emplace_back(name); });
    return names;
}

/// The codes of a list that zero or its end ends.
template <std::size_t N>
std::vector<std::string> Codecs(const uint32_t (&codes)[N]) {
    std::vector<std::string> names;
    for (const uint32_t code : codes) {
        if (code == 0)
            break;
        names.push_back(CodeName(code));
    }
    return names;
}

} // namespace

std::string FormatsText() {
    std::string text;
    for (const FileFormatInfo& format : FileFormats()) {
        const auto add = [&](const char* title, const std::vector<std::string>& codecs) {
            if (!codecs.empty())
                fmt::format_to(std::back_inserter(text), "      {:<9} {}\n", title, fmt::join(codecs, ", "));
        };
        fmt::format_to(std::back_inserter(text), "{:<5} {} (.{})\n", CodeName(format.fccFormat),
                       format.szName, fmt::join(Extensions(format), ", ."));
        add("pictures:", Codecs(format.fccVideoCodecs));
        add("sound:", Codecs(format.fccAudioCodecs));
    }
    return text;
}

std::string FormatsJson() {
    Json list = Json::array();
    for (const FileFormatInfo& format : FileFormats()) {
        list.push_back({{"code", CodeName(format.fccFormat)},
                        {"name", format.szName},
                        {"extensions", Extensions(format)},
                        {"pictures", Codecs(format.fccVideoCodecs)},
                        {"sound", Codecs(format.fccAudioCodecs)}});
    }
    return JsonLine("formats", {{"formats", list}});
}

std::string PresetsText() {
    std::string text;
    for (const PresetSummary& preset : ListPresets()) {
        const std::string& told = preset.failure.empty() ? preset.description : preset.failure;
        fmt::format_to(std::back_inserter(text), "{:<10} {}{}\n", text::Printable(preset.name),
                       text::Printable(told),
                       preset.path.empty() || !preset.failure.empty()
                           ? ""
                           : fmt::format(" ({})", text::Printable(preset.path)));
    }
    return text;
}

std::string PresetsJson() {
    Json list = Json::array();
    const auto given = [](const std::string& text) { return text.empty() ? Json(nullptr) : Json(text); };
    for (const PresetSummary& preset : ListPresets())
        list.push_back({{"name", preset.name},
                        {"description", preset.description},
                        {"path", given(preset.path)},
                        {"failure", given(preset.failure)}});
    return JsonLine("presets", {{"presets", list}});
}

std::string PresetNames() {
    std::string names;
    for (const PresetSummary& preset : ListPresets())
        names += preset.name + "\n";
    return names;
}

std::vector<std::string> ExtensionNames() {
    std::vector<std::string> names;
    for (const FileFormatInfo& format : FileFormats()) {
        const std::vector<std::string> own = Extensions(format);
        names.insert(names.end(), own.begin(), own.end());
    }
    return names;
}

std::vector<std::string> CodecNames(bool forSound) {
    std::vector<std::string> names;
    for (const FileFormatInfo& format : FileFormats()) {
        const std::vector<std::string> own =
            forSound ? Codecs(format.fccAudioCodecs) : Codecs(format.fccVideoCodecs);
        names.insert(names.end(), own.begin(), own.end());
    }
    std::sort(names.begin(), names.end());
    names.erase(std::unique(names.begin(), names.end()), names.end());
    return names;
}

} // namespace movieconv
