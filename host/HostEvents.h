// The program's own events in the main queue, beside the engine's: whatever happens on another thread reaches
// the main thread this way.
#ifndef MOVIECONV_HOST_HOSTEVENTS_H
#define MOVIECONV_HOST_HOSTEVENTS_H

#include <cstdint>

namespace host {

enum class EventKind : uint32_t {
    kFinished = 1,   ///< The engine's worker has nothing more to say.
    kProgress = 2,   ///< The engine's progress event; the value is in hundredths of a percent.
    kWriterNews = 3, ///< The media writer told something; see Conversion.
    kStop = 4,       ///< The user wants the conversion to end; the value is a signal, or 0 for the key.
    kPauseKey = 5,
    kSuspend = 6, ///< The terminal asks the process to sleep (SIGTSTP).
};

struct Event {
    EventKind kind;
    uint32_t value;
};

/// Posts to the main thread. Any thread.
void PostHostEvent(EventKind kind, uint32_t value = 0);

/// Waits for the next event of the program or the engine, at most `seconds` (negative: for ever). False when
/// none came in time. The main thread only.
bool ReceiveHostEvent(double seconds, Event& event);

} // namespace host

#endif
