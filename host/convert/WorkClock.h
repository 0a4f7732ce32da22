// How long the program has been working, pauses left out.
#ifndef MOVIECONV_HOST_CONVERT_WORKCLOCK_H
#define MOVIECONV_HOST_CONVERT_WORKCLOCK_H

#include <chrono>

namespace movieconv {

/// Belongs to one thread. Times are on the steady clock, which the caller reads.
class WorkClock {
public:
    using Time = std::chrono::steady_clock::time_point;

    static constexpr std::chrono::milliseconds kTick{500}; ///< How often to call Tick.

    static Time Now() { return std::chrono::steady_clock::now(); }

    explicit WorkClock(Time now) : last_(now) {}

    /// Counts the time since the last call unless the clock stands. To be called regularly.
    void Tick(Time now) {
        if (!stands_)
            worked_ += now - last_;
        last_ = now;
    }

    /// Likewise, behind a wait of kTick at most: if that took far longer, the whole process was suspended.
    void TickAfterWait(Time now) {
        constexpr std::chrono::milliseconds kSuspicious{1500};
        if (now - last_ > kSuspicious)
            Skip(now);
        else
            Tick(now);
    }

    /// Leaves out the time since the last Tick: the whole process was suspended.
    void Skip(Time now) { last_ = now; }

    void Stand(Time now) {
        Tick(now);
        stands_ = true;
    }
    void Go(Time now) {
        Tick(now);
        stands_ = false;
    }

    double Seconds() const { return std::chrono::duration<double>(worked_).count(); }

private:
    Time last_;
    std::chrono::steady_clock::duration worked_{};
    bool stands_ = false;
};

} // namespace movieconv

#endif
