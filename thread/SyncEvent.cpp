#include "thread/SyncEvent.h"

#include "thread/Clock.h"
#include "thread/SingleLock.h"

#include <new>

#include <unistd.h>

SyncEvent::SyncEvent(bool manualReset, int32_t initialState)
    : mutex(PTHREAD_MUTEX_INITIALIZER), bSignalled(initialState), bManualReset(manualReset) {}

SyncEvent::~SyncEvent() {
    pthread_mutex_destroy(&mutex);
}

void SyncEvent::SetEvent() {
    CSingleLock lock(&mutex);
    bSignalled = 1;
}

void SyncEvent::ResetEvent() {
    CSingleLock lock(&mutex);
    bSignalled = 0;
}

unsigned SyncEvent::Wait(unsigned timeoutMs) {
    if (!bSignalled) {
        if (timeoutMs == 0)
            return kWaitTimeout;
        const uint32_t start = MillisecondClock();
        while (!bSignalled) {
            if (timeoutMs <= MillisecondClock() - start)
                return kWaitTimeout;
            usleep(10000);
        }
    }
    if (!bManualReset)
        ResetEvent();
    return kWaitSignalled;
}

SyncEvent* SyncCreateEvent(void* /*attributes*/, unsigned manualReset, unsigned initialState,
                           const char* /*name*/) {
    return new (std::nothrow) SyncEvent(manualReset != 0, static_cast<int32_t>(initialState));
}

void SyncCloseEvent(SyncEvent* event) {
    delete event;
}
