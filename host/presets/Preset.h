// Presets: named sets of preferences, as JSON files that hold what differs from their parent. The schema is
// docs/preset.schema.json.
#ifndef MOVIECONV_HOST_PRESETS_PRESET_H
#define MOVIECONV_HOST_PRESETS_PRESET_H

#include "host/convert/Preferences.h"
#include "host/sentence/SentenceError.h"

#include <string>
#include <vector>

namespace movieconv {

/// A preset that cannot be used: where, with the line if there is one, and why.
class PresetError : public SentenceError {
public:
    using SentenceError::SentenceError;
};

/// There is no preset of that name.
class NoPresetError : public PresetError {
public:
    using PresetError::PresetError;
};

struct Preset {
    std::string name; ///< As it was asked for.
    std::string description;
    Preferences preferences;
    std::string text;                 ///< As JSON with all that its parents say; unknown keys are kept.
    std::vector<Sentence> complaints; ///< Where and which the unknown keys are.
};

/// What is to be told of a preset without using it.
struct PresetSummary {
    std::string name;
    std::string description;
    std::string path;    ///< Empty for what the program brings along.
    std::string failure; ///< Why it cannot be used; empty when it can.
};

/// The preset that conversions use unless another one is asked for.
constexpr const char* kStandardPreset = "standard";

/// The preset of that name, the user's own before the program's; a name with a slash is a file's. Throws
/// PresetError.
Preset LoadPreset(const std::string& nameOrFile);

/// All presets: the program's in their order, then the user's own by name. One that cannot be used is in it
/// with the reason.
std::vector<PresetSummary> ListPresets();

/// Where the user's own are looked for, "NAME.json" for the name: $XDG_CONFIG_HOME/movieconv/presets, or
/// ~/.config/movieconv/presets. Empty when the environment tells no folder.
std::string OwnPresetFolder();

} // namespace movieconv

#endif
