#include "thread/BaseThread.h"

#include "log/dyLog.h"
#include "thread/SingleLock.h"

#include <memory>
#include <new>
#include <utility>

#include <unistd.h>

pthread_t* _beginthreadex(void* /*security*/, unsigned /*stackSize*/, void* (*start)(void*), void* arg,
                          unsigned /*initFlag*/, unsigned* /*threadId*/) {
    std::unique_ptr<pthread_t> handle(new (std::nothrow) pthread_t);
    if (!handle)
        return nullptr;
    pthread_attr_t attributes;
    pthread_attr_init(&attributes);
    const int error = pthread_create(handle.get(), &attributes, start, arg);
    pthread_attr_destroy(&attributes);
    return error == 0 ? handle.release() : nullptr;
}

namespace {

/// Whose worker the calling thread is.
thread_local const BaseThread* t_worker = nullptr;

} // namespace

BaseThread::BaseThread() {
    dylog::Say(kLogDebug, "ThreadEngine::ThreadEngine() [0x%x]...\r\n", dylog::LowAddress(this));
    hStopEvent = SyncCreateEvent(nullptr, 1, 1, nullptr);
    hExitEvent = SyncCreateEvent(nullptr, 1, 1, nullptr);
}

BaseThread::~BaseThread() {
    Abort();
    Wait(kWaitInfinite);
    Join();
    nPauseCount = 0;
    nState = kStateIdle;
    dylog::Say(kLogDebug, "ThreadEngine::~ThreadEngine() [0x%x]\r\n", dylog::LowAddress(this));
    SyncCloseEvent(hStopEvent);
    SyncCloseEvent(hExitEvent);
    hStopEvent = nullptr;
    hExitEvent = nullptr;
    pthread_mutex_destroy(&joinMutex);
}

bool BaseThread::IsWorker() const {
    return t_worker == this;
}

bool BaseThread::IsActive() const {
    const int32_t state = nState;
    return state == kStateRunning || state == kStatePaused;
}

int BaseThread::Start() {
    if (IsActive())
        return 0;
    Join(); // a worker that ended without anybody waiting for it
    if (hStopEvent)
        hStopEvent->ResetEvent();
    if (hExitEvent)
        hExitEvent->ResetEvent();

    // Stored before the thread can run: a body that returns at once must find its "finished" left alone.
    const int32_t previousPauseCount = nPauseCount.exchange(0);
    const int32_t previousState = nState.exchange(kStateRunning);
    SettleState(); // another thread may have paused between the two
    if (!StartThread()) {
        nPauseCount = previousPauseCount;
        nState = previousState;
        if (hStopEvent)
            hStopEvent->SetEvent();
        if (hExitEvent)
            hExitEvent->SetEvent();
        return 0;
    }
    usleep(1000);
    return 1;
}

bool BaseThread::StartThread() {
    // Under the lock, so that who waits for a body that returns at once finds the thread to join.
    CSingleLock lock(&joinMutex);
    hThread = _beginthreadex(nullptr, 0, thread_func, this, 0, nullptr);
    return hThread != nullptr;
}

void* BaseThread::thread_func(void* arg) {
    if (!arg)
        return nullptr;
    auto* self = static_cast<BaseThread*>(arg);
    t_worker = self;
    self->svc();
    if (self->hExitEvent)
        self->hExitEvent->SetEvent();
    self->nState = kStateFinished;
    return nullptr;
}

int BaseThread::svc() {
    while (!IsStopRequestedAfterPause()) {
    }
    return 0;
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
    dylog::Say(kLogDebug, "ThreadEngine::Wait() ...\r\n");
    const unsigned result = hExitEvent ? hExitEvent->Wait(timeoutMs) : kWaitSignalled;
    if (result != kWaitTimeout)
        Join();
    dylog::Say(kLogDebug, "ThreadEngine::Wait() S_OK\r\n");
    return result;
}

void BaseThread::Join() {
    // Whoever comes second waits for the first, so that nobody returns from a wait before the worker is gone.
    CSingleLock lock(&joinMutex);
    const std::unique_ptr<pthread_t> thread(std::exchange(hThread, nullptr));
    if (thread)
        pthread_join(*thread, nullptr);
}

bool BaseThread::IsStopRequested() const {
    return !hStopEvent || hStopEvent->Wait(0) == kWaitSignalled;
}

bool BaseThread::IsStopRequestedAfterPause() const {
    while (nState == kStatePaused)
        usleep(10000);
    return IsStopRequested();
}

void BaseThread::ReleasePauses() {
    nPauseCount = 0;
    SettleState();
}

int32_t BaseThread::ActiveState() const {
    // A pause that comes after a stop request holds nothing up: the worker must get to see the request.
    return nPauseCount > 0 && !IsStopRequested() ? kStatePaused : kStateRunning;
}

void BaseThread::SettleState() {
    // What another thread changes meanwhile is looked at again, and a worker that has finished keeps its
    // state, since the exchange does not expect it.
    int32_t wanted;
    do {
        wanted = ActiveState();
        int32_t other = wanted == kStatePaused ? kStateRunning : kStatePaused;
        nState.compare_exchange_strong(other, wanted);
    } while (ActiveState() != wanted);
}
