// The log function of a host. Everything here runs in processes of its own, whose standard streams are looked
// at.
#include "api/MovieConv.h"
#include "tests/engine/IdleParts.h"
#include "tests/support/Folder.h"
#include "tests/support/Process.h"

#include <gtest/gtest.h>

#include <atomic>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace {

struct Lines {
    static void Take(void* user, int level, const char* line) {
        auto& self = *static_cast<Lines*>(user);
        const std::lock_guard lock(self.mutex);
        self.text += std::to_string(level) + " " + line + "\n";
    }
    bool Have(const std::string& part) const { return text.find(part) != std::string::npos; }

    std::mutex mutex;
    std::string text;
};

/// A second of black pictures as H.264. The outcome.
unsigned Convert(const std::string& path) {
    IdleVideo video(25);
    unsigned outcome = 99;
    const MCHandle handle = MCCreate(&video, nullptr);
    EncodeParam param{};
    MCGetEncodeParam(handle, &param);
    param.fccVideo = FourCC("H264");
    MCSetEncodeParam(handle, &param);
    MCSetOutputFile(handle, std::wstring(path.begin(), path.end()).c_str());
    const auto report = [](void* context, unsigned kind, unsigned value, uintptr_t) {
        if (kind == 1)
            *static_cast<unsigned*>(context) = value;
        return 1U;
    };
    MCStart(handle, 0.0, 0.0, nullptr, report, &outcome);
    MCWait(handle, MC_INFINITE);
    MCDestroy(handle);
    return outcome;
}

TEST(LogCallbackTest, TakesEverythingAndLeavesTheStandardStreamsAlone) {
    const Folder folder;
    const ProcessResult child = InChild([&] {
        Lines lines;
        EXPECT_EQ(MCSetLogCallback(Lines::Take, &lines), 1);
        EXPECT_EQ(Convert(folder / "out.mp4"), unsigned{kOutcomeCompleted});
        EXPECT_EQ(Convert(folder / "none/out.mp4"), unsigned{kOutcomeFailed});
        EXPECT_EQ(MCSetLogCallback(nullptr, nullptr), 1);
        for (const char* part : {"3 MovieConv::StartThread(): BeginTime[0.000s], Length[0.000s]\n",
                                 "4 ThreadEngine::Wait() S_OK\n", "3 [libx264 @ ", "MediaWriter::Failed: "})
            EXPECT_TRUE(lines.Have(part)) << part << "\n" << lines.text;
        EXPECT_FALSE(lines.Have("dyLog.h"));
        return testing::Test::HasFailure() ? 1 : 0;
    });
    EXPECT_EQ(child.code, 0) << child.out << child.err;
    EXPECT_EQ(child.out + child.err, "");
}

TEST(LogCallbackTest, WithoutItLinesGoWhereTheyWent) {
    const Folder folder;
    const ProcessResult child = InChild([&] {
        Lines lines;
        MCSetLogCallback(Lines::Take, &lines);
        MCSetLogCallback(nullptr, nullptr);
        const unsigned outcome = Convert(folder / "out.mp4");
        return outcome == kOutcomeCompleted && lines.text.empty() ? 0 : 1;
    });
    EXPECT_EQ(child.code, 0) << child.out << child.err;
    EXPECT_NE(child.out.find("ThreadEngine::Wait() S_OK"), std::string::npos) << child.out;
    EXPECT_NE(child.err.find("[libx264 @ "), std::string::npos) << child.err;
}

// What a function was given with it may be freed as soon as another is set.
TEST(LogCallbackTest, ATakenFunctionIsNotCalledAnyMore) {
    struct User {
        static void Take(void* user, int, const char*) {
            auto& self = *static_cast<User*>(user);
            ++self.inside;
            EXPECT_TRUE(self.alive);
            std::this_thread::yield();
            EXPECT_TRUE(self.alive);
            --self.inside;
        }
        std::atomic<bool> alive{true};
        std::atomic<int> inside{0};
    };
    std::atomic<bool> done{false};
    IdleVideo video(1);
    const MCHandle handle = MCCreate(&video, nullptr);
    std::vector<std::thread> loggers;
    for (int i = 0; i < 2; ++i)
        loggers.emplace_back([&] {
            while (!done)
                MCGetEstimateDiskSpace(handle);
        });
    User users[2];
    for (int round = 0; round < 200; ++round) {
        User& next = users[round % 2];
        next.alive = true;
        MCSetLogCallback(User::Take, &next);
        User& former = users[(round + 1) % 2];
        EXPECT_EQ(former.inside, 0);
        former.alive = false;
    }
    done = true;
    for (std::thread& logger : loggers)
        logger.join();
    // Out of a call it does not wait for that call.
    MCSetLogCallback([](void*, int, const char*) { MCSetLogCallback(nullptr, nullptr); }, nullptr);
    MCGetEstimateDiskSpace(handle);
    MCDestroy(handle);
}

} // namespace
