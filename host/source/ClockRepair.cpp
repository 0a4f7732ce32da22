#include "host/source/ClockRepair.h"

#include "host/source/MediaTime.h"

#include <algorithm>

namespace movieconv {
namespace {

constexpr int64_t kLargestStep = 10 * kTicksPerSecond; // between packets of one stream; more is a new clock
constexpr int64_t kLargestFall = kTicksPerSecond / 2;  // likewise, backwards

} // namespace

int64_t ClockRepair::ShiftFor(int stream, int64_t stamp, int64_t length) {
    int64_t shift = shift_;
    if (const auto due = due_.find(stream); due != due_.end()) {
        // Where others have gone on meanwhile, a step is a gap of this stream alone.
        const int64_t latest = std::max(due->second, OthersReached(stream));
        const auto ahead = [&](int64_t candidate) {
            return std::max<int64_t>(stamp + candidate - latest, 0);
        };
        const auto behind = [&](int64_t candidate) {
            return std::max<int64_t>(due->second - (stamp + candidate), 0);
        };
        // Where the clock changes, the last packets of one stream can come after the first ones of the other.
        if (ahead(earlier_) + behind(earlier_) < ahead(shift) + behind(shift))
            shift = earlier_;
        if (ahead(shift) > kLargestStep || behind(shift) > kLargestFall) {
            earlier_ = shift_;
            shift = shift_ = due->second - stamp;
            ++jumps_;
        }
    }
    due_[stream] = stamp + shift + length;
    return shift;
}

int64_t ClockRepair::OthersReached(int stream) const {
    int64_t reached = INT64_MIN;
    for (const auto& [other, due] : due_)
        if (other != stream)
            reached = std::max(reached, due);
    return reached;
}

} // namespace movieconv
