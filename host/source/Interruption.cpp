#include "host/source/Interruption.h"

#include <cerrno>
#include <sys/eventfd.h>
#include <system_error>
#include <unistd.h>

namespace movieconv {

Interruption::Interruption() : wake_(eventfd(0, EFD_CLOEXEC)) {
    if (wake_ < 0)
        throw std::system_error(errno, std::generic_category());
}

Interruption::~Interruption() {
    close(wake_);
}

void Interruption::Interrupt() {
    interrupted_ = true;
    eventfd_write(wake_, 1); // never read again: it ends every later wait too
}

} // namespace movieconv
