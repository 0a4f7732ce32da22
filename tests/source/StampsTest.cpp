#include "host/source/MediaTime.h"
#include "host/source/PacketTime.h"
#include "host/source/PictureRange.h"
#include "host/source/SoundTimeline.h"
#include "host/source/StampRepair.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <optional>
#include <vector>

namespace {

using movieconv::SoundTimeline;
using movieconv::StampRepair;

constexpr int64_t kStep = 400'000;
constexpr std::optional<int64_t> kNoStamp;

TEST(StampRepair, KeepsRisingStampsAndMendsTheOthers) {
    const struct {
        std::vector<std::optional<int64_t>> stamps;
        int repairs;
        std::vector<int64_t> times;
    } cases[] = {
        {{}, 0, {}},
        {{70}, 0, {70}},
        {{-5, 3, 4, 900'000'000}, 0, {-5, 3, 4, 900'000'000}},
        // A missing stamp is one step on, or between its neighbours.
        {{0, kNoStamp, kNoStamp}, 2, {0, kStep, 2 * kStep}},
        {{0, kNoStamp, 2 * kStep}, 1, {0, kStep, 2 * kStep}},
        {{0, kNoStamp, 100}, 1, {0, 50, 100}},
        {{kNoStamp, kStep * 3}, 1, {kStep * 2, kStep * 3}},
        // Equal and falling ones are lifted, and a single wild one is passed over.
        {{0, 0, 2 * kStep}, 1, {0, kStep, 2 * kStep}},
        {{5 * kStep, kStep, 0}, 2, {5 * kStep, 6 * kStep, 7 * kStep}},
        // Those that go on rising are caught up with.
        {{2 * kStep, kStep, 2 * kStep, 3 * kStep, 4 * kStep},
         2,
         {2 * kStep, 5 * kStep / 2, 11 * kStep / 4, 3 * kStep, 4 * kStep}},
        {{0, 900'000'000, 2 * kStep, 3 * kStep}, 1, {0, kStep, 2 * kStep, 3 * kStep}},
    };
    for (const auto& test : cases) {
        StampRepair repair(kStep);
        std::vector<int64_t> times;
        for (const auto& stamp : test.stamps)
            if (const auto settled = repair.Push(stamp))
                times.push_back(settled->time);
        if (const auto last = repair.Finish())
            times.push_back(last->time);
        EXPECT_EQ(times, test.times) << &test - cases;
        EXPECT_EQ(repair.Repaired(), test.repairs) << &test - cases;
    }
}

/// Pieces begin with parts and have to find the same ones as who reads from the start.
TEST(PictureStay, IsDividedAlikeFromEachOfItsParts) {
    constexpr int64_t kSecond = kTicksPerSecond;
    const std::vector<int64_t> changes{kSecond, kSecond + 1, kSecond * 2, kSecond * 3 - 1, kSecond * 4};
    const auto partsFrom = [&](int64_t begin, const StampRepair::Stamp& whole, int64_t end) {
        std::vector<int64_t> times;
        const StampRepair::Stamp fitted{begin, end - begin};
        for (movieconv::PictureStay stay(whole, fitted); !stay.IsOver();) {
            const auto next = std::upper_bound(changes.begin(), changes.end(), stay.Time());
            const StampRepair::Stamp part = stay.Take(next == changes.end() ? INT64_MAX : *next);
            times.push_back(part.time);
            EXPECT_GT(part.duration, 0);
        }
        return times;
    };
    constexpr int64_t kLeast = kSecond / 25;
    const StampRepair::Stamp whole{kSecond / 2, kSecond * 5 / 2};
    const int64_t end = whole.time + whole.duration;
    // One that is only just long enough to be a picture, and none of less than that at the end.
    const std::vector<int64_t> parts{whole.time, kSecond, kSecond + kLeast, 2 * kSecond};
    EXPECT_EQ(partsFrom(whole.time, whole, end), parts);
    for (std::size_t i = 1; i < parts.size(); ++i) {
        EXPECT_EQ(partsFrom(parts[i], whole, end),
                  std::vector(parts.begin() + static_cast<long>(i), parts.end()));
        EXPECT_EQ(partsFrom(whole.time, whole, parts[i]),
                  std::vector(parts.begin(), parts.begin() + static_cast<long>(i)));
    }
    const StampRepair::Stamp usual{kSecond * 2 - kLeast / 2, kLeast};
    EXPECT_EQ(partsFrom(usual.time, usual, usual.time + usual.duration), std::vector{usual.time});
}

TEST(PacketTime, StaysWithinWhatStampsCanTell) {
    const struct {
        int64_t pts, dts, duration, stamp, end;
    } cases[] = {
        {10, 5, 3, 10, 13},
        {AV_NOPTS_VALUE, 5, 3, 5, 8},
        {INT64_MAX - 1, 5, 3, INT64_MAX - 1, INT64_MAX},
    };
    for (const auto& test : cases) {
        AVPacket packet{};
        packet.pts = test.pts;
        packet.dts = test.dts;
        packet.duration = test.duration;
        EXPECT_EQ(movieconv::StampOf(packet), test.stamp);
        EXPECT_EQ(movieconv::EndStampOf(packet), test.end);
    }
}

TEST(StampRepair, GivesTheDistanceToTheNextPictureAsDuration) {
    StampRepair repair(kStep);
    EXPECT_FALSE(repair.Push(0));
    EXPECT_EQ(repair.Push(123)->duration, 123);
    EXPECT_EQ(repair.Finish()->duration, kStep);
}

TEST(StampRepair, TakesTheLastDurationAsItIsToldOfThatPicture) {
    for (const int64_t stamp : {123, 124}) {
        StampRepair repair(kStep);
        repair.Push(0);
        repair.Push(123);
        EXPECT_EQ(repair.Finish(StampRepair::Stamp{stamp, 77})->duration, stamp == 123 ? 77 : kStep);
    }
}

constexpr int kRate = 1000; // samples a second: a sample is a millisecond

int64_t Ms(int64_t milliseconds) {
    return milliseconds * (kTicksPerSecond / 1000);
}

void ExpectPlaced(const SoundTimeline::Placement& placement, int64_t silence, int64_t cut) {
    EXPECT_EQ(placement.silence, silence);
    EXPECT_EQ(placement.cut, cut);
}

TEST(SoundTimeline, BeginsAtTheSample) {
    SoundTimeline early(kRate, Ms(500));
    ExpectPlaced(early.Place(Ms(470), 20), 0, 20);
    ExpectPlaced(early.Place(Ms(490), 20), 0, 10);
    ExpectPlaced(early.Place(Ms(510), 20), 0, 0);
    EXPECT_EQ(early.Position(), 30);
    SoundTimeline late(kRate, Ms(500));
    ExpectPlaced(late.Place(Ms(503), 20), 3, 0);
    EXPECT_EQ(late.Corrections(), 0);
}

TEST(SoundTimeline, IgnoresRoundingAndMissingStamps) {
    SoundTimeline timeline(kRate, 0);
    ExpectPlaced(timeline.Place(0, 100), 0, 0);
    ExpectPlaced(timeline.Place(Ms(120), 100), 0, 0);
    ExpectPlaced(timeline.Place(std::nullopt, 100), 0, 0);
    ExpectPlaced(timeline.Place(Ms(280), 100), 0, 0);
    EXPECT_EQ(timeline.Position(), 400);
    EXPECT_EQ(timeline.Corrections(), 0);
}

TEST(SoundTimeline, FillsGapsAndCutsOverlaps) {
    SoundTimeline timeline(kRate, 0);
    timeline.Place(0, 100);
    ExpectPlaced(timeline.Place(Ms(300), 100), 200, 0);
    ExpectPlaced(timeline.Place(Ms(340), 100), 0, 60);
    EXPECT_EQ(timeline.Position(), 440);
    EXPECT_EQ(timeline.Corrections(), 2);
}

TEST(SoundTimeline, NeedsASecondWitnessForALargeGap) {
    SoundTimeline timeline(kRate, 0);
    timeline.Place(0, 100);
    EXPECT_FALSE(timeline.NeedsWitness(Ms(900)));
    EXPECT_TRUE(timeline.NeedsWitness(Ms(900'000)));
    ExpectPlaced(timeline.Place(Ms(900'000), 100, Ms(200)), 0, 0);
    ExpectPlaced(timeline.Place(Ms(200), 100), 0, 0);
    EXPECT_EQ(timeline.Position(), 300);
    ExpectPlaced(timeline.Place(Ms(8300), 100, Ms(8400)), 8000, 0);
    ExpectPlaced(timeline.Place(Ms(8400), 100), 0, 0);
    EXPECT_EQ(timeline.Position(), 8500);
}

TEST(SoundTimeline, BelievesAFarBeginningUnlessTheNextStampContradicts) {
    const struct {
        std::optional<int64_t> witness;
        int64_t silence;
    } cases[] = {{Ms(5100), 5000}, {std::nullopt, 5000}, {Ms(100), 0}, {Ms(400), 300}};
    for (const auto& test : cases) {
        SoundTimeline timeline(kRate, 0);
        EXPECT_TRUE(timeline.NeedsWitness(Ms(5000)));
        EXPECT_FALSE(timeline.NeedsWitness(Ms(-5000)));
        ExpectPlaced(timeline.Place(Ms(5000), 100, test.witness), test.silence, 0);
    }
}

} // namespace
