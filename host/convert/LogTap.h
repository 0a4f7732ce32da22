// The lines that the library and FFmpeg write, for a front end's own log.
#ifndef MOVIECONV_HOST_CONVERT_LOGTAP_H
#define MOVIECONV_HOST_CONVERT_LOGTAP_H

#include <functional>
#include <string>

namespace movieconv {

enum class LogWeight { kError, kWarning, kOther };

/// While it lives, the lines of this process go to it and nowhere else, but for those about PictureAt, which
/// go nowhere. One at a time.
class LogTap {
public:
    /// UTF-8 without a line end. Called on any thread, also on several at once; must return soon.
    using Take = std::function<void(LogWeight weight, const std::string& line)>;

    explicit LogTap(Take take);
    LogTap(const LogTap&) = delete;
    LogTap& operator=(const LogTap&) = delete;

    /// After it no call is under way any more.
    ~LogTap();

private:
    const Take take_;
};

} // namespace movieconv

#endif
