#include "host/terminal/StandardStreams.h"

#include "ffmpeg/LogLine.h"
#include "host/convert/Failure.h"
#include "host/terminal/SideFile.h"
#include "logsink/LogSink.h"
#include "text/Printable.h"
#include "text/Utf8.h"
#include "text/WriteAll.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <fcntl.h>
#include <fmt/format.h>
#include <new>
#include <sys/ioctl.h>
#include <system_error>
#include <unistd.h>

namespace movieconv {
namespace {

constexpr std::string_view kLogHead = "movieconv log\n"; // by which a log is known again

/// With the reason in errno.
Failure CannotWriteLog(const std::string& path) {
    return {Category::kOutput, fmt::format("cannot write the log \"{}\": {}", path, std::strerror(errno))};
}

/// FFmpeg's messages, a line each, as they would be shown at its usual level.
void LogFfmpeg(void* source, int level, const char* format, va_list arguments) {
    if (av::LogLevel(level) > AV_LOG_WARNING)
        return;
    static thread_local av::LogLine line;
    const char* const whole = line.Add(source, level, format, arguments);
    if (whole == nullptr)
        return;
    try {
        ::Log(text::FromUtf8(whole).c_str());
    } catch (const std::bad_alloc&) { // the line is lost; FFmpeg's threads know no exceptions
    }
}

} // namespace

StandardStreams::StandardStreams(const std::optional<std::string>& logFile, bool overwrite)
    : output_(fcntl(1, F_DUPFD_CLOEXEC, 3)) {
    const int log = logFile ? OpenLog(*logFile, overwrite) : open("/dev/null", O_WRONLY | O_CLOEXEC);
    if (log >= 0) {
        std::fflush(stdout);
        dup2(log, 1);
        close(log);
    }
    // By its descriptor: the name may stand for another file by now.
    if (LogSinkSetFile(logFile ? "/proc/self/fd/1" : "") == 0)
        throw CannotWriteLog(*logFile);
    av_log_set_callback(LogFfmpeg);
}

int StandardStreams::OpenLog(const std::string& path, bool overwrite) {
    const auto require = [&](const SideFile& file) {
        RequireWritable(file, "--log", path, "a log of movieconv", overwrite);
    };
    try {
        require(LookAtSideFile(path, kLogHead, 0)); // before it is opened, which a device may notice
        const int log =
            open(path.c_str(), O_RDWR | O_APPEND | O_CREAT | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC, 0666);
        if (log < 0)
            throw CannotWriteLog(path);
        require(LookAtSideFile(log, kLogHead, 0)); // another one may have come in between
        if (lseek(log, 0, SEEK_END) == 0)
            Write(log, kLogHead);
        return log;
    } catch (const std::system_error& error) {
        errno = error.code().value();
        throw CannotWriteLog(path);
    }
}

void StandardStreams::Report(std::string_view text) const {
    if (lost_ || Print(text))
        return;
    lost_ = true;
    PrintError(fmt::format("movieconv: warning: nothing more is told on the standard output: {}",
                           std::strerror(errno)));
}

void StandardStreams::ReportLine(std::string_view line) const {
    Report(text::Printable(line) + "\n");
}

void StandardStreams::PrintError(std::string_view line) const {
    Write(2, text::Printable(line) + "\n");
}

bool StandardStreams::OutputIsTerminal() const {
    return isatty(output_) != 0;
}

int StandardStreams::Columns() const {
    constexpr int kUsual = 80;
    winsize size{};
    return ioctl(output_, TIOCGWINSZ, &size) == 0 && size.ws_col > 0 ? size.ws_col : kUsual;
}

bool StandardStreams::Write(int descriptor, std::string_view text) {
    return text::WriteAll(descriptor, text) || errno == EPIPE;
}

} // namespace movieconv
