// Sound in samples of all channels: how long they last, and the record in which a block of them is handed on.
#ifndef MOVIECONV_HOST_SOURCE_SOUNDBLOCK_H
#define MOVIECONV_HOST_SOURCE_SOUNDBLOCK_H

#include "media/MediaRecords.h"

#include <cstdint>

extern "C" {
#include <libavutil/mathematics.h>
}

namespace movieconv {

/// The samples that a time lasts, the nearest number.
inline int64_t SamplesIn(int64_t time, int sampleRate) {
    return av_rescale(time, sampleRate, kTicksPerSecond);
}

/// The time that samples last, the nearest one.
inline int64_t TimeOfSamples(int64_t samples, int sampleRate) {
    return av_rescale(samples, kTicksPerSecond, sampleRate);
}

/// A block of that form and kMediaType..., without samples.
inline AudioFrame BlockOf(const AudioFormat& format, int32_t type) {
    AudioFrame block{};
    block.nType = type;
    block.nSampleRate = format.nSampleRate;
    block.nChannels = format.nChannels;
    block.nBitsPerSample = format.nBitsPerSample;
    return block;
}

} // namespace movieconv

#endif
