#include "platform/Platform.h"

#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <chrono>
#include <cstdint>
#include <limits>
#include <thread>
#include <vector>

namespace {

constexpr OSType kClass = 5000;
constexpr EventParamName kName = 0x5750414D;
constexpr EventParamType kType = 0x55494E54;

EventRef NewEvent(OSType eventClass, UInt32 kind) {
    EventRef event = nullptr;
    EXPECT_EQ(CreateEvent(nullptr, eventClass, kind, 0.0, 0, &event), noErr);
    return event;
}

OSStatus Post(EventRef event, EventPriority priority = kEventPriorityStandard) {
    return PostEventToQueue(GetMainEventQueue(), event, priority);
}

/// Posts a new event that only the queue owns.
void PostNew(UInt32 kind, EventPriority priority = kEventPriorityStandard, OSType eventClass = kClass) {
    const EventRef event = NewEvent(eventClass, kind);
    EXPECT_EQ(Post(event, priority), noErr);
    ReleaseEvent(event);
}

/// The kind of the next event, which is freed, or -1 when none waits.
int64_t NextKind(EventTimeout timeout = kEventDurationNoWait) {
    EventRef event = nullptr;
    if (ReceiveNextEvent(0, nullptr, timeout, 1, &event) != noErr)
        return -1;
    const UInt32 kind = GetEventKind(event);
    ReleaseEvent(event);
    return kind;
}

class EventQueue : public testing::Test {
protected:
    ~EventQueue() override {
        while (NextKind() >= 0) {
        }
    }
};

TEST_F(EventQueue, EventsCarryClassKindAndParameters) {
    const EventRef event = NewEvent(kClass, 7);
    EXPECT_EQ(GetEventClass(event), kClass);
    EXPECT_EQ(GetEventKind(event), 7U);

    const uint32_t values[] = {0x01020304, 0x05060708};
    EXPECT_EQ(SetEventParameter(event, kName, kType, sizeof values, values), noErr);
    EventParamType type = 0;
    ByteCount size = 0;
    std::array<uint32_t, 3> got{9, 9, 9};
    EXPECT_EQ(GetEventParameter(event, kName, kType, &type, sizeof got, &size, got.data()), noErr);
    EXPECT_EQ(type, kType);
    EXPECT_EQ(size, sizeof values);
    EXPECT_EQ(got, (std::array<uint32_t, 3>{0x01020304, 0x05060708, 9}));

    got = {9, 9, 9}; // a small buffer takes what fits
    EXPECT_EQ(GetEventParameter(event, kName, typeWildCard, nullptr, 4, &size, got.data()), noErr);
    EXPECT_EQ(size, sizeof values);
    EXPECT_EQ(got, (std::array<uint32_t, 3>{0x01020304, 9, 9}));

    // Set again: the new value and the new type take the place of the old ones.
    EXPECT_EQ(SetEventParameter(event, kName, kType + 1, 4, &values[1]), noErr);
    EXPECT_EQ(GetEventParameter(event, kName, kType, nullptr, 4, nullptr, got.data()), errAECoercionFail);
    EXPECT_EQ(GetEventParameter(event, kName, kType + 1, nullptr, 12, &size, got.data()), noErr);
    EXPECT_EQ(size, 4U);
    EXPECT_EQ(got[0], 0x05060708U);

    EXPECT_EQ(SetEventParameter(event, kName + 1, kType, 0, nullptr), noErr);
    EXPECT_EQ(GetEventParameter(event, kName + 1, kType, nullptr, 12, &size, got.data()), noErr);
    EXPECT_EQ(size, 0U);
    EXPECT_EQ(GetEventParameter(event, kName + 2, kType, nullptr, 12, &size, got.data()),
              eventParameterNotFoundErr);
    ReleaseEvent(event);
}

TEST_F(EventQueue, RefusesWhatMakesNoSense) {
    const EventRef event = NewEvent(kClass, 1);
    EventRef out = nullptr;
    EXPECT_EQ(CreateEvent(nullptr, kClass, 1, 0.0, 0, nullptr), paramErr);
    EXPECT_EQ(SetEventParameter(nullptr, kName, kType, 4, &out), paramErr);
    EXPECT_EQ(SetEventParameter(event, kName, kType, 4, nullptr), paramErr);
    EXPECT_EQ(SetEventParameter(event, kName, kType, std::numeric_limits<ByteCount>::max(), &out),
              memFullErr);
    EXPECT_EQ(GetEventParameter(nullptr, kName, kType, nullptr, 0, nullptr, nullptr), paramErr);
    EXPECT_EQ(PostEventToQueue(nullptr, event, kEventPriorityStandard), paramErr);
    EXPECT_EQ(Post(nullptr), paramErr);
    EXPECT_EQ(Post(event, -1), paramErr);
    EXPECT_EQ(Post(event, 3), paramErr);
    EXPECT_EQ(ReceiveNextEvent(0, nullptr, 0.0, 1, nullptr), paramErr);
    EXPECT_EQ(ReceiveNextEvent(1, nullptr, 0.0, 1, &out), paramErr);
    EXPECT_EQ(ReceiveNextEvent(0, nullptr, 0.0, 1, &out), eventLoopTimedOutErr);
    EXPECT_EQ(GetEventClass(nullptr), 0U);
    EXPECT_EQ(GetEventKind(nullptr), 0U);
    EXPECT_EQ(RetainEvent(nullptr), nullptr);
    ReleaseEvent(nullptr);
    ReleaseEvent(event);
}

TEST_F(EventQueue, IsFirstInFirstOutWithinAPriority) {
    PostNew(1, kEventPriorityLow);
    PostNew(2);
    PostNew(3, kEventPriorityHigh);
    PostNew(4, kEventPriorityLow);
    PostNew(5);
    PostNew(6, kEventPriorityHigh);
    for (const int64_t kind : {3, 6, 2, 5, 1, 4, -1})
        EXPECT_EQ(NextKind(), kind);
}

TEST_F(EventQueue, GivesOutOnlyTheTypesAskedFor) {
    PostNew(1, kEventPriorityHigh, kClass + 1);
    PostNew(2);
    PostNew(3);
    const EventTypeSpec wanted[] = {{kClass, 3}, {kClass + 1, 2}};
    EventRef event = nullptr;
    ASSERT_EQ(ReceiveNextEvent(2, wanted, kEventDurationNoWait, 1, &event), noErr);
    EXPECT_EQ(GetEventKind(event), 3U);
    ReleaseEvent(event);
    EXPECT_EQ(ReceiveNextEvent(2, wanted, kEventDurationNoWait, 1, &event), eventLoopTimedOutErr);
    EXPECT_EQ(event, nullptr);
    EXPECT_EQ(NextKind(), 1);
    EXPECT_EQ(NextKind(), 2);
}

TEST_F(EventQueue, LeavesAnEventThatIsNotPulled) {
    const EventRef event = NewEvent(kClass, 1);
    ASSERT_EQ(Post(event), noErr);
    EventRef seen = nullptr;
    EXPECT_EQ(ReceiveNextEvent(0, nullptr, kEventDurationNoWait, 0, &seen), noErr);
    EXPECT_EQ(seen, event);
    EXPECT_EQ(ReceiveNextEvent(0, nullptr, kEventDurationNoWait, 1, &seen), noErr);
    EXPECT_EQ(seen, event);
    ReleaseEvent(seen);
    EXPECT_EQ(NextKind(), -1);
    ReleaseEvent(event);
}

TEST_F(EventQueue, TakesAnEventOnceAtATime) {
    const EventRef event = NewEvent(kClass, 1);
    EXPECT_EQ(Post(event), noErr);
    EXPECT_EQ(Post(event, kEventPriorityHigh), eventAlreadyPostedErr);
    EXPECT_EQ(NextKind(), 1);
    EXPECT_EQ(Post(event), noErr);
    EXPECT_EQ(NextKind(), 1);
    EXPECT_EQ(NextKind(), -1);
    ReleaseEvent(event);
}

TEST_F(EventQueue, KeepsItsOwnReference) {
    PostNew(1); // the poster's reference is gone by now
    EventRef event = nullptr;
    ASSERT_EQ(ReceiveNextEvent(0, nullptr, kEventDurationNoWait, 1, &event), noErr);
    EXPECT_EQ(RetainEvent(event), event);
    ReleaseEvent(event);
    EXPECT_EQ(GetEventKind(event), 1U);
    ReleaseEvent(event);
}

TEST_F(EventQueue, RefusesMoreThanItHolds) {
    for (UInt32 kind = 0; kind < 16384; ++kind)
        PostNew(kind);
    const EventRef event = NewEvent(kClass, 99999);
    EXPECT_EQ(Post(event), eventQueueFullErr);
    EXPECT_EQ(NextKind(), 0);
    EXPECT_EQ(Post(event), noErr);
    EXPECT_EQ(Post(event), eventAlreadyPostedErr);
    ReleaseEvent(event);
}

TEST_F(EventQueue, WaitsNoLongerThanAsked) {
    const auto start = std::chrono::steady_clock::now();
    EXPECT_EQ(NextKind(0.05), -1);
    EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(50));
}

