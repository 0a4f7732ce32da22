// Starting, pausing and ending conversions, and which loop runs.
#include "tests/engine/ScriptedHost.h"

#include <gtest/gtest.h>

#include <thread>

namespace {

/// A movie that goes on until it is stopped.
class EndlessVideo : public ScriptedVideo {
public:
    VideoImage* GetCurrentImage() override { return &image; }
    int DecodeNext(int) override {
        image.llTime += kSecond / 10;
        ++pictures;
        return 1;
    }
    std::atomic<int> pictures{0};

private:
    VideoImage image{};
};

/// Waits until `condition` holds; a condition that never does ends in the test program's time limit.
template <class Condition>
void Await(Condition condition) {
    while (!condition())
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
}

class ControlTest : public testing::Test {
protected:
    ControlTest() { recorder::Reset(); }
    ~ControlTest() override { MCDestroy(handle); }

    void StartEndless() {
        video.Format().dDuration = 3600.0;
        handle = MCCreate(&video, nullptr);
        ASSERT_EQ(MCStart(handle, 0.0, 0.0, nullptr, nullptr, nullptr), 0);
        Await([&] { return video.pictures > 0; });
    }

    /// True when the worker stands still.
    bool Stands() {
        std::this_thread::sleep_for(std::chrono::milliseconds(50)); // for the iteration under way
        const int before = video.pictures;
        std::this_thread::sleep_for(std::chrono::milliseconds(30));
        return video.pictures == before;
    }

    void AwaitProgress() {
        const int before = video.pictures;
        Await([&] { return video.pictures > before; });
    }

    EndlessVideo video;
    MCHandle handle = nullptr;
};

TEST_F(ControlTest, PausesNest) {
    StartEndless();
    EXPECT_EQ(MCPause(handle), 1);
    EXPECT_EQ(MCPause(handle), 2);
    EXPECT_TRUE(Stands());
    EXPECT_EQ(MCResume(handle), 1);
    EXPECT_TRUE(Stands());
    EXPECT_EQ(MCResume(handle), 0);
    AwaitProgress();
    EXPECT_EQ(MCResume(handle), 0);
    AwaitProgress();
    EXPECT_EQ(MCPause(handle), 1);
    EXPECT_TRUE(Stands());
}

TEST_F(ControlTest, StopEndsAPausedConversion) {
    StartEndless();
    MCPause(handle);
    MCPause(handle);
    EXPECT_EQ(MCStop(handle), 0);
    EXPECT_EQ(MCWait(handle, 0), 0);
    EXPECT_EQ(MCPause(handle), 0);
    EXPECT_EQ(recorder::Trace().back(), "log Encoding thread Exit.");
    EXPECT_NE(TraceWithoutLog().find("close #1\nevent finished 1\n"), std::string::npos);
    EXPECT_EQ(TraceWithoutLog().find("event progress"), std::string::npos);
}

TEST_F(ControlTest, AbortDoesNotWait) {
    StartEndless();
    recorder::Block();
    recorder::WaitUntilBlocked();
    EXPECT_EQ(MCAbort(handle), 1);
    EXPECT_EQ(MCPause(handle), 0) << "a stop has been asked for";
    EXPECT_EQ(MCWait(handle, 0), MC_WAIT_TIMEOUT);
    EXPECT_EQ(MCSetSplitParam(handle, 1, 1000), 0);
    EXPECT_EQ(MCStart(handle, 0.0, 0.0, nullptr, nullptr, nullptr), 0) << "and changes nothing";
    recorder::Unblock();
    EXPECT_EQ(MCWait(handle, MC_INFINITE), 0);
    EXPECT_EQ(MCAbort(handle), 0);
    EXPECT_EQ(MCSetSplitParam(handle, 1, 1000), 1);
}

TEST_F(ControlTest, IdleConverterDoesNothing) {
    handle = MCCreate(&video, nullptr);
    EXPECT_EQ(MCPause(handle), 0);
    EXPECT_EQ(MCResume(handle), 0);
    EXPECT_EQ(MCAbort(handle), 0);
    EXPECT_EQ(MCStop(handle), 0);
    EXPECT_EQ(MCWait(handle, MC_INFINITE), 0);
    EXPECT_EQ(TraceWithoutLog(), "");
}

TEST_F(ControlTest, DestroyEndsTheConversion) {
    StartEndless();
    MCPause(handle);
    MCDestroy(handle);
    handle = nullptr;
    EXPECT_NE(TraceWithoutLog().find("event finished 1\n"), std::string::npos);
}

// Whatever the order in which a pause and a stop meet, the worker must not sleep on.
TEST_F(ControlTest, PauseNeverOutlivesAStop) {
    video.Format().dDuration = 3600.0;
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
        recorder::Reset();
    }
}

