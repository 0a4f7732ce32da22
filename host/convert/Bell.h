// Wakes a thread that has something new to look at.
#ifndef MOVIECONV_HOST_CONVERT_BELL_H
#define MOVIECONV_HOST_CONVERT_BELL_H

#include <chrono>
#include <condition_variable>
#include <mutex>
#include <optional>
#include <utility>

namespace movieconv {

class Bell {
public:
    /// Any thread. Needs no memory.
    void Ring() noexcept {
        {
            const std::lock_guard lock(mutex_);
            rung_ = true;
        }
        changed_.notify_one();
    }

    /// Waits until it has been rung since the last call, at most so long if there is a limit. One thread.
    void Wait(std::optional<std::chrono::milliseconds> limit) {
        std::unique_lock lock(mutex_);
        const auto rung = [this] { return rung_; };
        if (limit)
            changed_.wait_for(lock, *limit, rung);
        else
            changed_.wait(lock, rung);
        rung_ = false;
    }

private:
    std::mutex mutex_;
    std::condition_variable changed_;
    bool rung_ = false;
};

} // namespace movieconv

#endif
