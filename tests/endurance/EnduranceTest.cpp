// Many conversions in one process, ended at random moments in every way there is: nothing may pile up.
// MOVIECONV_ENDURANCE sets the number of rounds, two conversions each.
#include "api/MovieConv.h"
#include "tests/engine/IdleParts.h"
#include "tests/recorder/RecordingWriter.h"

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>
#include <random>
#include <thread>

#include <unistd.h>

namespace {

constexpr int kWarmUpRounds = 40;

int Rounds() {
    const char* asked = std::getenv("MOVIECONV_ENDURANCE");
    return asked ? std::max(std::atoi(asked), kWarmUpRounds + 1) : 150;
}

int64_t Entries(const char* folder) {
    const std::filesystem::directory_iterator entries(folder);
    return std::distance(begin(entries), end(entries));
}

/// Resident memory in bytes.
int64_t Memory() {
    std::ifstream statm("/proc/self/statm");
    int64_t total = 0;
    int64_t resident = 0;
    statm >> total >> resident;
    return resident * sysconf(_SC_PAGESIZE);
}

struct Usage {
    int64_t threads = Entries("/proc/self/task");
    int64_t descriptors = Entries("/proc/self/fd");
    int64_t memory = Memory();
};

void DropEvents() {
    EventRef event = nullptr;
    while (ReceiveNextEvent(0, nullptr, 0.0, true, &event) == noErr)
        ReleaseEvent(event);
}

struct Job {
    explicit Job(int kind)
        : video(kind == 1 ? 0 : 100000),
          audio(kind == 2 ? 0 : 200000),
          handle(MCCreate(kind == 1 ? nullptr : &video, kind == 2 ? nullptr : &audio)) {
        MCSetOutputFile(handle, L"out.mp4");
        MCSetSplitParam(handle, kind == 0, 1000);
    }
    ~Job() { MCDestroy(handle); }
    Job(const Job&) = delete;
    Job& operator=(const Job&) = delete;

    static unsigned Callback(void* context, unsigned kind, unsigned, uintptr_t) {
        if (kind == 1)
            ++static_cast<Job*>(context)->ends;
        return 1;
    }

    IdleVideo video;
    IdleAudio audio;
    MCHandle handle;
    std::atomic<int> ends{0};
};

enum Ending { kStop, kAbortAndWait, kPauseAndStop, kDestroy, kEndings };

void End(std::unique_ptr<Job>& job, int ending) {
    switch (ending) {
    case kAbortAndWait:
        MCAbort(job->handle);
        EXPECT_EQ(MCWait(job->handle, MC_INFINITE), 0);
        break;
    case kPauseAndStop:
        MCPause(job->handle);
        MCStop(job->handle);
        break;
    case kDestroy:
        job.reset();
        return;
    default:
        MCStop(job->handle);
        break;
    }
    EXPECT_EQ(job->ends, 1) << "one finished call for each conversion";
    job.reset();
}

void Round(std::mt19937& random) {
    std::unique_ptr<Job> jobs[2];
    for (auto& job : jobs) {
        job = std::make_unique<Job>(static_cast<int>(random() % 3));
        ASSERT_NE(job->handle, nullptr);
        ASSERT_EQ(MCStart(job->handle, 0.0, 0.0, nullptr, Job::Callback, job.get()), 0);
    }
    for (auto& job : jobs) {
        std::this_thread::sleep_for(std::chrono::microseconds(random() % 3000));
        End(job, static_cast<int>(random() % kEndings));
    }
    recorder::Reset();
    DropEvents();
}

TEST(EnduranceTest, NothingPilesUp) {
    std::mt19937 random(20);
    for (int i = 0; i < kWarmUpRounds; ++i)
        Round(random);
    const Usage before;
    for (int i = kWarmUpRounds; i < Rounds(); ++i)
        Round(random);
    const Usage after;
    EXPECT_LE(after.threads, before.threads);
    EXPECT_LE(after.descriptors, before.descriptors);
#if !defined(__SANITIZE_ADDRESS__) && !defined(__SANITIZE_THREAD__) // these keep freed memory
    EXPECT_LE(after.memory - before.memory, 24 << 20) << "bytes";
#endif
}

} // namespace
