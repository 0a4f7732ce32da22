// Ends the reading of a source from another thread, also while it is still being opened.
#ifndef MOVIECONV_HOST_SOURCE_INTERRUPTION_H
#define MOVIECONV_HOST_SOURCE_INTERRUPTION_H

#include <atomic>

namespace movieconv {

/// For any thread.
class Interruption {
public:
    /// Throws std::system_error when there is no descriptor for it.
    Interruption();
    Interruption(const Interruption&) = delete;
    Interruption& operator=(const Interruption&) = delete;
    ~Interruption();

    /// Makes every read of the sources that hold this object fail from now on, also one that is under way.
    void Interrupt();

    bool Interrupted() const { return interrupted_; }

    /// A descriptor that is readable once Interrupt was called.
    int Descriptor() const { return wake_; }

private:
    const int wake_;
    std::atomic<bool> interrupted_{false};
};

} // namespace movieconv

#endif
