// Starting, pausing and ending conversions, and which loop runs.
#include "tests/engine/IdleParts.h"
#include "tests/engine/ScriptedHost.h"

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <string_view>
#include <thread>
#include <utility>

#include <unistd.h>

namespace {

std::atomic<int> g_naps{0}; // that were begun

/// Waits until the count has grown.
void AwaitOneMore(std::atomic<int>& count) {
    count.wait(count);
}

} // namespace

// Takes the place of the system's, in the engine too.
extern "C" __attribute__((visibility("default"))) int usleep(useconds_t microseconds) {
    ++g_naps;
    g_naps.notify_all();
    std::this_thread::sleep_for(std::chrono::microseconds(microseconds));
    return 0;
}

namespace {

// What is waited for in vain ends in the test program's time limit.
class ControlTest : public testing::Test {
protected:
    ControlTest() { Count(); }
    ~ControlTest() override { MCDestroy(handle); }

    /// Counts the pictures written, and forgets what is recorded of them.
    void Count() {
        recorder::Reset({.onWrite = [&] {
            ++pictures;
            pictures.notify_all();
        }});
    }

    /// Waits until the worker has sat out a part of a pause, in which it naps, without moving on.
    void AwaitStandstill() {
        for (int before = -1; before != pictures;) {
            before = pictures;
            AwaitOneMore(g_naps);
            AwaitOneMore(g_naps);
        }
    }

    /// Waits until the worker has moved on.
    void AwaitProgress() { AwaitOneMore(pictures); }