TEST_F(EventQueue, WakesAReceiverOfAnyPatience) {
    for (const EventTimeout timeout : {kEventDurationForever, 60.0, 1e300}) {
        std::thread poster([] {
            std::this_thread::sleep_for(std::chrono::milliseconds(5));
            PostNew(8, kEventPriorityStandard, kClass + 1); // not the one that is waited for
            PostNew(9);
        });
        const EventTypeSpec wanted{kClass, 9};
        EventRef event = nullptr;
        EXPECT_EQ(ReceiveNextEvent(1, &wanted, timeout, 1, &event), noErr);
        EXPECT_EQ(GetEventKind(event), 9U);
        ReleaseEvent(event);
        poster.join();
        EXPECT_EQ(NextKind(), 8);
    }
}

TEST_F(EventQueue, LosesNothingBetweenThreads) {
    constexpr UInt32 kPosters = 3;
    constexpr UInt32 kEvents = 400;
    std::vector<std::thread> threads;
    for (UInt32 poster = 0; poster < kPosters; ++poster)
        threads.emplace_back([poster] {
            for (UInt32 i = 0; i < kEvents; ++i)
                PostNew(poster << 16 | i);
        });

    std::atomic<UInt32> received{0};
    std::atomic<bool> inOrder{true};
    for (int receiver = 0; receiver < 2; ++receiver)
        threads.emplace_back([&] {
            std::array<int64_t, kPosters> last{-1, -1, -1};
            while (received < kPosters * kEvents) {
                const int64_t kind = NextKind(0.01);
                if (kind < 0)
                    continue;
                ++received;
                int64_t& previous = last[static_cast<std::size_t>(kind >> 16)];
                if ((kind & 0xFFFF) <= previous)
                    inOrder = false;
                previous = kind & 0xFFFF;
            }
        });
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_EQ(received, kPosters * kEvents);
    EXPECT_TRUE(inOrder);
    EXPECT_EQ(NextKind(), -1);
}

} // namespace
