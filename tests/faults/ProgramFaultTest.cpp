// What befalls a conversion from outside: the input is cut or removed, the output's folder goes, threads
// cannot be started. The program tells it by its exit code and leaves no half file under a real name.
#include "tests/faults/CrashReport.h"
#include "tests/support/Inspect.h"
#include "tests/support/Program.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <regex>
#include <set>
#include <sys/resource.h>
#include <sys/stat.h>
#include <thread>

namespace {

namespace fs = std::filesystem;
using namespace test_movies;
using namespace inspect;
using program::Call;
using program::Result;
using program::Running;

/// A movie of 20 seconds that is much longer than what is read ahead: lightly compressed.
std::string Long(const std::string& extension) {
    return Make("long." + extension,
                Join(Args{"-f", "lavfi", "-i", "testsrc2=size=640x360:rate=25:duration=20"}, Beeps(20),
                     Args{"-c:v", "mpeg4", "-q:v", "2", "-g", "25", "-c:a", "aac"}));
}

/// Converts to out/out.mp4 in `folder`; `harm` comes when the conversion has begun.
template <class Harm>
Result Convert(const std::string& source, const Folder& folder, Harm harm) {
    fs::create_directory(folder / "out");
    Running running({source, folder / "out/out.mp4", "--size", "960x720"}, true);
    EXPECT_TRUE(running.WaitFor("0:00:(0[1-9]|1[0-4]) / "));
    harm();
    return running.Finish();
}

TEST(InputFault, ACutFileIsToldAndWhatWasReadIsConverted) {
    for (const std::string extension : {"mkv", "mp4"}) {
        const Folder folder;
        const std::string source = folder / ("in." + extension);
        fs::copy_file(Long(extension), source);
        const Result result =
            Convert(source, folder, [&] { fs::resize_file(source, fs::file_size(source) / 2); });
        EXPECT_EQ(result.code, 3) << result.out;
        EXPECT_NE(result.out.find("reading \"" + source), std::string::npos) << result.out;
        const std::size_t pictures = LookAt(folder / "out/out.mp4").pictures.size();
        EXPECT_GT(pictures, 25u);
        EXPECT_LT(pictures, 500u);
    }
}

// An open file stays until it is closed.
TEST(InputFault, ARemovedFileIsConvertedToItsEnd) {
    const Folder folder;
    const std::string source = folder / "in.mkv";
    fs::copy_file(Long("mkv"), source);
    const Result result = Convert(source, folder, [&] { fs::remove(source); });
    EXPECT_EQ(result.code, 0) << result.out;
    EXPECT_EQ(LookAt(folder / "out/out.mp4").pictures.size(), 500u);
}

TEST(OutputFault, ARemovedFolderEndsTheConversionSoon) {
    const Folder folder;
    const Result result = Convert(Long("mkv"), folder, [&] { fs::remove_all(folder / "out"); });
    EXPECT_EQ(result.code, 4) << result.out;
    EXPECT_NE(result.out.find("No such file or directory"), std::string::npos) << result.out;
    EXPECT_EQ(result.out.find("is in \""), std::string::npos) << "nothing is left: " << result.out;
    EXPECT_EQ(result.out.find("0:00:20 / "), std::string::npos) << "not all was converted for nothing";
}

TEST(OutputFault, ALimitOfTheFileSizeIsTold) {
    const Folder folder;
    const std::string source = Long("mkv");
    rlimit usual{};
    ASSERT_EQ(getrlimit(RLIMIT_FSIZE, &usual), 0);
    const rlimit small{500'000, usual.rlim_max}; // for the program, which inherits it
    ASSERT_EQ(setrlimit(RLIMIT_FSIZE, &small), 0);
    const Result result = Call({source, folder / "out.mp4", "--progress", "json"});
    setrlimit(RLIMIT_FSIZE, &usual);
    EXPECT_NE(result.out.find("\"event\":\"error\",\"text\":\"cannot write"), std::string::npos)
        << result.out;
    EXPECT_NE(result.out.find("\"outcome\":\"failed\",\"exit_code\":4"), std::string::npos) << result.out;
    EXPECT_EQ(result.code, 4) << result.err;
    EXPECT_NE(result.err.find("File too large; what was"), std::string::npos) << result.err;
    EXPECT_GT(LookAt(folder / "out.mp4.part").pictures.size(), 25u);
}

// A source that delivers nothing for a while, and then goes on.
TEST(LogFault, AStallIsNamed) {
    const Folder folder;
    const std::string source =
        Make("stalling.ts", Join(CountedPictures(60), Args{"-c:v", "mpeg2video", "-q:v", "2"}));
    ASSERT_EQ(mkfifo((folder / "in").c_str(), 0600), 0);
    Running running({folder / "in", folder / "out.mp4", "--log", folder / "log", "--progress", "json"},
                    false);
    const std::string bytes = ReadFile(source);
    std::ofstream to(folder / "in", std::ios::binary);
    const auto half = static_cast<std::streamsize>(bytes.size() / 2);
    to.write(bytes.data(), half).flush();
    const auto logged = [&](const char* line) {
        return ReadFile(folder / "log").find(line) != std::string::npos;
    };
    const auto waitsFiveSeconds = [&](const std::string& who) {
        const std::string log = ReadFile(folder / "log");
        const std::string line = who + " for ";
        const std::size_t at = log.find(line);
        return at != std::string::npos && std::atof(&log[at + line.size()]) >= 5;
    };
    while (!waitsFiveSeconds("A decoder waits for the source") ||
           !waitsFiveSeconds("The conversion waits for the picture decoder"))
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
    to.write(bytes.data() + half, static_cast<std::streamsize>(bytes.size()) - half);
    to.close();
    EXPECT_EQ(running.Finish().code, 0);
    EXPECT_TRUE(logged("A decoder waits for the source no longer, after "));
}

#ifdef MOVIECONV_FAILING_THREADS
/// Converts with what `variable` names failing by means of the preloaded `library`.
Result CallFailing(const char* library, const char* variable, const std::string& failing,
                   const Args& arguments) {
    setenv(variable, failing.c_str(), 1);
    setenv("LD_PRELOAD", library, 1);
    Result result = Call(arguments);
    unsetenv("LD_PRELOAD");
    // An emulator, which the library is not made for, complains and goes on.
    result.err = std::regex_replace(result.err, std::regex("ERROR: ld\\.so: .*\n"), "");
    return result;
}

// The threads of the program, the engine, the decoders and the writer, in the order of their start. The first
// run in which all start ends the loop. An encoder that gets none of its own is refused.
TEST(ThreadFault, EveryThreadThatCannotBeStartedIsTold) {
    const std::string source = Make("short.mkv", Join(CountedPictures(1), Beeps(1), Args{"-c:v", "mpeg4"}));
    for (const std::string codec : {"XVID", "H264"}) {
        std::set<int> codes;
        for (int number = 1; codes.count(0) == 0; ++number) {
            SCOPED_TRACE(codec + std::to_string(number));
            const Folder folder;
            const Result result = CallFailing(
                MOVIECONV_FAILING_THREADS, "MOVIECONV_FAILING_THREAD", std::to_string(number),
                {source, folder / "out.mp4", "--preview", folder / "now.png", "--video-codec", codec});
            codes.insert(result.code);
            EXPECT_EQ(result.err.empty(), result.code == 0);
            if (result.code == 0) {
                EXPECT_EQ(LookAt(folder / "out.mp4").pictures.size(), 25u);
                EXPECT_GE(number, 9) << "keys, preview, worker, decoders, reading, encoders";
            } else {
                EXPECT_TRUE(result.code == 3 || !fs::exists(folder / "out.mp4")) << result.err;
            }
            EXPECT_TRUE(result.code != 2 || result.err.find("encoder for \"H264\"") != std::string::npos);
        }
        const bool parallel = codec == "H264" && std::thread::hardware_concurrency() > 1;
        EXPECT_EQ(codes, parallel ? (std::set<int>{0, 1, 2, 3}) : (std::set<int>{0, 1, 3}));
    }
}

// Allocations of the whole program, some of them once and some for good. What has the real name plays, to the
// end where nothing was said.
TEST(MemoryFault, ALackOfItIsTold) {
    constexpr int kStep = 211;
    const std::string source = Make("short.mp4", Join(CountedPictures(1), Beeps(1), Args{"-c:v", "mpeg4"}));
    for (const std::string lack : {"", "-"}) {
        Result result{};
        for (int number = 1; result.err.find("No allocation") == std::string::npos; number += kStep) {
            SCOPED_TRACE(std::to_string(number) + lack);
            const Folder folder;
            const std::string output = folder / "out.mp4";
            result =
                CallFailing(MOVIECONV_FAILING_ALLOCATIONS, "MOVIECONV_FAILING_ALLOCATION",
                            std::to_string(number) + lack, {source, output, "--preview", folder / "now.png"});
            if (IsKnownCrash(result.err))
                continue;
            const bool told = result.err.find("movieconv: ") != std::string::npos;
            EXPECT_TRUE(result.code >= 0 && result.code <= 4) << result.code << result.err;
            EXPECT_TRUE(told || result.code == 0) << result.code << result.err;
            EXPECT_TRUE(fs::exists(output) || result.code != 0) << result.err;
            if (fs::exists(output) && result.code != 3) { // which may have lost a stream's pictures
                EXPECT_TRUE(WasOpening(result.err) || told || LookAt(output).pictures.size() == 25)
                    << result.err;
            }
        }
    }
}
#endif

} // namespace
