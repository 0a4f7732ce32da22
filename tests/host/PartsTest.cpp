#include "host/convert/Amounts.h"
#include "host/convert/SpeedMeter.h"
#include "host/convert/WorkClock.h"
#include "host/presets/Notation.h"
#include "host/terminal/JsonReporter.h"
#include "host/terminal/TextReporter.h"

#include <gtest/gtest.h>

namespace {

using namespace movieconv;

TEST(Units, ReadTimes) {
    EXPECT_EQ(ParseTime("83.5"), 83.5);
    EXPECT_EQ(ParseTime("1:23.5"), 83.5);
    EXPECT_EQ(ParseTime("1:00:00"), 3600);
    EXPECT_EQ(ParseTime("90:00"), 5400);
    for (const char* text :
         {"", "-1", "1:60", "1:2:3:4", "1:-2", ":5", "1:", "5s", "nan", "1e3", "1.5:00", "1:75:00"}) {
        EXPECT_EQ(ParseTime(text), std::nullopt) << text;
    }
}

TEST(Units, ReadRatesSizesAndFrameRates) {
    EXPECT_EQ(ParseRate("512000"), 512000);
    EXPECT_EQ(ParseRate("1.5M"), 1'500'000);
    EXPECT_EQ(ParseRate("128k"), 128'000);
    for (const char* text : {"0", "-5k", "k", "5000M", "12q"})
        EXPECT_EQ(ParseRate(text), std::nullopt) << text;
    EXPECT_EQ(ParseSize("640x360")->height, 360);
    for (const char* text : {"640", "x360", "640x", "1x1", "640x360x2", "99999x2", "-4x4"})
        EXPECT_FALSE(ParseSize(text)) << text;
    EXPECT_DOUBLE_EQ(*ParseFrameRate("30000/1001"), 30000.0 / 1001);
    for (const char* text : {"0", "25/0", "1000", "/5", "a"})
        EXPECT_EQ(ParseFrameRate(text), std::nullopt) << text;
}

TEST(Units, WriteTimesAndSizes) {
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

TEST(ProgressText, FitsTheTerminalAndNeverRoundsUp) {
    Progress report;
    report.percent = 42.99;
    report.position = 61;
    report.length = 3600;
    report.speed = 3.5;
    report.left = 59.2;
    report.bytes = 1'234'567;
    const std::string text = ProgressText(report, 1000);
    EXPECT_EQ(text, " 42.9%  0:01:01 / 1:00:00   3.50x  left 0:01:00  1.2 MB");
    for (int columns = 10; columns < 60; ++columns)
        EXPECT_LT(ProgressText(report, columns).size(), static_cast<std::size_t>(columns));
    report.percent.reset();
    EXPECT_EQ(ProgressText(report, 1000).find('%'), std::string::npos);
    report.phase = Phase::kWaitingForRoom;
    EXPECT_NE(ProgressText(report, 1000).find("disk full, waiting"), std::string::npos);
}

TEST(JsonString, EscapesWhatJsonDoesNotTake) {
    EXPECT_EQ(JsonString("a\"b\\c\n\x01"), "\"a\\\"b\\\\c\\u000a\\u0001\"");
    EXPECT_EQ(JsonString("ф\xff"), "\"ф\xEF\xBF\xBD\"");
}

} // namespace
