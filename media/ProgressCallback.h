/// \file
/// The host's progress callback, which the engine calls and hands on to the media writer's final close.
#ifndef MOVIECONV_MEDIA_PROGRESSCALLBACK_H
#define MOVIECONV_MEDIA_PROGRESSCALLBACK_H

#include <stdint.h>

/// Called on the engine's worker thread.
///
/// kind 0: progress; `value` is 0 to 10000 hundredths of a percent, `info` points to a ProgressInfo that is
/// valid during the call. Returning 0 cancels the conversion. kind 1: finished, the last call of a
/// conversion; `value` is the outcome (0 completed, 1 stopped, 2 cancelled by the callback, 3 could not
/// start), `info` points to the final ProgressInfo, or is 0 for outcome 3. The result is ignored.
///
/// The callback must not call MCStop, MCWait or MCDestroy, which wait for the very thread it runs on.
typedef unsigned (*ProgressCallback)(void* context, unsigned kind, unsigned value, uintptr_t info);

#endif
