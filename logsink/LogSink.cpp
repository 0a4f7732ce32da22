#include "logsink/LogSink.h"

#include "api/Version.h"
#include "text/Utf8.h"
#include "text/WriteAll.h"

#include <algorithm>
#include <cerrno>
#include <exception>
#include <mutex>
#include <string>
#include <string_view>

#include <fcntl.h>
#include <unistd.h>

namespace {

constexpr int kDiscard = -1;

std::mutex g_mutex; // keeps the lines whole and the file open while it is written
int g_target = STDERR_FILENO;

bool IsLineEnd(wchar_t character) {
    return character == L'\r' || character == L'\n';
}

bool IsSurrogate(wchar_t character) {
    return character >= 0xD800 && character <= 0xDFFF;
}

std::string LineOf(std::wstring_view text) {
    while (!text.empty() && IsLineEnd(text.back()))
        text.remove_suffix(1);
    std::wstring line(text);
    std::replace_if(line.begin(), line.end(), IsLineEnd, L' ');
    // Names carry bytes that are not UTF-8 as surrogates; a log is UTF-8 throughout.
    std::replace_if(line.begin(), line.end(), IsSurrogate, L'\uFFFD');
    return text::ToUtf8(line) + '\n';
}

} // namespace

int Log(const wchar_t* text) {
    if (!text)
        return 0;
    try {
        const std::string line = LineOf(text);
        const std::lock_guard lock(g_mutex);
        return g_target == kDiscard || text::WriteAll(g_target, line) ? 1 : 0;
    } catch (const std::exception&) { // no memory for the line
        return 0;
    }
}

int LogSinkSetFile(const char* utf8Path) {
    int target = kDiscard;
    if (!utf8Path) {
        target = STDERR_FILENO;
    } else if (*utf8Path != '\0') {
        target = open(utf8Path, O_WRONLY | O_APPEND | O_CREAT | O_CLOEXEC, 0666);
        if (target < 0)
            return 0;
    }
    const std::lock_guard lock(g_mutex);
    if (g_target != kDiscard && g_target != STDERR_FILENO)
        close(g_target);
    g_target = target;
    return 1;
}

unsigned LogSinkGetVersion(void) {
    return MC_VERSION;
}
