// Signals and keys, received on a thread of their own and passed on to the main thread.
#ifndef MOVIECONV_HOST_TERMINAL_CONTROLINPUT_H
#define MOVIECONV_HOST_TERMINAL_CONTROLINPUT_H

#include "host/terminal/MainLoop.h"

#include <atomic>
#include <chrono>
#include <functional>
#include <mutex>
#include <optional>
#include <string>
#include <thread>

namespace movieconv {

enum class Command {
    kStop, ///< The user wants the conversion to end.
    kPauseKey,
    kSuspend, ///< The terminal asks the process to sleep (SIGTSTP).
};

/// Exists once. Must be made before any other thread, because it blocks the signals that it receives.
///
/// SIGINT, SIGTERM and SIGHUP: before Arm the program leaves at once with the shell's code for the signal;
/// the first one after Arm becomes kStop, and another one half a second later or more leaves at once. SIGTSTP
/// suspends, after Arm by means of kSuspend. A signal that is ignored at the start stays so. On a terminal
/// the keys space and p become kPauseKey, q and Q kStop.
class ControlInput {
public:
    explicit ControlInput(MainLoop& loop);
    ~ControlInput();
    ControlInput(const ControlInput&) = delete;
    ControlInput& operator=(const ControlInput&) = delete;

    /// From now on there is something to finish. Starts to listen to the keyboard if `keys` and there is one.
    /// `obey` runs on the main thread.
    void Arm(bool keys, std::function<void(Command)> obey);

    /// Where the data of the open file is, to be told when the program leaves at once; empty without one.
    void NoteFile(const std::string& temporaryPath);

    /// Listens to the keyboard while the terminal is this job's; the shell gives it away and back without
    /// telling. To be called now and then.
    void FollowTerminal();

    /// Suspends the whole process as the terminal asked, with the terminal as it was found, and returns when
    /// it goes on.
    void Suspend();

private:
    using Clock = std::chrono::steady_clock;

    void Run();
    void Post(Command command);
    void TakeSignals();
    void TakeSignal(int signal, Clock::time_point now);
    void TakeKeys();
    void LeaveAtOnce(int signal);
    void UseKeyboard();
    void RestoreTerminal();

    MainLoop& loop_;
    std::function<void(Command)> obey_; // the main thread's
    std::mutex fileMutex_;
    std::string file_;
    int signals_ = -1;
    int wake_ = -1;
    std::atomic<bool> armed_{false};
    std::atomic<bool> wantsKeys_{false};
    std::atomic<bool> keys_{false};
    std::optional<Clock::time_point> stopAsked_; // the thread's
    std::thread thread_;
};

} // namespace movieconv

#endif
