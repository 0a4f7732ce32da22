// The program's conversions into clips that break off, and the same command with --resume.
#include "tests/pieces/ExitCodes.h"
#include "tests/pieces/Packets.h"
#include "tests/support/Folder.h"
#include "tests/support/Program.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <csignal>
#include <filesystem>
#include <fmt/format.h>
#include <string>
#include <sys/stat.h>
#include <vector>

namespace {

using program::Call;
using program::Result;
using program::Running;
using test_movies::Args;
using test_movies::Join;

/// Ten clips of two seconds, with pictures that build on later ones and sound that ends early.
std::string ClipSource() {
    return test_movies::Make("clips-left.mp4", {"-f", "lavfi", "-i", "testsrc2=s=320x240:r=25:d=20", "-f",
                                                "lavfi", "-i", "sine=d=19.5", "-c:v", "libx264", "-preset",
                                                "ultrafast", "-g", "70", "-bf", "2", "-c:a", "aac"});
}

/// A conversion of it that was killed when it had finished two clips or more.
struct Killed {
    static constexpr char kOutput[] = "\xE9t\xE9.mp4"; ///< Names of files are bytes; this one is no UTF-8.
    Folder folder;
    std::string output = folder / kOutput;
    std::string list = output + ".clips";
    Args options{"--progress", "json", "--split", "2"};

