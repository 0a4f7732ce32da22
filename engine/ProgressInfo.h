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
    kOutcomeFailed = 3     ///< Could not start: nothing to convert, or the output could not be created.
};

#pragma pack(push, 4)

/// 76 bytes in the 32-bit build, 80 in the 64-bit one. The engine's own; valid during the call only.
typedef struct ProgressInfo {
    double dTotalLength;       ///< Length of the conversion in seconds.
    double dPosition;          ///< Seconds of the source converted so far.
    int32_t nPercent;          ///< nProgress / 100.
    int32_t nProgress;         ///< Hundredths of a percent, at most 10000.
    VideoImage* pPreviewImage; ///< The picture just written, the decoder's own record; or null.
    TimeData tElapsed;         ///< Wall-clock time since the conversion began, pauses included.
    /// Estimated wall-clock time still needed; 0 while there is no estimate. When a source runs on past its
    /// announced length, the estimate turns negative and shows as a very large time.
    TimeData tRemaining;
    /// dPosition again. In the final record the length of the conversion, or the requested length when only
    /// sound was converted.
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
