#include "platform/Platform.h"

#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <chrono>
#include <cstdint>
#include <limits>
#include <memory>
#include <thread>
#include <vector>

namespace {

constexpr OSType kClass = 5000;
constexpr EventParamName kName = 0x5750414D;
constexpr EventParamType kType = 0x55494E54;

using Event = std::unique_ptr<OpaqueEventRef, decltype(&ReleaseEvent)>;

Event NewEvent(OSType eventClass, UInt32 kind) {
    EventRef event = nullptr;
    EXPECT_EQ(CreateEvent(nullptr, eventClass, kind, 0.0, 0, &event), noErr);
    return {event, ReleaseEvent};
}

OSStatus Post(const Event& event, EventPriority priority = kEventPriorityStandard) {
    return PostEventToQueue(GetMainEventQueue(), event.get(), priority);
}

/// Posts a new event that only the queue owns.
void PostNew(UInt32 kind, EventPriority priority = kEventPriorityStandard, OSType eventClass = kClass) {
    EXPECT_EQ(Post(NewEvent(eventClass, kind), priority), noErr);
}

/// The next event of the types that are wanted, of any if there are none; null when none waits.
Event Receive(const std::vector<EventTypeSpec>& wanted = {}, EventTimeout timeout = kEventDurationNoWait) {
    EventRef event = nullptr;
    const OSStatus status = ReceiveNextEvent(wanted.size(), wanted.data(), timeout, 1, &event);
    EXPECT_EQ(status, event ? noErr : eventLoopTimedOutErr);
    return {event, ReleaseEvent};
}

/// The kind of the next event, or -1 when none waits.
int64_t NextKind(EventTimeout timeout = kEventDurationNoWait) {
    const Event event = Receive({}, timeout);
    return event ? int64_t{GetEventKind(event.get())} : -1;
}

TEST(EventQueue, EventsCarryClassKindAndParameters) {
    const Event owner = NewEvent(kClass, 7);
    const EventRef event = owner.get();
    EXPECT_EQ(GetEventClass(event), kClass);
    EXPECT_EQ(GetEventKind(event), 7U);
    EXPECT_EQ(RetainEvent(event), event);
    ReleaseEvent(event);

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
}

TEST(EventQueue, RefusesWhatMakesNoSense) {
    const Event owner = NewEvent(kClass, 1);
    const EventRef event = owner.get();
    EventRef out = nullptr;
    EXPECT_EQ(CreateEvent(nullptr, kClass, 1, 0.0, 0, nullptr), paramErr);
    EXPECT_EQ(SetEventParameter(nullptr, kName, kType, 4, &out), paramErr);
    EXPECT_EQ(SetEventParameter(event, kName, kType, 4, nullptr), paramErr);
    EXPECT_EQ(SetEventParameter(event, kName, kType, std::numeric_limits<ByteCount>::max(), &out),
              memFullErr);
    EXPECT_EQ(GetEventParameter(nullptr, kName, kType, nullptr, 0, nullptr, nullptr), paramErr);
    EXPECT_EQ(PostEventToQueue(nullptr, event, kEventPriorityStandard), paramErr);
    EXPECT_EQ(Post({nullptr, ReleaseEvent}), paramErr);
    EXPECT_EQ(Post(owner, -1), paramErr);
    EXPECT_EQ(Post(owner, 3), paramErr);
    EXPECT_EQ(ReceiveNextEvent(0, nullptr, 0.0, 1, nullptr), paramErr);
    EXPECT_EQ(ReceiveNextEvent(1, nullptr, 0.0, 1, &out), paramErr);
    EXPECT_EQ(GetEventClass(nullptr), 0U);
    EXPECT_EQ(GetEventKind(nullptr), 0U);
    EXPECT_EQ(RetainEvent(nullptr), nullptr);
    ReleaseEvent(nullptr);
}

TEST(EventQueue, IsFirstInFirstOutWithinAPriority) {
    for (const UInt32 kind : {1, 4}) {
        PostNew(kind, kEventPriorityLow);
        PostNew(kind + 1);
        PostNew(kind + 2, kEventPriorityHigh);
    }
    for (const int64_t kind : {3, 6, 2, 5, 1, 4, -1})
        EXPECT_EQ(NextKind(), kind);
}

TEST(EventQueue, GivesOutOnlyTheTypesAskedFor) {
    PostNew(1, kEventPriorityHigh, kClass + 1);
    PostNew(2);
    PostNew(3);
    const std::vector<EventTypeSpec> wanted{{kClass, 3}, {kClass + 1, 2}};
    EXPECT_EQ(GetEventKind(Receive(wanted).get()), 3U);
    EXPECT_EQ(Receive(wanted), nullptr);
    EXPECT_EQ(NextKind(), 1);
    EXPECT_EQ(NextKind(), 2);
}

TEST(EventQueue, TakesAnEventOnceAndLeavesItUntilItIsPulled) {
    const Event event = NewEvent(kClass, 1);
    for (int round = 0; round < 2; ++round) {
        EXPECT_EQ(Post(event), noErr);
        EXPECT_EQ(Post(event, kEventPriorityHigh), eventAlreadyPostedErr);
        EventRef seen = nullptr;
        EXPECT_EQ(ReceiveNextEvent(0, nullptr, kEventDurationNoWait, 0, &seen), noErr);
        EXPECT_EQ(seen, event.get());
        EXPECT_EQ(Receive(), event);
        EXPECT_EQ(NextKind(), -1);
    }
}

TEST(EventQueue, RefusesMoreThanItHolds) {
    for (UInt32 kind = 0; kind < 16384; ++kind)
        PostNew(kind);
    const Event event = NewEvent(kClass, 99999);
    EXPECT_EQ(Post(event), eventQueueFullErr);
    EXPECT_EQ(NextKind(), 0);
    EXPECT_EQ(Post(event), noErr);
    for (UInt32 kind = 1; kind < 16384; ++kind)
        EXPECT_EQ(NextKind(), kind);
    EXPECT_EQ(NextKind(), 99999);
}

TEST(EventQueue, WaitsNoLongerThanAsked) {
    const auto start = std::chrono::steady_clock::now();
    EXPECT_EQ(NextKind(0.05), -1);
    EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(50));
}

TEST(EventQueue, WakesAReceiverOfAnyPatience) {
    for (const EventTimeout timeout : {kEventDurationForever, 60.0, 1e300}) {
        std::thread poster([] {
            std::this_thread::sleep_for(std::chrono::milliseconds(5));
            PostNew(8, kEventPriorityStandard, kClass + 1); // not the one that is waited for
            PostNew(9);
        });
        EXPECT_EQ(GetEventKind(Receive({{kClass, 9}}, timeout).get()), 9U);
        poster.join();
        EXPECT_EQ(NextKind(), 8);
    }
}

TEST(EventQueue, LosesNothingBetweenThreads) {
    constexpr int kPosters = 3;
    constexpr int kEvents = 400;
    std::vector<std::thread> threads;
    for (int poster = 0; poster < kPosters; ++poster)
        threads.emplace_back([] {
            for (UInt32 i = 0; i < kEvents; ++i)
                PostNew(i);
        });
    std::atomic<int> received{0};
    for (int receiver = 0; receiver < 2; ++receiver)
        threads.emplace_back([&received] {
            while (received < kPosters * kEvents)
                if (NextKind(0.01) >= 0)
                    ++received;
        });
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_EQ(received, kPosters * kEvents);
    EXPECT_EQ(NextKind(), -1);
}

} // namespace
