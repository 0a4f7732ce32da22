// A wait that lasts is named in the log, once, and once more when it ends.
#include "tests/recorder/RecordingWriter.h"
#include "thread/BoundedQueue.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <thread>

namespace {

constexpr QueueSides kSides{L"A waits for room", L"B waits for items", std::chrono::milliseconds(20)};

int Lines(const std::string& beginning) {
    const std::vector<std::string> trace = recorder::Recorded().trace;
    return static_cast<int>(std::count_if(trace.begin(), trace.end(), [&](const std::string& line) {
        return line.rfind("log " + beginning, 0) == 0;
    }));
}

void AwaitLine(const std::string& beginning) {
    while (Lines(beginning) == 0)
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
}

TEST(StallTest, BothSidesOfAQueueAreNamedOnce) {
    recorder::Reset();
    BoundedQueue<int> queue(1, 1, kSides);
    std::thread taker([&] { EXPECT_EQ(queue.Pop(), 1); });
    AwaitLine("B waits for items for 0.");
    EXPECT_TRUE(queue.Push(1));
    taker.join();
    EXPECT_EQ(Lines("B waits for items"), 2);
    EXPECT_EQ(Lines("B waits for items no longer, after "), 1);

    EXPECT_TRUE(queue.Push(2));
    std::thread giver([&] { EXPECT_FALSE(queue.Push(3)); });
    AwaitLine("A waits for room for 0.");
    queue.Close();
    giver.join();
    EXPECT_EQ(Lines("A waits for room"), 2);
    EXPECT_EQ(Lines("A waits for room no longer, after "), 1);
}

TEST(BoundedQueueTest, RoomIsAwaitedBeforeTheItemIsMade) {
    recorder::Reset();
    BoundedQueue<int> queue(1, 1, kSides);
    std::atomic<int> made{0};
    std::thread giver([&] {
        while (queue.WaitForRoom(1))
            queue.Push(++made, 1);
    });
    AwaitLine("A waits for room for 0.");
    EXPECT_EQ(made, 1);
    EXPECT_EQ(queue.Pop(), 1);
    EXPECT_EQ(queue.Pop(), 2);
    queue.Close();
    giver.join();
}

TEST(StallTest, NobodyIsNamedWhileItemsCome) {
    recorder::Reset();
    BoundedQueue<int> queue(4, 4, {L"A", L"B"});
    std::thread taker([&] {
        while (queue.Pop()) {
        }
    });
    for (int i = 0; i < 10000; ++i)
        EXPECT_TRUE(queue.Push(i));
    queue.Finish();
    taker.join();
    EXPECT_EQ(Lines(""), 0);
}

} // namespace