TEST(StartTest, CallbackMayAbort) {
    ScriptedHost host;
    host.video.stamps = Stamps(0, kSecond / 10, 10);
    host.audio.stamps = Stamps(0, kSecond / 20, 20);
    host.onCallback = [&](unsigned kind, const ProgressInfo*) {
        if (kind == 0) {
            EXPECT_EQ(MCAbort(host.handle), 1);
        }
    };
    const std::string trace = host.Convert();
    EXPECT_NE(trace.find("preview 1000000\nnext -> 1\nclose #1 with callback and context\nevent finished 1\n"
                         "finished 1 at 0.15 done 1\n"),
              std::string::npos)
        << trace;
}

// A stop is noticed before the end, when both come in one iteration.
TEST(StartTest, StopComesBeforeTheEnd) {
    ScriptedHost host;
    host.video.stamps = Stamps(0, kSecond / 10, 2);
    host.audio.stamps = {0};
    host.video.onNext = [&](size_t done) {
        if (done == 2)
            MCAbort(host.handle);
    };
    EXPECT_NE(host.Convert().find("event finished 1\n"), std::string::npos);
    recorder::Reset();
    ScriptedHost limited;
    limited.video.stamps = Stamps(0, kSecond / 10, 3);
    limited.audio.stamps = Stamps(0, kSecond / 20, 6);
    limited.video.onNext = [&](size_t) { MCAbort(limited.handle); };
    EXPECT_NE(limited.Convert(0.0, 0.01).find("event finished 1\n"), std::string::npos);
}

struct StartCase {
    double begin;
    double length;
    double converted; // what the record's total length must be
};

TEST(StartTest, LengthIsCutToTheSource) {
    for (const StartCase& test : {StartCase{10, 0, 50}, StartCase{10, 100, 50}, StartCase{10, 20, 20},
                                  StartCase{70, 0, -10}, StartCase{0, -5, 60}, StartCase{-2, 0, 62}}) {
        ScriptedHost host;
        host.video.stamps = {0};
        host.video.Format().dDuration = 30;
        host.audio.stamps = {0};
        host.audio.Format().dDuration = 60;
        double total = 0.0;
        host.onCallback = [&](unsigned, const ProgressInfo* info) { total = info->dTotalLength; };
        host.Convert(test.begin, test.length);
        EXPECT_EQ(total, test.converted) << test.begin << " " << test.length;
    }
}

// A picture source without a rate counts only by its sound.
TEST(StartTest, PicturesWithoutRateHaveNoLength) {
    ScriptedHost host;
    host.video.stamps = {0};
    host.video.Format() = {320, 240, 0.0, 100.0};
    host.audio.stamps = {0};
    host.audio.Format().dDuration = 2;
    double total = 0.0;
    host.onCallback = [&](unsigned, const ProgressInfo* info) { total = info->dTotalLength; };
    host.Convert();
    EXPECT_EQ(total, 2.0);
}

