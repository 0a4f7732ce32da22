/// \file
/// The records that pass from the host's decoders through the engine to the media writer. They are packed to
/// 4 bytes, so that a 64-bit build has the 32-bit layout with its pointers widened and nothing else moved.
#ifndef MOVIECONV_MEDIA_MEDIARECORDS_H
#define MOVIECONV_MEDIA_MEDIARECORDS_H

#include <stdint.h>

#define MC_TICKS_PER_SECOND 10000000 ///< Time stamps and durations count 100 ns.

#ifdef __cplusplus
#include <cstddef>

/// Time stamps and durations count 100 ns.
constexpr int64_t kTicksPerSecond = 10000000;
#endif

#pragma pack(push, 4)

/// The source's pictures as a whole.
typedef struct VideoFormat {
    int32_t nWidth;    ///< Picture width in pixels.
    int32_t nHeight;   ///< Picture height in pixels.
    double dFrameRate; ///< Pictures per second; 0 when there is no video.
    double dDuration;  ///< Length of the source in seconds.
} VideoFormat;

/// The source's sound as a whole.
typedef struct AudioFormat {
    int32_t nSampleRate;     ///< Samples per second and channel.
    int32_t nChannels;       ///< Channel count.
    int32_t nBitsPerSample;  ///< Bits of one sample of one channel.
    int32_t nBytesPerSecond; ///< Bytes of PCM data per second; turns byte counts into time.
    double dDuration;        ///< Length of the source in seconds.
} AudioFormat;

/// Host-owned description of the picture source. The engine reads `format` only.
typedef struct VideoSourceInfo {
    unsigned char host[1036]; ///< The host's own.
    VideoFormat format;       ///< The figures of the pictures.
} VideoSourceInfo;

/// Host-owned description of the sound source. The engine reads `format` only.
typedef struct AudioSourceInfo {
    unsigned char host[1080]; ///< The host's own.
    AudioFormat format;       ///< The figures of the sound.
} AudioSourceInfo;

enum {
    kMediaTypePicture = 1,       ///< VideoImage::nType of a picture.
    kMediaTypeSound = 2,         ///< AudioFrame::nType of sound.
    kMediaTypeSilence = 3,       ///< AudioFrame::nType of the silence that the engine makes itself.
    kPictureFormatPlanar420 = 2, ///< VideoImage::nFormat of planar YUV 4:2:0.
    /// Likewise of 10 bits, each sample in the lower bits of a 16-bit word. Pitches still count bytes.
    kPictureFormatPlanar420Deep = 10
};

/// One decoded picture: 76 bytes in the 32-bit build, 88 in the 64-bit one.
typedef struct VideoImage {
    int32_t nType;              ///< kMediaTypePicture.
    int32_t nFormat;            ///< Pixel layout, kPictureFormatPlanar420 or ...Deep.
    unsigned char* pY;          ///< Luma plane.
    unsigned char* pU;          ///< Cb plane, half width and half height, rounded up.
    unsigned char* pV;          ///< Cr plane, likewise.
    int32_t nReserved;          ///< Copied unchanged.
    int32_t nWidth;             ///< Width in pixels.
    int32_t nHeight;            ///< Height in pixels.
    int32_t nPitchY;            ///< Bytes from one luma row to the next.
    int32_t nPitchU;            ///< Bytes from one row of pU to the next.
    int32_t nPitchV;            ///< Bytes from one row of pV to the next.
    unsigned char reserved[12]; ///< Copied unchanged. The media writer looks for a WriterSourceTime in it.
    int64_t llTime2;            ///< Second time stamp, shifted exactly as llTime is; 100 ns units.
    int64_t llTime;             ///< Time stamp, 100 ns units; -1 when the picture has none.
    int32_t nDuration;          ///< Duration, 100 ns units; 0 or less when it is not known.
} VideoImage;

