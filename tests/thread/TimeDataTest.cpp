#include "thread/TimeData.h"

#include "thread/Clock.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>

#include <unistd.h>

namespace {

TEST(TimeData, Table) {
    struct {
        unsigned long ms;
        TimeData time;
    } const cases[] = {
        {59999, {0, 0, 59, 999}},    {60000, {0, 1, 0, 0}},
        {3599999, {0, 59, 59, 999}}, {3723456, {1, 2, 3, 456}},
        {90000000, {25, 0, 0, 0}},   {static_cast<unsigned long>(-1000), {1193, 2, 46, 296}},
    };
    for (const auto& [ms, time] : cases) {
        const TimeData got = GetTimeData(ms);
        EXPECT_EQ(std::memcmp(&got, &time, sizeof got), 0) << ms;
    }
}

TEST(Clock, GoesOnInStepsOfTenMilliseconds) {
    const uint32_t start = MillisecondClock();
    uint32_t now = start;
    while (now == start) {
        usleep(1000);
        now = MillisecondClock();
    }
    EXPECT_LT(now - start, 0x80000000U);
    EXPECT_EQ((now - start) % 10, 0U);
}

} // namespace
