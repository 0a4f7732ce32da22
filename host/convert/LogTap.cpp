#include "host/convert/LogTap.h"

#include "api/MovieConv.h"
#include "host/source/LogSilence.h"

#include <new>
#include <utility>

namespace movieconv {

LogTap::LogTap(Take take) : take_(std::move(take)) {
    MCSetLogCallback(
        [](void* user, int level, const char* line) {
            if (LogSilence::Holds())
                return;
            try {
                static_cast<LogTap*>(user)->take_(level <= MC_LOG_ERROR     ? LogWeight::kError
                                                  : level <= MC_LOG_WARNING ? LogWeight::kWarning
                                                                            : LogWeight::kOther,
                                                  line);
            } catch (const std::bad_alloc&) { // a line that nobody has room for
            }
        },
        this);
}

LogTap::~LogTap() {
    MCSetLogCallback(nullptr, nullptr);
}

} // namespace movieconv
