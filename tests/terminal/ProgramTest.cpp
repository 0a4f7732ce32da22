// Whole conversions, looked at from outside.
#include "tests/support/Program.h"
#include "tests/support/Inspect.h"
#include "tests/support/SmallDisk.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <chrono>
#include <csignal>
#include <cstdio>
#include <fcntl.h>
#include <filesystem>
#include <ostream>
#include <sys/stat.h>
#include <thread>
#include <unistd.h>

namespace {

namespace fs = std::filesystem;
using namespace test_movies;
using namespace inspect;
using program::Call;
using program::Result;
using program::Running;

std::string Flashing() {
    return Make("flashing.mp4",
                Join(FlashPictures(8), Beeps(8), Args{"-c:v", "libx264", "-bf", "2", "-c:a", "aac"}));
}

/// Slow enough that a test can interfere: many large pictures, but none that a codec keeps for later.
Args Slowly(const std::string& output) {
    return {CountedMovie(60), output, "--size", "1280x960", "--frame-rate", "100"};
}

TEST(Program, WritesEveryPictureOnceAndAllSound) {
    const Folder folder;
    const Result result = Call({CountedMovie(), folder / "out.mp4", "--video-rate", "2M"});
    ASSERT_EQ(result.code, 0) << result.err;
    EXPECT_EQ(result.err, "");
    EXPECT_NE(result.out.find("100% done"), std::string::npos) << result.out;
    EXPECT_EQ(result.out.find('\r'), std::string::npos);
    EXPECT_EQ(folder.Names(), Args{"out.mp4"});

    movieconv::Movie movie(folder / "out.mp4", {});
    EXPECT_EQ(movie.Info().pictures->codec, "mpeg4");
    EXPECT_EQ(movie.Info().sound->codec, "aac");
    EXPECT_NEAR(movie.Info().duration, 4, 0.04);
    const Seen seen = TakeAll(movie);
    ASSERT_EQ(seen.pictures.size(), 100u);
    for (int i = 0; i < 100; ++i) {
        EXPECT_NEAR(seen.pictures[i].luma, LumaOf(i), 3) << i;
        EXPECT_NEAR(seen.pictures[i].time, i / 25.0, 0.001) << i;
    }
    EXPECT_GE(seen.sound.size(), 4u * 44100 - 441);
    EXPECT_LE(seen.sound.size(), 4u * 44100 + 1024);
}

TEST(Program, KeepsSoundAndPicturesInStep) {
    struct {
        Args options;
        std::size_t files, pictures, flashes;
    } const cases[] = {{{"--progress", "none"}, 1, 200, 8},
                       {{"--begin", "2.5", "--length", "4"}, 1, 101, 4},
                       {{"--split", "2.4"}, 4, 200, 8}};
    for (const auto& test : cases) {
        SCOPED_TRACE(test.options[0]);
        const Folder folder;
        const Result result = Call(Join(Args{Flashing(), folder / "out.mp4"}, test.options));
        ASSERT_EQ(result.code, 0) << result.err;
        EXPECT_GE(folder.Names().size(), test.files);
        std::size_t pictures = 0;
        std::size_t flashes = 0;
        for (const std::string& name : folder.Names()) {
            movieconv::Movie movie(folder / name, {});
            const Seen seen = TakeAll(movie);
            const std::vector<double> light = Flashes(seen);
            const std::vector<double> sound = Beginnings(seen, movie.Info().sound->sampleRate);
            ASSERT_EQ(light.size(), sound.size()) << name;
            for (std::size_t i = 0; i < light.size(); ++i)
                EXPECT_NEAR(light[i], sound[i], 0.025) << name << ", flash " << i;
            pictures += seen.pictures.size();
            flashes += light.size();
        }
        EXPECT_EQ(pictures, test.pictures);
        EXPECT_EQ(flashes, test.flashes);
    }
    const Folder folder;
    const Args slowly =
        Join(CountedPictures(4), Beeps(4), Args{"-r", "2"}, NearLossless()); // begin clips late
    const Result slow = Call({Make("slow.mkv", slowly), folder / "slow.mp4", "--split", "1"});
    EXPECT_EQ(slow.code, 0) << slow.err;
}

struct Odd {
    const char* name;
    Args making;
    const char* output;
    std::size_t pictures;
    double sound; // seconds
    Args options = {};
};

void PrintTo(const Odd& odd, std::ostream* out) {
    *out << odd.name << " to " << odd.output;
    for (const std::string& option : odd.options)
        *out << ' ' << option;
}

class ProgramTakes : public testing::TestWithParam<Odd> {};

TEST_P(ProgramTakes, AndConvertsAll) {
    const Odd& odd = GetParam();
    const Folder folder;
    const std::string source = Make(std::string("odd-") + odd.name, odd.making);
    const Result result = Call(Join(Args{source, folder / odd.output}, odd.options));
    ASSERT_EQ(result.code, 0) << result.err;
    movieconv::Movie movie(folder / odd.output, {});
    const Seen seen = TakeAll(movie);
    EXPECT_EQ(seen.pictures.size(), odd.pictures);
    const double seconds =
        movie.Info().sound ? static_cast<double>(seen.sound.size()) / movie.Info().sound->sampleRate : 0;
    EXPECT_NEAR(seconds, odd.sound, odd.sound > 0 ? 0.06 : 0);
}

Args Lossless(double pictureSeconds, double soundSeconds) {
    return Join(CountedPictures(pictureSeconds), Beeps(soundSeconds), NearLossless());
}

const Args kVariable = Join(CountedPictures(4), Args{"-vf", "select='lt(mod(n,6),3)'", "-fps_mode", "vfr"});
const Args kStill = Join(CountedPictures(14), Beeps(14), Args{"-vf", "select='lt(n,1)+gt(n,250)'"},
                         Args{"-fps_mode", "vfr"}, NearLossless());
const Args kFast = Join(CountedPictures(1, "240"), Args{"-c:v", "libx264"});
const Args kMilliseconds = Join(CountedPictures(1), Args{"-enc_time_base", "1/1000", "-fps_mode", "vfr"},
                                Args{"-vf", "settb=1/1000", "-c:v", "mjpeg"});
const Args kSmall{"--size",        "80x80", "--frame-rate",     "12.5",
                  "--video-codec", "avc1",  "--video-max-rate", "1M"};

// A part has the picture shown at its begin, and those that begin before its end.
const Odd kOddities[] = {
    {"size.mkv", Join(CountedPictures(1), Args{"-vf", "scale=161:121", "-c:v", "ffv1"}), "o.mp4", 25, 0},
    {"one.mp4", Join(CountedPictures(0.04), Args{"-c:v", "libx264"}), "o.mp4", 1, 0},
    {"short-sound.mkv", Lossless(3, 1), "o.mp4", 75, 3},
    {"long-sound.mkv", Lossless(1, 3), "o.mp4", 25, 3},
    {"still.mkv", kStill, "o.flv", 100, 14},
    {"variable.mp4", kVariable, "o.avi", 100, 0},
    {"fast.mkv", kFast, "o.mp4", 240, 0}, // a rate that the engine would bring down to 30
    {"milliseconds.avi", kMilliseconds, "o.avi", 25, 0},
    {"plain.mkv", Lossless(2, 2), "o.mkv", 50, 0, {"--no-audio"}},
    {"plain.mkv", Lossless(2, 2), "o.mp3", 0, 2, {"--no-video"}},
    {"plain.mkv", Lossless(2, 2), "o.mkv", 2, 1.6, {"--length", "1.6", "--frame-rate", "1"}},
    {"plain.mkv", Lossless(2, 2), "o.webm", 26, 1, {"--begin", "0.5", "--length", "1"}},
    {"plain.mkv", Lossless(2, 2), "o.ts", 25, 2, kSmall},
    {"plain.mkv", Lossless(2, 2), "o.mov", 50, 2},
};
INSTANTIATE_TEST_SUITE_P(Sources, ProgramTakes, testing::ValuesIn(kOddities));

TEST(Program, TakesNamesInAnyScript) {
    const Folder folder;
    const std::string dashed = folder / "-y";
    fs::copy_file(CountedMovie(), dashed);
    const Args names{"фильм 映画.mp4",   "it's 100%d \"quoted\".tar.mp4", "[a,b].mp4",
                     "\xff\xfe raw.mp4", "file:http:movie.mp4",           std::string(248, 'n') + ".mp4"};
    for (const std::string& name : names) {
        const Result result = Call({"--length", "0.4", "--split", "0.2", "--", dashed, folder / name});
        EXPECT_EQ(result.code, 0) << name << ": " << result.err;
        const std::string stem = name.substr(0, name.rfind('.'));
        EXPECT_TRUE(fs::exists(folder / (stem + "_00.mp4"))) << name;
        EXPECT_TRUE(fs::exists(folder / (stem + "_01.mp4"))) << name;
    }
}

TEST(Program, RefusesAndLeavesEverythingAsItWas) {
    const Folder folder;
    const std::string source = folder / "in.mkv";
    fs::copy_file(CountedMovie(), source);
    fs::create_hard_link(source, folder / "same.mkv");
    fs::create_symlink("nothing.mkv", folder / "link.mkv");
    fs::create_symlink("there.mp4", folder / "linked");
    WriteFile(folder / "there.mp4", "precious");
    WriteFile(folder / "clip_03.mp4", "precious");
    WriteFile(folder / "text.srt", "1\n00:00:00,000 --> 00:00:01,000\nWords alone.\n");
    WriteFile(folder / "text.ans", "Words alone.\n");
    WriteFile(folder / "text.ffconcat", "ffconcat version 1.0\nfile in.mkv\n");
    WriteFile(folder / "network.sdp", "v=0\nc=IN IP4 127.0.0.1\nm=video 5004 RTP/AVP 33\n");
    const std::string whole = ReadFile(
        Make("index-first.mp4", Join(CountedPictures(1), Beeps(1), Args{"-movflags", "+faststart"})));
    WriteFile(folder / "head.mp4", whole.substr(0, whole.find("mdat") + 4)); // opens, but holds nothing
    WriteFile(folder / "body.mp4", whole.substr(whole.find("mdat") - 4));
    const std::vector<std::string> before = folder.Names();
    const struct {
        Args arguments;
        int code;
        const char* word;
    } refusals[] = {
        {{source, source, "-y"}, 2, "source itself"},
        {{source, folder / "out.mkv", "--preview", folder / "same.mkv"}, 2, "is the source"},
        {{source, folder / "out.mkv", "--log", folder / "out.mkv.part"}, 2, "is the output"},
        {{source, folder / "clip.mkv", "--split", "1", "--log", folder / "clip_100.mkv"}, 2, "is the output"},
        {{source, folder / "out.mkv", "--log", folder / "x", "--preview", folder / "x"}, 2, "the same file"},
        {{source, folder / "out.mkv", "--preview", folder / "there.mp4"}, 4, "not a preview"},
        {{source, folder / "out.mkv", "--preview", folder / "linked", "-y"}, 4, "a symbolic link"},
        {{source, folder / "out.mkv", "--preview", "/dev/null", "-y"}, 4, "a device"},
        {{source, folder / "out.mkv", "--log", folder / "there.mp4"}, 4, "not a log"},
        {{"--list-formats", "--log", folder / "link.mkv", "-y"}, 4, "a symbolic link"},
        {{source, folder / "out.mkv", "--log", "/dev/full", "-y"}, 4, "a device"},
        {{source, folder / "there.mp4"}, 4, "--overwrite"},
        {{source, folder / "clip.mp4", "--split", "1"}, 4, "clip_03.mp4"},
        {{source, folder / (std::string(252, 'n') + ".mp4")}, 4, "too long"},
        {{source, folder / "out.mp4", "--preview", folder / (std::string(248, 'n') + ".png")}, 4, "too long"},
        {{source, folder / "out.mp4", "--split", "0.01"}, 2, "--split takes"},
        {{source, folder / "out.mp4", "--length", "0"}, 2, "at least 0.001"},
        {{source, folder / "out.mp4", "--length", "9999999999"}, 2, "is not a time"},
        {{"--estimate", source, folder / "nowhere/out.mp4"}, 4, "nowhere"},
        {{source, "/proc/out.mp4"}, 4, "/proc"}, // where not even the superuser can create a file
        {{folder.Path(), folder / "out.mp4"}, 3, "directory"},
        {{source, folder / "out.xyz"}, 2, "--format"},
        {{folder / "body.mp4", folder / "out.mp4"}, 3, "index"},
        {{source, folder / "out.mp4", "--log", folder / "nowhere/log"}, 4, "nowhere/log"},
        {{folder / "none.mkv", folder / "out.mp4"}, 3, "none.mkv"},
        {{folder / "there.mp4", folder / "out.mp4"}, 3, "there.mp4"},
        {{folder / "text.srt", folder / "out.mp4"}, 3, "no pictures and no sound"},
        {{folder / "text.ans", folder / "out.mp4"}, 3, "it is a text"},
        {{folder / "network.sdp", folder / "out.mp4"}, 3, "where to find one"},
        {{folder / "text.ffconcat", folder / "out.mp4"}, 3, "--allow-playlists"},
        {{folder / "head.mp4", folder / "there.mp4", "-y"}, 3, "nothing to convert"},
        {{source, folder / "out.mp4", "--begin", "9"}, 2, "--begin"},
        {{source, folder / "out.mp4", "--fit", "wide"}, 2, "\"wide\" is not borders|stretch"},
        {{"none.mkv", folder / "out.webm", "--video-codec", "XVID"}, 2, "cannot carry pictures as \"XVID\""},
        {{source, folder / "out.mp4", "--video-codec", "H.264"}, 2, "four characters"},
        {{source, folder / "out.mp4", "--no-video", "--no-audio"}, 2, "--no-audio"},
        {{source, folder / "out.mp4", "--frame-rate", "240"}, 2, "up to 200"},
        {{source, folder / "out.mp4", "--quality", "best"}, 2, "\"best\" is not a number such as 23"},
        {{source, folder / "out.mp4", "--channels", "9"}, 2, "\"9\" is not a whole number from 1 to 8"},
        {{"--piece", "x", source}, 2, "\"x\" is not a whole number from 0 to 10000"},
        {{source}, 2, "OUTPUT"},
        {{}, 2, "INPUT"},
        {{"--nonsense"}, 2, "--help"},
    };
    for (const auto& refusal : refusals) {
        const Result result = Call(refusal.arguments);
        EXPECT_EQ(result.code, refusal.code) << result.err;
        EXPECT_NE(result.err.find(refusal.word), std::string::npos) << result.err;
        EXPECT_EQ(folder.Names(), before) << result.err;
    }
    EXPECT_EQ(ReadFile(folder / "there.mp4"), "precious");
    EXPECT_EQ(ReadFile(source), ReadFile(CountedMovie()));
    EXPECT_EQ(Call({source, folder / "there.mp4", "-y"}).code, 0);
    EXPECT_GT(fs::file_size(folder / "there.mp4"), 1000u);
}

TEST(Program, PrintsValidJsonAndNothingElse) {
    const Folder folder;
    const Result result = Call({CountedMovie(), folder / "a \"b\"\n\xff.mp4", "--progress", "json", "--split",
                                "2", "--log", folder / "log"});
    ASSERT_EQ(result.code, 0) << result.err;
    EXPECT_EQ(result.err, "");
    WriteFile(folder / "events", result.out);
    const char* check =
        "import json, sys\n"
        "events = [json.loads(line) for line in open(sys.argv[1], encoding='utf-8', newline='\\n')]\n"
        "kinds = [e['event'] for e in events]\n"
        "assert all(e['v'] == 1 for e in events)\n"
        "assert kinds[0] == 'start' and kinds[-1] == 'end'\n"
        "assert kinds.count('clip_opened') == kinds.count('clip_closed') >= 2\n"
        "assert events[-1]['exit_code'] == 0 and events[-1]['outcome'] == 'done'\n"
        "last = len(kinds) - kinds[::-1].index('clip_closed')\n"
        "assert all(e['phase'] == 'finishing' for e in events[last:-1])\n"
        "assert all(e['percent'] < 100 for e in events if e['event'] == 'progress')\n";
    EXPECT_EQ(program::Run({"python3", "-c", check, folder / "events"}).code, 0) << result.out;
    EXPECT_NE(ReadFile(folder / "log").find("Encoding thread Exit."), std::string::npos);
}

TEST(Program, CropsWhatItIsToldOrFinds) {
    const std::string source =
        Make("bordered.mkv", Join(Lavfi("testsrc2=s=320x160:d=1,pad=320:240:0:40"), NearLossless()));
    const Folder folder;
    const struct {
        const char* crop;
        int width;
        int height;
        const char* says;
    } cases[] = {{"auto", 320, 160, "cropped to 320x160: 40 above, 40 below, 0 left, 0 right"},
                 {"21:30:40:51", 230, 190, "done"}};
    for (const auto& test : cases) {
        const Result result = Call({"-y", "--crop", test.crop, source, folder / "o.mkv"});
        EXPECT_EQ(result.code, 0) << result.err;
        EXPECT_NE((result.out + result.err).find(test.says), std::string::npos) << result.out << result.err;
        const movieconv::Movie movie(folder / "o.mkv", {});
        EXPECT_EQ(movie.Info().pictures->width, test.width);
        EXPECT_EQ(movie.Info().pictures->height, test.height);
    }
    const Result plain = Call({"-y", "--crop", "auto", CountedMovie(), folder / "o.mkv"});
    EXPECT_NE(plain.err.find("no black borders"), std::string::npos) << plain.err;
    const Result tooMuch = Call({"-y", "--crop", "120:110:0:0", source, folder / "o.mkv"});
    EXPECT_EQ(tooMuch.code, 2);
    EXPECT_NE(tooMuch.err.find("too little is left"), std::string::npos) << tooMuch.err;
}

TEST(Program, KeepsAPreview) {
    const Folder folder;
    for (const Args& options : {Args{}, Args{"--no-audio"}, Args{"--length", "0.5"}}) {
        const Args preview{CountedMovie(), folder / "out.mp4", "-y", "--preview", folder / "now.png"};
        ASSERT_EQ(Call(Join(preview, options)).code, 0);
        const Seen seen = LookAt(folder / "now.png");
        ASSERT_EQ(seen.pictures.size(), 1u);
        EXPECT_EQ(seen.pictures[0].width, 160);
        EXPECT_NEAR(seen.pictures[0].luma, LumaOf(options.size() < 2 ? 99 : 12), 2);
        WriteFile(folder / "there.png", "precious"); // replaced by leave only, a preview of before without
        EXPECT_EQ(Call({CountedMovie(), folder / "out.mp4", "-y", "--preview", folder / "there.png"}).code,
                  0);
        EXPECT_EQ(LookAt(folder / "there.png").pictures.size(), 1u);
    }

    Running running(
        Join(Slowly(folder / "slow.mp4"), Args{"--progress", "json", "--preview", folder / "now.png"}),
        false);
    ASSERT_TRUE(running.WaitFor("clip_opened"));
    const auto before = fs::last_write_time(folder / "now.png");
    while (fs::last_write_time(folder / "now.png") == before)
        ASSERT_TRUE(running.WaitFor("\"event\":\"progress\""));
    WriteFile(folder / "precious", "precious");
    fs::rename(folder / "precious", folder / "now.png");
    running.Signal(SIGINT); // the last picture is shown, too
    const Result result = running.Finish();
    EXPECT_EQ(result.code, 6) << result.out;
    EXPECT_NE(result.out.find("another file has come there meanwhile"), std::string::npos) << result.out;
    EXPECT_EQ(ReadFile(folder / "now.png"), "precious");
    EXPECT_EQ(folder.Names(), (Args{"now.png", "out.mp4", "slow.mp4", "there.png"}));

    const Result without = Call(
        {CountedMovie(), folder / "out.mkv", "--preview", folder / "nowhere/now.png", "--progress", "none"});
    EXPECT_EQ(without.code, 0);
    EXPECT_NE(without.err.find("nowhere/now.png\": No such file"), std::string::npos) << without.err;
    EXPECT_EQ(without.out.find("100% done"), 0u) << without.out;
}

TEST(Program, TellsAboutSourcesFormatsAndRoom) {
    const Folder folder;
    const Result info = Call({"--info", CountedMovie()});
    EXPECT_EQ(info.code, 0);
    EXPECT_NE(info.out.find("160 x 120"), std::string::npos) << info.out;
    const Result estimate = Call({"--estimate", CountedMovie(), "out.mp4"});
    EXPECT_EQ(estimate.code, 0) << estimate.err;
    EXPECT_NE(estimate.out.find("320.0 kB"), std::string::npos) << estimate.out; // 640 kbit/s for 4 s
    EXPECT_NE(estimate.out.find("are free in \".\""), std::string::npos) << estimate.out;
    EXPECT_NE(Call({"--list-formats"}).out.find("MKV"), std::string::npos);
    EXPECT_NE(Call({"--help"}).out.find("--split"), std::string::npos);
    EXPECT_NE(Call({"--version"}).out.find("movieconv 1."), std::string::npos);
}

TEST(Program, VersionTellsTheColourRoutinesLevel) {
    const auto version = [](const std::string& wanted) {
        return program::Run({"env", "MOVIECONV_COLOUR_LEVEL=" + wanted, MOVIECONV_PROGRAM, "--version"}).out;
    };
    EXPECT_NE(version("plain").find("\ncolour routines: plain\n"), std::string::npos) << version("plain");
    EXPECT_NE(version("fast").find("\"fast\", which is not to be had"), std::string::npos) << version("fast");
}

TEST(Program, GetsAlongWithWhateverStandardStreams) {
    const Folder folder;
    const std::string raw = Make("raw.mpv", Join(CountedPictures(1), Args{"-f", "mpeg2video"}));
    const auto shell = [&](const std::string& command) {
        return program::Run({"sh", "-c", "movieconv() { '" MOVIECONV_PROGRAM "' \"$@\"; }; " + command, raw,
                             folder / "out.mp4"});
    };
    EXPECT_EQ(shell("movieconv \"$0\" \"$1\" <&- >&- 2>&-").code, 0);
    EXPECT_EQ(LookAt(folder / "out.mp4").pictures.size(), 25u);
    EXPECT_EQ(shell("movieconv --list-formats >/dev/full").code, 4);
    EXPECT_NE(shell("cat \"$0\" | movieconv --info -").out.find("length unknown"), std::string::npos);
    EXPECT_EQ(shell("cat \"$0\" | movieconv --estimate /dev/stdin \"$1\"").code, 2);
}

TEST(Program, AppendsToItsOwnLogsAndByLeaveToOthers) {
    const Folder folder;
    const auto call = [&](const std::string& log, const char* leave) {
        return Call({CountedMovie(), folder / "out.mp4", leave, "--length", "0.2", "--log", folder / log})
            .code;
    };
    WriteFile(folder / "empty", "");
    WriteFile(folder / "letter", "Dear reader,\n");
    EXPECT_EQ(call("log", "-q"), 0);
    const std::string first = ReadFile(folder / "log");
    for (const char* log : {"log", "empty", "letter"})
        EXPECT_EQ(call(log, "-y"), 0);
    EXPECT_EQ(ReadFile(folder / "log").find(first), 0u);
    EXPECT_GT(ReadFile(folder / "log").size(), first.size());
    EXPECT_EQ(ReadFile(folder / "empty").find("movieconv log\n"), 0u);
    EXPECT_EQ(ReadFile(folder / "letter").find("Dear reader,\n"), 0u);
    EXPECT_NE(ReadFile(folder / "letter").find("Encoding thread Exit."), std::string::npos);
}

class ProgramSignal : public testing::TestWithParam<int> {};

TEST_P(ProgramSignal, FinishesAPlayableFile) {
    const Folder folder;
    Running running(Join(Slowly(folder / "out.mp4"), Args{"--progress", "json"}), false);
    for (int report = 0; report < 4; ++report)
        ASSERT_TRUE(running.WaitFor("\"event\":\"progress\""));
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

TEST(Program, ConvertsAllAlthoughTheLogCannotBeWritten) {
    const Folder folder;
    const SmallDisk disk(folder / "disk", "600k");
    if (!disk.IsThere())
        GTEST_SKIP() << "no small disk can be mounted here";
    WriteFile(folder / "disk/much", std::string(1'000'000, 'x'));
    const Result result = Call({CountedMovie(), folder / "out.mp4", "--log", folder / "disk/log"});
    EXPECT_EQ(result.code, 0) << result.err;
    EXPECT_EQ(LookAt(folder / "out.mp4").pictures.size(), 100u);
    EXPECT_EQ(ReadFile(folder / "disk/log"), "");
}

} // namespace
