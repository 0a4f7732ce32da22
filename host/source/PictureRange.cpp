#include "host/source/PictureRange.h"

#include "host/source/MediaTime.h"
#include "host/source/SourceTime.h"

#include <algorithm>

namespace movieconv {

PictureRange::Place PictureRange::Fit(StampRepair::Stamp& stamp, bool isLast) const {
    if (end_ && stamp.time >= *end_)
        return Place::kBehind;
    if (end_)
        stamp.duration = std::min(stamp.duration, *end_ - stamp.time);
    if (begin_ && stamp.time + stamp.duration <= *begin_) {
        if (!isLast || !first_)
            return Place::kBefore;
        stamp.time = *begin_;
        return Place::kWithin;
    }
    const int64_t begin = begin_.value_or(0);
    if (first_ && (begin_ || stamp.time > begin)) {
        stamp.duration += stamp.time - begin;
        stamp.time = begin;
    }
    return Place::kWithin;
}

PictureStay::PictureStay(const StampRepair::Stamp& whole, const StampRepair::Stamp& fitted)
    : rest_(fitted),
      end_(whole.time + whole.duration),
      isLong_(std::max(whole.duration, fitted.duration) > kTicksPerSecond / 4) {}

StampRepair::Stamp PictureStay::Take(int64_t change) {
    constexpr int64_t kShortest = kTicksPerSecond / 25;
    constexpr int64_t kLongest = 100 * kTicksPerSecond; // two of them are within the engine's 214 s
    constexpr int64_t kCredible = int64_t{24} * 3600 * kTicksPerSecond; // more is a fault of the stamps
    StampRepair::Stamp part{rest_.time, std::min(rest_.duration, kLongest)};
    if (rest_.duration > kCredible) {
        rest_ = {};
        return part;
    }
    if (const int64_t cut = std::max(change, rest_.time + kShortest); isLong_ && cut <= end_ - kShortest)
        part.duration = std::min(part.duration, cut - rest_.time);
    rest_ = {part.time + part.duration, rest_.duration - part.duration};
    return part;
}

void TellTimes(VideoImage& image, const StampRepair::Stamp& stamp) {
    image.llTime = image.llTime2 = stamp.time;
    TellSourceTime(image.reserved, stamp.time);
    image.nDuration = static_cast<int32_t>(stamp.duration);
}

} // namespace movieconv
