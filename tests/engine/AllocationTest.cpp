// What the engine allocates: nothing in an iteration, and nothing that it cannot do without.
#include "api/MovieConv.h"
#include "tests/engine/CountingAllocator.h"
#include "tests/engine/IdleParts.h"

#include <gtest/gtest.h>

namespace {

unsigned Callback(void* outcome, unsigned kind, unsigned value, uintptr_t) {
    if (kind == 1)
        *static_cast<int*>(outcome) = static_cast<int>(value);
    return 1;
}

/// Allocations of one conversion.
int64_t Convert(int64_t pictures, int64_t blocks) {
    IdleVideo video(pictures);
    IdleAudio audio(blocks);
    int outcome = -1;
    MCHandle handle = MCCreate(pictures > 0 ? &video : nullptr, blocks > 0 ? &audio : nullptr);
    const int64_t before = Allocations();
    MCStart(handle, 0.0, 0.0, nullptr, Callback, &outcome);
    MCWait(handle, MC_INFINITE);
    const int64_t count = Allocations() - before;
    MCDestroy(handle);
    EXPECT_EQ(outcome, kOutcomeCompleted);
    return count;
}

TEST(AllocationTest, DoesNotDependOnTheLength) {
    const struct {
        const char* name;
        int64_t pictures, blocks; // a thousandth of them in the short run
    } cases[] = {{"pictures and sound", 50000, 100000},
                 {"pictures end first", 20000, 100000},
                 {"sound ends first", 50000, 20000},
                 {"sound", 0, 100000},
                 {"pictures", 50000, 0}};
    Convert(1, 1); // looks for the log sink, once in a process
    for (const auto& test : cases)
        EXPECT_EQ(Convert(test.pictures, test.blocks), Convert(test.pictures / 1000, test.blocks / 1000))
            << test.name;
}

// Every allocation fails once: the converter is not made, or the name not set, or the conversion does not
// come about, and never more than that. The first run without a failure ends the loop.
TEST(AllocationFailureTest, IsReported) {
    Convert(1, 1); // what the log sink is looked for with is not counted: no conversion fails for a lost line
    for (int64_t number = 1;; ++number) {
        IdleVideo video(10);
        IdleAudio audio(1);
        int outcome = -1;
        FailAllocation(number);
        MCHandle handle = MCCreate(&video, &audio);
        const bool named =
            handle && MCSetOutputFile(handle, L"/a/name/that/does/not/fit/into/the/object/itself.mp4") == 1;
        if (named) {
            MCSetSplitParam(handle, 1, 1000);
            EXPECT_EQ(MCStart(handle, 0.0, 0.0, nullptr, Callback, &outcome), 0);
            EXPECT_EQ(MCWait(handle, MC_INFINITE), 0);
        }
        const bool failed = FailAllocation(0);
        MCDestroy(handle);
        if (!failed) {
            EXPECT_EQ(outcome, kOutcomeCompleted);
            EXPECT_GT(number, 7) << "converter, events, name, thread, clip name, list, silence";
            return;
        }
        EXPECT_TRUE(outcome == -1 || outcome == kOutcomeFailed) << number;
    }
}

} // namespace
