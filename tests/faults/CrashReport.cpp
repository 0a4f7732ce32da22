#include "tests/faults/CrashReport.h"

#include <algorithm>
#include <array>
#include <csignal>
#include <cstring>
#include <string_view>

#include <dlfcn.h>
#include <execinfo.h>
#include <unistd.h>

namespace {

void Tell(const char* text) {
    if (write(STDERR_FILENO, text, std::strlen(text)) < 0)
        _exit(1);
}

void TellStack(const char* what) {
    std::array<void*, 64> frames;
    const int count = backtrace(frames.data(), static_cast<int>(frames.size()));
    bool begun = false;
    Tell(what);
    for (int i = 0; i < count; ++i) {
        Dl_info info;
        if (dladdr(frames[i], &info) == 0)
            continue;
        const std::string_view file(info.dli_fname);
        begun = begun || file.find("/libav") != file.npos || file.find("/libsw") != file.npos;
        if (!begun)
            continue;
        Tell(" ");
        Tell(info.dli_sname != nullptr ? info.dli_sname : "?");
    }
    Tell(" .\n");
}

void Report(int signal) {
    TellStack("\nCrash:");
    std::signal(signal, SIG_DFL);
    raise(signal);
}

/// Whether one of the functions stands in the line of `output` that begins so.
template <size_t Size>
bool Names(const std::string& output, const std::string& beginning,
           const std::array<const char*, Size>& functions) {
    const size_t from = output.find(beginning);
    if (from == std::string::npos)
        return false;
    const std::string line = output.substr(from, output.find('\n', from) - from);
    return std::any_of(functions.begin(), functions.end(),
                       [&](const char* name) { return line.find(name) != std::string::npos; });
}

} // namespace

void TellPlace() {
    TellStack("In:");
}

void ReportCrashes() {
    void* unused = nullptr;
    backtrace(&unused, 1); // loads what it needs
    for (const int signal : {SIGSEGV, SIGFPE, SIGABRT})
        std::signal(signal, Report);
}

bool IsKnownCrash(const std::string& output) {
    constexpr std::array kCrashing{" avcodec_alloc_context3 ", " avcodec_open2 ", " swr_convert ",
                                   " av_write_trailer "};
    constexpr std::array kHiding{" avcodec_open2 "};
    constexpr std::array kFirstPicture{" avcodec_send_frame ", " avcodec_send_packet "};
    return Names(output, "Crash:", kCrashing) ||
           (Names(output, "Crash:", kFirstPicture) && Names(output, "In:", kHiding));
}

bool WasOpening(const std::string& output) {
    return Names(output, "In:", std::array{" avformat_open_input ", " avformat_find_stream_info "});
}
