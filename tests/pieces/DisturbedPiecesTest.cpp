// Pieces that are stopped, killed, met at work by others, or find no room.
#include "tests/pieces/ExitCodes.h"
#include "tests/support/Folder.h"
#include "tests/support/Program.h"
#include "tests/support/SmallDisk.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <random>
#include <string>
#include <unistd.h>
#include <vector>

namespace {

using program::Call;
using program::Result;
using program::Running;
using test_movies::Args;

/// A source whose pieces take long enough to be met at work.
std::string LongSource() {
    return test_movies::Make("long-pieces.mkv",
                             {"-f", "lavfi", "-i", "testsrc2=s=640x360:r=25:d=40", "-f", "lavfi", "-i",
                              "sine=d=40", "-c:v", "libx264", "-preset", "ultrafast", "-c:a", "aac"});
}

TEST(Pieces, EndOnASignalWithCodeSixAndLeaveNothing) {
    const Folder folder;
    const std::string plan = folder / "movie.plan";
    ASSERT_EQ(Call({"-q", "--plan", plan, "--pieces", "1", LongSource(), folder / "out.mp4"}).code, 0);
    Running piece({"--progress", "json", "--piece", "0", plan}, false);
    ASSERT_TRUE(piece.WaitFor(R"("event":"progress")"));
    piece.Signal(SIGTERM);
    const Result result = piece.Finish();
    EXPECT_EQ(result.code, kStopped) << result.out << result.err;
    EXPECT_EQ(folder.Names(), (std::vector<std::string>{"movie.plan"}));
}

TEST(Pieces, ThatAreStoppedAreNoOutputAndToldToStay) {
    const Folder folder;
    const std::string output = folder / "out.mp4";
    Running run({"--progress", "json", "--jobs", "1", "--pieces", "8", LongSource(), output}, false);
    ASSERT_TRUE(run.WaitFor(R"("position_s":[123][0-9]\.)")); // behind the first of 5 s
    run.Signal(SIGTERM);
    const Result result = run.Finish();
    EXPECT_EQ(result.code, kStopped) << result.err;
    EXPECT_TRUE(Has(result.out, R"("bytes":0,"files":0)")) << result.out;
    EXPECT_TRUE(Has(result.out, "pieces are made and stay") && Has(result.out, "--resume")) << result.out;
    EXPECT_FALSE(std::filesystem::exists(output));
    EXPECT_TRUE(std::filesystem::exists(output + ".plan"));
}

/// A plan is being made; its lock tells that the program runs.
TEST(Pieces, EndWithCodeSixOnASignalBeforeTheFirstIsBegun) {
    const Folder folder;
    const std::string output = folder / "out.mp4";
    Running run({"-q", "--jobs", "1", LongSource(), output}, false);
    while (!std::filesystem::exists(output + ".plan.lock") && !run.HasEnded())
        usleep(200);
    run.Signal(SIGTERM);
    const Result result = run.Finish();
    EXPECT_EQ(result.code, kStopped) << result.err;
    EXPECT_FALSE(std::filesystem::exists(output + ".plan.lock"));
}

TEST(Pieces, OfOneOutputAreMadeByOneRunAtATime) {
    const Folder folder;
    const Args make{"--progress", "json",       "--jobs",          "1", "--pieces", "8",
                    "-y",         LongSource(), folder / "out.mp4"};
    Running first(make, false);
    ASSERT_TRUE(first.WaitFor(R"("event":"progress")"));
    const Result second = Call(make);
    EXPECT_EQ(second.code, kCannotWrite);
    EXPECT_TRUE(Has(second.err, "another run is working on")) << second.err;
    const Result result = first.Finish();
    EXPECT_EQ(result.code, 0) << result.out << result.err;
    EXPECT_EQ(folder.Names(), (std::vector<std::string>{"out.mp4"}));
}

TEST(Pieces, WaitForRoomForTheirOutputUntilThereIsOrAStop) {
    const Folder folder;
    const SmallDisk disk(folder / "disk", "200k");
    if (!disk.IsThere())
        GTEST_SKIP() << "no file system can be mounted here";
    const std::string plan = folder / "movie.plan";
    ASSERT_EQ(Call({"-q", "--plan", plan, "--pieces", "1", LongSource(), folder / "disk/out.mp4"}).code, 0);
    for (const char* number : {"0", "1"})
        ASSERT_EQ(Call({"-q", "--piece", number, plan}).code, 0);
    const Args join{"--progress", "json", "--on-full", "wait", "--join", plan};
    {
        Running stopped(join, false);
        ASSERT_TRUE(stopped.WaitFor("waiting_for_room"));
        stopped.Signal(SIGTERM);
        const Result result = stopped.Finish();
        EXPECT_EQ(result.code, kStopped) << result.out << result.err;
        EXPECT_TRUE(Has(result.out, "waiting until there is room for")) << result.out;
        EXPECT_TRUE(folder.Names("disk").empty());
    }
    Running waiting(join, false);
    ASSERT_TRUE(waiting.WaitFor("waiting_for_room"));
    ASSERT_TRUE(disk.Grow());
    const Result result = waiting.Finish();
    EXPECT_EQ(result.code, 0) << result.out << result.err;
    EXPECT_EQ(folder.Names("disk"), (std::vector<std::string>{"out.mp4"}));
}

TEST(Pieces, OfASourceThatIsWrittenToMeanwhileAreNotJoined) {
    const Folder folder;
    const std::string source = folder / "source.mkv";
    WriteFile(source, ReadFile(LongSource()));
    Running run({"--progress", "json", "--jobs", "1", "--pieces", "8", source, folder / "out.mp4"}, false);
    ASSERT_TRUE(run.WaitFor(R"("event":"progress")"));
    run.Signal(SIGSTOP);
    std::ofstream(source, std::ios::binary | std::ios::app) << "more";
    run.Signal(SIGCONT);
    const Result result = run.Finish();
    EXPECT_EQ(result.code, kCannotRead) << result.err;
    EXPECT_TRUE(Has(result.out + result.err, "is not the source that was planned with")) << result.out;
    EXPECT_FALSE(std::filesystem::exists(folder / "out.mp4"));
}

/// Two machines that make the same piece at once.
TEST(Pieces, MayBeMadeTwiceAtOnce) {
    const Folder folder;
    const std::string plan = folder / "movie.plan";
    ASSERT_EQ(Call({"-q", "--plan", plan, "--pieces", "1", LongSource(), folder / "out.mp4"}).code, 0);
    const Args make{"--progress", "json", "--piece", "0", plan};
    Running one(make, false);
    Running other(make, false);
    ASSERT_TRUE(one.WaitFor(R"("event":"progress")"));
    ASSERT_TRUE(other.WaitFor(R"("event":"progress")"));
    const Result first = one.Finish();
    const Result second = other.Finish();
    EXPECT_EQ(first.code, 0) << first.err;
    EXPECT_EQ(second.code, 0) << second.err;
    EXPECT_EQ(folder.Names(), (std::vector<std::string>{"movie.plan", "movie.plan.0000.piece"}));
    EXPECT_EQ(Call({"-q", "--piece", "1", plan}).code, 0);
    EXPECT_EQ(Call({"-q", "--join", plan}).code, 0);
}

TEST(Pieces, ThatFindNoRoomLeaveNothingAndAreMadeLater) {
    const Folder folder;
    const SmallDisk disk(folder / "disk", "400k");
    if (!disk.IsThere())
        GTEST_SKIP() << "no file system can be mounted here";
    const std::string plan = folder / "disk/movie.plan";
    ASSERT_EQ(Call({"-q", "--plan", plan, "--pieces", "2", LongSource(), folder / "out.mp4"}).code, 0);
    const Result full = Call({"-q", "--piece", "0", plan});
    EXPECT_EQ(full.code, kNoSpace) << full.err;
    EXPECT_EQ(folder.Names("disk"), (std::vector<std::string>{"movie.plan"}));
    ASSERT_TRUE(disk.Grow());
    for (const char* number : {"0", "1", "2"})
        EXPECT_EQ(Call({"-q", "--piece", number, plan}).code, 0);
    EXPECT_EQ(Call({"-q", "--join", plan}).code, 0);
}

/// Killed at any moment, however often, the same command with --resume ends with the bytes of an undisturbed
/// run.
TEST(Pieces, GoOnAfterKills) {
    const char* asked = std::getenv("MOVIECONV_KILLS");
    const int kills = asked != nullptr ? std::atoi(asked) : 5;
    const Folder folder;
    const std::string calm = folder / "calm.mp4";
    const std::string output = folder / "out.mp4";
    const Args options{"-q", "--jobs", "2", "--pieces", "8", LongSource()};
    ASSERT_EQ(Call(test_movies::Join(options, Args{calm})).code, 0);
    WriteFile(output + ".plan.making-desk-7", "{"); // as a kill leaves that comes just then
    std::mt19937 dice(7);
    for (int i = 0; i < kills; ++i) {
        Running run(test_movies::Join(options, Args{"--resume", output}), false);
        usleep(dice() % 700'000);
        run.Signal(SIGKILL);
        run.Finish();
        if (!std::filesystem::exists(output))
            continue;
        EXPECT_EQ(ReadFile(output), ReadFile(calm)) << "after " << i + 1 << " kills";
        std::filesystem::remove(output);
    }
    const Result resumed = Call(test_movies::Join(options, Args{"-y", "--resume", output}));
    ASSERT_EQ(resumed.code, 0) << resumed.err;
    EXPECT_EQ(ReadFile(output), ReadFile(calm));
    EXPECT_EQ(folder.Names(), (std::vector<std::string>{"calm.mp4", "out.mp4"})) << "something was left over";
}

TEST(Pieces, AreNoWayAroundALargestSize) {
    const Folder folder;
    const Result result = Call({"-q", "--length", "5", "--max-size", "100k", "--pieces", "40", "--jobs", "2",
                                LongSource(), folder / "out.mp4"});
    EXPECT_EQ(result.code, kCannotWrite) << result.err;
    EXPECT_TRUE(Has(result.err, "has become larger than asked for")) << result.err;
    EXPECT_EQ(folder.Names(), (std::vector<std::string>{"out.mp4"})) << "pieces would give the same again";
}

} // namespace
