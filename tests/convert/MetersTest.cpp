#include "host/convert/Amounts.h"
#include "host/convert/SizeForecast.h"
#include "host/convert/SpeedMeter.h"
#include "host/convert/WorkClock.h"

#include <gtest/gtest.h>

#include <cmath>

namespace {

using namespace movieconv;

TEST(Amounts, WriteTimesAndSizes) {
    EXPECT_EQ(FormatTime(3661.9996), "1:01:01");
    EXPECT_EQ(FormatTime(3661.9996, true), "1:01:02.000");
    EXPECT_EQ(FormatTime(-1), "0:00:00");
    EXPECT_EQ(FormatBytes(999), "999 B");
    EXPECT_EQ(FormatBytes(999'999), "1.0 MB");
}

TEST(WorkClock, LeavesPausesAndSuspensionOut) {
    const WorkClock::Time start{};
    const auto at = [&](int seconds) { return start + std::chrono::seconds(seconds); };
    WorkClock clock(start);
    clock.Tick(at(2));
    clock.Stand(at(3));
    clock.Tick(at(60));
    clock.Go(at(70));
    clock.Tick(at(71));
    clock.Skip(at(500));
    clock.TickAfterWait(at(501));
    clock.TickAfterWait(at(900));
    EXPECT_DOUBLE_EQ(clock.Seconds(), 5);
}

TEST(SpeedMeter, FollowsTheLastTenSeconds) {
    SpeedMeter meter;
    EXPECT_FALSE(meter.Speed());
    for (int i = 0; i <= 20; ++i)
        meter.Add(i, i);
    EXPECT_NEAR(*meter.Speed(), 1, 1e-9);
    for (int i = 1; i <= 11; ++i)
        meter.Add(20 + i, 20 + 4 * i);
    EXPECT_NEAR(*meter.Speed(), 4, 0.3);
    EXPECT_NEAR(*meter.Left(104), 10, 1);
    EXPECT_EQ(*meter.Left(1), 0);
}

/// Of 100 seconds, after so many of them were converted in steps of half a second.
std::optional<ByteRange> Foretell(double seconds, double rate(double position)) {
    SizeForecast forecast;
    double bytes = 5000; // the head
    for (int step = 0; step <= 2 * seconds; ++step) {
        const double position = step / 2.0;
        forecast.Add(position, static_cast<int64_t>(bytes));
        bytes += rate(position) / 2;
    }
    return forecast.Total(100);
}

TEST(SizeForecast, TakesNoWaitForALumpForAnEnd) {
    SizeForecast forecast;
    for (int step = 0; step <= 48; ++step) {
        const double position = step / 2.0;
        const double written = std::floor(position / 5) * 5; // seconds
        forecast.Add(position, static_cast<int64_t>(5000 + written * 1000));
        if (const auto range = forecast.Total(100)) {
            EXPECT_LE(range->least, 105'000) << position;
            EXPECT_GE(range->most, 105'000) << position;
        }
    }
    EXPECT_TRUE(forecast.Total(100));
}

TEST(SizeForecast, NarrowsDownToTheTruth) {
    const auto steady = [](double) { return 1000.0; };
    const auto moody = [](double position) { return static_cast<int>(position) % 8 < 4 ? 400.0 : 1600.0; };
    EXPECT_FALSE(Foretell(9.5, steady));
    for (const auto& [rate, truth] : {std::pair(+steady, 105'000), std::pair(+moody, 102'600)}) {
        int64_t width = 1'000'000;
        for (const double seconds : {10.0, 40.0, 80.0, 100.0}) {
            const auto range = Foretell(seconds, rate);
            ASSERT_TRUE(range) << seconds;
            EXPECT_LE(range->least, truth) << seconds;
            EXPECT_GE(range->most, truth) << seconds;
            EXPECT_LT(range->most - range->least, width) << seconds;
            width = range->most - range->least;
        }
    }
    const auto even = Foretell(40, steady);
    const auto uneven = Foretell(40, moody);
    EXPECT_LT((even->most - even->least) * 2, uneven->most - uneven->least);
    EXPECT_FALSE(Foretell(40, [](double) { return 0.0; })) << "nothing is written";
}

} // namespace
