// Scripts by which shells complete the program's command line.
#ifndef MOVIECONV_HOST_TERMINAL_COMPLETION_H
#define MOVIECONV_HOST_TERMINAL_COMPLETION_H

#include <string>
#include <vector>

namespace movieconv {

/// One option as the table of --help has it.
struct OptionEntry {
    /// What its value is; decides what a shell offers.
    enum class Value { kNone, kFree, kFile, kChoice, kPreset };

    std::string shortName; ///< "f", or empty.
    std::string longName;  ///< "format".
    Value value = Value::kNone;
    std::vector<std::string> choices; ///< Of kChoice.
    bool repeatable = false;          ///< Each mention of it adds to the others.
    std::string help;                 ///< One line.
};

enum class Shell { kBash, kZsh, kFish };

std::string CompletionScript(Shell shell, const std::vector<OptionEntry>& options);

} // namespace movieconv

#endif
