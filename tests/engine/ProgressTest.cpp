// What the records and the written blocks and pictures hold, and the pace of the news.
#include "tests/engine/ScriptedHost.h"

#include <gtest/gtest.h>

#include <iterator>
#include <utility>

namespace {

uint32_t Milliseconds(const TimeData& t) {
    return ((t.nHours * 60 + t.nMinutes) * 60 + t.nSeconds) * 1000 + t.nMilliseconds;
}

struct Estimate {
    size_t record;
    uint32_t elapsed, remaining; // ms
    double speed;
};

TEST(PaceTest, EstimatesComeAtTheirTimes) {
    struct Movie {
        const char* name;
        size_t pictures, blocks;
        uint32_t pictureMs, blockMs; // of work for each
        size_t records;
    };
    const std::pair<Movie, std::vector<Estimate>> cases[] = {
        // Records come with pictures 1, 4, 7, ..., with the last picture and at the end; an estimate is made
        // after 1 s, after 2 s, then every 2 s, and with each of the last pictures.
        {{"pictures and sound", 100, 200, 200, 0, 35},
         {{0, 200, 0, 0.0},      // picture 1
          {1, 800, 0, 0.0},      // picture 4
          {2, 1400, 19200, 0.5}, // picture 7: (100 - 4) pictures at 1000 ms for 5
          {3, 2000, 18200, 0.5}, // picture 10: (100 - 9) at 1000 for 5
          {4, 2600, 18200, 0.5},
          {6, 3800, 18200, 0.5},
          {7, 4400, 16200, 0.5}, // picture 22, estimated at 20: (100 - 19) at 2000 for 10
          {33, 19800, 400, 0.5}, // picture 99: (100 - 98) at 200 for 1
          {34, 20000, 0, 0.5}}},
        // An estimate made with the very first pictures counts five of them: 100 at 1000 ms for 5.
        {{"slow pictures and sound", 100, 1, 1000, 0, 35}, {{0, 1000, 20000, 0.5}}},
        // 80 ms are enough, and the speed is looked at once a second. Every second picture is told.
        {{"pictures", 41, 0, 50, 0, 21},
         {{0, 100, 0, 0.0},
          {8, 900, 0, 0.0},
          {9, 1000, 1050, 2.0}, // (4.1 - 2.0) / 2
          {18, 1900, 150, 2.0},
          {20, 2050, 0, 2.0}}},
        // Block 1 brings too few samples; blocks 31, 61 and 91 bring more than 1000 each.
        {{"sound", 0, 100, 0, 100, 4},
         {{0, 3200, 7800, 0.5}, // estimated with block 21: (5.0 - 1.1) / 0.5
          {1, 6200, 3800, 0.5}, // with this very block
          {2, 9200, 1800, 0.5}, // with block 81
          {3, 10100, 0, 0.5}}},
    };
    for (const auto& [movie, estimates] : cases) {
        ScriptedHost host;
        host.SetMovie(movie.pictures, movie.blocks);
        host.video.stepMs = movie.pictureMs;
        host.audio.stepMs = movie.blockMs;
        host.Convert();
        ASSERT_EQ(host.records.size(), movie.records) << movie.name;
        for (const Estimate& expected : estimates) {
            SCOPED_TRACE(testing::Message() << movie.name << ", record " << expected.record);
            const ProgressInfo& record = host.records.at(expected.record);
            EXPECT_EQ(Milliseconds(record.tElapsed), expected.elapsed);
            EXPECT_EQ(Milliseconds(record.tRemaining), expected.remaining);
            EXPECT_NEAR(record.dSpeed, expected.speed, 1e-9);
        }
    }
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

// Every thirtieth block is told of when more than 1000 samples have come since the last time.
TEST(PaceTest, AudioIsPacedBySamples) {
    const struct {
        int32_t bits, blockLength;
        size_t told; // of 62 blocks
    } cases[] = {{8, 34, 2},  {8, 33, 1},  {8, 31, 1},   {16, 68, 2}, {16, 62, 1},
                 {8, 501, 3}, {8, 500, 2}, {7, 5000, 0}, {0, 5000, 0}};
    for (const auto& test : cases) {
        ScriptedHost host;
        host.SetMovie(0, 62);
        host.audio.blockLength = test.blockLength;
        host.audio.Format().nBitsPerSample = test.bits;
        host.Convert();
        EXPECT_EQ(host.records.size(), test.told + 1) << test.bits << " " << test.blockLength;
    }
}

TEST(RecordTest, PreviewMayBeSwitchedWhileRunning) {
    ScriptedHost host;
    host.SetMovie(10, 20);
    host.onCallback = [&](unsigned, const ProgressInfo* info) {
        const unsigned enable = info->pPreviewImage ? 0 : 2;
        EXPECT_EQ(MCEnablePreview(host.handle, enable), enable);
    };
    host.Convert();
    ASSERT_EQ(host.records.size(), 5U); // pictures 1, 4, 7 and 9, and the end
    for (size_t i = 0; i < 4; ++i)
        EXPECT_EQ(host.records[i].pPreviewImage != nullptr, i % 2 == 0);
}

// The writer gets the decoder's records with other stamps, and those of sound alone as they are.
TEST(RecordTest, StampsAloneAreChanged) {
    using Stamped = std::vector<std::pair<int64_t, int64_t>>; // llTime2 and llTime of each
    const struct {
        const char* name;
        std::vector<int64_t> pictures, blocks;
        unsigned long clipMs;
        Stamped writtenPictures, writtenBlocks;
    } cases[] = {
        {"pictures and sound",
         {3000000, 4000000},
         {3200000, 3700000, 4200000},
         60000,
         {{7, 0}, {1000007, 1000000}},
         {{200000, 200000}, {700000, 700000}, {1200000, 1200000}}},
        {"pictures, a clip each", {1000, 2000, 5000}, {}, 0, {{1007, 1000}, {1000, 1000}, {3000, 3000}}, {}},
        {"sound", {}, {5, 5, -9}, 60000, {}, {{8, 5}, {8, 5}, {-6, -9}}},
    };
    for (const auto& test : cases) {
        SCOPED_TRACE(test.name);
        ScriptedHost host;
        host.hasVideo = !test.pictures.empty();
        host.hasAudio = !test.blocks.empty();
        host.video.stamps = test.pictures;
        host.audio.stamps = test.blocks;
        host.Split(test.clipMs);
        host.Convert();
        const recorder::Recording written = recorder::Recorded();
        ASSERT_EQ(written.pictures.size(), test.writtenPictures.size());
        ASSERT_EQ(written.sounds.size(), test.writtenBlocks.size());
        for (size_t i = 0; i < written.pictures.size(); ++i) {
            VideoImage expected = host.video.Image(i);
            expected.llTime2 = test.writtenPictures[i].first;
            expected.llTime = test.writtenPictures[i].second;
            EXPECT_TRUE(SameBytes(written.pictures[i], expected)) << i;
        }
        for (size_t i = 0; i < written.sounds.size(); ++i) {
            AudioFrame expected = host.audio.Block(i);
            expected.llTime2 = test.writtenBlocks[i].first;
            expected.llTime = test.writtenBlocks[i].second;
            EXPECT_TRUE(SameBytes(written.sounds[i], expected)) << i;
        }
    }
}

TEST(RecordTest, SilenceIsOfTheOutputsFormat) {
    ScriptedHost host;
    host.SetMovie(2, 0);
    host.audio.Format().dDuration = 1.0;
    host.Change([](EncodeParam& param) {
        param.nSampleRate = 44100;
        param.nChannels = 3;
        param.nBitsPerSample = 24;
    });
    host.Convert();
    const std::vector<AudioFrame> sounds = recorder::Recorded().sounds;
    const struct {
        int64_t time;
        int32_t length, duration;
    } blocks[] = {{-1, 15876, 400000}, {399999, 15876, 400000}, {799999, 7938, 200001}};
    ASSERT_EQ(sounds.size(), std::size(blocks));
    for (size_t i = 0; i < sounds.size(); ++i) {
        const auto& [time, length, duration] = blocks[i];
        const AudioFrame expected{3,       44100, 3,    24,   sounds[0].pData, length,
                                  1048576, {},    time, time, duration};
        EXPECT_TRUE(SameBytes(sounds[i], expected)) << i;
    }
}

} // namespace
