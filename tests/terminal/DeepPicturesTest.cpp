// Pictures of 10 bits and HDR, from the source to the file, by figures.
#include "host/source/Movie.h"
#include "tests/support/Program.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <string>

namespace {

using namespace test_movies;
using movieconv::Movie;
using movieconv::SourceChoice;
using program::Call;
using program::Result;

constexpr SourceChoice kAsTheyAre{.deep = true, .keepHdr = true};
constexpr int kPq = 16;
constexpr int kHlg = 18;
constexpr int kBt709 = 1;

/// The value of a component, whatever the depth.
int At(const VideoImage& image, int plane, int x, int y) {
    const unsigned char* const planes[] = {image.pY, image.pU, image.pV};
    const int pitches[] = {image.nPitchY, image.nPitchU, image.nPitchV};
    const unsigned char* row = planes[plane] + static_cast<ptrdiff_t>(y) * pitches[plane];
    if (image.nFormat != kPictureFormatPlanar420Deep)
        return row[x];
    uint16_t value = 0;
    std::memcpy(&value, row + 2 * static_cast<ptrdiff_t>(x), sizeof value);
    return value;
}

// 256x64: above a grey ramp, below BT.2020's red, green and blue at 100 cd/m2 by PQ.
constexpr char kChart[] = "color=black:s=256x64:r=25:d=0.4,format=yuv420p10le,"
                          "geq=lum='if(lt(Y,32),64+X*876/255,if(lt(X,86),181,if(lt(X,172),366,90)))'"
                          ":cb='if(lt(Y,16),512,if(lt(X,43),448,if(lt(X,86),348,740)))'"
                          ":cr='if(lt(Y,16),512,if(lt(X,43),740,if(lt(X,86),303,494)))'";

std::string Chart(const std::string& name, const std::string& colours, const Args& more = {}) {
    return Make(name, Join(Args{"-f", "lavfi", "-i", kChart, "-c:v", "libx265", "-x265-params",
                                "log-level=none:crf=4" + colours},
                           more));
}

std::string Hdr10() {
    return Chart("chart-hdr10.mkv",
                 ":colorprim=9:colormatrix=9:transfer=16:max-cll=1000,400:"
                 "master-display=G(13250,34500)B(7500,3000)R(34000,16000)WP(15635,16450)L(10000000,50)");
}
std::string Hlg() {
    return Chart("chart-hlg.mp4", ":colorprim=9:colormatrix=9:transfer=18");
}
std::string DeepCounted() {
    return Make("deep-counted.mp4", Join(CountedPictures(0.4), Args{"-c:v", "mpeg4"}));
}
std::string Plain() {
    return Chart("chart-sdr.mp4", ":colorprim=1:colormatrix=1:transfer=1");
}

TEST(DeepPictures, AreHandedOutWithTheirBitsUprightOrTurned) {
    for (const bool turned : {false, true}) {
        SCOPED_TRACE(turned);
        const std::string path =
            turned ? Make("chart-turned.mp4", {"-i", Plain(), "-metadata:s:v", "rotate=90", "-c", "copy"})
                   : Plain();
        for (const bool deep : {true, false}) {
            Movie movie(path, {.deep = deep});
            const VideoImage* image = movie.Pictures()->GetCurrentImage();
            ASSERT_NE(image, nullptr);
            EXPECT_EQ(image->nFormat, deep ? kPictureFormatPlanar420Deep : kPictureFormatPlanar420);
            EXPECT_EQ(image->nWidth, turned ? 64 : 256);
            int levels = 0;
            for (int x = 1; x < 256; ++x) {
                const auto at = [&](int place) {
                    return turned ? At(*image, 0, 8, 255 - place) : At(*image, 0, place, 8);
                };
                EXPECT_NEAR(at(x), (64 + x * 876 / 255.0) / (deep ? 1 : 4), deep ? 4 : 2);
                levels += at(x) != at(x - 1) ? 1 : 0;
            }
            EXPECT_GT(levels, deep ? 240 : 180);
        }
    }
}

void ExpectRamp(const std::string& path, int black, int slope) {
    Movie movie(path, kAsTheyAre);
    const VideoImage* image = movie.Pictures()->GetCurrentImage();
    ASSERT_NE(image, nullptr);
    for (int x = 4; x < 252; x += 4) {
        EXPECT_NEAR(At(*image, 0, x, 8), black + x * slope / 255.0, slope / 30.0) << x;
        EXPECT_NEAR(At(*image, 1, x / 2, 4), black * 8, black / 4.0) << x;
    }
}

TEST(DeepPictures, KeepBitsAndLightWhereTheCodecHasThem) {
    const struct {
        std::string source;
        Args options;
        const char* output;
        int transfer;
        int depth;
    } cases[] = {
        {Hdr10(), {"--preset", "small"}, "o.mp4", kPq, 10},
        {Hdr10(), {"--preset", "small"}, "o.mov", kPq, 10},
        {Hdr10(), {"--preset", "small"}, "o.mkv", kPq, 10},
        {Hdr10(), {"--preset", "small", "--hdr", "keep"}, "o.ts", kPq, 10},
        {Hdr10(), {"--preset", "web"}, "o.webm", kPq, 10},
        {Hdr10(), {"--preset", "av1"}, "o.mp4", kPq, 10},
        {Hlg(), {"--preset", "small"}, "o.mp4", kHlg, 10},
        {Plain(), {"--preset", "small"}, "o.mp4", kBt709, 10},
        {Plain(), {"--preset", "web"}, "o.webm", kBt709, 10},
        {Plain(), {"--preset", "archive"}, "o.mkv", kBt709, 10},
        {Plain(), {"--preset", "small", "--depth", "8"}, "o.mp4", kBt709, 8},
        {Plain(), {"--preset", "standard"}, "o.mp4", kBt709, 8},
        {DeepCounted(), {"--preset", "small", "--depth", "10"}, "o.mp4", 2, 10},
    };
    for (const auto& test : cases) {
        SCOPED_TRACE(&test - cases);
        const Folder folder;
        const std::string output = folder / test.output;
        const Result result = Call(Join(test.options, Args{test.source, output}));
        ASSERT_EQ(result.code, 0) << result.err;
        const bool told = test.depth == 8 && result.err.find("of 10 bits got 8") != std::string::npos;
        EXPECT_EQ(told, test.depth == 8) << result.err;
        const auto source = Movie(test.source, {}).Info().pictures;
        const auto made = Movie(output, {}).Info().pictures;
        EXPECT_EQ(made->depth, test.depth);
        EXPECT_EQ(made->colorTransfer, test.transfer);
        EXPECT_EQ(made->colorPrimaries, source->colorPrimaries);
        // A small one that tells none is of BT.601, and is labelled so.
        EXPECT_EQ(made->colorMatrix, test.transfer == 2 ? 6 : source->colorMatrix);
        ASSERT_EQ(made->masteringDisplay.has_value(), test.transfer == kPq);
        if (made->masteringDisplay) {
            EXPECT_NEAR(made->masteringDisplay->red[0], 0.68, 0.0001);
            EXPECT_NEAR(made->masteringDisplay->green[1], 0.69, 0.0001);
            EXPECT_NEAR(made->masteringDisplay->blue[1], 0.06, 0.0001);
            EXPECT_NEAR(made->masteringDisplay->white[0], 0.3127, 0.0001);
            EXPECT_NEAR(made->masteringDisplay->brightest, 1000, 0.1);
            EXPECT_NEAR(made->masteringDisplay->darkest, 0.005, 0.0001);
            ASSERT_TRUE(made->lightLevel);
            EXPECT_EQ(made->lightLevel->brightestPixel, 1000);
            EXPECT_EQ(made->lightLevel->brightestPicture, 400);
        }
        if (test.transfer != 2)
            ExpectRamp(output, test.depth == 10 ? 64 : 16, test.depth == 10 ? 876 : 219);
    }
}

TEST(DeepPictures, AreBorderedAndPadded) {
    const Folder folder;
    const Result result = Call({"--preset", "small", "--size", "333x65", Plain(), folder / "o.mp4"});
    ASSERT_EQ(result.code, 0) << result.err;
    Movie movie(folder / "o.mp4", kAsTheyAre);
    const VideoImage* image = movie.Pictures()->GetCurrentImage();
    ASSERT_NE(image, nullptr);
    EXPECT_EQ(image->nWidth, 334);
    EXPECT_NEAR(At(*image, 0, 10, 30), 64, 8);
    EXPECT_NEAR(At(*image, 1, 5, 15), 512, 8);
    EXPECT_NEAR(At(*image, 0, 36 + 130, 10), 64 + 438, 30);
    EXPECT_NEAR(At(*image, 0, 333, 30), 64, 8);
}

/// Grey that rises from black, and primaries that are still such, in limits of 8 bits.
void ExpectUsualLight(const std::string& path, int unit) {
    Movie movie(path, kAsTheyAre);
    const VideoImage* image = movie.Pictures()->GetCurrentImage();
    ASSERT_NE(image, nullptr);
    EXPECT_NEAR(At(*image, 0, 2, 8), 16 * unit, 3 * unit);
    for (int x = 8; x < 252; x += 8) {
        EXPECT_GE(At(*image, 0, x, 8) + unit, At(*image, 0, x - 8, 8)) << x;
        EXPECT_NEAR(At(*image, 1, x / 2, 4), 128 * unit, 3 * unit) << x;
        EXPECT_NEAR(At(*image, 2, x / 2, 4), 128 * unit, 3 * unit) << x;
    }
    const int middle = At(*image, 0, 130, 8); // some 100 cd/m2
    EXPECT_GT(middle, 110 * unit);
    EXPECT_LT(middle, 190 * unit);
    const auto chroma = [&](int plane, int x) { return At(*image, plane, x, 24) - 128 * unit; };
    EXPECT_GT(chroma(2, 20), 50 * unit); // red
    EXPECT_LT(chroma(1, 20), -5 * unit);
    EXPECT_LT(chroma(1, 64), -30 * unit); // green
    EXPECT_LT(chroma(2, 64), -30 * unit);
    EXPECT_GT(chroma(1, 108), 50 * unit); // blue
    EXPECT_LT(chroma(2, 108), 0);
}

TEST(DeepPictures, BecomeUsualOnesElsewhere) {
    const struct {
        Args options;
        const char* output;
        int depth;
    } cases[] = {
        {{"--preset", "standard", "--quality", "4"}, "o.mp4", 8},
        {{"--preset", "small", "--hdr", "sdr", "--quality", "4"}, "o.mp4", 10},
        {{"--preset", "small", "--depth", "8", "--quality", "4"}, "o.mkv", 8},
    };
    for (const auto& test : cases) {
        SCOPED_TRACE(&test - cases);
        const Folder folder;
        const std::string output = folder / test.output;
        const Result result = Call(Join(test.options, Args{Hdr10(), output}));
        ASSERT_EQ(result.code, 0) << result.err;
        EXPECT_NE(result.err.find("BT.709"), std::string::npos) << result.err;
        const auto made = Movie(output, {}).Info().pictures;
        EXPECT_EQ(made->depth, test.depth);
        for (const int code : {made->colorTransfer, made->colorPrimaries, made->colorMatrix})
            EXPECT_EQ(code, kBt709);
        EXPECT_FALSE(made->masteringDisplay);
        ExpectUsualLight(output, test.depth == 10 ? 4 : 1);
    }
}

TEST(DeepPictures, AreRefusedWhereTheCodecHasNone) {
    const Folder folder;
    const struct {
        Args options;
        const char* says;
    } cases[] = {{{"--hdr", "keep"}, "HDR needs pictures of 10 bits"},
                 {{"--preset", "small", "--hdr", "keep", "--depth", "8"}, "HDR needs pictures of 10 bits"},
                 {{"--depth", "10"}, "has pictures of 8 bits"},
                 {{"--depth", "9"}, "is not 10|8"}};
    for (const auto& test : cases) {
        const Result result = Call(Join(test.options, Args{Hdr10(), folder / "o.mp4"}));
        EXPECT_EQ(result.code, 2) << result.err;
        EXPECT_NE(result.err.find(test.says), std::string::npos) << result.err;
    }
}

TEST(DeepPictures, AreShownOnUsualDisplays) {
    const Folder folder;
    for (const std::string& source : {Hdr10(), Plain()}) {
        SCOPED_TRACE(source);
        const Result result =
            Call({"--preset", "small", "-y", "--preview", folder / "now.png", source, folder / "o.mp4"});
        ASSERT_EQ(result.code, 0) << result.err;
        const Result pixels = program::Run({"ffmpeg", "-v", "error", "-nostdin", "-i", folder / "now.png",
                                            "-f", "rawvideo", "-pix_fmt", "rgb24", "-"});
        ASSERT_EQ(pixels.out.size(), 256U * 64 * 3);
        const auto grey = [&](int x) {
            return static_cast<unsigned char>(pixels.out[static_cast<std::size_t>(8 * 256 + x) * 3 + 1]);
        };
        for (int x = 8; x < 252; x += 8)
            EXPECT_GE(grey(x) + 2, grey(x - 8)) << x;
        EXPECT_LT(grey(3), 10);
        if (source == Plain())
            EXPECT_NEAR(grey(128), 128, 5);
        else
            EXPECT_TRUE(grey(130) > 115 && grey(130) < 205) << int{grey(130)};
        const auto red = [&](int channel) {
            return static_cast<unsigned char>(
                pixels.out[static_cast<std::size_t>(48 * 256 + 40) * 3 + static_cast<std::size_t>(channel)]);
        };
        EXPECT_GT(red(0), red(1) + 60);
    }
}

} // namespace
