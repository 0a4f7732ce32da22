// The command line.
#ifndef MOVIECONV_HOST_TERMINAL_OPTIONS_H
#define MOVIECONV_HOST_TERMINAL_OPTIONS_H

#include "host/convert/Request.h"

#include <optional>
#include <string>

namespace movieconv {

enum class Task { kConvert, kInfo, kEstimate, kListFormats };
enum class ProgressStyle { kBar, kJson, kNone };
/// Names are bytes as the system has them.
struct Options {
    Task task = Task::kConvert;
    Request request;

    std::optional<std::string> log;
    bool quiet = false;
    std::optional<std::string> preview;
    ProgressStyle progress = ProgressStyle::kBar;
};

/// Reads the command line. Prints help or the version to standard output and returns nothing when that was
/// all that was asked for. Throws Failure when the command line makes no sense.
std::optional<Options> ParseOptions(int argc, char** argv);

} // namespace movieconv

#endif
