// One conversion at the terminal: its news go to the reports, keys and signals to the conversion.
#ifndef MOVIECONV_HOST_TERMINAL_SESSION_H
#define MOVIECONV_HOST_TERMINAL_SESSION_H

#include "host/convert/Observer.h"
#include "host/convert/Work.h"
#include "host/terminal/ControlInput.h"
#include "host/terminal/ExitCode.h"
#include "host/terminal/MainLoop.h"
#include "host/terminal/Options.h"
#include "host/terminal/Preview.h"
#include "host/terminal/Reporter.h"

#include <memory>
#include <optional>

namespace movieconv {

/// The main thread's.
class Session final : public Observer {
public:
    Session(const Options& options, const StandardStreams& streams, MainLoop& loop, ControlInput& control);

    /// Converts and reports. Throws Failure when the conversion cannot begin.
    ExitCode Run();

    void Started(const Start& news) override;
    void Progressed(const Progress& news) override;
    void Opened(const OpenedFile& news) override;
    void Closed(const ClosedFile& news) override;
    void Warned(const Warning& news) override;
    void LeftBehind(const NotCarried& news) override;
    void Showed(const std::shared_ptr<const ShownPicture>& news) override;
    void Ended(const Verdict& news) override;

private:
    void Arm();
    void Obey(Command command);

    const Options& options_;
    MainLoop& loop_;
    ControlInput& control_;
    const std::unique_ptr<Reporter> reporter_;
    std::optional<Preview> preview_;
    bool armed_ = false;
    bool started_ = false;
    bool paused_ = false;
    std::optional<ExitCode> code_;
    const std::unique_ptr<Work> work_; // last: the others hear from it
};

} // namespace movieconv

#endif
