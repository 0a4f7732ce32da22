// A place where a test holds the thread under test.
#ifndef MOVIECONV_TESTS_SUPPORT_GATE_H
#define MOVIECONV_TESTS_SUPPORT_GATE_H

#include <condition_variable>
#include <mutex>

/// Holds who passes while it is shut.
class Gate {
public:
    void Pass() {
        std::unique_lock lock(mutex_);
        held_ = shut_;
        changed_.notify_all();
        changed_.wait(lock, [&] { return !shut_; });
        held_ = false;
    }
    void Shut() {
        const std::lock_guard lock(mutex_);
        shut_ = true;
    }
    void Open() {
        const std::lock_guard lock(mutex_);
        shut_ = false;
        changed_.notify_all();
    }
    void AwaitHeld() {
        std::unique_lock lock(mutex_);
        changed_.wait(lock, [&] { return held_; });
    }

private:
    std::mutex mutex_;
    std::condition_variable changed_;
    bool shut_ = false;
    bool held_ = false;
};

#endif
