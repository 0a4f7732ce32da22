// FFmpeg's lines for the host's log function.
#include "ffmpeg/LogLine.h"
#include "platform/LogRoute.h"
#include "writer/WriterStatus.h"

namespace {

int LevelOf(int level) {
    if (level <= AV_LOG_ERROR)
        return kLogError;
    if (level <= AV_LOG_WARNING)
        return kLogWarning;
    return level <= AV_LOG_INFO ? kLogInfo : kLogDebug;
}

void Forward(void* source, int level, const char* format, va_list arguments) {
    if (av::LogLevel(level) > av_log_get_level())
        return;
    static thread_local av::LogLine line;
    if (const char* whole = line.Add(source, level, format, arguments))
        LogRouteTakeUtf8(LevelOf(av::LogLevel(level)), whole);
}

} // namespace

void MWForwardLog(int forward) {
    av_log_set_callback(forward != 0 ? Forward : av_log_default_callback);
}
