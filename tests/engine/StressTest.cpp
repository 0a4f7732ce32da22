// The three loops run while other threads pause, resume, query, toggle the preview and abort. What matters is
// that nothing hangs and that the thread sanitizer stays silent.
#include "tests/engine/IdleParts.h"
#include "tests/engine/ScriptedHost.h"

#include <gtest/gtest.h>

#include <thread>

namespace {

unsigned ReadRecord(void*, unsigned, unsigned, uintptr_t info) {
    if (const auto* record = reinterpret_cast<const ProgressInfo*>(info))
        return record->nProgress >= 0;
    return 1;
}

struct Loop {
    const char* name;
    int64_t pictures, blocks;
};

class StressTest : public testing::TestWithParam<Loop> {};

TEST_P(StressTest, EverythingAtOnce) {
    IdleVideo video(GetParam().pictures);
    IdleAudio audio(GetParam().blocks);
    recorder::Reset();
    const MCHandle handle = MCCreate(&video, &audio);
    MCSetOutputFile(handle, L"out.mp4");
    MCSetSplitParam(handle, 1, 5000);

    std::atomic<bool> done{false};
    const auto again = [&](auto operation) {
        return std::thread([&done, operation]() mutable {
            while (!done) {
                operation();
                std::this_thread::sleep_for(std::chrono::microseconds(200));
            }
        });
    };
    std::thread threads[] = {
        again([=] {
            MCPause(handle);
            MCPause(handle);
            MCResume(handle);
            MCResume(handle);
        }),
        again([=, on = 0U]() mutable {
            MCEnablePreview(handle, ++on % 2);
            MCResume(handle);
        }),
        again([=] {
            EncodeParam param;
            MCGetEncodeParam(handle, &param);
            MCGetEstimateDiskSpace(handle);
            wchar_t name[MC_MAX_TARGET_NAME];
            for (int i = MCGetTargetCount(handle) - 1; i >= 0 && i % 50 != 0; --i)
                EXPECT_EQ(MCGetTargetFileName(handle, name, i), 1);
            MCWait(handle, 0);
        }),
    };
    for (int round = 0; round < 20; ++round) {
        ASSERT_EQ(MCStart(handle, 0.0, 0.0, nullptr, ReadRecord, nullptr), 0);
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
        if (round % 2 == 0) {
            EXPECT_EQ(MCAbort(handle), 1);
        }
        MCStop(handle);
        EXPECT_EQ(MCWait(handle, MC_INFINITE), 0);
        recorder::Reset();
    }
    done = true;
    for (std::thread& thread : threads)
        thread.join();
    MCDestroy(handle);
}

INSTANTIATE_TEST_SUITE_P(Loops, StressTest,
                         testing::Values(Loop{"AudioVideo", kEndless, kEndless}, Loop{"Audio", 0, kEndless},
                                         Loop{"Video", kEndless, 0}),
                         [](const auto& info) { return info.param.name; });

} // namespace
