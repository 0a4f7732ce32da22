/// \file
/// The log, line by line, for a host that has a log of its own.
#ifndef MOVIECONV_API_LOGCALLBACK_H
#define MOVIECONV_API_LOGCALLBACK_H

#ifdef __cplusplus
extern "C" {
#endif
#pragma GCC visibility push(default)

/// How much a line matters.
enum {
    MC_LOG_ERROR = 1,   ///< Something failed.
    MC_LOG_WARNING = 2, ///< Something was put right or is worth knowing.
    MC_LOG_INFO = 3,    ///< What is going on.
    MC_LOG_DEBUG = 4    ///< What only a developer of the library wants to see.
};

/// Given one line of UTF-8 without a line end, valid during the call only. Called on whichever thread logs,
/// possibly on several at once; no lock of the library's is held meanwhile. It must not throw, and not call
/// an MC function that waits.
typedef void (*MCLogFunction)(void* user, int level, const char* line);

/// Sends every line of the process to `function` from now on, with `user` as its first argument: the
/// engine's, the media writer's and FFmpeg's own (up to the level that av_log_set_level chose, by default
/// MC_LOG_INFO). Nothing of them reaches the log sink, standard output or standard error any more. Null
/// brings back what was before: lines for the log sink, and the trace of the threads on standard output.
///
/// When it returns, the function set before is not running and is not called any more, so that its `user` may
/// be freed. Called out of a log function, it does not wait for that one.
///
/// 1, or 0 with nothing changed without memory. From any thread.
int MCSetLogCallback(MCLogFunction function, void* user);

#pragma GCC visibility pop
#ifdef __cplusplus
} // extern "C"
#endif

#endif
