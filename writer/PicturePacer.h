// When each picture is shown in the file, and how often: stamps kept, or a steady rate made by leaving out
// and repeating.
#ifndef MOVIECONV_WRITER_PICTUREPACER_H
#define MOVIECONV_WRITER_PICTUREPACER_H

extern "C" {
#include <libavutil/rational.h>
}

#include <cstdint>
#include <optional>

namespace writer {

/// The unit in which the times of pictures are written.
struct PictureClock {
    AVRational rate;     ///< Pictures per second.
    AVRational tick;     ///< Length of a tick in seconds.
    int ticksPerPicture; ///< Ticks in one picture at the rate.
};

/// Ticks fine enough for single stamps; or whole pictures where the container knows nothing else, or parts
/// of one where there are few in a second.
PictureClock MakePictureClock(AVRational rate, bool wholePictures);

/// Turns the times of pictures into ticks. Not thread-safe.
class PicturePacer {
public:
    /// `keepStamps`: every picture is shown once at its own time, times that lie near the steady grid are put
    /// on it; where the clock counts whole pictures, those too many are left out. Otherwise the grid is
    /// filled exactly.
    PicturePacer(const PictureClock& clock, bool keepStamps);

    /// Goes on in a movie that began at 0 and of which the picture shown last is at `tick`. Before the first
    /// picture.
    void ContinueAfter(int64_t tick);

    /// The last tick given out; nothing before the first.
    std::optional<int64_t> LastTick() const { return lastTick_; }

    /// Whether a picture's showing is known when it comes. On the grid it is when the next one has come.
    bool AnswersAtOnce() const { return keepStamps_; }

    /// `count` showings, the first at `tick`, each a picture after the one before; 0: not shown at all.
    struct Showing {
        int64_t tick = 0;
        int64_t count = 0;
    };

    /// A picture whose time in the file is `time`, in 100 ns units, rising. Returns its own showing if that
    /// is answered at once, else that of the picture before.
    Showing Add(int64_t time);

    /// Ticks from `tick`, where Add has put a picture of that time, to the end of its `length`. Where stamps
    /// are kept.
    int64_t Stay(int64_t tick, int64_t time, int64_t length) const;

    /// Returns the showing of the last picture, which lasts until `end`, if it is still open. `more`: another
    /// picture is shown there, by someone else.
    Showing Finish(int64_t end, bool more = false);

private:
    int64_t PictureLength() const;
    int64_t PlaceOf(int64_t time) const;
    int64_t PlaceBehind(int64_t tick, int64_t time) const;
    std::optional<int64_t> TickOf(int64_t time) const;
    int64_t GridIndex(int64_t time) const;
    Showing ShowUntil(int64_t index);

    const PictureClock clock_;
    const bool keepStamps_;
    std::optional<int64_t> origin_;   ///< Time of the first picture.
    std::optional<int64_t> lastTick_; ///< The last tick or grid index given out.
    std::optional<int64_t> pending_;  ///< Grid index of the picture whose showing is still open.
};

} // namespace writer

#endif
