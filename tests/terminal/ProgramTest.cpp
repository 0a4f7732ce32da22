// Whole conversions, looked at from outside.
#include "tests/support/Program.h"
#include "tests/support/Inspect.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <ostream>

namespace {

namespace fs = std::filesystem;
using namespace test_movies;
using namespace inspect;
using program::Call;
using program::Result;

std::string Flashing() {
    return Make("flashing.mp4",
                Join(FlashPictures(8), Beeps(8), Args{"-c:v", "libx264", "-bf", "2", "-c:a", "aac"}));
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
const Args kNarrow = Join(CountedPictures(0.2), Args{"-vf", "scale=3:5", "-c:v", "ffv1", "-level", "1"});
const Args kSmall{"--size",        "80x80", "--frame-rate",     "12.5",
                  "--video-codec", "avc1",  "--video-max-rate", "1M"};

// A part has the picture shown at its begin, and those that begin before its end.
const Odd kOddities[] = {
    {"size.mkv", Join(CountedPictures(1), Args{"-vf", "scale=161:121", "-c:v", "ffv1"}), "o.mp4", 25, 0},
    {"narrow.mkv", kNarrow, "o.mkv", 5, 0, {"--video-codec", "FFV1"}},
    {"one.mp4", Join(CountedPictures(0.04), Args{"-c:v", "libx264"}), "o.mp4", 1, 0},
    {"short-sound.mkv", Lossless(3, 1), "o.mp4", 75, 3},
    {"long-sound.mkv", Lossless(1, 3), "o.mp4", 25, 3},
    {"still.mkv", kStill, "o.flv", 100, 14},
    {"variable.mp4", kVariable, "o.avi", 99, 0}, // of 3.96 s
    {"fast.mkv", kFast, "o.mp4", 240, 0},        // a rate that the engine would bring down to 30
    {"milliseconds.avi", kMilliseconds, "o.avi", 25, 0},
    {"plain.mkv", Lossless(2, 2), "o.mkv", 50, 0, {"--no-audio"}},
    {"plain.mkv", Lossless(2, 2), "o.mp3", 0, 2, {"--no-video"}},
    {"plain.mkv", Lossless(2, 2), "o.mkv", 2, 1.6, {"--length", "1.6", "--frame-rate", "1"}},
    {"plain.mkv", Lossless(2, 2), "o.webm", 26, 1, {"--begin", "0.5", "--length", "1"}},
    {"plain.mkv", Lossless(2, 2), "o.ts", 25, 2, kSmall},
    {"plain.mkv", Lossless(2, 2), "o.mov", 50, 2},
};
INSTANTIATE_TEST_SUITE_P(Sources, ProgramTakes, testing::ValuesIn(kOddities));

// Discs and camcorders have a stamp before each packet of a transport stream.
TEST(Program, WritesTransportStreamsOfBothKinds) {
    const std::string source = Make("short.mkv", Join(CountedPictures(1), Beeps(1)));
    const Folder folder;
    for (const auto& [name, sync, packet] : {std::tuple{"a.ts", 0U, 188U}, {"a.m2ts", 4U, 192U}}) {
        ASSERT_EQ(Call({"-q", source, folder / name}).code, 0) << name;
        const std::string written = ReadFile(folder / name);
        EXPECT_EQ(written.size() % packet, 0U) << name;
        EXPECT_EQ(written.at(sync), 'G') << name;
        EXPECT_EQ(written.at(sync + packet), 'G') << name;
    }
}

// The engine tells an encoder no higher rate than 200, which an AVI cannot exceed then.
TEST(Program, TellsTheRateOfFastMoviesAndWhatBecomesOfIt) {
    const std::string source = Make("faster.mkv", Join(CountedPictures(0.5, "500"), Args{"-c:v", "mpeg4"}));
    const Folder folder;
    for (const auto& [name, rate, told] : {std::tuple{"o.mp4", 500.0, false}, {"o.avi", 200.0, true}}) {
        const Result result = Call({source, folder / name});
        EXPECT_EQ(result.code, 0) << result.err;
        EXPECT_EQ(result.err.find("its 500 pictures a second got 200") != std::string::npos, told)
            << result.err;
        EXPECT_NEAR(movieconv::Movie(folder / name, {}).Info().pictures->frameRate, rate, 0.02 * rate)
            << name;
    }
}

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
    const Args looks[] = {{"--info", source},
                          {"--jobs", "2", source, folder / "jobs.mkv"},
                          {"--plan", folder / "p.plan", source, folder / "plan.mkv"},
                          {"--into", folder / "out", "--format", "mkv", source}};
    for (const Args& arguments : looks) {
        const Result result = Call(Join(Args{"--crop", "auto"}, arguments));
        EXPECT_EQ(result.code, 0) << arguments[0] << result.err;
    }
    const Result piped = program::Run({"sh", "-c", R"(cat "$1" | "$0" --crop auto -y /dev/stdin "$2")",
                                       MOVIECONV_PROGRAM, CountedMovie(), folder / "o.mkv"});
    EXPECT_EQ(piped.code, 0) << piped.err;
    EXPECT_NE(piped.err.find("cannot be looked for in a pipe"), std::string::npos) << piped.err;
    EXPECT_NEAR(movieconv::Movie(folder / "o.mkv", {}).Info().duration, 4, 0.1);
    const Result plain = Call({"-y", "--crop", "auto", CountedMovie(), folder / "o.mkv"});
    EXPECT_NE(plain.err.find("no black borders"), std::string::npos) << plain.err;
    const Result tooMuch = Call({"-y", "--crop", "120:110:0:0", source, folder / "o.mkv"});
    EXPECT_EQ(tooMuch.code, 2);
    EXPECT_NE(tooMuch.err.find("too little is left"), std::string::npos) << tooMuch.err;
}

} // namespace