TEST(StartTest, LogsWhatItFinds) {
    ScriptedHost host;
    host.hasAudio = false;
    host.video.stamps = {0};
    host.video.Format().dDuration = 60.0;
    host.Convert(0.25, 20.0);
    EXPECT_EQ(LogLines(), "MovieConv::StartThread(): BeginTime[0.250s], Length[20.000s]\n"
                          "MovieConv::Without Audio Decoder.\n"
                          "MovieConv::StartThread(): ConvLength[20.000s]\n"
                          "MovieConv::Estimate DiskSpace...\n"
                          "MovieConv::EstimateDiskSpace() dLength: 60.000s\r\n\n"
                          "MovieConv::Estimate Space[4800000 Bytes];\n"
                          "MovieConv::Disk Free Space[4294967295 Bytes];\n"
                          "Encoding thread Starting .\n"
                          "Encoding thread Exit.\n");
}

TEST(StartTest, WarnsOfTooLittleSpaceAndGoesOn) {
    ScriptedHost host;
    host.video.stamps = {0};
    host.audio.stamps = {0};
    host.video.Format().dDuration = 36000.0;
    host.audio.Format().dDuration = 36000.0;
    host.Create();
    EncodeParam param;
    MCGetEncodeParam(host.handle, &param);
    param.nVideoBitrate = 2000000;
    MCSetEncodeParam(host.handle, &param);
    MCSetOutputFile(host.handle, L"/tmp/%s.mp4");
    EXPECT_NE(host.Convert().find("event finished 0\n"), std::string::npos);
    EXPECT_NE(LogLines().find("MovieConv::Estimate Space[9576000000 Bytes];\n"
                              "MovieConv::Disk Free Space[4294967295 Bytes];\n"
                              "Without enough Disk space to generate file[/tmp/%s.mp4].\r\n\n"
                              "Encoding thread Starting .\n"),
              std::string::npos)
        << LogLines();
}

TEST(StartTest, NoNameMeansNoSpace) {
    ScriptedHost host;
    host.video.stamps = {0};
    host.Create();
    MCSetOutputFile(host.handle, nullptr);
    host.Convert();
    EXPECT_NE(LogLines().find("MovieConv::Disk Free Space[0 Bytes];\n"
                              "Without enough Disk space to generate file[].\r\n"),
              std::string::npos);
    EXPECT_NE(TraceWithoutLog().find("create  320x240@10 1000/1 -> #1\n"), std::string::npos);
}

TEST(StartTest, RefusesASourceThatCannotBeOpened) {
    ScriptedHost host;
    host.video.opens = false;
    EXPECT_EQ(host.Start(0.0, 2.0), MC_CANNOT_OPEN_SOURCE);
    EXPECT_EQ(MCWait(host.handle, MC_INFINITE), 0);
    EXPECT_EQ(TraceWithoutLog(), "");
    EXPECT_EQ(LogLines(), "MovieConv::StartThread(): BeginTime[0.000s], Length[2.000s]\n"
                          "MovieConv::StartThread(): ConvLength[2.000s]\n"
                          "Failed to open file.\r\n\n");
}

// An empty decoder is forgotten for good, and the stream switched off.
TEST(DispatchTest, ForgetsAnEmptyVideoDecoder) {
    ScriptedHost host;
    host.hasAudio = false;
    host.video.Format().dDuration = 0.0005;
    EXPECT_EQ(host.Convert(), "event finished 3\nfinished 3 without record\n");
    EXPECT_NE(LogLines().find("MovieConv::Without audio decoder or zero length.\nEncoding thread Exit.\n"),
              std::string::npos);
    EncodeParam param;
    MCGetEncodeParam(host.handle, &param);
    EXPECT_EQ(param.bNoVideo, 1);
    EXPECT_EQ(param.bNoAudio, 0);

    recorder::Reset();
    EXPECT_EQ(host.Convert(5.0, 7.0), "finished 3 without record\n") << "there is no event for this";
    EXPECT_EQ(LogLines(), "MovieConv::StartThread(): BeginTime[5.000s], Length[7.000s]\n"
                          "MovieConv::Without Video Decoder.\n"
                          "MovieConv::Without Audio Decoder.\n"
                          "MovieConv::StartThread(): ConvLength[0.000s]\n"
                          "MovieConv::Estimate DiskSpace...\n"
                          "MovieConv::EstimateDiskSpace() dLength: 0.000s\r\n\n"
                          "MovieConv::Estimate Space[0 Bytes];\n"
                          "MovieConv::Disk Free Space[4294967295 Bytes];\n"
                          "Encoding thread Starting .\n"
                          "MovieConv::decoder is null\n"
                          "Encoding thread Exit.\n");
}

