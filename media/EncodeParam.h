/// \file
/// The encoding parameters that cross the exported interface and reach the media writer, and the writer's
/// table of file formats. Both records have the same layout in every build.
#ifndef MOVIECONV_MEDIA_ENCODEPARAM_H
#define MOVIECONV_MEDIA_ENCODEPARAM_H

#include <stdint.h>

#ifdef __cplusplus
#include <cstddef>
#endif

#pragma pack(push, 4)

/// What to encode: 104 bytes, no padding. MCSetEncodeParam says which fields it completes when they are 0.
/// The codes of formats and codecs stand in docs/decoders.md.
typedef struct EncodeParam {
    uint32_t fccVideo;        ///< Video codec, "XVID" by default.
    uint32_t fccColorFormat;  ///< "YV12" by default. Not read: each VideoImage tells its own format.
    int32_t nBitCount;        ///< Bits per pixel of that format, 12 by default. Not read.
    int32_t nWidth;           ///< Output picture width in pixels.
    int32_t nHeight;          ///< Output picture height in pixels.
    double dFrameRate;        ///< Output pictures per second.
    int32_t nVideoRateMode;   ///< 0: one video bit rate; otherwise a target rate and an upper rate.
    int32_t nVideoBitrate;    ///< Video bit rate in bits per second.
    int32_t nVideoMaxBitrate; ///< Upper video bit rate in bits per second, used in two-rate mode.
    int32_t bResize;          ///< 0: pictures of another shape get bars; else they are distorted.
    /// Word 0 is the number of a set of options of the media writer's, 0 for none; see writer/WriterStatus.h.
    /// The others are not read. The engine hands all of them on as they are.
    uint32_t nReserved[5];
    uint32_t fccAudio;        ///< Audio codec, "AAC " by default.
    int32_t nSampleRate;      ///< Audio samples per second and channel.
    int32_t nChannels;        ///< Audio channels.
    int32_t nBitsPerSample;   ///< Bits per audio sample, 16 by default.
    int32_t nAudioRateMode;   ///< As nVideoRateMode, for sound.
    int32_t nAudioBitrate;    ///< Audio bit rate in bits per second.
    int32_t nAudioMaxBitrate; ///< Upper audio bit rate in bits per second, used in two-rate mode.
    int32_t bNoVideo;         ///< Nonzero: the output carries no pictures.
    int32_t bNoAudio;         ///< Nonzero: the output carries no sound.
    uint32_t fccFileFormat;   ///< Container, "MP4 " by default.
} EncodeParam;

/// One entry of the media writer's table of file formats: 828 bytes. Only what can be encoded on this machine
/// is in it.
typedef struct FileFormatInfo {
    uint32_t fccFormat;     ///< The format's code; 0 ends the table.
    char szName[128];       ///< Human-readable name, UTF-8, zero-terminated.
    char szExtensions[128]; ///< File-name extensions without dots, separated by commas, the usual one first.
    uint32_t fccVideoCodecs[32]; ///< Video codecs that the format carries, the default first; 0 ends them.
    uint32_t fccAudioCodecs[32]; ///< Audio codecs that the format carries, the default first; 0 ends them.
    unsigned char reserved[296]; ///< Zero.
    int32_t bHasAudio;           ///< 0: the format cannot carry sound.
    int32_t bHasVideo;           ///< 0: the format cannot carry pictures.
    unsigned char reserved2[8];  ///< Zero.
} FileFormatInfo;

#pragma pack(pop)

#ifdef __cplusplus
static_assert(sizeof(EncodeParam) == 104);
static_assert(offsetof(EncodeParam, fccColorFormat) == 4 && offsetof(EncodeParam, nBitCount) == 8);
static_assert(offsetof(EncodeParam, nWidth) == 12 && offsetof(EncodeParam, nHeight) == 16);
static_assert(offsetof(EncodeParam, dFrameRate) == 20 && offsetof(EncodeParam, nVideoRateMode) == 28);
static_assert(offsetof(EncodeParam, nVideoBitrate) == 32 && offsetof(EncodeParam, nVideoMaxBitrate) == 36);
static_assert(offsetof(EncodeParam, bResize) == 40 && offsetof(EncodeParam, nReserved) == 44);
static_assert(offsetof(EncodeParam, fccAudio) == 64 && offsetof(EncodeParam, nSampleRate) == 68);
static_assert(offsetof(EncodeParam, nChannels) == 72 && offsetof(EncodeParam, nBitsPerSample) == 76);
static_assert(offsetof(EncodeParam, nAudioRateMode) == 80 && offsetof(EncodeParam, nAudioBitrate) == 84);
static_assert(offsetof(EncodeParam, nAudioMaxBitrate) == 88 && offsetof(EncodeParam, bNoVideo) == 92);
static_assert(offsetof(EncodeParam, bNoAudio) == 96 && offsetof(EncodeParam, fccFileFormat) == 100);
static_assert(sizeof(FileFormatInfo) == 828);
static_assert(offsetof(FileFormatInfo, bHasAudio) == 812 && offsetof(FileFormatInfo, bHasVideo) == 816);
#endif

#endif
