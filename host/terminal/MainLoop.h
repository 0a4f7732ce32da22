// What other threads ask the main thread to do.
#ifndef MOVIECONV_HOST_TERMINAL_MAINLOOP_H
#define MOVIECONV_HOST_TERMINAL_MAINLOOP_H

#include <chrono>
#include <condition_variable>
#include <deque>
#include <functional>
#include <mutex>
#include <utility>

namespace movieconv {

class MainLoop {
public:
    /// Any thread. Throws std::bad_alloc.
    void Post(std::function<void()> work) {
        {
            const std::lock_guard lock(mutex_);
            work_.push_back(std::move(work));
        }
        posted_.notify_one();
    }

    /// Does the next thing, waiting for it at most so long. False when there was none. The main thread only.
    bool RunNext(std::chrono::milliseconds limit) {
        std::function<void()> work;
        {
            std::unique_lock lock(mutex_);
            if (!posted_.wait_for(lock, limit, [this] { return !work_.empty(); }))
                return false;
            work = std::move(work_.front());
            work_.pop_front();
        }
        work();
        return true;
    }

private:
    std::mutex mutex_;
    std::condition_variable posted_;
    std::deque<std::function<void()>> work_;
};

} // namespace movieconv

#endif
