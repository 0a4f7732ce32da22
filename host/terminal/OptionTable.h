// The table of the program's options.
#ifndef MOVIECONV_HOST_TERMINAL_OPTIONTABLE_H
#define MOVIECONV_HOST_TERMINAL_OPTIONTABLE_H

#include "host/terminal/Options.h"

namespace CLI {
class App;
}

namespace movieconv {

/// The headings under which --help has the options.
namespace heading {
constexpr const char* kRange = "What to convert";
constexpr const char* kEncoding = "Format and codecs";
constexpr const char* kPictures = "Pictures";
constexpr const char* kSound = "Sound";
constexpr const char* kMany = "Many movies";
constexpr const char* kPieces = "In pieces";
constexpr const char* kCarried = "Tracks and texts";
constexpr const char* kOutput = "Output";
constexpr const char* kReports = "Reports";
constexpr const char* kInsteadOfConverting = "Instead of converting"; // what only prints
} // namespace heading

/// Adds all options but those for help and the version: parsing then fills `options`, which has to stay until
/// that is done.
void AddOptions(CLI::App& app, Options& options);

} // namespace movieconv

#endif
