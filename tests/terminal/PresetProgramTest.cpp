// What the presets make of a movie, and the options around them, looked at from outside.
#include "tests/support/Inspect.h"
#include "tests/support/Program.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <filesystem>
#include <ostream>
#include <string>
#include <tuple>

namespace {

namespace fs = std::filesystem;
using namespace test_movies;
using namespace inspect;
using program::Call;
using program::Result;

/// Two seconds with grain, lossless.
std::string Grainy(const std::string& size = "320x180", const std::string& rate = "25") {
    const std::string pictures =
        "testsrc2=size=" + size + ":rate=" + rate + ":duration=2,noise=alls=6:allf=t";
    return Make(
        "grainy-" + size + "-" + rate + ".mkv",
        Join(Args{"-f", "lavfi", "-i", pictures, "-f", "lavfi", "-i", "sine=duration=2:sample_rate=48000"},
             Args{"-ac", "2", "-pix_fmt", "yuv420p", "-c:v", "ffv1", "-c:a", "flac"}));
}

/// How alike the pictures of two movies are: 1 for the same.
double Ssim(const std::string& movie, const std::string& source) {
    const Result result = program::Run(
        {"ffmpeg", "-nostdin", "-i", movie, "-i", source, "-lavfi", "ssim", "-an", "-f", "null", "-"});
    const std::size_t at = result.err.rfind("All:");
    return at == std::string::npos ? 0 : std::atof(&result.err[at + 4]);
}

struct Expected {
    const char* preset;
    const char* output;
    const char* pictures; ///< Codec; empty: none.
    const char* sound;
    double ssim; ///< At least.
};

void PrintTo(const Expected& expected, std::ostream* out) {
    *out << expected.preset;
}

class ProgramPreset : public testing::TestWithParam<Expected> {};

TEST_P(ProgramPreset, GivesWhatItPromises) {
    const Expected& expected = GetParam();
    const Folder folder;
    const std::string output = folder / expected.output;
    const Result result = Call({"--preset", expected.preset, Grainy(), output});
    ASSERT_EQ(result.code, 0) << result.err;
    movieconv::Movie movie(output, {});
    EXPECT_EQ(movie.Info().pictures ? movie.Info().pictures->codec : "", expected.pictures);
    EXPECT_EQ(movie.Info().sound->codec, expected.sound);
    EXPECT_EQ(movie.Info().sound->channels, 2);
    EXPECT_NEAR(movie.Info().duration, 2, 0.06);
    if (movie.Info().pictures) {
        EXPECT_EQ(movie.Info().pictures->width, 320);
        EXPECT_EQ(TakeAll(movie).pictures.size(), 50u);
        EXPECT_GE(Ssim(output, Grainy()), expected.ssim);
    }
}

const Expected kPresets[] = {{"standard", "o.mp4", "h264", "aac", 0.9},
                             {"standard", "o.webm", "vp9", "opus", 0.88},
                             {"standard", "o.mpg", "mpeg2video", "mp2", 0.9},
                             {"standard", "o.wav", "", "pcm_s16le", 0},
                             {"small", "o.mp4", "hevc", "aac", 0.87},
                             {"best", "o.mov", "h264", "aac", 0.94},
                             {"web", "o.webm", "vp9", "opus", 0.88},
                             {"av1", "o.mkv", "av1", "opus", 0.87},
                             {"phone", "o.mp4", "h264", "aac", 0.88},
                             {"archive", "o.mkv", "ffv1", "flac", 1},
                             {"sound", "o.m4a", "", "aac", 0},
                             {"classic", "o.mp4", "mpeg4", "aac", 0.8}};
INSTANTIATE_TEST_SUITE_P(All, ProgramPreset, testing::ValuesIn(kPresets));

TEST(ProgramGif, IsSmallEvenAndHasTheColoursOfThePictures) {
    const Folder folder;
    const struct {
        Args options;
        int width;
        int pictures;
    } cases[] = {{{}, 480, 25}, {{"--size", "640x360", "--frame-rate", "20"}, 640, 40}};
    for (const auto& test : cases) {
        const std::string output = folder / "o.gif";
        const Result result =
            Call(Join(Args{"--preset", "standard", "-y"}, test.options, Args{Grainy("640x360"), output}));
        ASSERT_EQ(result.code, 0) << result.err;
        EXPECT_NE((result.out + result.err).find("not carried: sound"), std::string::npos) << result.err;
        movieconv::Movie movie(output, {});
        EXPECT_EQ(movie.Info().pictures->codec, "gif");
        EXPECT_EQ(movie.Info().pictures->width, test.width);
        EXPECT_EQ(static_cast<int>(TakeAll(movie).pictures.size()), test.pictures);
        EXPECT_NEAR(movie.Info().duration, 2, 0.06);
        const std::string same = Make("grainy-gif-" + std::to_string(test.width) + ".mkv",
                                      {"-i", Grainy("640x360"), "-vf",
                                       "fps=" + std::string(test.width == 480 ? "25/2" : "20") +
                                           ":round=near,scale=" + std::to_string(test.width) + ":-2",
                                       "-an", "-c:v", "ffv1"});
        EXPECT_GE(Ssim(output, same), 0.8);
    }
    EXPECT_EQ(Call({"-y", "--preset", "standard", "--max-size", "1M", Grainy(), folder / "o.gif"}).code, 2);
}

TEST(ProgramPresets, AreTheStandardAndGiveWayToOptions) {
    const Folder folder;
    const struct {
        Args options;
        const char* output;
        const char* codec;
        int width;
        double rate;
    } cases[] = {
        {{"--overwrite"}, "plain.mp4", "h264", 1366, 50}, // no preset asked for
        {{"--preset", "phone"}, "phone.mp4", "h264", 1280, 30},
        {{"--preset", "phone", "--size", "640x360", "--frame-rate", "10"}, "o.mp4", "h264", 640, 10},
        {{"--preset", "standard", "--video-codec", "mjpg", "--size", "320x180"}, "o.avi", "mjpeg", 320, 50},
        {{"--preset", "web", "--size", "320x180"}, "no-extension", "vp9", 320, 50},
    };
    const std::string source = Grainy("1366x768", "50");
    for (const auto& test : cases) {
        SCOPED_TRACE(test.output);
        const std::string output = folder / test.output;
        const Args whole =
            Join(Args{MOVIECONV_PROGRAM, "-y", "--length", "0.2"}, test.options, Args{source, output});
        const Result result = program::Run(whole);
        ASSERT_EQ(result.code, 0) << result.err;
        movieconv::Movie movie(output, {});
        EXPECT_EQ(movie.Info().pictures->codec, test.codec);
        EXPECT_EQ(movie.Info().pictures->width, test.width);
        EXPECT_NEAR(movie.Info().pictures->frameRate, test.rate, 0.5);
    }
    const auto size = [&](const Args& options) {
        const Result result =
            Call(Join(Args{"-y", "--preset", "standard"}, options, Args{Grainy(), folder / "o.mkv"}));
        EXPECT_EQ(result.code, 0) << result.err;
        return fs::file_size(folder / "o.mkv");
    };
    WriteFile(folder / "kept.json", R"({"audio": {"codec": "copy"}})");
    for (const auto& [option, codec] : {std::pair{"--no-chapters", "flac"}, {"--channels=1", "aac"}}) {
        const std::string output = folder / "sound.mkv";
        ASSERT_EQ(Call({"-y", "--preset", folder / "kept.json", option, Grainy(), output, "-q"}).code, 0);
        EXPECT_EQ(movieconv::Movie(output, {}).Info().sound->codec, codec);
    }
    EXPECT_GT(size({"--quality", "18"}), size({"--quality", "30"}));
    EXPECT_LT(size({"--video-rate", "100k"}), size({}));
    EXPECT_NE(size({"--speed", "slow"}), size({"--speed", "fastest"}));
}

// A quality is what pictures get however hard they are to code, unless an upper rate is too low for it.
TEST(ProgramQuality, IsTheEncodersAndLimitedByAnUpperRateAlone) {
    const Folder folder;
    for (const auto& [codec, good, bad] : {std::tuple{"H264", "4", "30"},
                                           {"VP90", "4", "40"},
                                           {"VP80", "4", "40"},
                                           {"AV01", "4", "40"},
                                           {"XVID", "1", "20"}}) {
        SCOPED_TRACE(codec);
        const auto size = [&, codec = codec](const Args& rates) {
            const Result result = Call(
                Join(Args{"-q", "-y", "--no-audio", "--length", "0.5", "--speed", "fastest"},
                     Join(Args{"--video-codec", codec}, rates), Args{Grainy("160x120"), folder / "o.mkv"}));
            EXPECT_EQ(result.code, 0) << result.err;
            return static_cast<int64_t>(fs::file_size(folder / "o.mkv"));
        };
        const int64_t free = size({"--quality", good});
        EXPECT_GT(free, 3 * size({"--quality", bad}));
        EXPECT_LT(size({"--quality", good, "--video-max-rate", "100k"}), std::min<int64_t>(45'000, free));
        EXPECT_LT(size({"--video-rate", "100k", "--video-max-rate", "100k"}), 45'000);
    }
}

// Pieces of one plan are made on different machines and again after a kill.
TEST(ProgramPresets, GiveTheSamePicturesWhateverIsInFreshMemory) {
    const Folder folder;
    const std::string source = Make("fresh-memory.mkv", {"-f", "lavfi", "-i", "testsrc2=s=320x240:r=25:d=3"});
    const auto made = [&](const char* filledWith) {
        const Result result =
            program::Run({"env", std::string("MALLOC_PERTURB_=") + filledWith, MOVIECONV_PROGRAM, "-q", "-y",
                          "--no-audio", source, folder / "o.mkv"});
        EXPECT_EQ(result.code, 0) << result.err;
        return FfmpegReads(folder / "o.mkv", Words("-c copy -f framemd5"));
    };
    const std::string usual = made("0");
    for (const char* filledWith : {"85", "170"})
        EXPECT_EQ(made(filledWith), usual);
}

struct Sized {
    const char* name;
    const char* pictures; ///< An lavfi source; empty: none.
    const char* sound;
    int64_t most;
    const char* output = "o.mp4";
    const char* preset = "standard";
};

// Sources that are hard to keep small, and some that are not.
TEST(ProgramMaxSize, IsNeverExceeded) {
    const Sized cases[] = {
        {"noise", "nullsrc=s=320x240:r=25:d=6,geq=random(1)*255:128:128", "anoisesrc=d=6", 200'000},
        {"tiny", "nullsrc=s=320x240:r=25:d=6,geq=random(1)*255:128:128", "anoisesrc=d=6", 90'000},
        {"bars", "testsrc2=s=640x360:r=25:d=6", "sine=d=6", 150'000},
        {"fast", "testsrc2=s=320x180:r=100:d=4", "sine=d=4", 150'000},
        {"black", "color=black:s=640x360:r=25:d=6", "sine=d=6", 100'000},
        {"fractal", "mandelbrot=s=480x360:r=25,trim=duration=5", "sine=d=5", 120'000},
        {"life", "life=s=320x240:r=25:mold=10,trim=duration=5", "sine=d=5", 120'000, "o.mkv"},
        {"modern", "mandelbrot=s=320x240:r=25,trim=duration=3", "sine=d=3", 90'000, "o.mkv", "av1"},
        {"silent", "testsrc2=s=320x240:r=25:d=6", "", 100'000, "o.ts"},
        {"short", "testsrc2=s=640x360:r=25:d=0.4", "sine=d=0.4", 60'000},
        {"tall", "testsrc2=s=120x640:r=30:d=6", "sine=d=6", 100'000, "o.mov"},
        {"sound", "", "anoisesrc=d=20", 200'000, "o.m4a"},
    };
    for (const Sized& test : cases) {
        SCOPED_TRACE(test.name);
        Args making;
        for (const std::string input : {test.pictures, test.sound})
            if (!input.empty())
                making = Join(making, Args{"-f", "lavfi", "-i", input});
        const std::string source =
            Make(std::string("sized-") + test.name + ".mkv", Join(making, NearLossless()));
        const Folder folder;
        const std::string output = folder / test.output;
        const Result result =
            Call({"--preset", test.preset, "--max-size", std::to_string(test.most), source, output});
        ASSERT_EQ(result.code, 0) << result.err;
        EXPECT_NE(result.err.find("to keep below"), std::string::npos) << result.err;
        EXPECT_LE(static_cast<int64_t>(fs::file_size(output)), test.most);
        EXPECT_GT(movieconv::Movie(output, {}).Info().duration, 0.3);
    }
    const Folder folder;
    const Result result = Call({"--preset", "standard", "--max-size", "5k", Grainy(), folder / "o.mp4"});
    EXPECT_EQ(result.code, 2) << result.err;
    EXPECT_NE(result.err.find("too little"), std::string::npos) << result.err;
}

TEST(ProgramPresets, AreListedShownAndRefused) {
    const Folder folder;
    const std::string own = folder / "movieconv/presets/";
    fs::create_directories(own);
    WriteFile(own + "mine.json", "{\n\"parent\": \"small\",\n\"colour\": \"blue\"\n}");
    std::string deep; // whose levels have names, and so places of their own
    for (int level = 0; level < 100'000; ++level)
        deep += "{\"a\":";
    WriteFile(folder / "deep.json", deep);
    WriteFile(own + "broken.json", "{\n\n\"video\": {\"speed\": 3}\n}");
    setenv("XDG_CONFIG_HOME", folder.Path().c_str(), 1);
    const std::string source = Grainy();
    const std::string output = folder / "o.mp4";
    const struct {
        Args arguments;
        int code;
        std::string out;
        std::string err;
    } cases[] = {
        {{"--list-presets"}, 0, "classic ", ""},
        {{"--list-presets"}, 0, own + "broken.json:3: \"video.speed\" has to be", ""},
        {{"--list-presets", "--quiet"}, 0, "phone\narchive\n", ""},
        {{"--show-preset", "mine"}, 0, "\"colour\": \"blue\"", "mine.json:3: there is no \"colour\""},
        {{"--show-preset", "nobody"}, 2, "", "no preset \"nobody\""},
        {{"--preset", "broken", source, output}, 2, "", own + "broken.json:3: \"video.speed\" has to be"},
        {{"--preset", folder / "deep.json", source, output}, 2, "", "nested too deep"},
        {{"--preset", "none/at/all", source, output}, 2, "", "none/at/all"},
        {{"--preset", "archive", source, output}, 2, "", "cannot carry pictures as \"FFV1\""},
        {{"--preset", "classic", "--quality", "40", source, output}, 2, "", "from 1 (best) to 31"},
        {{"--preset", "archive", "--quality", "4", source, folder / "o.mkv"}, 2, "", "no constant quality"},
        {{"--quality", "20", "--video-rate", "1M", source, output}, 2, "", "exclude each other"},
        {{"--list-presets", "--progress", "json"}, 0, "\"presets\":[{\"name\":\"", ""},
        {{"--preset", "standard", "--estimate", source, output}, 0, "unknown", ""},
        {{"--preset", "classic", "--estimate", "--progress", "json", source, output},
         0,
         "\"event\":\"estimate\",\"length_s\":2.0,\"needed\":160000,\"folder\"",
         ""},
        {{"--list-formats", "--progress", "json"}, 0, "\"code\":\"MKV\",\"name\":\"Matroska\"", ""},
        {{"--help"}, 0, "--preset", ""},
        {{"--help-all"}, 0, "--speed", ""},
        {{"--preset", "mine", "--length", "0.2", source, output},
         0,
         "done",
         "mine.json:3: there is no \"colour\""},
    };
    for (const auto& test : cases) {
        const Result result = Call(test.arguments);
        EXPECT_EQ(result.code, test.code) << result.err;
        EXPECT_NE(result.out.find(test.out), std::string::npos) << test.out << " is not in " << result.out;
        EXPECT_NE(result.err.find(test.err), std::string::npos) << test.err << " is not in " << result.err;
        EXPECT_EQ(fs::exists(output), test.out == "done");
    }
    unsetenv("XDG_CONFIG_HOME");
    EXPECT_EQ(Call({"--help"}).out.find("--speed"), std::string::npos) << "only the usual options";
}

} // namespace
