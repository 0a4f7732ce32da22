// The three loops run while other threads pause, resume, query, toggle the preview and abort. What matters is
// that nothing hangs and that the thread sanitizer stays silent.
#include "tests/engine/ScriptedHost.h"

#include <gtest/gtest.h>

#include <thread>

namespace {

class BusyVideo : public VideoDecoder {
public:
    explicit BusyVideo(double duration) { info.format = {320, 240, 25.0, duration}; }
    VideoSourceInfo* GetVideoInfo() override { return &info; }
    double Seek(double, int) override { return 0.0; }
    VideoImage* GetCurrentImage() override { return &image; }
    int DecodeNext(int) override {
        image.llTime += kSecond / 25;
        return 1;
    }

private:
    VideoSourceInfo info{};
    VideoImage image{};
};

class BusyAudio : public AudioDecoder {
public:
    explicit BusyAudio(double duration) {
        info.format = {8000, 1, 8, 8000, duration};
        block.nLength = 80;
        block.pData = samples;
    }
    AudioSourceInfo* GetAudioInfo() override { return &info; }
    double Seek(double) override { return 0.0; }
    AudioFrame* GetNextFrame() override {
        block.llTime += kSecond / 100;
        return &block;
    }

private:
    AudioSourceInfo info{};
    AudioFrame block{};
    unsigned char samples[80] = {};
};

unsigned ReadRecord(void*, unsigned, unsigned, uintptr_t info) {
    if (const auto* record = reinterpret_cast<const ProgressInfo*>(info))
        return record->nProgress >= 0;
    return 1;
}

struct Loop {
    const char* name;
    double videoDuration, audioDuration;
};

class StressTest : public testing::TestWithParam<Loop> {};

TEST_P(StressTest, EverythingAtOnce) {
    BusyVideo video(GetParam().videoDuration);
    BusyAudio audio(GetParam().audioDuration);
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
                         testing::Values(Loop{"AudioVideo", 3600.0, 3600.0}, Loop{"Audio", 0.0, 3600.0},
                                         Loop{"Video", 3600.0, 0.0}),
                         [](const auto& info) { return info.param.name; });

// Stops of several threads run one after the other, and all return.
TEST(StopTest, SeveralThreadsStop) {
    BusyVideo video(3600.0);
    recorder::Reset();
    const MCHandle handle = MCCreate(&video, nullptr);
    for (int round = 0; round < 10; ++round) {
        ASSERT_EQ(MCStart(handle, 0.0, 0.0, nullptr, nullptr, nullptr), 0);
        std::thread threads[3];
        for (std::thread& thread : threads)
            thread = std::thread([=] {
                MCStop(handle);
                EXPECT_EQ(MCWait(handle, 0), 0);
            });
        for (std::thread& thread : threads)
            thread.join();
    }
    MCDestroy(handle);
}

} // namespace
