// MCStop and MCAbort from every state: what holds the worker is let go once the stop has been asked for, and
// then MCStop comes back. How long that takes is printed, never judged.
#include "api/MovieConv.h"
#include "tests/engine/IdleParts.h"
#include "tests/recorder/RecordingWriter.h"
#include "tests/support/Gate.h"

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <cstdio>
#include <ostream>
#include <thread>
#include <vector>

namespace {

Gate g_picture;
Gate g_sound;
Gate g_callback;
Gate g_write;
Gate g_close;

class GatedVideo : public IdleVideo {
public:
    using IdleVideo::IdleVideo;
    int DecodeNext(int mode) override {
        g_picture.Pass();
        return IdleVideo::DecodeNext(mode);
    }
};

class GatedAudio : public IdleAudio {
public:
    using IdleAudio::IdleAudio;
    AudioFrame* GetNextFrame() override {
        g_sound.Pass();
        return IdleAudio::GetNextFrame();
    }
};

void Nothing() {}

void PauseTwice(MCHandle handle) {
    MCPause(handle);
    MCPause(handle);
}

struct State {
    const char* name;
    void (*hold)();          // before the start
    void (*enter)(MCHandle); // waits until the worker is there
    void (*release)();
    int64_t pictures = 1'000'000;
    unsigned outcome = kOutcomeStopped;
};

void PrintTo(const State& state, std::ostream* out) {
    *out << state.name;
}

template <Gate& gate>
State HeldBy(const char* name) {
    return {name, [] { gate.Shut(); }, [](MCHandle) { gate.AwaitHeld(); }, [] { gate.Open(); }};
}

std::vector<State> States() {
    State inTheClose = HeldBy<g_close>("InTheClose");
    inTheClose.pictures = 100;
    inTheClose.outcome = kOutcomeCompleted;
    return {{"Running", Nothing, [](MCHandle) {}, Nothing},
            {"PausedTwice", Nothing, PauseTwice, Nothing},
            HeldBy<g_write>("InTheWriter"),
            HeldBy<g_picture>("InThePictureDecoder"),
            HeldBy<g_sound>("InTheSoundDecoder"),
            HeldBy<g_callback>("InTheCallback"),
            inTheClose};
}

class StopFrom : public testing::TestWithParam<State> {
protected:
    StopFrom() {
        recorder::Reset({.onWrite = [] { g_write.Pass(); }, .onClose = [] { g_close.Pass(); }});
    }
    ~StopFrom() override {
        recorder::Reset();
        MCDestroy(handle_);
    }

    static bool IsHeld() { return GetParam().release != Nothing; }

    static unsigned Callback(void* context, unsigned kind, unsigned value, uintptr_t) {
        if (kind == 1)
            static_cast<StopFrom*>(context)->outcome_ = value;
        else
            g_callback.Pass();
        return 1;
    }

    GatedVideo video_{GetParam().pictures};
    GatedAudio audio_{2 * GetParam().pictures};
    MCHandle handle_ = MCCreate(&video_, &audio_);
    std::atomic<unsigned> outcome_{99};
};

TEST_P(StopFrom, ComesBack) {
    GetParam().hold();
    ASSERT_EQ(MCStart(handle_, 0.0, 0.0, nullptr, Callback, this), 0);
    GetParam().enter(handle_);
    EXPECT_EQ(MCAbort(handle_), 1);
    EXPECT_EQ(MCPause(handle_), 0) << "a stop has been asked for";
    std::atomic<bool> back{false};
    std::chrono::steady_clock::time_point returned;
    if (IsHeld()) {
        EXPECT_EQ(MCWait(handle_, 0), MC_WAIT_TIMEOUT) << "the worker is held";
        EXPECT_EQ(MCSetSplitParam(handle_, 1, 1000), 0);
        EXPECT_EQ(MCStart(handle_, 0.0, 0.0, nullptr, nullptr, nullptr), 0) << "and changes nothing";
    }
    std::thread stopper([&] {
        MCStop(handle_);
        returned = std::chrono::steady_clock::now();
        back = true;
    });
    if (IsHeld()) {
        EXPECT_EQ(MCWait(handle_, 20), MC_WAIT_TIMEOUT);
        EXPECT_FALSE(back) << "the worker is held";
    }
    const auto released = std::chrono::steady_clock::now();
    GetParam().release();
    stopper.join();
    std::printf("MCStop came back %.1f ms after nothing held the worker any more\n",
                std::chrono::duration<double, std::milli>(returned - released).count());
    EXPECT_EQ(MCWait(handle_, 0), 0);
    EXPECT_EQ(MCAbort(handle_), 0);
    EXPECT_EQ(MCSetSplitParam(handle_, 1, 1000), 1);
    EXPECT_EQ(outcome_, GetParam().outcome);
}

INSTANTIATE_TEST_SUITE_P(States, StopFrom, testing::ValuesIn(States()),
                         [](const auto& info) { return info.param.name; });

} // namespace
