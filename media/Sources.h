/// \file
/// Pictures and sound from functions: what a host that is not written in C++ gives to MCCreateFromSources
/// instead of decoders. docs/decoders.md tells more about the records.
///
/// Lifetime. The tables are copied. pUser must stay valid until pfnRelease has been called with it, or, where
/// that is null, until MCDestroy has returned. What a record points to must stay valid until the next call of
/// any function with the same pUser.
///
/// Threads. pfnGetFormat is called once, inside MCCreateFromSources. pfnSeek, pfnGetPicture and pfnGetBlock
/// are called on the converter's worker thread, one call at a time over both tables. pfnRelease is called
/// once, inside MCDestroy, when the worker is gone; it is not called when MCCreateFromSources fails.
#ifndef MOVIECONV_MEDIA_SOURCES_H
#define MOVIECONV_MEDIA_SOURCES_H

#include "media/MediaRecords.h"

#include <stdint.h>

/// Pictures. A later version may add functions at the end.
typedef struct MCVideoSource {
    uint32_t nSize; ///< Size of this record in bytes.
    void* pUser;    ///< First argument of every function.

    /// Describes the pictures: nWidth and nHeight above 0, dFrameRate above 0, dDuration in seconds. `format`
    /// holds zeros; a duration that stays 0 stands for an unknown one, with which progress is 100 % all the
    /// time. Nonzero, or 0 when the source cannot be opened.
    int (*pfnGetFormat)(void* pUser, VideoFormat* format);

    /// Moves to the picture shown at `seconds`. Called at most once in a conversion, before its first
    /// picture; for a begin of 0 only when an earlier conversion has read from the source. Nonzero, or 0 when
    /// that fails, which ends the pictures as an error of pfnGetPicture does. May be null: pictures before
    /// `seconds` are read and left out, and a later conversion goes on where the source stands.
    int (*pfnSeek)(void* pUser, double seconds);

    /// Gives the next picture: 1. At the end 0; a negative number of the host's own is an error, which ends
    /// the pictures and which MCGetResult tells.
    ///
    /// `image` comes filled in for planes without padding and pictures that follow each other at the frame
    /// rate: size, pitches, llTime (of the picture after the last one, or of the place sought) and nDuration.
    /// What is to be different is changed; pY, pU and pV must be set. llTime2 follows llTime.
    int (*pfnGetPicture)(void* pUser, VideoImage* image);

    /// Gives up pUser. May be null.
    void (*pfnRelease)(void* pUser);
} MCVideoSource;

/// Sound. A later version may add functions at the end.
typedef struct MCAudioSource {
    uint32_t nSize; ///< Size of this record in bytes.
    void* pUser;    ///< First argument of every function.

    /// Describes the sound: nSampleRate and nChannels above 0, nBitsPerSample 8 (unsigned), 16, 24 or 32
    /// (signed, little-endian), dDuration as above. nBytesPerSecond follows from these when it stays 0.
    /// Nonzero, or 0 when the source cannot be opened.
    int (*pfnGetFormat)(void* pUser, AudioFormat* format);

    /// Moves to `seconds`, as MCVideoSource does; in conversions of sound alone it is called for a begin of 0
    /// too. May be null: blocks that end before `seconds` are read and left out.
    int (*pfnSeek)(void* pUser, double seconds);

    /// Gives the next block of sound: 1. At the end 0, or a block with nLength 0; a negative number is an
    /// error, as with pictures.
    ///
    /// `block` comes filled in with the format and with llTime (of the block after the last one, or of the
    /// place sought); pData and nLength must be set. nBufferSize, nDuration and llTime2 follow from these.
    int (*pfnGetBlock)(void* pUser, AudioFrame* block);

    /// Gives up pUser. May be null.
    void (*pfnRelease)(void* pUser);
} MCAudioSource;

#ifdef __cplusplus
static_assert(sizeof(MCVideoSource) == 6 * sizeof(void*) && offsetof(MCVideoSource, pUser) == sizeof(void*));
static_assert(offsetof(MCVideoSource, pfnGetFormat) == 2 * sizeof(void*));
static_assert(offsetof(MCVideoSource, pfnSeek) == 3 * sizeof(void*));
static_assert(offsetof(MCVideoSource, pfnGetPicture) == 4 * sizeof(void*));
static_assert(offsetof(MCVideoSource, pfnRelease) == 5 * sizeof(void*));
static_assert(sizeof(MCAudioSource) == 6 * sizeof(void*) && offsetof(MCAudioSource, pUser) == sizeof(void*));
static_assert(offsetof(MCAudioSource, pfnGetFormat) == 2 * sizeof(void*));
static_assert(offsetof(MCAudioSource, pfnSeek) == 3 * sizeof(void*));
static_assert(offsetof(MCAudioSource, pfnGetBlock) == 4 * sizeof(void*));
static_assert(offsetof(MCAudioSource, pfnRelease) == 5 * sizeof(void*));
#endif

#endif
