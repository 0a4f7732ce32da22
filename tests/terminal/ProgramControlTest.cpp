// Signals, keys, pauses, stalled sources and full disks, while the program converts.
#include "tests/support/Inspect.h"
#include "tests/support/Program.h"
#include "tests/support/SmallDisk.h"
#include "tests/support/TestMovies.h"
#include "tests/terminal/Slowly.h"

#include <gtest/gtest.h>

#include <chrono>
#include <csignal>
#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <sys/resource.h>
#include <sys/stat.h>
#include <thread>
#include <unistd.h>

namespace {

namespace fs = std::filesystem;
using namespace test_movies;
using inspect::LookAt;
using program::Call;
using program::Result;
using program::Running;

class ProgramSignal : public testing::TestWithParam<int> {};

TEST_P(ProgramSignal, FinishesAPlayableFile) {
    const Folder folder;
    Running running(Join(Slowly(folder / "out.mp4"), Args{"--progress", "json"}), false);
    ASSERT_TRUE(running.WaitFor("\"position_s\":[1-9]"));
    running.Signal(GetParam());
    const Result result = running.Finish();
    EXPECT_EQ(result.code, 6) << result.out;
    EXPECT_NE(result.out.find("\"outcome\":\"stopped\""), std::string::npos);
    EXPECT_EQ(folder.Names(), Args{"out.mp4"});
    // What the full queues held is in the file, too.
    EXPECT_EQ(result.out.find("\"event\":\"warning\""), std::string::npos) << result.out;
    const std::string told = "\"video_s\":";
    const std::size_t at = result.out.rfind(told);
    ASSERT_NE(at, std::string::npos) << result.out;
    const double seconds = std::atof(&result.out[at + told.size()]);
    EXPECT_GT(seconds, 0);
    EXPECT_LT(seconds, 60);
    EXPECT_NEAR(static_cast<double>(LookAt(folder / "out.mp4").pictures.size()), seconds * 100, 1);
}

INSTANTIATE_TEST_SUITE_P(Signals, ProgramSignal, testing::Values(SIGINT, SIGTERM));

TEST(Program, LeavesAtOnceOnASignalWellAfterTheFirst) {
    const Folder folder;
    Running running(Join(Slowly(folder / "out.mp4"), Args{"--progress", "json"}), false);
    ASSERT_TRUE(running.WaitFor("\"position_s\":[1-9]"));
    running.Jam(); // so that it cannot come to an end by itself
    while (!running.HasEnded()) {
        running.Signal(SIGTERM);
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    }
    EXPECT_EQ(running.Finish().code, 128 + SIGTERM);
}

TEST(Program, TakesTwoSignalsAtOnceForOne) {
    const Folder folder;
    Running running(Join(Slowly(folder / "out.mp4"), Args{"--progress", "json"}), false);
    ASSERT_TRUE(running.WaitFor("\"position_s\":[1-9]"));
    running.Signal(SIGSTOP);
    ASSERT_TRUE(running.WaitUntilSuspended());
    for (const int signal : {SIGINT, SIGTERM, SIGCONT})
        running.Signal(signal);
    EXPECT_EQ(running.Finish().code, 6);
    EXPECT_EQ(folder.Names(), Args{"out.mp4"});
}

TEST(Program, GoesOnIgnoringWhatItsCallerIgnores) {
    const Folder folder;
    for (const int signal : {SIGHUP, SIGINT, SIGTERM}) {
        const auto usual = std::signal(signal, SIG_IGN); // which the program inherits
        Running running({CountedMovie(), folder / "out.mp4", "-y", "--progress", "json"}, false);
        std::signal(signal, usual);
        ASSERT_TRUE(running.WaitFor("clip_opened"));
        running.Jam();
        running.Signal(signal);
        running.Signal(signal);
        const Result result = running.Finish();
        EXPECT_EQ(result.code, 0) << result.out;
        EXPECT_EQ(LookAt(folder / "out.mp4").pictures.size(), 100u);
    }
}

TEST(Program, FollowsKeysAndLeavesTheTerminalWhileItIsSuspended) {
    const Folder folder;
    Running running(Slowly(folder / "out.mp4"), true);
    ASSERT_TRUE(running.WaitFor("0:00:0[1-9] / "));
    running.Press(" ");
    ASSERT_TRUE(running.WaitFor("paused"));
    running.Press("p");
    ASSERT_TRUE(running.WaitFor("left"));
    EXPECT_FALSE(running.Echoes());
    running.Press("\x1a");
    ASSERT_TRUE(running.WaitUntilSuspended());
    EXPECT_TRUE(running.Echoes());
    ASSERT_TRUE(running.WaitFor("\r\n")); // it left its line
    running.Signal(SIGCONT);
    ASSERT_TRUE(running.WaitFor("left"));
    EXPECT_FALSE(running.Echoes());
    running.Press("q");
    const Result result = running.Finish();
    EXPECT_EQ(result.code, 6) << result.out;
    EXPECT_GT(LookAt(folder / "out.mp4").pictures.size(), 0u);
}

TEST(Program, LeavesTheTerminalAsItWasWhenItIsToldToQuitAtOnce) {
    const Folder folder;
    rlimit usual{};
    getrlimit(RLIMIT_CORE, &usual);
    const rlimit none{0, usual.rlim_max};
    setrlimit(RLIMIT_CORE, &none);
    Running running(Slowly(folder / "out.mp4"), true);
    setrlimit(RLIMIT_CORE, &usual);
    ASSERT_TRUE(running.WaitFor("0:00:0[1-9] / ")); // the file is open
    EXPECT_FALSE(running.Echoes());
    running.Press("\x1c"); // Ctrl-backslash
    ASSERT_TRUE(running.WaitFor("what was written so far is in .*out.mp4.part"));
    EXPECT_TRUE(running.Echoes());
    EXPECT_EQ(running.Finish().code, 128 + SIGQUIT);
}

class ProgramStalls : public testing::TestWithParam<const char*> {};

TEST_P(ProgramStalls, AndStops) {
    const bool beforeTheBegin = GetParam() != std::string("0");
    const Folder folder;
    const std::string pipe = folder / "pipe";
    ASSERT_EQ(mkfifo(pipe.c_str(), 0600), 0);
    const int end = open(pipe.c_str(), O_RDWR | O_CLOEXEC); // waits for nobody, and lets nobody see an end
    const std::string movie = ReadFile(
        Make("streamed.ts", Join(CountedPictures(8), Beeps(8), Args{"-c:v", "mpeg2video", "-c:a", "mp2"})));
    ASSERT_GE(fcntl(end, F_SETPIPE_SZ, 1 << 20), static_cast<int>(movie.size()));
    const std::size_t half = movie.size() / 2;
    ASSERT_EQ(write(end, movie.data(), half), static_cast<ssize_t>(half));
    Running running({pipe, folder / "out.mp4", "--progress", "json", "--begin", GetParam()}, false);
    EXPECT_TRUE(running.WaitFor(beforeTheBegin ? "clip_opened" : "\"position_s\":[3-9]"));
    running.Signal(SIGINT);
    const Result result = running.Finish();
    close(end);
    EXPECT_EQ(result.code, 6) << result.out;
    EXPECT_EQ(folder.Names(), beforeTheBegin ? Args{"pipe"} : (Args{"out.mp4", "pipe"}));
    EXPECT_TRUE(beforeTheBegin || LookAt(folder / "out.mp4").pictures.size() > 70);
}

INSTANTIATE_TEST_SUITE_P(Begins, ProgramStalls, testing::Values("0", "6"));

TEST(Program, AStopEndsTheSubtitlesToo) {
    const Folder folder;
    WriteFile(
        folder / "cues.srt",
        "1\n00:00:00,500 --> 00:00:00,900\nFirst words\n\n2\n00:00:59,000 --> 00:00:59,500\nLast words\n");
    Running running(
        Join(Slowly(folder / "out.mkv"), Args{"--subtitle-file", folder / "cues.srt", "--progress", "json"}),
        false);
    ASSERT_TRUE(running.WaitFor("\"position_s\":[1-9]"));
    running.Signal(SIGINT);
    const Result result = running.Finish();
    EXPECT_EQ(result.code, 6) << result.out;
    const std::string movie = ReadFile(folder / "out.mkv");
    EXPECT_NE(movie.find("First words"), std::string::npos);
    EXPECT_EQ(movie.find("Last words"), std::string::npos);
}

TEST(Program, StopsWhileAFileOfSubtitlesBringsNothing) {
    const Folder folder;
    ASSERT_EQ(mkfifo((folder / "pipe.srt").c_str(), 0600), 0);
    Running running(
        {CountedMovie(), folder / "out.mkv", "--subtitle-file", folder / "pipe.srt", "--progress", "json"},
        false);
    ASSERT_TRUE(running.WaitFor("\"event\":\"start\""));
    running.Signal(SIGINT);
    const Result result = running.Finish();
    EXPECT_EQ(result.code, 6) << result.out;
    EXPECT_EQ(folder.Names(), Args{"pipe.srt"});
}

TEST(Program, WritesTheSameFileWhateverThePauses) {
    const Folder folder;
    const Args part{"--length", "4"};
    ASSERT_EQ(Call(Join(Slowly(folder / "steady.mp4"), part)).code, 0);
    Running running(Join(Slowly(folder / "paused.mp4"), part), true);
    ASSERT_TRUE(running.WaitFor("0:00:0[0-9] / "));
    for (int i = 0; i < 3; ++i) {
        running.Press(" ");
        ASSERT_TRUE(running.WaitFor("paused"));
        running.Press(" ");
        ASSERT_TRUE(running.WaitFor("left"));
    }
    EXPECT_EQ(running.Finish().code, 0);
    EXPECT_EQ(ReadFile(folder / "steady.mp4"), ReadFile(folder / "paused.mp4"));
}

TEST(Program, KeepsWhatIsDoneOnAFullDiskRemovesItOrWaits) {
    const Folder folder;
    const SmallDisk disk(folder / "disk", "600k");
    if (!disk.IsThere())
        GTEST_SKIP() << "no small disk can be mounted here";
    const Args making{CountedMovie(60), folder / "disk/out.mov", "--audio-codec", "PCM"};
    const Result result = Call(making);
    EXPECT_EQ(result.code, 5) << result.err;
    EXPECT_NE(result.err.find("out.mov"), std::string::npos);
    EXPECT_FALSE(fs::exists(folder / "disk/out.mov"));
    const std::vector<std::string> left = folder.Names("disk");
    ASSERT_EQ(left.size(), 1u);
    EXPECT_NE(result.err.find(left[0]), std::string::npos) << result.err;
    EXPECT_GT(LookAt(folder / "disk/" + left[0]).pictures.size(), 25u);

    fs::remove(folder / "disk/" + left[0]);
    const Result quiet = Call(Join(making, Args{"--no-keep-partial", "--quiet"}));
    EXPECT_EQ(quiet.code, 5);
    EXPECT_EQ(quiet.out, "");
    EXPECT_TRUE(folder.Names("disk").empty());

    Running waiting(Join(making, Args{"--on-full", "wait", "--progress", "json"}), false);
    ASSERT_TRUE(waiting.WaitFor("waiting_for_room"));
    ASSERT_TRUE(disk.Grow());
    const Result whole = waiting.Finish();
    EXPECT_EQ(whole.code, 0) << whole.out;
    EXPECT_EQ(LookAt(folder / "disk/out.mov").pictures.size(), 1500u);
}

} // namespace
