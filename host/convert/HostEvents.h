// The program's own events in the main queue, beside the engine's: whatever happens on another thread reaches
// the main thread this way.
#ifndef MOVIECONV_HOST_CONVERT_HOSTEVENTS_H
#define MOVIECONV_HOST_CONVERT_HOSTEVENTS_H

#include <cstdint>
#include <optional>

namespace movieconv {

enum class EventKind : uint32_t {
    kFinished = 1,   ///< The engine's worker has nothing more to say.
    kProgress = 2,   ///< The engine's progress event.
    kWriterNews = 3, ///< The media writer told something; see Conversion.
    kStop = 4,       ///< The user wants the conversion to end.
    kPauseKey = 5,
    kSuspend = 6, ///< The terminal asks the process to sleep (SIGTSTP).
};

/// Posts to the main thread. Any thread.
void PostHostEvent(EventKind kind);

/// Waits for the next event of the program or the engine, at most `seconds` (negative: for ever). Nothing
/// when none came in time. The main thread only.
std::optional<EventKind> ReceiveHostEvent(double seconds);

} // namespace movieconv

#endif
