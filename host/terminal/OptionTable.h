// The table of the program's options.
#ifndef MOVIECONV_HOST_TERMINAL_OPTIONTABLE_H
#define MOVIECONV_HOST_TERMINAL_OPTIONTABLE_H

#include "host/terminal/Options.h"

namespace CLI {
class App;
}

namespace movieconv {

/// The heading of what only prints.
constexpr const char* kInsteadOfConverting = "Instead of converting";

/// Adds all options but those for help and the version: parsing then fills `options`, which has to stay until
/// that is done.
void AddOptions(CLI::App& app, Options& options);

} // namespace movieconv

#endif
