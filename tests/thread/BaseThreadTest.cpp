#include "thread/BaseThread.h"

#include <gtest/gtest.h>

#include <atomic>
#include <cerrno>
#include <memory>
#include <string>
#include <thread>
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

    int State() const { return nState; }
    bool StopIsSet() const { return hStopEvent->Wait(0) == kWaitSignalled; }
    bool ExitIsSet() const { return hExitEvent->Wait(0) == kWaitSignalled; }

    std::atomic<int> runs{0};

private:
    int svc() override {
        ++runs;
        while (!atOnce && !IsStopRequested()) {
            usleep(100);
            while (nState == kStatePaused)
                usleep(100);
        }
        return 0;
    }

    bool atOnce;
};

class BaseThreadTest : public testing::Test {
protected:
    BaseThreadTest() {
        g_failCreation = false;
        g_created = 0;
        g_joined = 0;
        testing::internal::CaptureStdout();
    }
    ~BaseThreadTest() override {
        testing::internal::GetCapturedStdout();
        EXPECT_EQ(g_created, g_joined) << "every worker is joined exactly once";
    }

    static std::string Printed() {
        fflush(stdout);
        std::string text = testing::internal::GetCapturedStdout();
        testing::internal::CaptureStdout();
        return text;
    }
};

TEST_F(BaseThreadTest, RunsUntilItIsAborted) {
    Worker worker;
    EXPECT_EQ(worker.State(), kStateIdle);
    EXPECT_TRUE(worker.StopIsSet());
    EXPECT_TRUE(worker.ExitIsSet());
    EXPECT_EQ(worker.Abort(), 0);
    EXPECT_EQ(worker.Wait(kWaitInfinite), kWaitSignalled);
    ASSERT_EQ(worker.Start(), 1);
    EXPECT_EQ(worker.State(), kStateRunning);
    EXPECT_FALSE(worker.StopIsSet());
    EXPECT_FALSE(worker.ExitIsSet());
    EXPECT_EQ(worker.Start(), 0);
    EXPECT_EQ(worker.Wait(0), kWaitTimeout);
    EXPECT_EQ(worker.Wait(20), kWaitTimeout);
    EXPECT_EQ(g_joined, 0);
    EXPECT_EQ(worker.Abort(), 1);
    EXPECT_EQ(worker.Wait(kWaitInfinite), kWaitSignalled);
    EXPECT_EQ(worker.State(), kStateFinished);
    EXPECT_EQ(g_joined, 1);
    EXPECT_TRUE(worker.StopIsSet());
    EXPECT_TRUE(worker.ExitIsSet());
    EXPECT_EQ(worker.Abort(), 0);
    EXPECT_EQ(worker.runs, 1);
}

TEST_F(BaseThreadTest, ABodyThatReturnsAtOnceEndsAsFinished) {
    Worker worker(true);
    for (int start = 1; start <= 20; ++start) { // a finished worker may be started again, joined or not
        ASSERT_EQ(worker.Start(), 1);
        while (worker.State() != kStateFinished)
            usleep(1000);
        EXPECT_FALSE(worker.StopIsSet());
        EXPECT_EQ(worker.runs, start);
        if (start % 2 == 0) {
            EXPECT_EQ(worker.Wait(kWaitInfinite), kWaitSignalled);
        }
    }
}

TEST_F(BaseThreadTest, AStopReleasesEveryPause) {
    Worker worker;
    ASSERT_EQ(worker.Start(), 1);
    worker.Pause();
    worker.Pause();
    EXPECT_EQ(worker.State(), kStatePaused);
    EXPECT_EQ(worker.Start(), 0);
    EXPECT_EQ(worker.Abort(), 1);
    EXPECT_NE(worker.State(), kStatePaused);
    worker.Pause(); // too late: it must not keep the worker from ending
    EXPECT_NE(worker.State(), kStatePaused);
    EXPECT_EQ(worker.Wait(kWaitInfinite), kWaitSignalled);
    ASSERT_EQ(worker.Start(), 1);
    EXPECT_EQ(worker.State(), kStateRunning);
}

TEST_F(BaseThreadTest, StartReportsAThreadThatCannotBeMade) {
    Worker worker;
    for (const int before : {kStateIdle, kStateFinished}) {
        g_failCreation = true;
        EXPECT_EQ(worker.Start(), 0);
        EXPECT_EQ(worker.State(), before);
        EXPECT_TRUE(worker.StopIsSet());
        EXPECT_TRUE(worker.ExitIsSet());
        EXPECT_EQ(worker.Wait(kWaitInfinite), kWaitSignalled);
        g_failCreation = false;
        ASSERT_EQ(worker.Start(), 1);
        worker.Abort();
        worker.Wait(kWaitInfinite);
    }
}

TEST_F(BaseThreadTest, BeginThreadReturnsNullWhenThereIsNoThread) {
    g_failCreation = true;
    EXPECT_EQ(_beginthreadex(
                  nullptr, 0, [](void* arg) { return arg; }, nullptr, 0, nullptr),
              nullptr);
    g_failCreation = false;
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

/// Shows the entry and the default body, which polls without sleeping.
class DefaultBody : public BaseThread {
public:
    static void* Enter(void* arg) { return thread_func(arg); }
};

TEST_F(BaseThreadTest, TheDefaultBodyEndsWhenAsked) {
    EXPECT_EQ(DefaultBody::Enter(nullptr), nullptr);
    DefaultBody worker;
    ASSERT_EQ(worker.Start(), 1);
    EXPECT_EQ(worker.Wait(0), kWaitTimeout);
    EXPECT_EQ(worker.Abort(), 1);
    EXPECT_EQ(worker.Wait(kWaitInfinite), kWaitSignalled);
}

TEST_F(BaseThreadTest, PrintsItsLines) {
    Printed();
    {
        BaseThread worker;
        char address[32];
        snprintf(address, sizeof address, "[0x%x]",
                 static_cast<unsigned>(reinterpret_cast<uintptr_t>(&worker)));
        EXPECT_EQ(Printed(), "ThreadEngine::ThreadEngine() " + std::string(address) + "...\r\n");
        worker.Wait(0); // nothing runs, nothing to tell
        EXPECT_EQ(Printed(), "");
        worker.Start();
        worker.Wait(0);
        EXPECT_EQ(Printed(), "ThreadEngine::Wait() ...\r\nThreadEngine::Wait() S_OK\r\n");
    }
    const std::string end = Printed();
    EXPECT_EQ(
        end.rfind(
            "ThreadEngine::Wait() ...\r\nThreadEngine::Wait() S_OK\r\nThreadEngine::~ThreadEngine() [0x", 0),
        0U)
        << end;
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