/// One block of interleaved PCM sound: 76 bytes in the 32-bit build, 80 in the 64-bit one.
typedef struct AudioFrame {
    int32_t nType;              ///< kMediaTypeSound; kMediaTypeSilence in the engine's own blocks.
    int32_t nSampleRate;        ///< Samples per second and channel.
    int32_t nChannels;          ///< Channel count.
    int32_t nBitsPerSample;     ///< Bits per sample.
    unsigned char* pData;       ///< First byte of the samples.
    int32_t nLength;            ///< Bytes of sound in this block; 0 means that the sound has ended.
    int32_t nBufferSize;        ///< Bytes available behind pData.
    unsigned char reserved[28]; ///< As VideoImage's; zero in the engine's own blocks.
    int64_t llTime2;            ///< Second time stamp, 100 ns units.
    int64_t llTime;             ///< Time stamp of the first sample, 100 ns units.
    int32_t nDuration;          ///< Duration, 100 ns units.
} AudioFrame;

#pragma pack(pop)

#ifdef __cplusplus
namespace media_layout {
/// Bytes that `pointers` pointers in front of a field add to its offset on a 64-bit build.
constexpr std::size_t widened(std::size_t pointers) {
    return pointers * (sizeof(void*) - 4);
}
} // namespace media_layout

static_assert(sizeof(VideoFormat) == 24 && offsetof(VideoFormat, dFrameRate) == 8);
static_assert(offsetof(VideoFormat, nHeight) == 4 && offsetof(VideoFormat, dDuration) == 16);
static_assert(sizeof(AudioFormat) == 24 && offsetof(AudioFormat, nChannels) == 4);
static_assert(offsetof(AudioFormat, nBitsPerSample) == 8 && offsetof(AudioFormat, nBytesPerSecond) == 12);
static_assert(offsetof(AudioFormat, dDuration) == 16);
static_assert(offsetof(VideoSourceInfo, format) == 1036 && offsetof(AudioSourceInfo, format) == 1080);

static_assert(sizeof(VideoImage) == 76 + media_layout::widened(3));
static_assert(offsetof(VideoImage, nFormat) == 4 && offsetof(VideoImage, pY) == 8);
static_assert(offsetof(VideoImage, pU) == 12 + media_layout::widened(1));
static_assert(offsetof(VideoImage, pV) == 16 + media_layout::widened(2));
static_assert(offsetof(VideoImage, nReserved) == 20 + media_layout::widened(3));
static_assert(offsetof(VideoImage, nWidth) == 24 + media_layout::widened(3));
static_assert(offsetof(VideoImage, nHeight) == 28 + media_layout::widened(3));
static_assert(offsetof(VideoImage, nPitchY) == 32 + media_layout::widened(3));
static_assert(offsetof(VideoImage, nPitchU) == 36 + media_layout::widened(3));
static_assert(offsetof(VideoImage, nPitchV) == 40 + media_layout::widened(3));
static_assert(offsetof(VideoImage, reserved) == 44 + media_layout::widened(3));
static_assert(offsetof(VideoImage, llTime2) == 56 + media_layout::widened(3));
static_assert(offsetof(VideoImage, llTime) == 64 + media_layout::widened(3));
static_assert(offsetof(VideoImage, nDuration) == 72 + media_layout::widened(3));

static_assert(sizeof(AudioFrame) == 76 + media_layout::widened(1));
static_assert(offsetof(AudioFrame, nSampleRate) == 4 && offsetof(AudioFrame, nChannels) == 8);
static_assert(offsetof(AudioFrame, nBitsPerSample) == 12 && offsetof(AudioFrame, pData) == 16);
static_assert(offsetof(AudioFrame, nLength) == 20 + media_layout::widened(1));
static_assert(offsetof(AudioFrame, nBufferSize) == 24 + media_layout::widened(1));
static_assert(offsetof(AudioFrame, reserved) == 28 + media_layout::widened(1));
static_assert(offsetof(AudioFrame, llTime2) == 56 + media_layout::widened(1));
static_assert(offsetof(AudioFrame, llTime) == 64 + media_layout::widened(1));
static_assert(offsetof(AudioFrame, nDuration) == 72 + media_layout::widened(1));
#endif

#endif
