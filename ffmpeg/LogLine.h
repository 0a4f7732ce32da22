// FFmpeg's messages as lines.
#ifndef MOVIECONV_FFMPEG_LOGLINE_H
#define MOVIECONV_FFMPEG_LOGLINE_H

extern "C" {
#include <libavutil/log.h>
}

#include <array>
#include <cstdarg>
#include <cstddef>
#include <cstring>

namespace av {

/// A level as FFmpeg names it, without the colours in the upper bits.
inline int LogLevel(int level) {
    return level & 0xFF;
}

/// Joins the pieces of which FFmpeg makes a line; the last one has the line end. Each thread has its own.
/// Needs no memory.
class LogLine {
public:
    /// Adds a piece, as a log callback gets it. The line, valid until the next call, when it is whole or can
    /// take no more; null before.
    const char* Add(void* source, int level, const char* format, va_list arguments) {
        if (isWhole_)
            length_ = 0;
        av_log_format_line2(source, LogLevel(level), format, arguments, line_.data() + length_,
                            static_cast<int>(line_.size() - length_), &prefix_);
        length_ += std::strlen(line_.data() + length_);
        isWhole_ = length_ + 1 >= line_.size() || (length_ > 0 && line_[length_ - 1] == '\n');
        return isWhole_ ? line_.data() : nullptr;
    }

private:
    std::array<char, 1024> line_{};
    std::size_t length_ = 0;
    int prefix_ = 1;
    bool isWhole_ = false;
};

} // namespace av

#endif
