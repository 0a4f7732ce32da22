#include "thread/SyncEvent.h"

#include "thread/Clock.h"

#include <gtest/gtest.h>

#include <atomic>
#include <cstdint>
#include <memory>

namespace {

using EventPointer = std::unique_ptr<SyncEvent, decltype(&SyncCloseEvent)>;

EventPointer NewEvent(unsigned manualReset, unsigned initialState) {
    return {SyncCreateEvent(nullptr, manualReset, initialState, nullptr), SyncCloseEvent};
}

std::atomic<uint32_t> g_now;
std::atomic<uint32_t> g_readings;

/// Every reading of the clock finds that 10 ms have gone by.
uint32_t SteppingClock() {
    ++g_readings;
    return g_now.fetch_add(10);
}

TEST(SyncEvent, InitialAndManualStates) {
    struct {
        unsigned manualReset, initialState;
        unsigned first, second;
    } const cases[] = {
        {1, 0, kWaitTimeout, kWaitTimeout},     {1, 1, kWaitSignalled, kWaitSignalled},
        {1, 5, kWaitSignalled, kWaitSignalled}, {7, 1, kWaitSignalled, kWaitSignalled},
        {0, 0, kWaitTimeout, kWaitTimeout},     {0, 1, kWaitSignalled, kWaitTimeout},
    };
    for (const auto& row : cases) {
        const EventPointer event = NewEvent(row.manualReset, row.initialState);
        EXPECT_EQ(event->Wait(0), row.first) << row.manualReset << row.initialState;
        EXPECT_EQ(event->Wait(0), row.second) << row.manualReset << row.initialState;
    }
}

TEST(SyncEvent, SetAndReset) {
    const EventPointer manual = NewEvent(1, 0);
    manual->SetEvent();
    EXPECT_EQ(manual->Wait(0), kWaitSignalled);
    manual->ResetEvent();
    EXPECT_EQ(manual->Wait(0), kWaitTimeout);

    const EventPointer automatic = NewEvent(0, 0);
    automatic->SetEvent();
    automatic->SetEvent(); // set is set: the second adds nothing
    EXPECT_EQ(automatic->Wait(kWaitInfinite), kWaitSignalled);
    EXPECT_EQ(automatic->Wait(0), kWaitTimeout);

    SyncCloseEvent(nullptr);
}

TEST(SyncEvent, TimesOutOnceTheTimeHasGoneBy) {
    // The start is one reading; then one reading a look, each 10 ms later than the one before.
    // Without a time to wait, nothing is read.
    SetMillisecondClock(SteppingClock);
    for (const uint32_t start : {0U, 1000U, 0xFFFFFFF0U, 0x7FFFFFF6U}) {
        for (const uint32_t timeout : {0U, 1U, 10U, 50U, 55U}) {
            g_now = start;
            g_readings = 0;
            EXPECT_EQ(NewEvent(1, 0)->Wait(timeout), kWaitTimeout);
            EXPECT_EQ(g_readings, timeout == 0 ? 0 : 1 + (timeout + 9) / 10) << start << " " << timeout;
        }
    }
    SetMillisecondClock(nullptr);
}

} // namespace
