// Logging: wide printf-style lines, handed to the function "Log" of the log sink library quennet.dylib, which
// lies in the directory of the application's executable and is loaded with the first line. Without it, lines
// are dropped.
//
// Callers use LogEx and Log; the other four serve them. All are inline and exported, so that every unit that
// logs shares one handle. They may be called from any thread and never fail toward the caller.
#ifndef MOVIECONV_LOG_DYLOG_H
#define MOVIECONV_LOG_DYLOG_H

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
            std::printf("dyLog.h: dlopen [%s] error.\r\n", path);
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
        std::printf("dyLog.h: LogGetAddress [%s] [0x%x] error.\r\n", name, dylog::LowAddress(handle));
    else
        std::printf("dyLog.h: LogGetAddress [%d] [0x%x] error.\r\n", static_cast<int>(ordinal),
                    dylog::LowAddress(handle));
    return nullptr;
}

/// Hands `text` to the log sink as it stands. The sink's result, or 0 without a sink.
DYLOG_EXPORT inline int Log(const wchar_t* text) {
    using LogEntry = int (*)(const wchar_t*);
    const auto entry = reinterpret_cast<LogEntry>(LogGetAddress("Log"));
    return entry ? entry(text) : 0;
}

/// Formats a line as wprintf does and hands it to the log sink; of a longer line the first 1023 characters.
/// The sink's result, or 0 without a sink or for an empty line.
DYLOG_EXPORT inline int LogEx(const wchar_t* fmt, ...) {
    wchar_t line[1024] = {};
    va_list arguments;
    va_start(arguments, fmt);
    const int written = std::vswprintf(line, 1024, fmt, arguments);
    va_end(arguments);
    return written == 0 ? 0 : Log(line);
}

#undef DYLOG_EXPORT

#endif
