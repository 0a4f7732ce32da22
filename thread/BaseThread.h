// A worker thread with its state, its pause count and its two events.
#ifndef MOVIECONV_THREAD_BASETHREAD_H
#define MOVIECONV_THREAD_BASETHREAD_H

#include "thread/SyncEvent.h"

#include <atomic>
#include <cstdint>

#include <pthread.h>

enum ThreadState : int32_t { kStateIdle = 0, kStateRunning = 1, kStatePaused = 2, kStateFinished = 3 };

/// Owns at most one worker thread at a time, which runs `svc`.
///
/// Start and the destructor belong to one thread, the owner's; Abort and Wait may be called from several
/// threads at once, Wait not from the worker; svc runs on the worker. A derived class must stop its worker in
/// its own destructor: once that has run, the derived svc is gone.
class BaseThread {
public:
    BaseThread();
    ~BaseThread();
    BaseThread(const BaseThread&) = delete;
    BaseThread& operator=(const BaseThread&) = delete;

    /// Starts the worker. 1 when started; 0 when it already runs or no thread could be made.
    int Start();

    /// Asks the worker to stop and releases any pause. 1 when it was running or paused, else 0.
    int Abort();

    /// Waits for the worker's end and joins it. kWaitSignalled, also when nothing runs, or kWaitTimeout.
    unsigned Wait(unsigned timeoutMs);

    /// True on the worker itself, which nobody may wait for there.
    bool IsWorker() const;

protected:
    /// The worker's body; the result is not used. The default polls until it is told to stop.
    virtual int svc();

    static void* thread_func(void* arg);

    /// True while the worker runs or is paused.
    bool IsActive() const;

    /// True once the worker shall end.
    bool IsStopRequested() const;

    /// For the worker: sits out a pause, then tells as IsStopRequested whether to end.
    bool IsStopRequestedAfterPause() const;

    /// Brings the state of an active worker in line with the pause count and the stop request, after any
    /// change of them.
    void SettleState();

    /// Ends every pause.
    void ReleasePauses();

    pthread_t* hThread = nullptr; // guarded by joinMutex
    SyncEvent* hStopEvent = nullptr;
    SyncEvent* hExitEvent = nullptr;
    std::atomic<int32_t> nPauseCount{0};
    std::atomic<int32_t> nState{kStateIdle};

private:
    int32_t ActiveState() const;
    bool StartThread();
    void Join();

    // Held while the thread is made and while it is joined.
    pthread_mutex_t joinMutex = PTHREAD_MUTEX_INITIALIZER;
};

#pragma GCC visibility push(default)

/// Starts a thread that runs `start(arg)`. The heap-allocated handle is the caller's, who joins the thread
/// and deletes it; null when no thread could be made. `security`, `stackSize` and `initFlag` are not used,
/// `threadId` not written.
pthread_t* _beginthreadex(void* security, unsigned stackSize, void* (*start)(void*), void* arg,
                          unsigned initFlag, unsigned* threadId);

#pragma GCC visibility pop

#endif
