// What --help and shells tell about the options, both from the same table.
#ifndef MOVIECONV_HOST_TERMINAL_HELP_H
#define MOVIECONV_HOST_TERMINAL_HELP_H

#include "host/terminal/Completion.h"

#include <memory>
#include <vector>

namespace CLI {
class App;
class FormatterBase;
} // namespace CLI

namespace movieconv {

/// Shows the usual options for --help and all of them for --help-all.
std::shared_ptr<CLI::FormatterBase> MakeHelpFormatter();

/// The options of `app` for the shells.
std::vector<OptionEntry> OptionEntries(const CLI::App& app);

} // namespace movieconv

#endif