    IdleVideo video{kEndless};
    std::atomic<int> pictures{0};
    MCHandle handle = nullptr;
};

TEST_F(ControlTest, PausesNestAndEndWithTheConverter) {
    handle = MCCreate(&video, nullptr);
    EXPECT_EQ(MCPause(handle), 0) << "nothing runs yet";
    EXPECT_EQ(MCResume(handle), 0);
    EXPECT_EQ(MCAbort(handle), 0);
    EXPECT_EQ(MCWait(handle, MC_INFINITE), 0);
    ASSERT_EQ(MCStart(handle, 0.0, 0.0, nullptr, nullptr, nullptr), 0);
    AwaitProgress();
    EXPECT_EQ(MCPause(handle), 1);
    EXPECT_EQ(MCPause(handle), 2);
    AwaitStandstill();
    EXPECT_EQ(MCResume(handle), 1);
    AwaitStandstill();
    EXPECT_EQ(MCResume(handle), 0);
    AwaitProgress();
    EXPECT_EQ(MCResume(handle), 0);
    AwaitProgress();
    EXPECT_EQ(MCPause(handle), 1);
    AwaitStandstill();
    MCDestroy(std::exchange(handle, nullptr));
    EXPECT_NE(Trace(Part::kWithoutLog).find("event finished 1\n"), std::string::npos);
}

// Whatever the order in which a pause and a stop meet, the worker must not sleep on.
TEST_F(ControlTest, PauseNeverOutlivesAStop) {
    handle = MCCreate(&video, nullptr);
    for (int round = 0; round < 30; ++round) {
        ASSERT_EQ(MCStart(handle, 0.0, 0.0, nullptr, nullptr, nullptr), 0);
        std::atomic<bool> stopped{false};
        std::thread pauser([&] {
            while (!stopped)
                MCPause(handle);
        });
        MCStop(handle);
        stopped = true;
        pauser.join();
        ASSERT_EQ(MCWait(handle, 0), 0);
        Count();
    }
    ASSERT_EQ(MCStart(handle, 0.0, 0.0, nullptr, nullptr, nullptr), 0);
    AwaitProgress(); // nor keep the next one from running
}

TEST(StartTest, LengthIsCutToTheSource) {
    const struct {
        double rate, video, audio; // of the sources: pictures a second and seconds
        double begin, length;
        double converted; // what the record's total length must be
    } cases[] = {
        {10, 30, 60, 10, 0, 50},  {10, 30, 60, 10, 100, 50}, {10, 30, 60, 10, 20, 20},
        {10, 30, 60, 70, 0, -10}, {10, 30, 60, 0, -5, 60},   {10, 30, 60, -2, 0, 62},
        {10, 100, 2, 0, 0, 100},  {0, 100, 2, 0, 0, 2}, // pictures without a rate do not count
    };
    for (const auto& test : cases) {
        ScriptedHost host;
        host.video.stamps = host.audio.stamps = {0};
        host.video.Format() = {320, 240, test.rate, test.video};
        host.audio.Format().dDuration = test.audio;
        host.Convert(test.begin, test.length);
        EXPECT_EQ(+host.records.back().dTotalLength, test.converted) << &test - cases;
    }
}

TEST(DispatchTest, ChoosesTheLoopByTheStreams) {
    const struct {
        const char* name;
        double videoDuration, audioDuration;
        int noVideo, noAudio;
        const char* formats;
        long long estimate;                        // bytes
        bool keepsVideo = true, keepsAudio = true; // for a later conversion
    } cases[] = {
        {"both", 1, 2, 0, 0, "320x240@10 1000/1", 160000},
        {"sound switched off", 1, 2, 0, 1, "320x240@10 -", 64000},
        {"pictures switched off", 2, 1, 1, 0, "- 1000/1", 16000},
        {"both switched off", 1, 1, 1, 1, "- 1000/1", 0},
        {"empty sound", 1, 0.0009, 0, 0, "320x240@10 -", 80000, true, false},
        {"empty sound switched off", 1, 0, 0, 1, "320x240@10 -", 64000, true, false},
        {"empty pictures", 0.0009, 1, 0, 0, "- 1000/1", 80000, false, true},
        {"empty pictures switched off", 0, 1, 1, 0, "- 1000/1", 16000, false, true},
        {"just long enough", 0.001, 0.001, 0, 0, "320x240@10 1000/1", 80},
    };
    for (const auto& test : cases) {
        SCOPED_TRACE(test.name);
        ScriptedHost host;
        host.video.stamps = host.audio.stamps = {0};
        host.video.Format().dDuration = test.videoDuration;
        host.audio.Format().dDuration = test.audioDuration;
        host.Change([&](EncodeParam& param) {
            param.nWidth = 99;
            param.bNoVideo = test.noVideo;
            param.bNoAudio = test.noAudio;
        });
        EXPECT_EQ(MCGetEstimateDiskSpace(host.handle), test.estimate);
        const std::string trace = host.Convert();
        EXPECT_EQ(trace.substr(0, trace.find('\n')),
                  std::string("create out.mp4 ") + test.formats + " -> #1");

        const EncodeParam param = recorder::Recorded().params.at(0);
        EXPECT_EQ(param.nWidth, 99);
        EXPECT_EQ(param.bNoVideo, test.formats[0] == '-');
        EXPECT_EQ(param.bNoAudio, test.noAudio || std::string_view(test.formats).back() == '-');

        recorder::Reset();
        host.Convert();
        EXPECT_EQ(Trace(Part::kLog).find("Without Video Decoder") == std::string::npos, test.keepsVideo);
        EXPECT_EQ(Trace(Part::kLog).find("Without Audio Decoder") == std::string::npos, test.keepsAudio);
    }
}

TEST(CallbackTest, WaitingForItsOwnThreadIsRefused) {
    ScriptedHost host;
    host.SetMovie(2, 4);
    host.onCallback = [&host](unsigned kind, const ProgressInfo*) {
        if (kind == 0 && host.records.size() == 1) {
            EXPECT_EQ(MCStop(host.handle), 0);
            EXPECT_EQ(MCWait(host.handle, MC_INFINITE), MC_WAIT_TIMEOUT);
            MCDestroy(host.handle);
        }
    };
    EXPECT_NE(host.Convert().find("finished 0"), std::string::npos) << "the conversion went on to its end";
    const std::string log = Trace(Part::kLog);
    for (const char* function : {"MCStop", "MCWait", "MCDestroy"})
        EXPECT_NE(log.find(std::string("MovieConv::") + function + " is refused"), std::string::npos) << log;
}

TEST(EventTest, NoneIsPostedForAHostThatWantsNone) {
    ScriptedHost host;
    host.SetMovie(2, 4);
    host.Create();
    EXPECT_EQ(MCEnableEvents(host.handle, 0), 0U);
    const std::string trace = host.Convert();
    EXPECT_EQ(trace.find("event"), std::string::npos) << trace;
    EXPECT_NE(trace.find("finished 0"), std::string::npos) << trace;
    EXPECT_EQ(MCEnableEvents(host.handle, 7), 7U);
}

} // namespace
