#include "host/source/PictureNotes.h"

#include <cstddef>
#include <cstdint>

extern "C" {
#include <libavutil/stereo3d.h>
}

namespace movieconv {
namespace {

/// Whether triples as in ANSI/CTA-708 hold text or commands. Of the older captions (types 0 and 1), two bytes
/// that are zero but for their parity are padding.
bool HoldsCaptions(const AVFrameSideData& captions) {
    constexpr std::size_t kTriple = 3;
    constexpr unsigned kValid = 4;
    constexpr unsigned kType = 3;
    constexpr unsigned kFirstOfNewType = 2;
    constexpr unsigned kWithoutParity = 0x7f;
    for (std::size_t i = 0; i + kTriple <= captions.size; i += kTriple) {
        const uint8_t* triple = captions.data + i;
        const bool isPadding = (triple[0] & kType) < kFirstOfNewType &&
                               ((static_cast<unsigned>(triple[1]) | triple[2]) & kWithoutParity) == 0;
        if ((triple[0] & kValid) != 0 && !isPadding)
            return true;
    }
    return false;
}

} // namespace

void PictureNotes::Look(const AVFrame& frame) {
    if (int64_t{frame.width} * frame.height > int64_t{width_} * height_) {
        width_ = frame.width;
        height_ = frame.height;
    }
    const AVFrameSideData* captions = av_frame_get_side_data(&frame, AV_FRAME_DATA_A53_CC);
    if (captions != nullptr && !captioned_)
        captioned_ = HoldsCaptions(*captions);
    const AVFrameSideData* stereo = av_frame_get_side_data(&frame, AV_FRAME_DATA_STEREO3D);
    if (stereo != nullptr && reinterpret_cast<const AVStereo3D*>(stereo->data)->type != AV_STEREO3D_2D)
        stereoscopic_ = true;
}

} // namespace movieconv
