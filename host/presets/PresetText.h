// The text of one preset file: JSON with the lines that its members stand on.
#ifndef MOVIECONV_HOST_PRESETS_PRESETTEXT_H
#define MOVIECONV_HOST_PRESETS_PRESETTEXT_H

#include <map>
#include <nlohmann/json.hpp>
#include <string>

namespace movieconv {

using Json = nlohmann::ordered_json;

/// Where each member of a JSON text stands, by its pointer, such as "/video/codec".
using KeyLines = std::map<std::string, int>;

/// A parsed preset file.
struct PresetText {
    std::string where; ///< The path, or what stands for it.
    Json json;         ///< An object.
    KeyLines lines;

    /// "FILE:LINE", or the file alone where the line of `pointer` is not known.
    std::string Place(const std::string& pointer) const;
};

/// Throws PresetError when `text` is no JSON object or names a member twice.
PresetText ParsePresetText(const std::string& text, const std::string& where);

/// Reads a file of at most 1 MiB. Throws PresetError.
PresetText ReadPresetFile(const std::string& path);

} // namespace movieconv

#endif
