// Waits that do not stay silent: who waits for longer than a while is named in the log, and named again when
// it goes on.
#ifndef MOVIECONV_THREAD_STALL_H
#define MOVIECONV_THREAD_STALL_H

#include "log/dyLog.h"

#include <chrono>
#include <condition_variable>
#include <mutex>

constexpr std::chrono::milliseconds kStallLimit{5000};

/// Waits until `ready` holds, as the condition variable itself does. `who` is the beginning of the log's
/// lines, such as "Movie::A decoder waits for the source". They are written under the lock, which nobody
/// needs for as long as nothing goes on.
template <class Ready>
void WaitAndTell(std::condition_variable& changed, std::unique_lock<std::mutex>& lock, Ready ready,
                 const wchar_t* who, std::chrono::milliseconds limit = kStallLimit) {
    if (ready() || changed.wait_for(lock, limit, ready))
        return;
    const auto seconds = [start = std::chrono::steady_clock::now() - limit] {
        return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
    };
    LogEx(L"%ls for %.1fs.\r\n", who, seconds());
    changed.wait(lock, ready);
    LogEx(L"%ls no longer, after %.1fs.\r\n", who, seconds());
}

#endif
