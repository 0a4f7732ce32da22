// What the library has to say while conversions run, for the log of each.
#ifndef MOVIECONV_HOST_WINDOW_RUNNER_LOGSHARE_H
#define MOVIECONV_HOST_WINDOW_RUNNER_LOGSHARE_H

#include "host/convert/LogTap.h"
#include "host/window/model/Runner.h"

#include <memory>
#include <mutex>
#include <vector>

namespace movieconv::window {

/// Errors and warnings go to all that run: a line does not tell whose it is. Of each conversion the first
/// hundred, since a broken movie can be worth thousands.
class LogShare {
public:
    LogShare();

    void Add(const std::shared_ptr<RunListener>& listener);

private:
    struct Reader {
        std::weak_ptr<RunListener> listener;
        int lines;
    };

    void Take(LogWeight weight, const std::string& line);

    std::mutex mutex_;
    std::vector<Reader> readers_;
    LogTap tap_; // last: it calls
};

} // namespace movieconv::window

#endif
