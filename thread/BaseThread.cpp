#include "thread/BaseThread.h"

#include <cstdio>
#include <memory>

#include <unistd.h>

pthread_t* _beginthreadex(void* /*security*/, unsigned /*stackSize*/, void* (*start)(void*), void* arg,
                          unsigned /*initFlag*/, unsigned* /*threadId*/) {
    auto handle = std::make_unique<pthread_t>();
    pthread_attr_t attributes;
    pthread_attr_init(&attributes);
    const int error = pthread_create(handle.get(), &attributes, start, arg);
    pthread_attr_destroy(&attributes);
    return error == 0 ? handle.release() : nullptr;
}

namespace {

/// What "%x" shows of an address: its low 32 bits.
unsigned LowAddress(const void* address) {
    return static_cast<unsigned>(reinterpret_cast<uintptr_t>(address));
}

} // namespace

BaseThread::BaseThread()
    : hThread(nullptr), hStopEvent(nullptr), hExitEvent(nullptr), nPauseCount(0), nState(kStateIdle) {
    printf("ThreadEngine::ThreadEngine() [0x%x]...\r\n", LowAddress(this));
    hStopEvent = SyncCreateEvent(nullptr, 1, 1, nullptr);
    hExitEvent = SyncCreateEvent(nullptr, 1, 1, nullptr);
}

BaseThread::~BaseThread() {
    Abort();
    Wait(kWaitInfinite);
    Join();
    nPauseCount = 0;
    nState = kStateIdle;
    printf("ThreadEngine::~ThreadEngine() [0x%x]\r\n", LowAddress(this));
    SyncCloseEvent(hStopEvent);
    SyncCloseEvent(hExitEvent);
    hStopEvent = nullptr;
    hExitEvent = nullptr;
}

bool BaseThread::IsActive() const {
    const int32_t state = nState;
    return state == kStateRunning || state == kStatePaused;
}

int BaseThread::Start() {
    int32_t previousState = nState;
    if (previousState == kStateRunning || previousState == kStatePaused)
        return 0;
    Join(); // a worker that ended without anybody waiting for it
    if (hStopEvent)
        hStopEvent->ResetEvent();
    if (hExitEvent)
        hExitEvent->ResetEvent();

    // Stored before the thread can run: a body that returns at once must find its "finished" left alone.
    const int32_t previousPauseCount = nPauseCount.exchange(0);
    nState = kStateRunning;
    pthread_t* thread = _beginthreadex(nullptr, 0, thread_func, this, 0, nullptr);
    if (!thread) {
        nPauseCount = previousPauseCount;
        nState = previousState;
        if (hStopEvent)
            hStopEvent->SetEvent();
        if (hExitEvent)
            hExitEvent->SetEvent();
        return 0;
    }
    hThread = thread;
    usleep(1000);
    return 1;
}

void* BaseThread::thread_func(void* arg) {
    if (!arg)
        return nullptr;
    auto* self = static_cast<BaseThread*>(arg);
    self->svc();
    if (self->hExitEvent)
        self->hExitEvent->SetEvent();
    self->nState = kStateFinished;
    return nullptr;
}

int BaseThread::svc() {
    for (;;) {
        while (nState == kStatePaused)
            usleep(10000);
        if (!hStopEvent || hStopEvent->Wait(0) == kWaitSignalled)
            return 0;
    }
}

int BaseThread::Abort() {
    if (!IsActive())
        return 0;
    if (hStopEvent)
        hStopEvent->SetEvent();
    ReleasePauses();
    return 1;
}

unsigned BaseThread::Wait(unsigned timeoutMs) {
    if (!IsActive())
        return kWaitSignalled;
    puts("ThreadEngine::Wait() ...\r");
    const unsigned result = hExitEvent ? hExitEvent->Wait(timeoutMs) : kWaitSignalled;
    if (result != kWaitTimeout)
        Join();
    puts("ThreadEngine::Wait() S_OK\r");
    return result;
}

void BaseThread::Join() {
    // Whoever takes the handle joins, so the worker is joined once in every order of calls.
    const std::unique_ptr<pthread_t> thread(hThread.exchange(nullptr));
    if (thread)
        pthread_join(*thread, nullptr);
}

void BaseThread::ReleasePauses() {
    nPauseCount = 0;
    SettleState();
}

void BaseThread::SettleState() {
    // The count decides between running and paused. A count that another thread changes meanwhile is looked at again, and
    // a worker that has finished keeps its state, since neither exchange expects it.
    int32_t count;
    do {
        count = nPauseCount;
        int32_t expected = count > 0 ? kStateRunning : kStatePaused;
        nState.compare_exchange_strong(expected, count > 0 ? kStatePaused : kStateRunning);
    } while (nPauseCount != count);
}
