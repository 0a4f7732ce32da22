// Which pictures of a source are handed out, and with what stamps.
#ifndef MOVIECONV_HOST_SOURCE_PICTURERANGE_H
#define MOVIECONV_HOST_SOURCE_PICTURERANGE_H

#include "host/source/StampRepair.h"
#include "media/MediaRecords.h"

#include <cstdint>
#include <optional>

namespace movieconv {

/// One rule for those who decode pictures and those who only look at their stamps: plans depend on it. Media
/// time.
class PictureRange {
public:
    enum class Place { kBefore, kWithin, kBehind };

    /// The picture shown at `begin` is the first one and is stamped with it. Without it, the source's first
    /// picture is, and is stamped with 0 if it comes later.
    void BeginAt(int64_t begin) { begin_ = begin; }

    /// The last picture is the one before `end`, where it ends, too.
    void EndAt(int64_t end) { end_ = end; }

    /// Where a picture lies; its stamp is fitted in. The source's last one is still shown at a `begin` behind
    /// it.
    Place Fit(StampRepair::Stamp& stamp, bool isLast) const;

    /// One was handed out.
    void Gave() { first_ = false; }

private:
    std::optional<int64_t> begin_;
    std::optional<int64_t> end_;
    bool first_ = true;
};

/// How long one picture stays, in the parts for each of which it is handed out once. What divides it follows
/// from the source alone, wherever a range begins or ends in it.
class PictureStay {
public:
    PictureStay() = default;

    /// `whole` became `fitted` by PictureRange.
    PictureStay(const StampRepair::Stamp& whole, const StampRepair::Stamp& fitted);

    bool IsOver() const { return rest_.duration <= 0; }

    /// When the next part begins.
    int64_t Time() const { return rest_.time; }

    /// The next part: not more than a record can tell, and, of a picture that stays long, not beyond
    /// `change`, from when on something else is drawn into it.
    StampRepair::Stamp Take(int64_t change);

private:
    StampRepair::Stamp rest_;
    int64_t end_ = 0; // whatever range ends before
    bool isLong_ = false;
};

/// Enters the times into a picture's record.
void TellTimes(VideoImage& image, const StampRepair::Stamp& stamp);

} // namespace movieconv

#endif
