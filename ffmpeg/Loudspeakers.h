// Which loudspeakers the channels of sound are for, as FFmpeg's masks AV_CH_...; 0 where they are not told.
#ifndef MOVIECONV_FFMPEG_LOUDSPEAKERS_H
#define MOVIECONV_FFMPEG_LOUDSPEAKERS_H

extern "C" {
#include <libavutil/channel_layout.h>
}

#include <bit>
#include <cstdint>

namespace av {

/// 0 for layouts that are no such mask.
inline uint64_t SpeakersOf(const AVChannelLayout& layout) {
    return layout.order == AV_CHANNEL_ORDER_NATIVE ? layout.u.mask : 0;
}

/// Those that sound of that many channels usually has; 0 when there is no usual layout.
inline uint64_t UsualSpeakers(int channels) {
    AVChannelLayout layout{};
    av_channel_layout_default(&layout, channels);
    return SpeakersOf(layout);
}

/// `speakers` when they are that many, or else the usual ones.
inline uint64_t SpeakersFor(int channels, uint64_t speakers) {
    return std::popcount(speakers) == channels ? speakers : UsualSpeakers(channels);
}

/// The same for layouts that are heard alike: surround loudspeakers are at the side or behind, and a channel
/// that is alone is mono, whichever it is.
inline uint64_t AlikeSpeakers(uint64_t speakers) {
    constexpr uint64_t kSides = AV_CH_SIDE_LEFT | AV_CH_SIDE_RIGHT;
    constexpr uint64_t kBacks = AV_CH_BACK_LEFT | AV_CH_BACK_RIGHT;
    constexpr uint64_t kMixed = AV_CH_STEREO_LEFT | AV_CH_STEREO_RIGHT;
    if ((speakers & kSides) == kSides && (speakers & kBacks) == 0)
        speakers ^= kSides | kBacks;
    if (speakers == kMixed)
        speakers = AV_CH_LAYOUT_STEREO;
    if (std::has_single_bit(speakers))
        speakers = AV_CH_LAYOUT_MONO;
    return speakers;
}

} // namespace av

#endif
