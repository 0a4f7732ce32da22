// What the stages have in common: a queue, and a thread that works it off.
#ifndef MOVIECONV_WRITER_STAGETHREAD_H
#define MOVIECONV_WRITER_STAGETHREAD_H

#include "thread/BoundedQueue.h"

#include <atomic>
#include <cstddef>
#include <exception>
#include <functional>
#include <thread>
#include <utility>

namespace writer {

/// Told of what ended a stage's thread early; called on that thread.
using StageFailure = std::function<void(std::exception_ptr)>;

/// The last member of its stage: what the thread works with has to outlive it.
template <class Item>
class StageThread {
public:
    StageThread(std::size_t mostItems, std::size_t mostWeight, QueueSides sides)
        : queue_(mostItems, mostWeight, sides) {}
    StageThread(const StageThread&) = delete;
    StageThread& operator=(const StageThread&) = delete;
    ~StageThread() {
        Cancel();
        Join();
    }

    /// Runs `work` on the thread.
    void Start(std::function<void()> work, StageFailure failed) {
        thread_ = std::thread([work = std::move(work), failed = std::move(failed)] {
            try {
                work();
            } catch (...) {
                failed(std::current_exception());
            }
        });
    }

    BoundedQueue<Item>& Queue() { return queue_; }

    /// Nothing more will come.
    void Finish() { queue_.Finish(); }

    /// Ends the stage at once; what it holds is dropped.
    void Cancel() {
        cancelled_ = true;
        queue_.Close();
    }

    bool Cancelled() const { return cancelled_; }

    /// Waits for the thread.
    void Join() {
        if (thread_.joinable())
            thread_.join();
    }

private:
    BoundedQueue<Item> queue_;
    std::atomic<bool> cancelled_{false};
    std::thread thread_;
};

} // namespace writer

#endif
