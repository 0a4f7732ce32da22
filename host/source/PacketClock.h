// The stamps of a movie's packets, put right where the source's clock jumps.
#ifndef MOVIECONV_HOST_SOURCE_PACKETCLOCK_H
#define MOVIECONV_HOST_SOURCE_PACKETCLOCK_H

#include "host/source/ClockRepair.h"
#include "host/source/MovieReader.h"
#include "host/source/SourceInfo.h"

#include <atomic>
#include <vector>

namespace movieconv {

/// For one reader of the source. What it reads from the start on gets the same stamps as by any other one.
class PacketClock {
public:
    PacketClock(const SourceInfo& info, const AVFormatContext& context);

    /// The streams by which jumps are found: all pictures and sound on the clock of what is converted, taken
    /// or not. They have to be read; none where no jumps are to be expected.
    const std::vector<int>& Witnesses() const { return witnesses_; }

    /// Shifts the stamps of a packet that `reader` gave, each once, in their order.
    void Repair(const MovieReader& reader, AVPacket& packet);

    /// Jumps that were put right. Any thread.
    int Jumps() const { return jumps_; }

private:
    const std::vector<int> witnesses_;
    ClockRepair repair_;
    std::atomic<int> jumps_{0};
};

} // namespace movieconv

#endif
