// The boxes of which files of the MP4 family consist.
#ifndef MOVIECONV_FFMPEG_MP4BOX_H
#define MOVIECONV_FFMPEG_MP4BOX_H

extern "C" {
#include <libavutil/intreadwrite.h>
}

#include <cstddef>
#include <cstdint>
#include <optional>

namespace av {

/// A box's type as a number, of its four letters.
constexpr uint32_t BoxType(const char (&name)[5]) {
    uint32_t type = 0;
    for (int i = 0; i < 4; ++i)
        type = type << 8 | static_cast<unsigned char>(name[i]);
    return type;
}

/// What a box says of itself.
struct BoxHead {
    static constexpr std::size_t kLeastSize = 8;
    static constexpr std::size_t kMostSize = 16;
    static constexpr int64_t kOpen = -1;

    uint32_t type = 0;
    int64_t headSize = 0; ///< Bytes.
    int64_t size = 0;     ///< With its head; kOpen: up to the end of what holds it.
};

/// Of the `count` first bytes of a box, or more than these. Nothing when the head is not whole, or makes no
/// sense.
inline std::optional<BoxHead> ReadBoxHead(const uint8_t* bytes, std::size_t count) {
    if (count < BoxHead::kLeastSize)
        return std::nullopt;
    BoxHead head{AV_RB32(bytes + 4), BoxHead::kLeastSize, AV_RB32(bytes)};
    if (head.size == 1 && count >= BoxHead::kMostSize) {
        head.headSize = BoxHead::kMostSize;
        head.size = static_cast<int64_t>(AV_RB64(bytes + 8));
    } else if (head.size == 0) {
        head.size = BoxHead::kOpen;
        return head;
    }
    return head.size >= head.headSize ? std::optional(head) : std::nullopt;
}

} // namespace av

#endif
