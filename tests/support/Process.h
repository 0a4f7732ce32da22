// Processes of a test's own, and the test's.
#ifndef MOVIECONV_TESTS_SUPPORT_PROCESS_H
#define MOVIECONV_TESTS_SUPPORT_PROCESS_H

#include "tests/support/Folder.h"

#include <chrono>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <thread>

#include <sys/wait.h>
#include <unistd.h>

inline bool Has(const std::string& text, const std::string& part) {
    return text.find(part) != std::string::npos;
}

/// What a process has left.
struct ProcessResult {
    int code; ///< Exit code, or 128 plus the signal that ended it.
    std::string out;
    std::string err;
};

/// Waits for the end of a process; gives its exit code, or 128 plus the signal that ended it.
inline int AwaitEnd(pid_t child) {
    int status = 0;
    waitpid(child, &status, 0);
    return WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
}

/// Threads of this process, when their number has stayed the same for a while: the kernel may count one for a
/// moment after it was joined.
inline int64_t CountThreads() {
    constexpr int kWhile = 20; // milliseconds
    int64_t count = CountEntries("/proc/self/task");
    for (int same = 0; same < kWhile; ++same) {
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
        const int64_t now = CountEntries("/proc/self/task");
        same = now == count ? same : 0;
        count = now;
    }
    return count;
}

/// What has been written into a file, which is closed.
inline std::string Drain(std::FILE* file) {
    std::rewind(file);
    std::string text;
    for (int c = std::fgetc(file); c != EOF; c = std::fgetc(file))
        text += static_cast<char>(c);
    std::fclose(file);
    return text;
}

/// Lives `life`, which returns the exit code, in a process of its own.
template <class Life>
ProcessResult InChild(Life life) {
    std::FILE* out = std::tmpfile();
    std::FILE* err = std::tmpfile();
    const pid_t child = fork();
    if (child == 0) {
        dup2(fileno(out), STDOUT_FILENO);
        dup2(fileno(err), STDERR_FILENO);
        std::exit(life());
    }
    const int code = AwaitEnd(child);
    return {code, Drain(out), Drain(err)};
}

#endif
