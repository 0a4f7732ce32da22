// Many conversions in one process, two at a time, one of them paused, resumed and queried from another
// thread, and ended at random moments in every way there is: nothing may hang or pile up, and the thread
// sanitizer has to stay silent. MOVIECONV_ENDURANCE sets the number of rounds. Built twice: for the engine
// alone, over the recording writer, and for the whole with the real one.
#include "api/MovieConv.h"
#include "platform/Platform.h"
#include "tests/engine/IdleParts.h"
#include "tests/support/Folder.h"
#include "tests/support/Process.h"

#ifdef MOVIECONV_RECORDED
#include "tests/recorder/RecordingWriter.h"
#endif

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <memory>
#include <random>
#include <string>
#include <thread>

#include <malloc.h>

namespace {

constexpr int kWarmUpRounds = 40; // the writer remembers its last 64 files

/// Bytes: one or two more files that the writer remembers because they were open when others were forgotten,
/// and the threads' caches of small pieces, which count as in use.
constexpr int64_t kAllowance = 24 << 10;

int Rounds() {
    const char* asked = std::getenv("MOVIECONV_ENDURANCE");
    return asked ? std::max(std::atoi(asked), kWarmUpRounds + 1) : 150;
}

struct Usage {
    int64_t threads = CountThreads();
    int64_t descriptors = CountEntries("/proc/self/fd");
    int64_t memory = static_cast<int64_t>(mallinfo2().uordblks); ///< Bytes in use, of all threads together.
};

void DropEvents() {
    EventRef event = nullptr;
    while (ReceiveNextEvent(0, nullptr, 0.0, true, &event) == noErr)
        ReleaseEvent(event);
}

struct Job {
    Job(int kind, const std::wstring& file)
        : video(kind == 1 ? 0 : 100000),
          audio(kind == 2 ? 0 : 200000),
          handle(MCCreate(kind == 1 ? nullptr : &video, kind == 2 ? nullptr : &audio)) {
        MCSetOutputFile(handle, file.c_str());
        MCSetSplitParam(handle, kind == 0, 1000);
    }
    ~Job() {
        LeaveAlone();
        MCDestroy(handle);
    }

    void Meddle() {
        for (unsigned round = 0; !left; ++round) {
            MCPause(handle);
            MCPause(handle);
            MCResume(handle);
            MCResume(handle);
            MCEnablePreview(handle, round % 2);
            EncodeParam param;
            MCGetEncodeParam(handle, &param);
            MCGetEstimateDiskSpace(handle);
            wchar_t name[MC_MAX_TARGET_NAME];
            for (int i = MCGetTargetCount(handle) - 1; i >= 0 && i % 50 != 0; --i)
                EXPECT_EQ(MCGetTargetFileName(handle, name, i), 1);
            MCWait(handle, 0);
            std::this_thread::sleep_for(std::chrono::microseconds(200));
        }
    }

    /// No other thread uses the converter any more.
    void LeaveAlone() {
        left = true;
        if (meddler.joinable())
            meddler.join();
    }

    static unsigned Callback(void* context, unsigned kind, unsigned, uintptr_t info) {
        if (kind == 1)
            ++static_cast<Job*>(context)->ends;
        const auto* record = reinterpret_cast<const ProgressInfo*>(info);
        return !record || record->nProgress >= 0;
    }

    IdleVideo video;
    IdleAudio audio;
    MCHandle handle;
    std::atomic<int> ends{0};
    std::atomic<bool> left{false};
    std::thread meddler;
};

enum Ending { kStop, kAbortAndWait, kPauseAndStop, kDestroy, kEndings };

void End(std::unique_ptr<Job>& job, int ending) {
    if (ending == kAbortAndWait) {
        MCAbort(job->handle);
        EXPECT_EQ(MCWait(job->handle, MC_INFINITE), 0);
    }
    if (ending == kPauseAndStop)
        MCPause(job->handle);
    if (ending != kDestroy) {
        MCStop(job->handle);
        EXPECT_EQ(job->ends, 1) << "one finished call for each conversion";
    }
    job.reset();
}

void Round(std::mt19937& random, const std::wstring& folder) {
    std::unique_ptr<Job> jobs[2];
    for (auto& job : jobs) {
        const std::wstring file = folder + (&job == jobs ? L"/a.mp4" : L"/b.mp4");
        job = std::make_unique<Job>(static_cast<int>(random() % 3), file);
        ASSERT_NE(job->handle, nullptr);
        ASSERT_EQ(MCStart(job->handle, 0.0, 0.0, nullptr, Job::Callback, job.get()), 0);
    }
    jobs[0]->meddler = std::thread(&Job::Meddle, jobs[0].get());
    for (auto& job : jobs) {
        std::this_thread::sleep_for(std::chrono::microseconds(random() % 3000));
        End(job, static_cast<int>(random() % kEndings));
    }
    DropEvents();
#ifdef MOVIECONV_RECORDED
    recorder::Reset();
#endif
}

TEST(EnduranceTest, NothingPilesUp) {
    const Folder folder;
    const std::wstring path = std::filesystem::path(folder.Path()).wstring();
    std::mt19937 random(20);
    for (int i = 0; i < kWarmUpRounds; ++i)
        Round(random, path);
    const Usage before;
    for (int i = kWarmUpRounds; i < Rounds(); ++i)
        Round(random, path);
    const Usage after;
    EXPECT_LE(after.threads, before.threads);
    EXPECT_LE(after.descriptors, before.descriptors);
#ifndef MOVIECONV_SANITIZED // sanitizers keep freed memory
    EXPECT_LE(after.memory - before.memory, kAllowance) << "bytes";
#endif
}

} // namespace
