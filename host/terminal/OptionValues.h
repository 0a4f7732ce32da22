// The notations of the program's own options; those that presets have too stand in host/presets/Notation.h.
#ifndef MOVIECONV_HOST_TERMINAL_OPTIONVALUES_H
#define MOVIECONV_HOST_TERMINAL_OPTIONVALUES_H

#include "host/convert/Request.h"

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <string_view>

namespace movieconv {

/// The code of a file format that the writer has, from its code or an extension. Nothing for anything else.
std::optional<uint32_t> ParseFormat(std::string_view name);

constexpr int kMostJobs = 256;

/// From "1" to kMostJobs; 0 for "auto". Nothing for anything else.
std::optional<int> ParseJobs(std::string_view text);

/// From "all", "none" or what stands between commas.
TrackList ParseTracks(const std::string& text);

/// From FILE or FILE:LANG, where a language has two or three letters and perhaps a region.
SubtitleFileWish ParseSubtitleFile(const std::string& text);

/// The speeds by their names.
std::map<std::string, Speed> SpeedChoices();

/// Enter a value into the request; false, with nothing that counts entered, where the text is not in the
/// option's notation: "copy" or a codec's code, "auto" or pixels as T:B:L:R, KEY=VALUE.
bool ReadSoundCodec(const std::string& text, Request& request);
bool ReadCrop(const std::string& text, Request& request);
bool ReadMetadata(const std::string& text, Request& request);

} // namespace movieconv

#endif
