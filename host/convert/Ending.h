// The end of work: its verdict, those who wait for it, and the news of it.
#ifndef MOVIECONV_HOST_CONVERT_ENDING_H
#define MOVIECONV_HOST_CONVERT_ENDING_H

#include "host/convert/Observer.h"
#include "host/convert/Outlet.h"

#include <condition_variable>
#include <mutex>
#include <new>
#include <optional>
#include <utility>

namespace movieconv {

/// All functions may be called on any thread.
class Ending {
public:
    /// Once, when nothing of the work runs any more. Tells it to `outlet` where there is memory for that;
    /// Result tells it in any case.
    void Come(Verdict verdict, Outlet& outlet) noexcept {
        {
            const std::lock_guard lock(mutex_);
            verdict_ = std::move(verdict);
        }
        come_.notify_all();
        try {
            outlet.Ended(*verdict_);
        } catch (const std::bad_alloc&) { // as promised
        }
    }

    void Wait() {
        std::unique_lock lock(mutex_);
        come_.wait(lock, [this] { return verdict_.has_value(); });
    }

    /// Null before it came; valid as long as this object.
    const Verdict* Result() const {
        const std::lock_guard lock(mutex_);
        return verdict_ ? &*verdict_ : nullptr;
    }

private:
    mutable std::mutex mutex_;
    std::condition_variable come_;
    std::optional<Verdict> verdict_; // written once
};

} // namespace movieconv

#endif
