#include "host/convert/Amounts.h"
#include "host/convert/SpeedMeter.h"
#include "host/convert/WorkClock.h"

#include <gtest/gtest.h>

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
    clock.Tick(at(501));
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

} // namespace
