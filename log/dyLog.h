// Logging: wide printf-style lines. They go to the host's log function when it has set one
// (platform/LogRoute.h), else to the function "Log" of the log sink library quennet.dylib, which lies in the
// directory of the application's executable and is loaded with the first line. Without it, lines are dropped.
//
// Callers use LogEx, Log and LogAt; the others serve them. The first two and what they stand on are inline
// and exported, so that every unit that logs shares one handle. All may be called from any thread and never
// fail toward the caller.
#ifndef MOVIECONV_LOG_DYLOG_H
#define MOVIECONV_LOG_DYLOG_H

#include "platform/LogRoute.h"
#include "platform/Platform.h"

#include <cstdarg>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <cwchar>

#include <dlfcn.h>

#define DYLOG_EXPORT [[gnu::used, gnu::visibility("default")]]

/// Replaces every occurrence of the non-empty `pattern` in `str` by `ch`, in place, from left to right; the
/// count of them.
DYLOG_EXPORT inline int replace_str_2_char(char* str, const char* pattern, char ch) {
    const std::size_t length = std::strlen(pattern);
    int count = 0;
    char* write = str;
    for (const char* read = str; *read != '\0'; ++write) {
        if (std::strncmp(read, pattern, length) == 0) {
            *write = ch;
            read += length;
            ++count;
        } else {
            *write = *read++;
        }
    }
    *write = '\0';
    return count;
}

namespace dylog {

/// Appends `text`; false, and nothing changed, when it does not fit into the `capacity` bytes of `path`.
inline bool Append(char* path, std::size_t capacity, const char* text) {
    const std::size_t used = std::strlen(path);
    const std::size_t added = std::strlen(text);
    if (added >= capacity - used)
        return false;
    std::memcpy(path + used, text, added + 1);
    return true;
}

/// The main bundle's URL as text with its spaces decoded; false when there is none or it does not fit.
inline bool GetBundleUrl(char* text, CFIndex capacity) {
    const CFBundleRef bundle = CFBundleGetMainBundle();
    const CFURLRef url = bundle ? CFBundleCopyBundleURL(bundle) : nullptr;
    if (!url)
        return false;
    const CFStringRef string = CFURLGetString(url);
    const bool taken = string && CFStringGetCString(string, text, capacity, kCFStringEncodingUTF8);
    CFRelease(url);
    if (taken)
        replace_str_2_char(text, "%20", ' ');
    return taken;
}

/// The directory of the application's executable without a "/" at its end; false, and an empty `path`, when
/// it cannot be told or does not fit. The root directory is an empty path too.
inline bool GetAppDirectory(char* path, std::size_t capacity) {
    path[0] = '\0';
    char url[544] = {};
    if (!GetBundleUrl(url, 511))
        return false;
    const char* text = std::strstr(url, "file://localhost/") ? url + std::strlen("file://localhost") : url;
    if (!Append(path, capacity, text))
        return false;

    const std::size_t length = std::strlen(path);
    if (length >= 5 && std::strcmp(path + length - 5, ".app/") == 0) {
        if (Append(path, capacity, "Contents/MacOS"))
            return true;
        path[0] = '\0';
        return false;
    }
    if (length > 0)
        path[length - 1] = '\0';
    return true;
}

/// What "%x" shows of an address: its low 32 bits.
inline unsigned LowAddress(const void* address) {
    return static_cast<unsigned>(reinterpret_cast<std::uintptr_t>(address));
}

/// A line of the modules that do not log: to the host's log function, or as it stands to standard output.
[[gnu::format(printf, 2, 3)]] inline void Say(int level, const char* format, ...) {
    char line[640];
    va_list arguments;
    va_start(arguments, format);
    std::vsnprintf(line, sizeof line, format, arguments);
    va_end(arguments);
    if (LogRouteTakeUtf8(level, line) == 0)
        std::fputs(line, stdout);
}

} // namespace dylog

/// Writes the directory of the application's executable, without a "/" at its end, into the `size` bytes of
/// `path`. A directory that cannot be told or does not fit gives an empty text.
DYLOG_EXPORT inline void GetAppPathA(char* path, int size) {
    if (size > 0)
        dylog::GetAppDirectory(path, static_cast<std::size_t>(size));
}

/// The log sink's library, loaded by the first call; null when that failed, which is never tried again.
DYLOG_EXPORT inline void* dyLogInit() {
    static void* const hLogHandle = [] {
        char path[512] = {};
        const bool found = dylog::GetAppDirectory(path, 511);
        const bool complete = dylog::Append(path, sizeof path, "/quennet.dylib") && found;
        void* handle = complete ? dlopen(path, RTLD_LAZY) : nullptr;
        if (!handle)
            dylog::Say(kLogError, "dyLog.h: dlopen [%s] error.\r\n", path);
        return handle;
    }();
    return hLogHandle;
}

/// The address of the symbol `name` in the log sink, or null, which is told on standard output.
DYLOG_EXPORT inline void* LogGetAddress(const char* name) {
    void* const handle = dyLogInit();
    // The loader takes a null handle for the whole process, where a function of that name may well be
    // another's.
    if (void* address = handle ? dlsym(handle, name) : nullptr)
        return address;
    const auto ordinal = reinterpret_cast<std::intptr_t>(name);
    if (ordinal > 65535)
        dylog::Say(kLogError, "dyLog.h: LogGetAddress [%s] [0x%x] error.\r\n", name,
                   dylog::LowAddress(handle));
    else
        dylog::Say(kLogError, "dyLog.h: LogGetAddress [%d] [0x%x] error.\r\n", static_cast<int>(ordinal),
                   dylog::LowAddress(handle));
    return nullptr;
}

namespace dylog {

/// Hands a line on; the host's function sees how much it matters, the sink has no room for that.
inline int Put(int level, const wchar_t* text) {
    if (LogRouteTake(level, text) != 0)
        return 1;
    using LogEntry = int (*)(const wchar_t*);
    const auto entry = reinterpret_cast<LogEntry>(LogGetAddress("Log"));
    return entry ? entry(text) : 0;
}

inline int PutFormatted(int level, const wchar_t* fmt, va_list arguments) {
    wchar_t line[1024] = {};
    return std::vswprintf(line, 1024, fmt, arguments) == 0 ? 0 : Put(level, line);
}

} // namespace dylog

/// Hands `text` on as it stands. 1 when the host's log function took it, else the sink's result, or 0 without
/// a sink.
DYLOG_EXPORT inline int Log(const wchar_t* text) {
    return dylog::Put(kLogInfo, text);
}

/// Formats a line as wprintf does and hands it on; of a longer line the first 1023 characters. The result is
/// Log's, or 0 for an empty line.
DYLOG_EXPORT inline int LogEx(const wchar_t* fmt, ...) {
    va_list arguments;
    va_start(arguments, fmt);
    const int result = dylog::PutFormatted(kLogInfo, fmt, arguments);
    va_end(arguments);
    return result;
}

/// LogEx for a line that is more or less than information.
inline int LogAt(int level, const wchar_t* fmt, ...) {
    va_list arguments;
    va_start(arguments, fmt);
    const int result = dylog::PutFormatted(level, fmt, arguments);
    va_end(arguments);
    return result;
}

#undef DYLOG_EXPORT

#endif
