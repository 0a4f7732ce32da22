// The stamps of a movie's packets, put right where the source's clock jumps.
#ifndef MOVIECONV_HOST_SOURCE_PACKETCLOCK_H
#define MOVIECONV_HOST_SOURCE_PACKETCLOCK_H

#include "ffmpeg/AvHandles.h"
#include "host/source/ClockRepair.h"
#include "host/source/PacketReader.h"
#include "host/source/SourceInfo.h"

#include <atomic>
#include <deque>
#include <vector>

namespace movieconv {

/// For one reader of the source. What it reads from the start on gets the same stamps as by any other one.
class PacketClock {
public:
    PacketClock(const SourceInfo& info, const PacketReader& reader);

    /// The streams by which jumps are found: all pictures and sound on the clock of what is converted, taken
    /// or not. They have to be read; none where no jumps are to be expected.
    const std::vector<int>& Witnesses() const { return witnesses_; }

    /// Takes a packet that the reader gave.
    void Push(av::Packet packet);

    /// The next packet, in the same order, with its stamps put right. Null while that depends on those that
    /// follow, unless `all` were taken.
    av::Packet Pop(bool all = false);

    /// Jumps that were put right. Any thread.
    int Jumps() const { return jumps_; }

private:
    const PacketReader& reader_;
    const std::vector<int> witnesses_;
    ClockRepair repair_;
    std::deque<av::Packet> waiting_;
    std::atomic<int> jumps_{0};
};

} // namespace movieconv

#endif
