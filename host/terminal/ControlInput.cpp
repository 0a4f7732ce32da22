#include "host/terminal/ControlInput.h"

#include "text/Printable.h"
#include "text/WriteAll.h"

#include <array>
#include <cerrno>
#include <csignal>
#include <cstdint>
#include <fmt/format.h>
#include <mutex>
#include <new>
#include <poll.h>
#include <string>
#include <sys/eventfd.h>
#include <sys/signalfd.h>
#include <system_error>
#include <termios.h>
#include <unistd.h>
#include <utility>

namespace movieconv {
namespace {

// `timeout` signals its child and then the child's group, which must not count as the user's impatience.
constexpr std::chrono::milliseconds kSameRequest{500};

bool IsIgnored(int signal) {
    struct sigaction action {};
    return sigaction(signal, nullptr, &action) == 0 && action.sa_handler == SIG_IGN;
}

/// Those that the caller wants ignored, as `nohup` does, stay ignored.
sigset_t OurSignals() {
    sigset_t set;
    sigemptyset(&set);
    for (const int signal : {SIGINT, SIGTERM, SIGHUP, SIGQUIT, SIGTSTP})
        if (!IsIgnored(signal))
            sigaddset(&set, signal);
    return set;
}

/// The terminal's settings as they were found, while they are changed.
struct Terminal {
    std::mutex mutex;
    termios found{};
    bool changed = false;
};

Terminal& TheTerminal() {
    static Terminal terminal;
    return terminal;
}

bool OwnsTerminal() {
    return isatty(STDIN_FILENO) != 0 && tcgetpgrp(STDIN_FILENO) == getpgrp();
}

} // namespace

ControlInput::ControlInput(MainLoop& loop) : loop_(loop) {
    const sigset_t ours = OurSignals();
    pthread_sigmask(SIG_BLOCK, &ours, nullptr);
    for (const int failure : {SIGPIPE, SIGXFSZ, SIGTTIN}) // the write or read that fails tells it
        std::signal(failure, SIG_IGN);
    signals_ = signalfd(-1, &ours, SFD_CLOEXEC);
    wake_ = eventfd(0, EFD_CLOEXEC);
    if (signals_ < 0 || wake_ < 0)
        throw std::system_error(errno, std::generic_category(), "no signals can be received");
    thread_ = std::thread(&ControlInput::Run, this);
}

ControlInput::~ControlInput() {
    keys_ = false;
    eventfd_write(wake_, UINT32_MAX); // larger than what one read of the thread takes away
    thread_.join();
    RestoreTerminal();
    close(signals_);
    close(wake_);
}

void ControlInput::Arm(bool keys, std::function<void(Command)> obey) {
    obey_ = std::move(obey);
    wantsKeys_ = keys;
    FollowTerminal();
    armed_ = true;
}

void ControlInput::NoteFile(const std::string& temporaryPath) {
    const std::lock_guard lock(fileMutex_);
    file_ = temporaryPath;
}

void ControlInput::FollowTerminal() {
    if (!wantsKeys_ || !OwnsTerminal()) {
        keys_ = false;
    } else if (!keys_) {
        UseKeyboard();
        keys_ = true;
        eventfd_write(wake_, 1);
    }
}

void ControlInput::Suspend() {
    RestoreTerminal();
    keys_ = false;
    kill(getpid(), SIGSTOP);
    FollowTerminal();
}

void ControlInput::Run() {
    for (;;) {
        std::array<pollfd, 3> sources{pollfd{signals_, POLLIN, 0}, pollfd{wake_, POLLIN, 0},
                                      pollfd{keys_ ? STDIN_FILENO : -1, POLLIN, 0}};
        if (poll(sources.data(), sources.size(), -1) < 0)
            continue;
        if ((sources[1].revents & POLLIN) != 0) {
            eventfd_t count = 0;
            eventfd_read(wake_, &count);
            if (count >= UINT32_MAX)
                return;
        }
        if ((sources[0].revents & POLLIN) != 0)
            TakeSignals();
        if (sources[2].revents != 0)
            TakeKeys();
    }
}

void ControlInput::Post(Command command) {
    try {
        loop_.Post([this, command] { obey_(command); });
    } catch (const std::bad_alloc&) { // the user asks once more
    }
}

/// Those that are pending together came at one moment, however late they are read.
void ControlInput::TakeSignals() {
    std::array<signalfd_siginfo, 8> pending{};
    const ssize_t size = read(signals_, pending.data(), sizeof pending);
    const Clock::time_point now = Clock::now();
    for (ssize_t i = 0; i < size / static_cast<ssize_t>(sizeof pending[0]); ++i)
        TakeSignal(static_cast<int>(pending[static_cast<std::size_t>(i)].ssi_signo), now);
}

void ControlInput::TakeSignal(int signal, Clock::time_point now) {
    if (signal == SIGTSTP && !armed_) {
        Suspend();
    } else if (signal == SIGTSTP) {
        Post(Command::kSuspend);
    } else if (!armed_ || signal == SIGQUIT || (stopAsked_ && now - *stopAsked_ >= kSameRequest)) {
        LeaveAtOnce(signal);
    } else if (!stopAsked_) {
        stopAsked_ = now;
        Post(Command::kStop);
    }
}

void ControlInput::TakeKeys() {
    std::array<char, 64> keys{};
    const ssize_t count = read(STDIN_FILENO, keys.data(), keys.size());
    if (count <= 0) {
        keys_ = false; // the terminal is gone, or another job's
        return;
    }
    for (ssize_t i = 0; i < count; ++i) {
        const char key = keys[static_cast<std::size_t>(i)];
        if (key == ' ' || key == 'p' || key == 'P')
            Post(Command::kPauseKey);
        else if (key == 'q' || key == 'Q')
            Post(Command::kStop);
    }
}

void ControlInput::LeaveAtOnce(int signal) {
    RestoreTerminal();
    try {
        const std::lock_guard lock(fileMutex_);
        if (!file_.empty())
            text::WriteAll(STDERR_FILENO,
                           fmt::format("\nmovieconv: left at once; what was written so far is in \"{}\"\n",
                                       text::Printable(file_)));
    } catch (const std::bad_alloc&) { // leaving matters more than the message
    }
    // Ends as if the signal had not been caught, which the shell shows as 128 plus its number.
    std::signal(signal, SIG_DFL);
    sigset_t set;
    sigemptyset(&set);
    sigaddset(&set, signal);
    pthread_sigmask(SIG_UNBLOCK, &set, nullptr);
    kill(getpid(), signal);
}

/// Makes keys arrive at once and unseen. Ctrl-C and Ctrl-Z still send signals.
void ControlInput::UseKeyboard() {
    Terminal& terminal = TheTerminal();
    const std::lock_guard lock(terminal.mutex);
    if (terminal.changed || tcgetattr(STDIN_FILENO, &terminal.found) != 0)
        return;
    termios settings = terminal.found;
    settings.c_lflag &= ~static_cast<tcflag_t>(ICANON | ECHO);
    settings.c_cc[VMIN] = 1;
    settings.c_cc[VTIME] = 0;
    terminal.changed = tcsetattr(STDIN_FILENO, TCSANOW, &settings) == 0;
}

void ControlInput::RestoreTerminal() {
    Terminal& terminal = TheTerminal();
    const std::lock_guard lock(terminal.mutex);
    if (terminal.changed) {
        // In the background this would stop the process; then the shell has put the settings right already.
        if (OwnsTerminal())
            tcsetattr(STDIN_FILENO, TCSANOW, &terminal.found);
        terminal.changed = false;
    }
}

} // namespace movieconv
