// A part of a movie, read for what its packets tell.
#ifndef MOVIECONV_HOST_SOURCE_STRETCH_H
#define MOVIECONV_HOST_SOURCE_STRETCH_H

#include "host/source/PacketReader.h"
#include "host/source/SourceInfo.h"

#include <cstdint>
#include <limits>
#include <vector>

namespace movieconv {

/// In seconds from the start of the source.
struct Stretch {
    int64_t bytes = 0;  // of packets
    int64_t begin = -1; // in the file
    int64_t reached = 0;
    double first = std::numeric_limits<double>::infinity(); // stamp
    double last = 0;
    double end = 0;             // of what lasts longest
    int packets = 0;            // of one stream, pictures if there are any
    double length = 0;          // of these packets
    std::vector<double> stamps; // likewise
};

constexpr int64_t kStretchBytes = 2 << 20; ///< Of packets, usually enough.

/// The stream whose packets are counted: the pictures if they are converted.
int Counted(const SourceInfo& info);

/// Reads to the end, or until it has so many bytes or packets of the stream that is counted. That may
/// describe the streams anew, as they are there; for the decoders they are as at the beginning.
Stretch ReadStretch(PacketReader& reader, int counted, int64_t mostBytes,
                    int mostPackets = std::numeric_limits<int>::max());

/// Throws SourceError.
void ReturnToBegin(PacketReader& reader, const SourceInfo& info);

} // namespace movieconv

#endif
