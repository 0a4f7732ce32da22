// MCStop with the real media writer while the disk takes nothing and the queue before it is full.
#include "api/MovieConv.h"
#include "tests/engine/IdleParts.h"
#include "tests/support/Folder.h"
#include "tests/support/Gate.h"
#include "writer/WriterStatus.h"

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <filesystem>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace {

Gate g_disk;

/// What the picture encoder's full queue holds, and the picture that waits for room in it.
constexpr int64_t kPicturesHeld = 3 + 1;

std::unique_ptr<WriterStatus> Status() {
    auto status = std::make_unique<WriterStatus>();
    MWGetFileStatus(MWGetFileCount(), status.get());
    return status;
}

void AwaitPictures(int64_t pictures) {
    while (Status()->llPicturesWritten < pictures)
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
}

void AwaitFullQueue() {
    for (auto status = Status(); status->llPicturesReceived - status->llPicturesWritten < kPicturesHeld;
         status = Status())
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
}

} // namespace

/// In place of the system's, for the media writer too. What does not go to a file of the disk passes.
extern "C" __attribute__((visibility("default"))) ssize_t write(int descriptor, const void* data,
                                                                size_t size) {
    struct stat status {};
    if (descriptor > STDERR_FILENO && fstat(descriptor, &status) == 0 && S_ISREG(status.st_mode))
        g_disk.Pass();
    return syscall(SYS_write, descriptor, data, size);
}

TEST(FullQueuesTest, AStopWaitsForTheDiskAndFinishesWhatWasTaken) {
    const Folder folder;
    IdleVideo video(1'000'000);
    MCHandle handle =
        MCCreate(&video, nullptr); // beside sound, the queue that is full first keeps the other empty
    MCSetOutputFile(handle, std::filesystem::path(folder / "out.mp4").wstring().c_str());
    ASSERT_EQ(MCStart(handle, 0.0, 0.0, nullptr, nullptr, nullptr), 0);
    AwaitPictures(100);
    g_disk.Shut();
    g_disk.AwaitHeld();
    AwaitFullQueue();

    std::atomic<bool> back{false};
    std::thread stopper([&] {
        MCStop(handle);
        back = true;
    });
    while (!back && MCPause(handle) != 0) // 0 once the stop has been asked for
        MCResume(handle);
    EXPECT_EQ(MCWait(handle, 100), MC_WAIT_TIMEOUT);
    EXPECT_FALSE(back) << "the disk takes nothing";
    g_disk.Open();
    stopper.join();
    EXPECT_EQ(MCWait(handle, 0), 0);
    MCDestroy(handle);

    EXPECT_EQ(Status()->nState, kWriterFileComplete);
    EXPECT_EQ(Status()->llPicturesWritten, Status()->llPicturesReceived);
    EXPECT_EQ(folder.Names(), std::vector<std::string>{"out.mp4"});
}
