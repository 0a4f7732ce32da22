// Something that takes its time on threads of its own, and can be paused and stopped: a conversion, or many.
#ifndef MOVIECONV_HOST_CONVERT_WORK_H
#define MOVIECONV_HOST_CONVERT_WORK_H

#include "host/convert/Observer.h"

namespace movieconv {

/// All functions may be called on any thread and return at once.
class Work {
public:
    Work() = default;
    Work(const Work&) = delete;
    Work& operator=(const Work&) = delete;
    virtual ~Work() = default; ///< Stops and waits for the end.

    /// Begins, once. Throws std::system_error when there is no thread for it.
    virtual void Start() = 0;
    virtual void Pause() = 0;
    virtual void Resume() = 0;

    /// Ends it: what can be kept is kept, and the outcome is kStopped.
    virtual void Stop() = 0;

    /// How it ended; null before. Stays valid as long as the work, and is there even when no memory was left
    /// to tell the observer.
    virtual const Verdict* Result() const = 0;
};

} // namespace movieconv

#endif
