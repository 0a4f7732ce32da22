// The command line.
#ifndef MOVIECONV_HOST_TERMINAL_OPTIONS_H
#define MOVIECONV_HOST_TERMINAL_OPTIONS_H

#include "host/convert/Request.h"
#include "host/pieces/Plan.h"
#include "host/presets/Preset.h"
#include "host/terminal/Completion.h"

#include <optional>
#include <string>
#include <vector>

namespace movieconv {

constexpr const char* kStandardInput = "/dev/stdin"; // what "-" stands for as an input

enum class Task { kConvert, kPlan, kPiece, kJoin, kInfo, kEstimate, kListFormats, kListPresets, kShowPreset };
enum class ProgressStyle { kBar, kJson, kNone };

/// Names are bytes as the system has them.
struct Options {
    Task task = Task::kConvert;
    Request request; ///< With the preset's preferences.
    std::string preset = kStandardPreset;
    std::vector<Sentence> complaints; ///< Of the preset.

    std::optional<std::string> plan; ///< Where a plan is to be written.
    Division division;
    int piece = 0;                    ///< The number of the one to make.
    std::optional<int> jobs;          ///< Pieces at once; 0: as many as help.
    std::optional<std::string> into;  ///< The folder for many movies.
    std::vector<std::string> inputs;  ///< What is converted into it; the request names none, then.
    std::optional<std::string> names; ///< The pattern of their outputs' names.
    bool resume = false;
    bool keepPieces = false;

    std::optional<std::string> log;
    bool quiet = false;
    std::optional<std::string> preview;
    ProgressStyle progress = ProgressStyle::kBar;
    std::optional<Shell> completion;
};

/// Reads the command line. Prints help, the version or a shell's script to standard output and returns
/// nothing when that was all that was asked for. Throws Failure when the command line makes no sense.
std::optional<Options> ParseOptions(int argc, char** argv);

} // namespace movieconv

#endif
