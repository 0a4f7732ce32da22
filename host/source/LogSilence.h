// Reading that nobody wants to hear about in a log.
#ifndef MOVIECONV_HOST_SOURCE_LOGSILENCE_H
#define MOVIECONV_HOST_SOURCE_LOGSILENCE_H

#include <utility>

namespace movieconv {

/// While it lives, what is said on this thread, and by the sources and decoders that are made on it, goes to
/// no log of a front end's.
class LogSilence {
public:
    explicit LogSilence(bool silent = true) : before_(std::exchange(holds_, holds_ || silent)) {}
    ~LogSilence() { holds_ = before_; }
    LogSilence(const LogSilence&) = delete;
    LogSilence& operator=(const LogSilence&) = delete;

    /// On this thread.
    static bool Holds() { return holds_; }

private:
    static thread_local bool holds_;
    const bool before_;
};

/// `work` for another thread, where it is as silent as here.
template <class Work>
auto AsSilentAsHere(Work work) {
    return [work = std::move(work), silent = LogSilence::Holds()] {
        const LogSilence silence(silent);
        work();
    };
}

} // namespace movieconv

#endif
