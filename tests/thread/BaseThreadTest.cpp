#include "thread/BaseThread.h"

#include <gtest/gtest.h>

#include <atomic>
#include <cerrno>
#include <memory>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include <unistd.h>

namespace {

std::atomic<bool> g_failCreation{false};
std::atomic<int> g_created{0};
std::atomic<int> g_joined{0};

} // namespace

extern "C" {
int __real_pthread_create(pthread_t*, const pthread_attr_t*, void* (*)(void*), void*);
int __real_pthread_join(pthread_t, void**);

// The linker lets the calls of the thread module end here.
int __wrap_pthread_create(pthread_t* thread, const pthread_attr_t* attributes, void* (*start)(void*),
                          void* arg) {
    if (g_failCreation)
        return EAGAIN;
    ++g_created;
    return __real_pthread_create(thread, attributes, start, arg);
}

int __wrap_pthread_join(pthread_t thread, void** result) {
    ++g_joined;
    return __real_pthread_join(thread, result);
}
}

namespace {

using Events = std::pair<bool, bool>; // whether stop and exit are set

/// A worker that runs until it is stopped, or returns at once.
class Worker : public BaseThread {
public:
    explicit Worker(bool returnsAtOnce = false) : atOnce(returnsAtOnce) {}
    ~Worker() {
        Abort();
        Wait(kWaitInfinite);
    }

    void Pause() {
        ++nPauseCount;
        SettleState();
    }

    using BaseThread::thread_func;

    int State() const { return nState; }
    Events SetEvents() const {
        return {hStopEvent->Wait(0) == kWaitSignalled, hExitEvent->Wait(0) == kWaitSignalled};
    }

    std::atomic<int> runs{0};

private:
    int svc() override {
        ++runs;
        while (!atOnce && !IsStopRequestedAfterPause())
            usleep(100);
        return 0;
    }

    bool atOnce;
};

class BaseThreadTest : public testing::Test {
protected:
    BaseThreadTest() {
        g_created = 0;
        g_joined = 0;
    }
    ~BaseThreadTest() override { EXPECT_EQ(g_created, g_joined) << "every worker is joined exactly once"; }
};

TEST_F(BaseThreadTest, RunsUntilItIsAborted) {
    Worker worker;
    EXPECT_EQ(worker.State(), kStateIdle);
    EXPECT_EQ(worker.SetEvents(), Events(true, true));
    EXPECT_EQ(worker.Abort(), 0);
    EXPECT_EQ(worker.Wait(kWaitInfinite), kWaitSignalled);
    ASSERT_EQ(worker.Start(), 1);
    EXPECT_EQ(worker.State(), kStateRunning);
    EXPECT_EQ(worker.SetEvents(), Events(false, false));
    EXPECT_EQ(worker.Start(), 0);
    EXPECT_EQ(worker.Wait(20), kWaitTimeout);
    EXPECT_EQ(g_joined, 0);
    EXPECT_EQ(worker.Abort(), 1);
    worker.Pause(); // too late: it must not keep the worker from ending
    EXPECT_NE(worker.State(), kStatePaused);
    EXPECT_EQ(worker.Wait(kWaitInfinite), kWaitSignalled);
    EXPECT_EQ(worker.State(), kStateFinished);
    EXPECT_EQ(worker.SetEvents(), Events(true, true));
    EXPECT_EQ(worker.Abort(), 0);
}

TEST_F(BaseThreadTest, ABodyThatReturnsAtOnceEndsAsFinished) {
    Worker worker(true);
    for (int start = 1; start <= 20; ++start) { // a finished worker may be started again, joined or not
        ASSERT_EQ(worker.Start(), 1);
        while (worker.State() != kStateFinished)
            usleep(1000);
        EXPECT_EQ(worker.SetEvents(), Events(false, true));
        EXPECT_EQ(worker.runs, start);
        if (start % 2 == 0) {
            EXPECT_EQ(worker.Wait(kWaitInfinite), kWaitSignalled);
        }
    }
}

TEST_F(BaseThreadTest, StartReportsAThreadThatCannotBeMade) {
    Worker worker;
    for (const int before : {kStateIdle, kStateFinished}) {
        g_failCreation = true;
        EXPECT_EQ(worker.Start(), 0);
        EXPECT_EQ(worker.State(), before);
        EXPECT_EQ(worker.SetEvents(), Events(true, true));
        g_failCreation = false;
        ASSERT_EQ(worker.Start(), 1);
        worker.Abort();
        worker.Wait(kWaitInfinite);
    }
}

TEST_F(BaseThreadTest, BeginThreadGivesAThreadToJoin) {
    unsigned threadId = 77;
    int value = 0;
    const std::unique_ptr<pthread_t> thread(_beginthreadex(
        nullptr, 1, [](void* arg) -> void* { return arg; }, &value, 4, &threadId));
    ASSERT_NE(thread, nullptr);
    void* result = nullptr;
    EXPECT_EQ(pthread_join(*thread, &result), 0);
    EXPECT_EQ(result, &value);
    EXPECT_EQ(threadId, 77U);
}

TEST_F(BaseThreadTest, TheDefaultBodyEndsWhenAskedAndLinesAreWritten) {
    EXPECT_EQ(Worker::thread_func(nullptr), nullptr);
    testing::internal::CaptureStdout();
    char address[32];
    {
        BaseThread worker; // polls without sleeping
        snprintf(address, sizeof address, "[0x%x]",
                 static_cast<unsigned>(reinterpret_cast<uintptr_t>(&worker)));
        worker.Wait(0); // nothing runs, nothing to tell
        EXPECT_EQ(worker.Start(), 1);
        EXPECT_EQ(worker.Wait(0), kWaitTimeout);
    }
    const std::string begin = std::string("ThreadEngine::ThreadEngine() ") + address + "...\r\n";
    const std::string wait = "ThreadEngine::Wait() ...\r\nThreadEngine::Wait() S_OK\r\n";
    const std::string end = std::string("ThreadEngine::~ThreadEngine() ") + address + "\r\n";
    const std::string lines = testing::internal::GetCapturedStdout();
    // The end waits too, unless the worker has seen the request by then.
    EXPECT_TRUE(lines == begin + wait + wait + end || lines == begin + wait + end) << lines;
}

TEST_F(BaseThreadTest, WhoeverWaitsReturnsOnlyAfterTheWorkerIsGone) {
    for (int round = 0; round < 100; ++round) {
        Worker worker;
        ASSERT_EQ(worker.Start(), 1);
        std::vector<std::thread> waiters;
        for (int i = 0; i < 3; ++i)
            waiters.emplace_back([&worker] {
                EXPECT_EQ(worker.Wait(kWaitInfinite), kWaitSignalled);
                EXPECT_EQ(worker.State(), kStateFinished);
            });
        EXPECT_EQ(worker.Abort(), 1);
        for (std::thread& waiter : waiters)
            waiter.join();
    }
}

} // namespace
