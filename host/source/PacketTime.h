// When a packet is there, in its stream's unit. Stamps are whatever the file says.
#ifndef MOVIECONV_HOST_SOURCE_PACKETTIME_H
#define MOVIECONV_HOST_SOURCE_PACKETTIME_H

extern "C" {
#include <libavcodec/packet.h>
#include <libavutil/common.h>
}

#include <cstdint>

namespace movieconv {

/// When it is shown or, where that is not told, decoded; AV_NOPTS_VALUE where neither is.
inline int64_t StampOf(const AVPacket& packet) {
    return packet.pts != AV_NOPTS_VALUE ? packet.pts : packet.dts;
}

/// Where it ends, of one that has a stamp.
inline int64_t EndStampOf(const AVPacket& packet) {
    return av_sat_add64(StampOf(packet), packet.duration);
}

} // namespace movieconv

#endif
