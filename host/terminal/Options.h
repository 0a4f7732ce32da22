// The command line.
#ifndef MOVIECONV_HOST_TERMINAL_OPTIONS_H
#define MOVIECONV_HOST_TERMINAL_OPTIONS_H

#include "host/terminal/Units.h"

#include <cstdint>
#include <optional>
#include <string>

namespace movieconv {

enum class Task { kConvert, kInfo, kEstimate, kListFormats };
enum class ProgressStyle { kBar, kJson, kNone };
enum class OnFull { kStop, kWait };
enum class Fit { kStretch, kBorders };

/// Names are bytes as the system has them. What is not given is left to the engine's defaults and the source.
struct Options {
    Task task = Task::kConvert;
    std::string input;
    std::string output;

    std::optional<std::string> format; ///< Four-character code or extension.
    std::optional<std::string> videoCodec;
    std::optional<std::string> audioCodec;
    std::optional<Size> size;
    Fit fit = Fit::kBorders;
    std::optional<double> frameRate;
    std::optional<int32_t> videoRate;
    std::optional<int32_t> videoMaxRate;
    std::optional<int32_t> audioRate;
    std::optional<int32_t> audioMaxRate;
    std::optional<int32_t> channels;
    std::optional<int32_t> sampleRate;
    bool noVideo = false;
    bool noAudio = false;
    bool playlists = false; ///< The input may be a playlist.

    double begin = 0;             ///< Seconds.
    std::optional<double> length; ///< Seconds.
    std::optional<double> split;  ///< Seconds of each clip.

    bool overwrite = false;
    OnFull onFull = OnFull::kStop;
    bool keepPartial = true;
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
