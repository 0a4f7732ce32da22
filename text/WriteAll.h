// Writing text out, whole.
#ifndef MOVIECONV_TEXT_WRITEALL_H
#define MOVIECONV_TEXT_WRITEALL_H

#include <cerrno>
#include <string_view>

#include <poll.h>
#include <unistd.h>

namespace text {

/// Writes all of it, however many calls and interruptions that takes; waits for a reader that is slow, also
/// where another process has made the descriptor one that does not wait. False with errno set when a write
/// fails. Allocates nothing.
inline bool WriteAll(int descriptor, std::string_view bytes) {
    while (!bytes.empty()) {
        const ssize_t written = write(descriptor, bytes.data(), bytes.size());
        if (written >= 0) {
            bytes.remove_prefix(static_cast<std::size_t>(written));
        } else if (errno == EAGAIN) {
            pollfd ready{descriptor, POLLOUT, 0};
            poll(&ready, 1, -1);
        } else if (errno != EINTR) {
            return false;
        }
    }
    return true;
}

} // namespace text

#endif
