// Where log lines go besides the log sink: to one function of the process, when a host has set it. The log
// module, the threads' trace and the media writer ask here first, so that all of them reach it.
//
// All functions may be called from any thread.
#ifndef MOVIECONV_PLATFORM_LOGROUTE_H
#define MOVIECONV_PLATFORM_LOGROUTE_H

#include <wchar.h>

#ifdef __cplusplus
extern "C" {
#endif
#pragma GCC visibility push(default)

/// How much a line matters.
enum { kLogError = 1, kLogWarning = 2, kLogInfo = 3, kLogDebug = 4 };

/// Given one line of UTF-8 without its line end.
typedef void (*LogRouteFunction)(void* user, int level, const char* line);

/// All lines go to `function` from now on; null ends that. When it returns, the function set before has
/// returned everywhere and is not called any more; out of a call of the function it does not wait for that.
/// 1; 0 with nothing changed without memory.
int LogRouteSet(LogRouteFunction function, void* user);

/// Hands a line on. 1; 0 when no function is set, and the line is to go where lines go without one.
int LogRouteTake(int level, const wchar_t* line);

/// The same with UTF-8.
int LogRouteTakeUtf8(int level, const char* line);

#pragma GCC visibility pop
#ifdef __cplusplus
}
#endif

#endif
