// FFmpeg's lines for the host's log function.
#include "platform/LogRoute.h"
#include "writer/WriterStatus.h"

extern "C" {
#include <libavutil/log.h>
}

#include <cstdarg>
#include <cstring>

namespace {

int LevelOf(int level) {
    if (level <= AV_LOG_ERROR)
        return kLogError;
    if (level <= AV_LOG_WARNING)
        return kLogWarning;
    return level <= AV_LOG_INFO ? kLogInfo : kLogDebug;
}

/// FFmpeg makes a line of several calls; the last piece has the line end.
void Forward(void* source, int level, const char* format, va_list arguments) {
    if ((level & 0xFF) > av_log_get_level()) // the upper bits are colours
        return;
    static thread_local int prefix = 1;
    static thread_local char line[1024];
    static thread_local std::size_t length = 0;
    av_log_format_line2(source, level & 0xFF, format, arguments, line + length,
                        static_cast<int>(sizeof line - length), &prefix);
    length += std::strlen(line + length);
    if (length + 1 < sizeof line && (length == 0 || line[length - 1] != '\n'))
        return;
    length = 0;
    LogRouteTakeUtf8(LevelOf(level & 0xFF), line);
}

} // namespace

void MWForwardLog(int forward) {
    av_log_set_callback(forward != 0 ? Forward : av_log_default_callback);
}
