// The three loops run while other threads pause, resume, query, toggle the preview and abort. What matters is
// that nothing hangs and that the thread sanitizer stays silent.
#include "tests/engine/IdleParts.h"
#include "tests/engine/ScriptedHost.h"

#include <gtest/gtest.h>

#include <atomic>
#include <functional>
#include <thread>
#include <utility>
#include <vector>

namespace {

unsigned ReadRecord(void*, unsigned, unsigned, uintptr_t info) {
    if (const auto* record = reinterpret_cast<const ProgressInfo*>(info))
        return record->nProgress >= 0;
    return 1;
}

void Meddle(MCHandle handle, const std::atomic<bool>& done) {
    for (unsigned round = 0; !done; ++round) {
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

TEST(StressTest, EverythingAtOnce) {
    const std::pair<int64_t, int64_t> movies[] = {{kEndless, kEndless}, {0, kEndless}, {kEndless, 0}};
    for (const auto& [pictures, blocks] : movies) {
        SCOPED_TRACE(testing::Message() << pictures << " pictures, " << blocks << " blocks");
        IdleVideo video(pictures);
        IdleAudio audio(blocks);
        recorder::Reset();
        const MCHandle handle = MCCreate(&video, &audio);
        MCSetSplitParam(handle, 1, 5000);
        std::atomic<bool> done{false};
        std::vector<std::thread> threads;
        for (int i = 0; i < 3; ++i)
            threads.emplace_back(Meddle, handle, std::cref(done));
        for (int round = 0; round < 20; ++round) {
            ASSERT_EQ(MCStart(handle, 0.0, 0.0, nullptr, ReadRecord, nullptr), 0);
            std::this_thread::sleep_for(std::chrono::milliseconds(5));
            EXPECT_TRUE(round % 2 == 0 || MCAbort(handle) == 1);
            MCStop(handle);
            EXPECT_EQ(MCWait(handle, MC_INFINITE), 0);
            recorder::Reset();
        }
        done = true;
        for (std::thread& thread : threads)
            thread.join();
        MCDestroy(handle);
    }
}

} // namespace
