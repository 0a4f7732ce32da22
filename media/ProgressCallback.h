/// \file
/// The host's progress callback, which the engine calls and hands on to the media writer's final close.
#ifndef MOVIECONV_MEDIA_PROGRESSCALLBACK_H
#define MOVIECONV_MEDIA_PROGRESSCALLBACK_H

#include <stdint.h>

/// Called on the engine's worker thread.
///
/// kind 0: progress; `value` is 0 to 10000 hundredths of a percent, `info` points to a ProgressInfo that is
/// valid during the call. Returning 0 cancels the conversion. kind 1: finished, the last call of a
/// conversion; `value` is the outcome, kOutcome... in engine/ProgressInfo.h, `info` points to the
/// last ProgressInfo, or is 0 for kOutcomeFailed. The result is ignored.
///
/// MCStop, MCWait and MCDestroy are refused inside the callback: they wait for the very thread it runs on.
typedef unsigned (*ProgressCallback)(void* context, unsigned kind, unsigned value, uintptr_t info);

#endif
