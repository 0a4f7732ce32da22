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

StampRepair::Stamp TakeOffOne(StampRepair::Stamp& stay) {
    constexpr int64_t kLongest = 100 * kTicksPerSecond; // two of them are within the engine's 214 s
    constexpr int64_t kCredible = int64_t{24} * 3600 * kTicksPerSecond; // more is a fault of the stamps
    const StampRepair::Stamp one{stay.time, std::min(stay.duration, kLongest)};
    stay = stay.duration > kCredible
               ? StampRepair::Stamp{}
               : StampRepair::Stamp{one.time + one.duration, stay.duration - one.duration};
    return one;
}

void TellTimes(VideoImage& image, const StampRepair::Stamp& stamp) {
    image.llTime = image.llTime2 = stamp.time;
    TellSourceTime(image.reserved, stamp.time);
    image.nDuration = static_cast<int32_t>(stamp.duration);
}

} // namespace movieconv
