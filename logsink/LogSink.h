/// \file
/// The log sink library, quennet.dylib: every line that it is given becomes one line of UTF-8. All functions
/// may be called from any thread.
#ifndef MOVIECONV_LOGSINK_LOGSINK_H
#define MOVIECONV_LOGSINK_LOGSINK_H

#include <wchar.h>

#ifdef __cplusplus
extern "C" {
#endif
#pragma GCC visibility push(default)

/// Writes `text` (UTF-32, zero-terminated) as one line, by one write and without waiting in a buffer. Line
/// ends at its end count as one, any within it become spaces, and values that are no characters become
/// U+FFFD. The line carries no time, so that what is logged can be compared. 1 when the line was written or
/// is to be discarded, else 0.
int Log(const wchar_t* text);

/// Chooses where lines go from now on: null the standard error stream, as at the beginning; "" nowhere; else
/// they are appended to the file of that name, which is created when it is missing. 1 on success; 0, with the
/// lines going where they went before and the reason in errno, when the file cannot be opened.
int LogSinkSetFile(const char* utf8Path);

/// The sink's version, as MC_MAKE_VERSION makes it.
unsigned LogSinkGetVersion(void);

#pragma GCC visibility pop
#ifdef __cplusplus
}
#endif

#endif