struct DispatchCase {
    const char* name;
    double videoDuration;
    double audioDuration;
    int noVideo;
    int noAudio;
    const char* created;
    bool keepsVideo; // for a later conversion
    bool keepsAudio;
};

TEST(DispatchTest, ChoosesTheLoopByTheStreams) {
    const DispatchCase cases[] = {
        {"both", 1, 1, 0, 0, "create out.mp4 320x240@10 1000/1 -> #1", true, true},
        {"sound switched off", 1, 1, 0, 1, "create out.mp4 320x240@10 - -> #1", true, true},
        {"pictures switched off", 1, 1, 1, 0, "create out.mp4 - 1000/1 -> #1", true, true},
        {"both switched off", 1, 1, 1, 1, "create out.mp4 - 1000/1 -> #1", true, true},
        {"empty sound", 1, 0.0009, 0, 0, "create out.mp4 320x240@10 - -> #1", true, false},
        {"empty sound switched off", 1, 0, 0, 1, "create out.mp4 320x240@10 - -> #1", true, false},
        {"empty pictures", 0.0009, 1, 0, 0, "create out.mp4 - 1000/1 -> #1", false, true},
        {"empty pictures switched off", 0, 1, 1, 0, "create out.mp4 - 1000/1 -> #1", false, true},
        {"just long enough", 0.001, 0.001, 0, 0, "create out.mp4 320x240@10 1000/1 -> #1", true, true},
    };
    for (const DispatchCase& test : cases) {
        SCOPED_TRACE(test.name);
        ScriptedHost host;
        host.video.stamps = {0};
        host.audio.stamps = {0};
        host.video.Format().dDuration = test.videoDuration;
        host.audio.Format().dDuration = test.audioDuration;
        host.Create();
        EncodeParam param;
        MCGetEncodeParam(host.handle, &param);
        param.bNoVideo = test.noVideo;
        param.bNoAudio = test.noAudio;
        MCSetEncodeParam(host.handle, &param);
        const std::string trace = host.Convert();
        EXPECT_EQ(trace.substr(0, trace.find('\n')), test.created);

        recorder::Reset();
        host.Convert();
        EXPECT_EQ(LogLines().find("Without Video Decoder") == std::string::npos, test.keepsVideo);
        EXPECT_EQ(LogLines().find("Without Audio Decoder") == std::string::npos, test.keepsAudio);
    }
}

/// Describes itself only so many times.
class ForgetfulVideo : public ScriptedVideo {
public:
    VideoSourceInfo* GetVideoInfo() override {
        return descriptions-- > 0 ? ScriptedVideo::GetVideoInfo() : nullptr;
    }
    int descriptions = 0;
};

// The one failure that comes without an event.
TEST(DispatchTest, TellsOfMissingPicturesByTheCallbackAlone) {
    recorder::Reset();
    ForgetfulVideo video;
    video.stamps = {0};
    video.descriptions = 1000;
    ScriptedHost host; // for its callback
    host.handle = MCCreate(&video, nullptr);
    EncodeParam param;
    MCGetEncodeParam(host.handle, &param);
    MCStart(host.handle, 0.0, 0.0, nullptr, ScriptedHost::Callback, &host);
    MCWait(host.handle, MC_INFINITE);
    const int usual = 1000 - video.descriptions;

    recorder::Reset();
    video.descriptions = usual - 2; // all but the constructor's and the loop's own
    MCStart(host.handle, 0.0, 0.0, nullptr, ScriptedHost::Callback, &host);
    MCWait(host.handle, MC_INFINITE);
    EXPECT_EQ(TraceWithoutLog(), "finished 3 without record\n");
    EXPECT_NE(LogLines().find("MovieConv::Without video decoder.\nEncoding thread Exit.\n"),
              std::string::npos);
}

} // namespace
