/// \file
/// What the progress callback is told: the record handed to it, and the ways in which a conversion ends.
#ifndef MOVIECONV_ENGINE_PROGRESSINFO_H
#define MOVIECONV_ENGINE_PROGRESSINFO_H

#include "media/MediaRecords.h"
#include "thread/TimeData.h"

#include <stdint.h>

/// How a conversion ended: the value of the callback's finished call and the lParam of the finished event.
enum {
    kOutcomeCompleted = 0, ///< The source ended, or the requested length was reached.
    kOutcomeStopped = 1,   ///< MCStop or MCAbort.
    kOutcomeCancelled = 2, ///< The callback returned 0.
    /// Nothing to convert, no output or clip that could be created, an exception out of a decoder, or no
    /// memory. What the writer does not take later is told by MCGetResult alone.
    kOutcomeFailed = 3
};

#pragma pack(push, 4)

/// 76 bytes in the 32-bit build, 80 in the 64-bit one. The engine's own; valid during the call only.
///
/// Once the file is closed, a last record comes with the finished call and, of a completed conversion, with a
/// progress call before it.
typedef struct ProgressInfo {
    double dTotalLength; ///< Seconds to convert: the length asked for, or the rest that the source announces.
    double dPosition;    ///< Seconds of the source converted so far, from the begin asked for.
    int32_t nPercent;    ///< nProgress / 100.
    int32_t nProgress;   ///< Hundredths of a percent, at most 10000; in the last record 10000 in any case.
    VideoImage* pPreviewImage; ///< The picture just written, the decoder's own record; or null.
    TimeData tElapsed;         ///< Wall-clock time since the conversion began, pauses included.
    /// Estimated wall-clock time still needed; 0 while there is no estimate and in the last record. When a
    /// source runs on past its announced length, the estimate turns negative and shows as a very large time.
    TimeData tRemaining;
    /// dPosition again. In the last record dTotalLength; of a conversion of sound alone the length that
    /// MCStart was given, which may be 0.
    double dDoneLength;
    /// Seconds of source converted per second, as last estimated; 0 while there is no estimate.
    double dSpeed;
} ProgressInfo;

#pragma pack(pop)

#ifdef __cplusplus
static_assert(sizeof(ProgressInfo) == 76 + media_layout::widened(1));
static_assert(offsetof(ProgressInfo, dPosition) == 8 && offsetof(ProgressInfo, nPercent) == 16);
static_assert(offsetof(ProgressInfo, nProgress) == 20 && offsetof(ProgressInfo, pPreviewImage) == 24);
static_assert(offsetof(ProgressInfo, tElapsed) == 28 + media_layout::widened(1));
static_assert(offsetof(ProgressInfo, tRemaining) == 44 + media_layout::widened(1));
static_assert(offsetof(ProgressInfo, dDoneLength) == 60 + media_layout::widened(1));
static_assert(offsetof(ProgressInfo, dSpeed) == 68 + media_layout::widened(1));
#endif

#endif
