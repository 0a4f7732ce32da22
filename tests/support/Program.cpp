#include "tests/support/Program.h"

#include <algorithm>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <pty.h>
#include <regex.h>
#include <set>
#include <sys/wait.h>
#include <termios.h>
#include <unistd.h>

namespace program {
namespace {

[[noreturn]] void Become(const std::vector<std::string>& command) {
    std::vector<char*> argv;
    for (const std::string& argument : command)
        argv.push_back(const_cast<char*>(argument.c_str()));
    argv.push_back(nullptr);
    execvp(argv[0], argv.data());
    _exit(127);
}

std::vector<std::string> Movieconv(std::vector<std::string> arguments) {
    const std::set<std::string> others{"--preset", "--piece",        "--join",         "--show-preset",
                                       "--info",   "--list-formats", "--list-presets", "--completion"};
    const bool convertsByItself = std::none_of(arguments.begin(), arguments.end(),
                                               [&](const std::string& one) { return others.count(one) > 0; });
    if (convertsByItself && !arguments.empty())
        arguments.insert(arguments.begin(), {"--preset", "classic"});
    arguments.insert(arguments.begin(), MOVIECONV_PROGRAM);
    return arguments;
}

} // namespace

Result Run(const std::vector<std::string>& command) {
    return InChild([&]() -> int {
        dup2(open("/dev/null", O_RDONLY), 0);
        Become(command);
    });
}

Result Call(const std::vector<std::string>& arguments) {
    return Run(Movieconv(arguments));
}

Running::Running(const std::vector<std::string>& arguments, bool terminal) {
    if (terminal) {
        winsize size{24, 100, 0, 0};
        child_ = forkpty(&output_, nullptr, nullptr, &size);
        if (child_ == 0) {
            setenv("TERM", "xterm", 1);
            Become(Movieconv(arguments));
        }
        return;
    }
    int ends[2] = {-1, -1};
    if (pipe2(ends, O_CLOEXEC) != 0)
        return;
    child_ = fork();
    if (child_ == 0) {
        dup2(open("/dev/null", O_RDONLY), 0);
        dup2(ends[1], 1);
        Become(Movieconv(arguments));
    }
    close(ends[1]);
    output_ = ends[0];
}

Running::~Running() {
    if (child_ > 0) {
        kill(child_, SIGKILL);
        waitpid(child_, nullptr, 0);
    }
    close(output_);
}

bool Running::ReadSome() {
    char buffer[4096];
    const ssize_t count = read(output_, buffer, sizeof buffer);
    if (count > 0)
        printed_.append(buffer, static_cast<std::size_t>(count));
    return count > 0; // a terminal whose program has ended gives an error
}

bool Running::WaitFor(const std::string& pattern) {
    regex_t regex; // of the C library: std::regex does not compile without warnings under the sanitizers
    if (regcomp(&regex, pattern.c_str(), REG_EXTENDED) != 0) {
        ADD_FAILURE() << "not a regular expression: " << pattern;
        return false;
    }
    regmatch_t match{};
    const auto matches = [&] { return regexec(&regex, printed_.c_str() + seen_, 1, &match, 0) == 0; };
    bool found = matches();
    while (!found && ReadSome())
        found = matches();
    regfree(&regex);
    if (found)
        seen_ += static_cast<std::size_t>(match.rm_eo);
    return found;
}

bool Running::WaitUntilSuspended() const {
    int status = 0;
    return waitpid(child_, &status, WUNTRACED) == child_ && WIFSTOPPED(status);
}

void Running::Jam() const {
    // A description of its own: the program's writing is not to fail instead of waiting.
    const std::string pipe = "/proc/self/fd/" + std::to_string(output_);
    const int end = open(pipe.c_str(), O_WRONLY | O_NONBLOCK | O_CLOEXEC);
    EXPECT_GE(end, 0);
    while (write(end, "\n", 1) == 1) {
    }
    close(end);
}

bool Running::HasEnded() const {
    siginfo_t info{};
    return waitid(P_PID, static_cast<id_t>(child_), &info, WEXITED | WNOHANG | WNOWAIT) == 0 &&
           info.si_pid == child_;
}

bool Running::Echoes() const {
    termios settings{};
    return tcgetattr(output_, &settings) == 0 && (settings.c_lflag & ECHO) != 0;
}

void Running::Signal(int signal) const {
    kill(child_, signal);
}

void Running::Press(const std::string& keys) const {
    if (write(output_, keys.data(), keys.size()) != static_cast<ssize_t>(keys.size()))
        std::perror("cannot press a key");
}

Result Running::Finish() {
    while (ReadSome()) {
    }
    const int code = AwaitEnd(child_);
    child_ = -1;
    return {code, printed_, {}};
}

} // namespace program
