// MCStop with the real media writer while its queues are full: what was taken is finished, and how long that
// takes printed.
#include "api/MovieConv.h"
#include "tests/engine/IdleParts.h"
#include "writer/WriterStatus.h"

#include <gtest/gtest.h>

#include <chrono>
#include <cstdio>
#include <filesystem>
#include <memory>
#include <thread>

#include <unistd.h>

namespace {

// The decoders cost nothing, so that the worker always waits for the encoders.
TEST(FullQueuesTest, AStopFinishesWhatWasTaken) {
    const std::filesystem::path file = testing::TempDir() + "full-" + std::to_string(getpid()) + ".mp4";
    IdleVideo video(1'000'000);
    IdleAudio audio(2'000'000);
    MCHandle handle = MCCreate(&video, &audio);
    MCSetOutputFile(handle, file.wstring().c_str());
    ASSERT_EQ(MCStart(handle, 0.0, 0.0, nullptr, nullptr, nullptr), 0);
    const auto status = std::make_unique<WriterStatus>();
    while (MWGetFileStatus(1, status.get()) == 0 || status->llPicturesWritten < 100)
        std::this_thread::sleep_for(std::chrono::milliseconds(1));

    const auto start = std::chrono::steady_clock::now();
    MCStop(handle);
    std::printf("MCStop came back after %.1f ms, the close included\n",
                std::chrono::duration<double, std::milli>(std::chrono::steady_clock::now() - start).count());
    MCDestroy(handle);
    ASSERT_EQ(MWGetFileStatus(1, status.get()), 1);
    EXPECT_EQ(status->nState, kWriterFileComplete);
    EXPECT_EQ(status->llPicturesWritten, status->llPicturesReceived);
    EXPECT_TRUE(std::filesystem::remove(file));
}

} // namespace
