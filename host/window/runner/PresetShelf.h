// The presets of the program, as the window shows and keeps them.
#ifndef MOVIECONV_HOST_WINDOW_RUNNER_PRESETSHELF_H
#define MOVIECONV_HOST_WINDOW_RUNNER_PRESETSHELF_H

#include "host/presets/Preset.h"
#include "host/window/model/Runner.h"
#include "media/EncodeParam.h"

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace movieconv::window {

/// Those that can be used: the program's with their texts in the user's language, then the user's own.
std::vector<PresetFacts> PresetsOnShelf();

/// Takes a file among the user's own, with all that its parents say. Throws PresetError.
PresetFacts TakeIntoShelf(const std::string& path);

/// Writes what `wishes` make of their preset, without what belongs to one movie alone. Gives the names of the
/// wishes that presets have no words for. Throws PresetError.
QStringList WritePreset(const std::string& path, const Wishes& wishes);

/// The codec that the preset takes for files of that format; nothing when it leaves pictures out or to
/// others, or when they cannot carry what it wants.
std::optional<uint32_t> CodecOf(const Preset& preset, const FileFormatInfo* format);

/// What the window's 0 to 100 stand for in pictures of that height, on the codec's own scale; the preset's
/// own place on the window's scale gives the preset's own quality. Nothing when the preset tells none.
std::optional<double> QualityOf(const Preset& preset, uint32_t codec, int height, int wish);

} // namespace movieconv::window

#endif
