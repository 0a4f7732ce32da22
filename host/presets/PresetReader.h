// From a preset's members to preferences.
#ifndef MOVIECONV_HOST_PRESETS_PRESETREADER_H
#define MOVIECONV_HOST_PRESETS_PRESETREADER_H

#include "host/convert/Preferences.h"
#include "host/presets/PresetText.h"
#include "host/sentence/Sentence.h"

#include <vector>

namespace movieconv {

/// Throws PresetError when a member has a value that makes no sense; adds unknown ones to `complaints`.
Preferences ReadPreferences(const PresetText& text, std::vector<Sentence>& complaints);

/// The members of `child`, and of `parent` where the child has none; null takes a member away. Those of
/// "video", "audio" and, by codec, "quality" are counted singly. A rate takes the parent's quality away and
/// the other way round.
Json MergePresets(const Json& parent, const Json& child);

} // namespace movieconv

#endif
