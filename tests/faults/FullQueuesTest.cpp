// A stop with the real media writer while the disk takes nothing and the queue before it is full.
#include "api/MovieConv.h"
#include "tests/engine/IdleParts.h"
#include "tests/support/Folder.h"
#include "tests/support/Gate.h"
#include "writer/WriterStatus.h"

#include <gtest/gtest.h>

#include <chrono>
#include <filesystem>
#include <string>
#include <thread>
#include <vector>

#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace {

Gate g_disk;

/// What the picture encoder's full queue holds, and the picture that waits for room in it.
constexpr int64_t kPicturesHeld = 1 + 1;

WriterStatus Status() {
    WriterStatus status{};
    MWGetFileStatus(kWriterDefaultSet, MWGetFileCount(kWriterDefaultSet), &status);
    return status;
}

void AwaitStatus(bool (*reached)(const WriterStatus& status)) {
    while (!reached(Status()))
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
    AwaitStatus([](const WriterStatus& status) { return status.llPicturesWritten >= 100; });
    g_disk.Shut();
    g_disk.AwaitHeld();
    AwaitStatus([](const WriterStatus& status) {
        return status.llPicturesReceived - status.llPicturesWritten >= kPicturesHeld;
    });

    EXPECT_EQ(MCAbort(handle), 1);
    EXPECT_EQ(MCWait(handle, 100), MC_WAIT_TIMEOUT) << "the disk takes nothing";
    g_disk.Open();
    EXPECT_EQ(MCWait(handle, MC_INFINITE), 0);
    MCDestroy(handle);

    EXPECT_EQ(Status().nState, kWriterFileComplete);
    EXPECT_EQ(Status().llPicturesWritten, Status().llPicturesReceived);
    EXPECT_EQ(folder.Names(), std::vector<std::string>{"out.mp4"});
}
