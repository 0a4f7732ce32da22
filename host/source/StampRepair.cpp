#include "host/source/StampRepair.h"

#include <algorithm>

namespace movieconv {

std::optional<StampRepair::Stamp> StampRepair::Push(std::optional<int64_t> stamp) {
    std::optional<Stamp> settled;
    if (held_)
        settled = Settle(stamp);
    held_ = Held{stamp};
    return settled;
}

std::optional<StampRepair::Stamp> StampRepair::Finish(std::optional<Stamp> told) {
    if (!held_)
        return std::nullopt;
    Stamp settled = Settle(std::nullopt);
    if (told && held_->stamp == told->time)
        settled.duration = told->duration;
    held_.reset();
    return settled;
}

StampRepair::Stamp StampRepair::Settle(std::optional<int64_t> next) {
    const std::optional<int64_t> own = held_->stamp;
    const bool nextRises = next && last_ && *next > *last_;
    const bool falls = own && last_ && *own <= *last_;
    const bool jumpsAhead = own && nextRises && *next <= *own;
    int64_t time = own.value_or(0);
    if (!own || falls || jumpsAhead) {
        ++repaired_;
        if (last_) {
            // Stamps that go on rising below the last one are caught up with.
            const int64_t pace = falls && next && *next > *own ? step_ / 2 : step_;
            const int64_t room = nextRises ? (*next - *last_) / 2 : pace;
            time = *last_ + std::clamp<int64_t>(room, 1, step_);
        } else if (!own && next) {
            time = *next - step_;
        }
    }
    last_ = time;
    return {time, next && *next > time ? *next - time : step_};
}

} // namespace movieconv
