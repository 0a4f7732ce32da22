// One conversion, from the first look at the output to the exit code. It drives the engine through its MC
// functions and learns what happens through the main event queue: the engine's events, its callback's, the
// media writer's news, signals and keys all arrive there.
#ifndef MOVIECONV_HOST_CONVERT_CONVERSION_H
#define MOVIECONV_HOST_CONVERT_CONVERSION_H

#include "api/MovieConv.h"
#include "host/convert/FileLedger.h"
#include "host/convert/HostEvents.h"
#include "host/convert/Preview.h"
#include "host/convert/SpeedMeter.h"
#include "host/convert/WorkClock.h"
#include "host/convert/WriterWatch.h"
#include "host/source/Movie.h"
#include "host/terminal/ControlInput.h"
#include "host/terminal/Options.h"
#include "host/terminal/Reporter.h"

#include <atomic>
#include <memory>
#include <optional>
#include <string>

namespace movieconv {

struct ConverterFree {
    void operator()(void* converter) const { MCDestroy(converter); }
};
using Converter = std::unique_ptr<void, ConverterFree>;

/// A converter for the movie with its parameters set as the options ask, for files with these options of the
/// writer. Throws Failure.
Converter MakeConverter(const Options& options, Movie& movie, uint32_t writerSet = kWriterDefaultSet);

class Conversion {
public:
    Conversion(const Options& options, Movie& movie, Reporter& reporter, ControlInput& control);
    Conversion(const Conversion&) = delete;
    Conversion& operator=(const Conversion&) = delete;

    /// Converts and reports. Throws Failure when it cannot begin.
    ExitCode Run();

private:
    static constexpr int kNone = -1;

    static unsigned OnProgress(void* context, unsigned kind, unsigned value, uintptr_t info);

    void WarnOfSmallRoom();
    void WaitForEnd();
    void Handle(EventKind event);
    void TakeNews();
    void Stop();
    void TogglePause();
    void Suspend();
    void UpdateClock();
    ProgressReport Figures();
    void ReportProgress();
    ExitCode Conclude();
    std::optional<Failure> Verdict();
    double Converted(double position) const;
    std::string WhyItEndedEarly() const;
    void ReportComplaints();

    const Options& options_;
    Movie& movie_;
    Reporter& reporter_;
    ControlInput& control_;
    const double length_;
    WriterWatch watch_;
    FileLedger files_;
    std::optional<Preview> preview_;
    Converter converter_;

    // The engine's worker sets these.
    std::atomic<double> position_{0}; // in seconds
    std::atomic<int> outcome_{kNone}; // once the worker has nothing more to say

    WorkClock clock_;
    SpeedMeter speed_;
    bool paused_ = false;
    bool userStopped_ = false;
    Phase shownPhase_ = Phase::kConverting;
};

} // namespace movieconv

#endif
