// The clock of recordings that were joined end to end, which starts anew in the middle.
#ifndef MOVIECONV_HOST_SOURCE_CLOCKREPAIR_H
#define MOVIECONV_HOST_SOURCE_CLOCKREPAIR_H

#include <cstdint>
#include <map>

namespace movieconv {

/// Finds where the clock jumps and by how much the stamps from there on have to be shifted, so that time goes
/// on where it stopped. All times are media time.
class ClockRepair {
public:
    /// What to add to the stamps of a packet, in the order of the file. `stamp`: its decoding time; `length`:
    /// 0 where it is not known.
    int64_t ShiftFor(int stream, int64_t stamp, int64_t length);

    /// What to add now to those of a stream whose own tell nothing, since they come seldom.
    int64_t Shift() const { return shift_; }

    int Jumps() const { return jumps_; }

private:
    int64_t OthersReached(int stream) const;

    int64_t shift_ = 0;
    int64_t earlier_ = 0;        // the shift before the latest jump
    std::map<int, int64_t> due_; // where the next packet of a stream is expected, shifted
    int jumps_ = 0;
};

} // namespace movieconv

#endif
