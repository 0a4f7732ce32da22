// What a conversion tells its user, apart from how it is told.
#ifndef MOVIECONV_HOST_TERMINAL_REPORTER_H
#define MOVIECONV_HOST_TERMINAL_REPORTER_H

#include "host/terminal/ExitCode.h"
#include "host/terminal/Options.h"
#include "host/terminal/StandardStreams.h"

#include <cstdint>
#include <memory>
#include <optional>
#include <string>

namespace movieconv {

enum class Phase { kConverting, kPaused, kFinishing, kWaitingForRoom };

struct StartReport {
    std::string input;
    std::string output;
    double length;      ///< Seconds to convert.
    bool lengthIsKnown; ///< False when it is a guess.
};

struct ProgressReport {
    Phase phase;
    double position; ///< Seconds of the source converted.
    double length;
    std::optional<double> percent; ///< Below 100; nothing when the length is a guess.
    std::optional<double> speed;   ///< Seconds of source a second of work.
    std::optional<double> left;    ///< Seconds of work for the rest.
    int64_t bytes;                 ///< In the output so far, all clips.
    double worked;                 ///< Seconds, pauses left out.
    double finished;               ///< Of the finishing phase, 0 to 1.
    int clip;                      ///< Number of the open clip from 1; 0 without splitting.
};

struct FileReport {
    int number; ///< Of the file, from 1.
    std::string path;
    double videoSeconds; ///< In the file; 0 without such a stream.
    double audioSeconds;
    int64_t bytes;
};

struct EndReport {
    ExitCode code;
    std::string outcome; ///< "done", "stopped" or "failed".
    std::string summary; ///< A sentence.
    double position;
    double worked;
    int64_t bytes;
    int files; ///< Complete ones.
};

/// The main thread's. The defaults tell nothing.
class Reporter {
public:
    Reporter() = default;
    Reporter(const Reporter&) = delete;
    Reporter& operator=(const Reporter&) = delete;
    virtual ~Reporter() = default;

    virtual void Start(const StartReport&) {}
    /// Called as often as there is news; the reporter decides what to show. `milestone` when something other
    /// than the figures changed, such as the phase.
    virtual void Progress(const ProgressReport&, bool /*milestone*/) {}
    virtual void FileOpened(int /*number*/, const std::string& /*path*/) {}
    virtual void FileClosed(const FileReport&) {}
    virtual void Warning(const std::string&) {}
    virtual void Error(const std::string& text) = 0;
    virtual void End(const EndReport&) {}

    /// Leaves the terminal line before something else writes to the terminal.
    virtual void LeaveLine() {}
};

/// The reporter that the options ask for. `streams` must outlive it.
std::unique_ptr<Reporter> MakeReporter(const Options& options, const StandardStreams& streams);

} // namespace movieconv

#endif
