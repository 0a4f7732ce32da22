// The first failure of the threads that read and decode: want of memory or of threads, a source that cannot
// be read on.
#ifndef MOVIECONV_HOST_SOURCE_FAILURES_H
#define MOVIECONV_HOST_SOURCE_FAILURES_H

#include "host/sentence/SentenceError.h"

#include <exception>
#include <functional>
#include <mutex>
#include <thread>

namespace movieconv {

/// There is no thread to be had.
class ThreadError : public SentenceError {
public:
    using SentenceError::SentenceError;
};

/// A thread that does the work. Throws ThreadError.
std::thread NewThread(std::function<void()> work);

/// For any thread.
class Failures {
public:
    /// `stop` is called after each exception, by the thread that caught it: it ends the others' work.
    explicit Failures(std::function<void()> stop) : stop_(std::move(stop)) {}

    /// Does a part of the work. False when it threw.
    template <class Work>
    bool Attempt(Work work) {
        try {
            work();
            return true;
        } catch (...) {
            Enter(std::current_exception());
            return false;
        }
    }

    /// Notes a reason unless there is one.
    void Note(Sentence reason) noexcept;

    /// The first reason, empty without one.
    Sentence First() const;

private:
    void Enter(const std::exception_ptr& failure) noexcept;

    const std::function<void()> stop_;
    mutable std::mutex mutex_;
    Sentence first_;
};

} // namespace movieconv

#endif