    Killed() {
        while (!std::filesystem::exists(list)) { // it can have come to its end before the signal
            Running run(Join(options, Args{"-y", ClipSource(), output}), false);
            EXPECT_TRUE(run.WaitFor(R"("event":"clip_opened".*_02\.mp4)"));
            run.Signal(SIGKILL);
            run.Finish();
        }
    }
    int Listed() const {
        const std::string lines = ReadFile(list);
        int finished = 0;
        for (std::size_t at = 0; (at = lines.find("\"clip\":", at)) != std::string::npos; ++at)
            ++finished;
        return finished;
    }
    /// What is there but for the clip that the kill left unfinished, which stays as after any kill.
    std::vector<std::string> Names() const {
        std::vector<std::string> names = folder.Names();
        std::erase_if(names, [](const std::string& name) { return name.ends_with(".part"); });
        return names;
    }
    Result Resume(const Args& more = {}) const {
        return Call(Join(options, Args{"--resume"}, more, Args{ClipSource(), output}));
    }
    std::string Clip(int number) const { return folder / fmt::format("\xE9t\xE9_{:02}.mp4", number); }
};

/// All packets with their times; what decoded sound holds depends on where decoding began.
std::vector<std::string> Times(const std::string& path) {
    std::vector<std::string> lines = packets::Of(path);
    for (std::string& line : lines)
        line.resize(std::min(line.find(" skips "), line.size()));
    return lines;
}

std::string Told(int clips) {
    return fmt::format("{} clips are made already", clips);
}

TEST(ClipsLeft, AreGoneOnWithAtTheFirstOneMissing) {
    const Folder calm;
    ASSERT_EQ(Call({"-q", "--split", "2", ClipSource(), calm / Killed::kOutput}).code, 0);
    EXPECT_EQ(calm.Names().size(), 10U);
    const Killed killed;
    const auto before = std::filesystem::last_write_time(killed.Clip(1));
    const std::string told = Told(killed.Listed());
    WriteFile(killed.list + ".making-desk-7", "{");
    const Result resumed = killed.Resume();
    ASSERT_EQ(resumed.code, 0) << resumed.err;
    EXPECT_TRUE(Has(resumed.out + resumed.err, told)) << resumed.out << resumed.err;
    EXPECT_EQ(killed.folder.Names(), calm.Names()) << "all clips, and nothing that lists them";
    EXPECT_EQ(std::filesystem::last_write_time(killed.Clip(1)), before);
    for (const std::string& name : calm.Names())
        EXPECT_EQ(Times(killed.folder / name), Times(calm / name)) << name;
}

TEST(ClipsLeft, AreNotUsedForAnotherConversionOrWithoutBeingAskedFor) {
    const Killed killed;
    const Result other = killed.Resume({"--size", "80x60"});
    EXPECT_EQ(other.code, kUsage);
    EXPECT_TRUE(Has(other.err, "settings size was nothing, now [80,60]")) << other.err;
    const Args anew = Join(killed.options, Args{ClipSource(), killed.output});
    const Result refused = Call(anew);
    EXPECT_EQ(refused.code, kCannotWrite);
    EXPECT_TRUE(Has(refused.err, R"(\xe9t\xe9.mp4.clips)")) << refused.err;
    WriteFile(killed.Clip(0), "precious");
    const Result changed = killed.Resume();
    EXPECT_EQ(changed.code, kCannotWrite);
    EXPECT_TRUE(Has(changed.err, "was changed since it was finished")) << changed.err;
    EXPECT_EQ(ReadFile(killed.Clip(0)), "precious");
    const Result replaced = Call(Join(Args{"-y"}, anew));
    EXPECT_EQ(replaced.code, 0);
    EXPECT_TRUE(Has(replaced.out + replaced.err, "its clips are made anew")) << replaced.out << replaced.err;
    EXPECT_EQ(killed.Names().size(), 10U);
}

TEST(ClipsLeft, ThatAreMissingOrListedOnADamagedLineAreMadeAgain) {
    for (const bool missing : {true, false}) {
        const Killed killed;
        const std::string told = Told(missing ? 1 : killed.Listed() - 1);
        if (missing)
            std::filesystem::remove(killed.Clip(1));
        else
            std::filesystem::resize_file(killed.list, std::filesystem::file_size(killed.list) - 20);
        const Result resumed = killed.Resume();
        ASSERT_EQ(resumed.code, 0) << resumed.err;
        EXPECT_TRUE(Has(resumed.out + resumed.err, told)) << resumed.out << resumed.err;
        EXPECT_EQ(killed.Names().size(), 10U);
    }
}

// A stop completes the clip that is being written, which is then shorter than it should be.
TEST(ClipsLeft, OfRunsThatWereStoppedAreGoneOnWithHoweverOften) {
    const struct {
        const char* clip; // at which the first run is stopped; later ones are at their first clip
        int stops;
    } rows[] = {{"_00", 2}, {"_01", 3}};
    for (const auto& row : rows) {
        const Folder folder;
        const std::string output = folder / "out.mp4";
        Args arguments{"--progress", "json", "--size",  "960x720", "--speed",    "slower",
                       "--length",   "8",    "--split", "2",       ClipSource(), output};
        for (int stop = 0; stop < row.stops; ++stop) {
            Running run(arguments, false);
            EXPECT_TRUE(run.WaitFor(fmt::format(R"("event":"clip_opened".*{})", stop == 0 ? row.clip : "")));
            EXPECT_TRUE(
                run.WaitFor(R"("phase":"converting".*"position_s":(0\.[1-9]|[1-9]))")); // there is some
            run.Signal(SIGTERM);
            ASSERT_EQ(run.Finish().code, kStopped) << row.clip << ", stop " << stop;
            ASSERT_TRUE(std::filesystem::exists(output + ".clips")) << row.clip << ", stop " << stop;
            if (stop == 0)
                arguments.insert(arguments.begin(), "--resume");
        }
        const Result resumed = Call(arguments);
        EXPECT_EQ(resumed.code, 0) << row.clip << ", " << row.stops << " stops: " << resumed.err;
        EXPECT_EQ(folder.Names().size(), 4U) << row.clip << ", " << row.stops << " stops";
    }
}

// Of clips that are all there it would only be in the way, also when it could not be written to.
TEST(ClipsLeft, AreListedNoLongerThanTheyHaveTo) {
    const Killed killed;
    const Folder folder;
    const std::string output = folder / (std::string(236, 'o') + ".mp4"); // too long for a list in the making
    for (const char* leave : {"-y", "--resume"}) {
        WriteFile(output + ".clips", ReadFile(killed.list));
        const Result result = Call(Join(killed.options, Args{"-y", leave, ClipSource(), output}));
        EXPECT_EQ(result.code, 0) << result.err;
        EXPECT_TRUE(Has(result.out + result.err, "it cannot be gone on with")) << result.out << result.err;
        EXPECT_EQ(folder.Names().size(), 10U) << leave;
    }
}

// Whatever others have put under names that are to come.
TEST(ClipsLeft, LeaveWhatIsNoneOfThem) {
    const Killed killed;
    WriteFile(killed.Clip(8), "precious");
    const Result refused = killed.Resume();
    EXPECT_EQ(refused.code, kCannotWrite);
    EXPECT_TRUE(Has(refused.err, R"(\xe9t\xe9_08.mp4" exists)")) << refused.err;
    EXPECT_EQ(ReadFile(killed.Clip(8)), "precious");
    std::filesystem::remove(killed.Clip(8));
    EXPECT_EQ(killed.Resume().code, 0);

    const Folder folder;
    const std::string list = folder / "out.mp4.clips";
    WriteFile(list, "precious");
    for (const char* leave : {"-q", "-y", "--resume"}) {
        const Result result = Call({"-q", leave, "--split", "5", ClipSource(), folder / "out.mp4"});
        EXPECT_EQ(result.code, kCannotWrite);
        EXPECT_TRUE(Has(result.err, list)) << result.err;
        EXPECT_EQ(ReadFile(list), "precious");
    }
    for (const Args& makes :
         {Args{"--split", "5"}, Args{"--jobs", "1"}, Args{"--plan", folder / "out.mp4.plan"}}) {
        for (const char* name : {"out.mp4.clips", "out.mp4.plan"}) {
            std::filesystem::remove(folder / name);
            std::filesystem::create_symlink(folder / "nowhere", folder / name);
        }
        const Result result = Call(Join(makes, Args{"-q", ClipSource(), folder / "out.mp4"}));
        EXPECT_EQ(result.code, kCannotWrite) << makes.front() << ": " << result.err;
    }
}

// What a kill has left is removed, but not a movie that is converted.
TEST(ClipsLeft, MayBeOfASourceThatIsCalledLikeOneOfThem) {
    for (const char* name : {"out_02.mp4.part", "out.mp4.clips.making-desk-7"}) {
        const Folder folder;
        const std::string source = folder / name;
        const Args arguments{"--progress", "json", "--split", "2", source, folder / "out.mp4"};
        while (!std::filesystem::exists(folder / "out.mp4.clips")) {
            WriteFile(source, ReadFile(ClipSource()));
            Running run(Join(arguments, Args{"-y"}), false);
            EXPECT_TRUE(run.WaitFor(R"("event":"clip_opened".*_02\.mp4)"));
            run.Signal(SIGKILL);
            run.Finish();
        }
        EXPECT_EQ(Call(Join(arguments, Args{"--resume"})).code, 0);
        EXPECT_TRUE(ReadFile(source) == ReadFile(ClipSource())) << name;
    }
}

TEST(ClipsLeft, AreMadeByOneRunAtATime) {
    const Folder folder;
    const Args make{"--progress", "json", "-y", "--split", "2", ClipSource(), folder / "out.mp4"};
    Running first(make, false);
    ASSERT_TRUE(first.WaitFor(R"("event":"clip_opened")"));
    const Result second = Call(make);
    EXPECT_EQ(second.code, kCannotWrite);
    EXPECT_TRUE(Has(second.err, R"(another run is working on ")" + folder.Path() + "/out.mp4.clips"))
        << second.err;
    EXPECT_EQ(first.Finish().code, 0);
    EXPECT_EQ(folder.Names().size(), 10U);
}

TEST(ClipsLeft, OfAPipeAreNot) {
    const Folder folder;
    const std::string pipe = folder / "pipe.mkv";
    ASSERT_EQ(mkfifo(pipe.c_str(), 0600), 0);
    const Result result = Call({"--split", "2", "--resume", pipe, folder / "out.mp4"});
    EXPECT_EQ(result.code, kUsage) << result.err;
    EXPECT_EQ(Call({"--resume", ClipSource(), folder / "out.mp4"}).code, kUsage);
}

} // namespace
