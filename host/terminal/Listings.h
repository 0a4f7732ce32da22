// What --list-formats and --list-presets print, and the names that are offered as values of options.
#ifndef MOVIECONV_HOST_TERMINAL_LISTINGS_H
#define MOVIECONV_HOST_TERMINAL_LISTINGS_H

#include <string>
#include <vector>

namespace movieconv {

/// The table of file formats and codecs, for people.
std::string FormatsText();

/// The same as one JSON object in a line; docs/progress-json.md describes it.
std::string FormatsJson();

/// The presets with what they say of themselves, for people; as one JSON object in a line.
std::string PresetsText();
std::string PresetsJson();

/// Their names, one a line.
std::string PresetNames();

/// The names of all file formats' extensions, and of all codecs for pictures or sound.
std::vector<std::string> ExtensionNames();
std::vector<std::string> CodecNames(bool forSound);

} // namespace movieconv

#endif
