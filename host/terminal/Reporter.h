// What a conversion tells its user, apart from how it is told.
#ifndef MOVIECONV_HOST_TERMINAL_REPORTER_H
#define MOVIECONV_HOST_TERMINAL_REPORTER_H

#include "host/convert/Observer.h"
#include "host/terminal/ExitCode.h"
#include "host/terminal/Options.h"
#include "host/terminal/StandardStreams.h"

#include <cstdint>
#include <memory>
#include <string>

namespace movieconv {

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
class Reporter : public Observer {
public:
    void Warned(const Warning& news) override { Warn(Explain(news), news.input); }
    void Ended(const Verdict& verdict) final;

    /// `input`: of which of many movies; otherwise empty.
    virtual void Warn(const std::string& /*text*/, const std::string& /*input*/) {}

    /// Leaves the terminal line before something else writes to the terminal.
    virtual void LeaveLine() {}

protected:
    virtual void Error(const std::string& text) = 0;
    virtual void End(const EndReport&) {}
};

/// The reporter that the options ask for. `streams` must outlive it.
std::unique_ptr<Reporter> MakeReporter(const Options& options, const StandardStreams& streams);

} // namespace movieconv

#endif
