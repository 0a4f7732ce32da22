// An event that threads wait for by polling.
#ifndef MOVIECONV_THREAD_SYNCEVENT_H
#define MOVIECONV_THREAD_SYNCEVENT_H

#include <atomic>
#include <cstdint>

#include <pthread.h>

constexpr unsigned kWaitSignalled = 0;         ///< The awaited thing happened.
constexpr unsigned kWaitTimeout = 258;         ///< The time ran out.
constexpr unsigned kWaitInfinite = 0xFFFFFFFF; ///< Wait without a limit.

class SyncEvent {
public:
    SyncEvent(bool manualReset, int32_t initialState);
    ~SyncEvent();
    SyncEvent(const SyncEvent&) = delete;
    SyncEvent& operator=(const SyncEvent&) = delete;

    void SetEvent();
    void ResetEvent();

    /// Waits until the event is set, looking every 10 ms, for at most `timeoutMs` milliseconds.
    /// kWaitSignalled or kWaitTimeout. An event made without manual reset is reset by a successful wait.
    unsigned Wait(unsigned timeoutMs);

private:
    pthread_mutex_t mutex; // guards changes of the flag, never its reads
    std::atomic<int32_t> bSignalled;
    int32_t bManualReset;
};

#pragma GCC visibility push(default)

/// A new event on the heap, owned by the caller, to be given to SyncCloseEvent; null without memory.
/// `attributes` and `name` are not used.
SyncEvent* SyncCreateEvent(void* attributes, unsigned manualReset, unsigned initialState, const char* name);

/// Frees an event. Null does nothing.
void SyncCloseEvent(SyncEvent* event);

#pragma GCC visibility pop

#endif
