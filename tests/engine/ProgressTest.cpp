// What the records and the written blocks and pictures hold, and the pace of the news.
#include "tests/engine/ScriptedHost.h"

#include <gtest/gtest.h>

#include <cstring>

namespace {

uint32_t Milliseconds(const TimeData& t) {
    return ((t.nHours * 60 + t.nMinutes) * 60 + t.nSeconds) * 1000 + t.nMilliseconds;
}

struct Estimate {
    size_t record;
    uint32_t elapsed, remaining; // ms
    double speed;
};

void ExpectEstimates(const ScriptedHost& host, const std::vector<Estimate>& estimates) {
    for (const Estimate& expected : estimates) {
        SCOPED_TRACE(expected.record);
        ASSERT_LT(expected.record, host.records.size());
        const ProgressInfo& record = host.records[expected.record];
        EXPECT_EQ(Milliseconds(record.tElapsed), expected.elapsed);
        EXPECT_EQ(Milliseconds(record.tRemaining), expected.remaining);
        EXPECT_NEAR(record.dSpeed, expected.speed, 1e-9);
    }
}

// 100 pictures at 10 a second, 200 ms of work for each. Records come with pictures 1, 4, 7, ...; an estimate
// is made after 1 s, after 2 s, then every 2 s, and with each of the last pictures.
TEST(PaceTest, AudioVideoEstimates) {
    ScriptedHost host;
    host.SetMovie(100, 200);
    host.video.stepMs = 200;
    host.Convert();
    ExpectEstimates(host, {
                              {0, 200, 0, 0.0},      // picture 1
                              {1, 800, 0, 0.0},      // picture 4
                              {2, 1400, 19200, 0.5}, // picture 7: (100 - 4) pictures at 1000 ms for 5
                              {3, 2000, 18200, 0.5}, // picture 10: (100 - 9) at 1000 for 5
                              {4, 2600, 18200, 0.5},
                              {6, 3800, 18200, 0.5},
                              {7, 4400, 16200, 0.5}, // picture 22, estimated at 20: (100 - 19) at 2000 for 10
                          });
    ASSERT_EQ(host.records.size(), 35U); // 33 by the interval, one with the last picture, one at the end
    ExpectEstimates(host,
                    {{33, 19800, 400, 0.5}, {34, 20000, 0, 0.5}}); // picture 99: (100 - 98) at 200 for 1
}

// An estimate made with the very first pictures counts five of them.
TEST(PaceTest, FirstAudioVideoEstimateIsCautious) {
    ScriptedHost host;
    host.SetMovie(100, 1);
    host.video.stepMs = 1000;
    host.Convert();
    ExpectEstimates(host, {{0, 1000, 20000, 0.5}}); // 100 pictures at 1000 ms for 5
}

TEST(PaceTest, AudioVideoIntervalGrowsWithTheLength) {
    // pictures, then the numbers of the first, second and third picture that are told
    const int cases[][4] = {{10000, 1, 4, 7},    {22499, 1, 4, 7},    {30000, 1, 5, 9},
                            {300000, 1, 41, 81}, {337500, 1, 46, 91}, {400000, 1, 46, 91}};
    for (const auto& test : cases) {
        ScriptedHost host;
        host.SetMovie(100, 1);
        host.video.Format().dDuration = test[0] / 10.0;
        host.Convert();
        ASSERT_GE(host.records.size(), 3U);
        for (int i = 0; i < 3; ++i)
            EXPECT_EQ(host.records[static_cast<size_t>(i)].pPreviewImage->nDuration, test[i + 1]) << test[0];
    }
}

// 80 ms are enough, and the speed is looked at once a second.
TEST(PaceTest, VideoEstimates) {
    ScriptedHost host;
    host.hasAudio = false;
    host.SetMovie(41, 0);
    host.video.stepMs = 50;
    host.Convert();
    ASSERT_EQ(host.records.size(), 21U); // every second picture
    ExpectEstimates(host, {
                              {0, 100, 0, 0.0},
                              {8, 900, 0, 0.0},
                              {9, 1000, 1050, 2.0}, // (4.1 - 2.0) / 2
                              {18, 1900, 150, 2.0},
                              {20, 2050, 0, 2.0}, // the final one
                          });
}

TEST(PaceTest, AudioEstimates) {
    ScriptedHost host;
    host.hasVideo = false;
    host.SetMovie(0, 100);
    host.audio.stepMs = 100;
    host.Convert();
    // Block 1 brings too few samples; blocks 31, 61 and 91 bring more than 1000 each.
    ASSERT_EQ(host.records.size(), 4U);
    ExpectEstimates(host, {
                              {0, 3200, 7800, 0.5}, // estimated with block 21: (5.0 - 1.1) / 0.5
                              {1, 6200, 3800, 0.5}, // with this very block
                              {2, 9200, 1800, 0.5}, // with block 81
                              {3, 10100, 0, 0.5},   // the final one
                          });
}

struct SampleCase {
    int32_t bits, blockLength;
    size_t told; // of 62 blocks
};

// Every thirtieth block is told of when more than 1000 samples have come since the last time.
TEST(PaceTest, AudioIsPacedBySamples) {
    for (const SampleCase& test : {SampleCase{8, 34, 2}, SampleCase{8, 33, 1}, SampleCase{8, 31, 1},
                                   SampleCase{16, 68, 2}, SampleCase{16, 62, 1}, SampleCase{8, 501, 3},
                                   SampleCase{8, 500, 2}, SampleCase{7, 5000, 0}, SampleCase{0, 5000, 0}}) {
        ScriptedHost host;
        host.hasVideo = false;
        host.audio.stamps = Stamps(0, 1, 62);
        host.audio.blockLength = test.blockLength;
        host.audio.Format().nBitsPerSample = test.bits;
        host.Convert();
        EXPECT_EQ(host.records.size(), test.told + 1) << test.bits << " " << test.blockLength;
    }
}

TEST(RecordTest, PreviewMayBeSwitchedWhileRunning) {
    ScriptedHost host;
    host.SetMovie(10, 20);
    host.onCallback = [&](unsigned kind, const ProgressInfo* info) {
        const unsigned enable = info->pPreviewImage ? 0 : 2;
        const unsigned result = MCEnablePreview(host.handle, kind == 0 ? enable : 1);
        EXPECT_EQ(result, kind == 0 ? enable : 1);
    };
    host.Convert();
    ASSERT_EQ(host.records.size(), 5U); // pictures 1, 4, 7 and 9, and the end
    for (size_t i = 0; i < 4; ++i)
        EXPECT_EQ(host.records[i].pPreviewImage != nullptr, i % 2 == 0);
}

// Copies differ from the decoder's records by their stamps only, and both stamps of a picture move alike.
TEST(RecordTest, StampsAloneAreChanged) {
    ScriptedHost host;
    host.video.stamps = {3000000, 4000000};
    host.audio.stamps = {3200000, 3700000, 4200000};
    host.Convert();
    const auto pictures = recorder::Pictures();
    const auto sounds = recorder::Sounds();
    ASSERT_EQ(pictures.size(), 2U);
    ASSERT_EQ(sounds.size(), 3U);
    for (size_t i = 0; i < 2; ++i) {
        VideoImage expected = *host.video.Image(i);
        expected.llTime -= 3000000;
        expected.llTime2 -= 3000000;
        EXPECT_EQ(std::memcmp(&pictures[i], &expected, sizeof expected), 0);
    }
    for (size_t i = 0; i < 3; ++i) {
        AudioFrame expected = host.audio.Block(i);
        expected.llTime = expected.llTime2 = 200000 + static_cast<int64_t>(i) * 500000;
        EXPECT_EQ(std::memcmp(&sounds[i], &expected, sizeof expected), 0);
    }
}

TEST(RecordTest, SoundAloneIsHandedOnUnchanged) {
    ScriptedHost host;
    host.hasVideo = false;
    host.audio.stamps = {5, 5, -9};
    host.Convert();
    const auto sounds = recorder::Sounds();
    ASSERT_EQ(sounds.size(), 3U);
    for (size_t i = 0; i < 3; ++i) {
        const AudioFrame expected = host.audio.Block(i);
        EXPECT_EQ(std::memcmp(&sounds[i], &expected, sizeof expected), 0);
    }
}

TEST(RecordTest, ClipsOfPicturesMoveBothStamps) {
    ScriptedHost host;
    host.hasAudio = false;
    host.video.stamps = {1000, 2000, 5000};
    host.Split(0);
    host.Convert();
    const auto pictures = recorder::Pictures();
    ASSERT_EQ(pictures.size(), 3U);
    EXPECT_EQ(+pictures[0].llTime2, 1007);
    EXPECT_EQ(+pictures[1].llTime2, 1000);
    EXPECT_EQ(+pictures[2].llTime2, 3000);
    EXPECT_EQ(pictures[2].nDuration, 2);
}

TEST(RecordTest, SilenceIsOfTheOutputsFormat) {
    ScriptedHost host;
    host.video.stamps = Stamps(0, kSecond / 10, 2);
    host.audio.stamps = {};
    host.Change([](EncodeParam& param) {
        param.nSampleRate = 44100;
        param.nChannels = 3;
        param.nBitsPerSample = 24;
    });
    host.Convert();
    const auto sounds = recorder::Sounds();
    ASSERT_EQ(sounds.size(), 3U);
    AudioFrame expected{};
    expected.nType = 3;
    expected.nSampleRate = 44100;
    expected.nChannels = 3;
    expected.nBitsPerSample = 24;
    expected.pData = sounds[0].pData;
    expected.nBufferSize = 1048576;
    const int64_t steps[] = {400000, 400000, 200001};
    expected.llTime = expected.llTime2 = -1;
    for (size_t i = 0; i < 3; ++i) {
        expected.nLength = i < 2 ? 15876 : 7938;
        expected.nDuration = static_cast<int32_t>(steps[i]);
        EXPECT_EQ(std::memcmp(&sounds[i], &expected, sizeof expected), 0) << i;
        expected.llTime = expected.llTime2 += steps[i];
    }
}

} // namespace
