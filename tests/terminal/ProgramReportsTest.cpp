// What the program refuses, prints and keeps beside its output.
#include "tests/support/Inspect.h"
#include "tests/support/Program.h"
#include "tests/support/SmallDisk.h"
#include "tests/support/TestMovies.h"
#include "tests/terminal/Slowly.h"
#include "text/Utf8.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <csignal>
#include <filesystem>
#include <nlohmann/json.hpp>

namespace {

namespace fs = std::filesystem;
using namespace test_movies;
using inspect::LookAt;
using inspect::Seen;
using program::Call;
using program::Result;
using program::Running;

TEST(Program, TakesANameInBracketsForOneName) {
    const Folder folder;
    const Result result = Call({"--into", folder / "out", folder / "a.mkv", folder / "b.mkv", "[c, d]"});
    EXPECT_EQ(result.code, 3) << result.err;
    EXPECT_NE(result.err.find("\"./[c, d]\""), std::string::npos) << result.err;
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
    const std::string plan = folder / "planned";
    ASSERT_EQ(Call({"--plan", plan, source, folder / "later.mkv"}).code, 0);
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
        {{"--plan", source, source, folder / "out.mkv", "-y"}, 2, "is the source"},
        {{"--plan", folder / "same.mkv", source, folder / "out.mkv", "-y"}, 2, "is the source"},
        {{"--plan", folder / "there.mp4", source, folder / "there.mp4", "-y"}, 2, "is the output"},
        {{"--plan", folder / "p", source, source}, 2, "is the source itself"},
        {{"--plan", folder / "p", source, folder / "there.mp4"}, 4, "--overwrite"},
        {{"--plan", folder / "p", source, folder / "nowhere/out.mp4"}, 4, "nowhere"},
        {{"--plan", folder / "p", "-", folder / "out.mp4"}, 2, "standard input"},
        {{source, folder / "o.mkv", "--jobs", "1", "--log", folder / "o.mkv.plan"}, 2, "is the plan"},
        {{source, folder / "o.mkv", "--jobs", "1", "--log", folder / "o.mkv.plan.lock"}, 2, "what guards it"},
        {{source, folder / "o.mkv", "--jobs", "1", "--log", folder / "o.mkv.plan.0001.piece"}, 2, "a piece"},
        {{source, folder / "o.mkv", "--split", "1", "--log", folder / "o.mkv.clips"},
         2,
         "list of the output's"},
        {{source, folder / "o.mkv", "--split", "1", "--preview", folder / "o.mkv.clips"}, 2, "list of"},
        {{"--piece", "0", plan, "--log", source, "-y"}, 2, "is the source"},
        {{"--piece", "0", plan, "--log", plan, "-y"}, 2, "is the plan"},
        {{"--piece", "0", plan, "--log", plan + ".0000.piece"}, 2, "is a piece"},
        {{"--join", plan, "--log", folder / "later.mkv"}, 2, "is the output"},
        {{"--into", folder / "out", source, folder / "body.mp4", folder / "same.mkv", "--log", source, "-y"},
         2,
         "is the source"},
        {{source, folder / "text.srt", "--subtitle-file", folder / "text.srt", "-f", "mkv", "-y"},
         2,
         "subtitles that is read"},
        {{source, folder / "out.mkv", "--burn-subtitles", folder / "text.srt", "--log", folder / "text.srt",
          "-y"},
         2,
         "subtitles that is read"},
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
        {{source, folder / "out.mp4", "--frame-rate", "240"}, 2, "from 0.1 to 200"},
        {{source, folder / "out.mp4", "--quality", "best"}, 2, "\"best\" is not a number such as 23"},
        {{source, folder / "out.mp4", "--channels", "9"}, 2, "\"9\" is not a whole number from 1 to 8"},
        {{"--piece", "x", source}, 2, "\"x\" is not a whole number from 0 to 10000"},
        {{source}, 2, "OUTPUT"},
        {{}, 2, "INPUT"},
        {{"--nonsense"}, 2, "--help"},
        {{"--info", "--list-formats", source}, 2, "--info and --list-formats exclude each other"},
        {{"--estimate", "--info", source, "o.mp4"}, 2, "--info and --estimate exclude each other"},
        {{"--piece", "0", "--size", "100x100", "x.plan"}, 2, "--size does not go with --piece"},
        {{"--join", "-f", "mkv", "x.plan"}, 2, "--format does not go with --join"},
        {{"--list-presets", "--channels", "2"}, 2, "--channels does not go with --list-presets"},
        {{"--list-formats", "--on-full", "wait"}, 2, "--on-full does not go with --list-formats"},
        {{"--info", source, "--preset", "nonexistent"}, 2, "--preset does not go with --info"},
        {{"--info", source, "--quality", "99"}, 2, "--quality does not go with --info"},
        {{"--info", source, "--begin", "5"}, 2, "--begin does not go with --info"},
        {{"--info", source, "--no-chapters"}, 2, "--no-chapters does not go with --info"},
        {{"--info", source, "--preview", "p.png"}, 2, "--preview does not go with --info"},
        {{"--plan", folder / "p", source, folder / "o.mp4", "--preview", "p.png"},
         2,
         "--preview does not go"},
        {{"--plan", folder / "p", source, folder / "o.mp4", "--on-full", "wait"}, 2, "--on-full does not go"},
        {{source, folder / "out.mp4", "--keep-pieces"}, 2, "--keep-pieces goes with"},
        {{source, folder / "out.mp4", "--subtitle-charset", "NOSUCH"}, 2, "--subtitle-charset goes with"},
        {{source, folder / "out.m4a", "--no-video", "--size", "64x64"}, 2, "--no-video leaves"},
        {{source, folder / "out.m4a", "--no-video", "--hdr", "sdr"}, 2, "it excludes --hdr"},
        {{source, folder / "out.mp4", "--no-audio", "--channels", "1"}, 2, "--no-audio leaves"},
        {{source, folder / "out.mp4", "--audio-tracks", "none", "--audio-codec", "AAC"},
         2,
         "excludes --audio-c"},
        {{source, folder / "out.mp4", "--video-rate", "1M", "--video-max-rate", "1k"}, 2, "at least"},
        {{source, folder / "out.mp4", "--audio-rate", "1M", "--audio-max-rate", "1k"}, 2, "at least"},
        {{source, folder / "out.mp4", "--audio-tracks", ""}, 2, "--audio-tracks has an empty value"},
        {{source, folder / "out.mp4", "--burn-subtitles", ""}, 2, "--burn-subtitles has an empty value"},
        {{source, folder / "out.mp4", "--subtitle-file", ""}, 2, "--subtitle-file has an empty value"},
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

/// Sound that stays as it is has a size that is known: what is left is what the format adds.
TEST(Program, EstimatesCountThePacketsOfStreamsForBroadcast) {
    for (const auto& [name, codec] : {std::pair{"o.ts", "ac3"}, {"o.m2ts", "ac3"}, {"o.mpg", "mp2"}}) {
        SCOPED_TRACE(name);
        const Folder folder;
        const std::string source = Make(std::string("estimated-") + codec + ".mkv",
                                        Join(Beeps(20), Args{"-c:a", codec, "-b:a", "192k"}));
        const Args order{source, folder / name, "--audio-codec", "copy", "--progress", "json"};
        const Result estimate = Call(Join(Args{"--estimate"}, order));
        ASSERT_EQ(estimate.code, 0) << estimate.err;
        ASSERT_EQ(Call(order).code, 0);
        const auto needed = nlohmann::json::parse(estimate.out).at("needed").get<double>();
        const auto bytes = static_cast<double>(fs::file_size(folder / name));
        EXPECT_NEAR(needed, bytes, 0.03 * bytes);
    }
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
    for (const char* asked : {"--list-formats", "--help", "--version", "--completion bash"})
        EXPECT_EQ(shell(std::string("movieconv ") + asked + " >/dev/full").code, 4) << asked;
    const auto full = shell("movieconv -y --progress json \"$0\" \"$1\" >/dev/full");
    EXPECT_EQ(full.code, 0);
    EXPECT_EQ(full.err, "movieconv: warning: nothing more is told on the standard output: No space left on "
                        "device\n");
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

/// What is in it, with what a terminal would obey or show in another order made visible.
bool IsPlainText(const std::string& text) {
    const auto holds = [&text](const char* part) { return text.find(part) != std::string::npos; };
    return std::none_of(text.begin(), text.end(),
                        [](unsigned char c) { return (c < 0x20 && c != '\n') || c == 0x7F; }) &&
           !holds("\xC2\x9B") && !holds("\xE2\x80\xAE") && // NOLINT(misc-misleading-bidirectional)
           text::ToUtf8(text::FromUtf8(text)) == text;
}

// Tags, titles, chapters and names of files are whoever's who made the movie.
TEST(Program, ShowsNoTextOfOthersThatTerminalsObey) {
    const Folder folder;
    // NOLINTNEXTLINE(misc-misleading-bidirectional)
    const std::string evil = "\x1b]0;owned\x07\xC2\x9b"
                             "2J\xE2\x80\xAE\x7f";
    const std::string description = Part("evil-texts", ";FFMETADATA1\ntitle=" + evil +
                                                           "\ncomment=one\\\ntags:\\\n      code: forged\n"
                                                           "[CHAPTER]\nTIMEBASE=1/1\nSTART=0\nEND=1\ntitle=" +
                                                           evil + "\n");
    const std::string source =
        Make("evil-texts.mkv", Join(Args{"-i", description}, CountedPictures(1),
                                    Args{"-map", "1", "-map_metadata", "0", "-map_chapters", "0",
                                         "-metadata:s:v", "title=" + evil}));
    const std::string input = folder / ("in" + evil + "\n100% done: forged\n\xff.mkv");
    fs::copy_file(source, input);
    const std::string output = folder / ("out" + evil + "\nwrote forged.mp4");
    for (const Args& arguments :
         {Args{"--info", input}, Args{"--info", input, "--progress", "json"}, Args{input, output},
          Args{input, output, "-y", "--progress", "json"}, Args{input, output}, Args{input + "x", output},
          Args{"--" + evil + "\n", input}, Args{"--estimate", input, folder / (evil + "/o.mp4")}}) {
        const Result result = Call(arguments);
        EXPECT_TRUE(IsPlainText(result.out)) << result.out;
        EXPECT_TRUE(IsPlainText(result.err)) << result.err;
        EXPECT_FALSE(Has("\n" + result.out + result.err, "\n100% done: forged")) << result.out;
        EXPECT_FALSE(Has("\n" + result.out, "\nwrote forged")) << result.out;
    }
    const std::string told = Call({"--info", input}).out;
    EXPECT_TRUE(Has(told, "\\x1b]0;owned\\x07\\u009b2J\\u202e\\x7f")) << told;
    EXPECT_TRUE(Has(told, "COMMENT: one\n          tags:\n                code: forged\n")) << told;
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
