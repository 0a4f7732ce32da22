// A file descriptor that is closed.
#ifndef MOVIECONV_TEXT_DESCRIPTOR_H
#define MOVIECONV_TEXT_DESCRIPTOR_H

#include <unistd.h>

namespace text {

/// Closes it in the end, unless that was done. That of a failed open stays negative.
class Descriptor {
public:
    explicit Descriptor(int number) : number_(number) {}
    ~Descriptor() { Close(); }
    Descriptor(const Descriptor&) = delete;
    Descriptor& operator=(const Descriptor&) = delete;
    int Number() const { return number_; }

    /// False, with errno set, when the system tells a failure.
    bool Close() {
        const int number = number_;
        number_ = -1;
        return number < 0 || close(number) == 0;
    }

private:
    int number_;
};

} // namespace text

#endif
