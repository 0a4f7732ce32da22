#include "thread/TimeData.h"

TimeData GetTimeData(unsigned long ms) {
    const auto total = static_cast<uint32_t>(ms);
    const uint32_t secondsOfHour = total / 1000 % 3600;
    return {total / 3600000, secondsOfHour / 60, secondsOfHour % 60, total % 1000};
}
