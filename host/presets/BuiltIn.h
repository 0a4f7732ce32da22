// The presets that the program brings along: the files in host/presets/builtin.
#ifndef MOVIECONV_HOST_PRESETS_BUILTIN_H
#define MOVIECONV_HOST_PRESETS_BUILTIN_H

#include <string_view>
#include <vector>

namespace movieconv {

struct BuiltInPreset {
    std::string_view name;
    std::string_view text; ///< JSON.
};

/// In the order in which they are listed.
const std::vector<BuiltInPreset>& BuiltInPresets();

} // namespace movieconv

#endif
