// Interlaced, HDR and bordered pictures, measured where they are handed to the engine.
#include "host/source/CropDetection.h"
#include "host/source/Movie.h"
#include "tests/support/Folder.h"
#include "tests/support/Inspect.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <string>
#include <vector>

namespace {

using namespace test_movies;
using movieconv::Deinterlace;
using movieconv::Movie;

/// How much the rows differ from what lies above and below them: large where two moments are combed.
double Comb(const VideoImage& image) {
    int64_t sum = 0;
    for (int y = 1; y + 1 < image.nHeight; ++y) {
        const uint8_t* row = image.pY + static_cast<ptrdiff_t>(y) * image.nPitchY;
        for (int x = 0; x < image.nWidth; ++x)
            sum += std::abs(2 * row[x] - row[x - image.nPitchY] - row[x + image.nPitchY]);
    }
    return static_cast<double>(sum) / image.nWidth / image.nHeight;
}

struct Combed {
    int pictures = 0;
    double comb = 0;
    std::string told; // about the comb
};

Combed LookFor(const std::string& path, Deinterlace deinterlace) {
    Movie movie(path, {.deinterlace = deinterlace});
    Combed seen;
    while (const VideoImage* image = movie.Pictures()->GetCurrentImage()) {
        EXPECT_NEAR(static_cast<double>(image->llTime) / kTicksPerSecond, seen.pictures / 25.0, 0.002);
        seen.comb += Comb(*image);
        ++seen.pictures;
        if (movie.Pictures()->DecodeNext(1) < 1)
            break;
    }
    for (const auto& complaint : movie.Losses())
        if (complaint.Text().find("interlaced") != std::string::npos)
            seen.told = complaint.Text();
    seen.comb /= seen.pictures;
    return seen;
}

std::string MovingBars(const char* name, const Args& making) {
    return Make(name, Join(Args{"-f", "lavfi", "-i",
                                "color=black:s=160x120:r=50:d=2,format=yuv420p,"
                                "geq=lum='if(between(mod(X-N*4,80),0,40),220,30)':cb=128:cr=128"},
                           making, Args{"-c:v", "libx264", "-qp", "10"}));
}

TEST(Filters, TakeTheCombFromPicturesThatSayTheyAreInterlaced) {
    const Args interlace{"-vf", "tinterlace=interleave_top,setfield=tff", "-flags", "+ilme+ildct"};
    const std::string flagged = MovingBars("interlaced.mkv", interlace);
    const std::string unflagged =
        MovingBars("combed.mkv", Args{"-vf", "tinterlace=interleave_top,setfield=prog"});
    const struct {
        std::string path;
        Deinterlace deinterlace;
        bool comb;
        const char* told;
    } cases[] = {
        {flagged, Deinterlace::kFlagged, false, "interlaced pictures were made progressive"},
        {flagged, Deinterlace::kNone, true,
         "interlaced pictures stayed as they are, in files that do not tell it"},
        {unflagged, Deinterlace::kFlagged, true, ""},
        {unflagged, Deinterlace::kAll, false, "interlaced pictures were made progressive"},
    };
    for (const auto& test : cases) {
        SCOPED_TRACE(&test - cases);
        const Combed seen = LookFor(test.path, test.deinterlace);
        EXPECT_EQ(seen.pictures, 50);
        EXPECT_EQ(seen.told, test.told);
        EXPECT_TRUE(test.comb ? seen.comb > 20 : seen.comb < 3) << seen.comb;
    }
}

TEST(Filters, TellThatFullRangeBecomesTheUsualOne) {
    const Args grey{"-f", "lavfi", "-i", "color=gray:s=64x48:r=25:d=0.2"};
    const struct {
        const char* name;
        Args making;
        bool told;
    } cases[] = {
        {"full.mkv", {"-vf", "scale=out_range=pc", "-color_range", "pc", "-c:v", "libx264"}, true},
        {"usual.mkv", {"-vf", "scale=out_range=tv", "-color_range", "tv", "-c:v", "libx264"}, false},
        {"full-jpeg.avi", {"-pix_fmt", "yuvj420p", "-c:v", "mjpeg"}, true},
        {"rgb.mkv", {"-pix_fmt", "bgr0", "-c:v", "ffv1"}, false}, // these have no other range
    };
    for (const auto& test : cases) {
        SCOPED_TRACE(test.name);
        Movie movie(Make(test.name, Join(grey, test.making)), {});
        inspect::TakeAll(movie);
        const std::vector<movieconv::Sentence> losses = movie.Losses();
        const bool told = std::any_of(losses.begin(), losses.end(), [](const auto& loss) {
            return loss.Text() == "its pictures of full range got the usual one, which has fewer levels";
        });
        EXPECT_EQ(told, test.told);
    }
}

/// White of full range is that of the usual one, also where layout and size stay and the format of the pixels
/// does not say the range.
TEST(Filters, BringFullRangeToTheUsualOne) {
    const Args white{"-f", "lavfi", "-i", "color=white:s=64x48:r=25:d=0.2,format=yuv420p,geq=255:128:128"};
    const Args full{"-color_range", "pc"};
    const std::string vp9 =
        Make("white.webm", Join(white, full, Args{"-c:v", "libvpx-vp9", "-lossless", "1"}));
    const Args deepCoded{"-pix_fmt", "yuv420p10le",  "-c:v",
                         "libx265",  "-x265-params", "log-level=none:lossless=1:range=full"};
    const Args deepWhite{"-f", "lavfi", "-i",
                         "color=white:s=64x48:r=25:d=0.2,format=yuv420p10le,geq=1023:512:512"};
    const std::string hevc = Make("white-deep.mkv", Join(deepWhite, deepCoded));
    for (const std::string& path : {vp9, hevc})
        for (const bool deep : {false, true}) {
            SCOPED_TRACE(path + (deep ? " deep" : ""));
            Movie movie(path, {.deep = deep});
            const VideoImage* image = movie.Pictures()->GetCurrentImage();
            ASSERT_NE(image, nullptr);
            const bool isDeep = image->nFormat == kPictureFormatPlanar420Deep;
            EXPECT_EQ(isDeep, deep && path == hevc);
            const int luma = isDeep ? reinterpret_cast<const uint16_t*>(image->pY)[8] : image->pY[8];
            EXPECT_NEAR(luma, isDeep ? 940 : 235, isDeep ? 4 : 1); // swscale is off by 3 of 1023
        }
}

/// In a recording of two programmes, of which the second one states another matrix.
TEST(Filters, KeepColoursWhereTheMatrixChanges) {
    const auto red = [](const char* name, const char* matrix, const char* label) {
        return ReadFile(
            Make(name, Join(Lavfi("color=red:s=64x48:r=25:d=0.2,format=gbrp,scale=out_color_matrix=" +
                                  std::string(matrix) + ":out_range=tv,format=yuv420p"),
                            Args{"-colorspace", label, "-c:v", "mpeg2video", "-q:v", "1"})));
    };
    const Folder folder;
    WriteFile(folder / "both.ts",
              red("red709.ts", "bt709", "bt709") + red("red601.ts", "bt601", "smpte170m"));
    for (const bool deep : {false, true}) {
        Movie movie(folder / "both.ts", {.deep = deep});
        int pictures = 0;
        do {
            const VideoImage* image = movie.Pictures()->GetCurrentImage();
            ASSERT_NE(image, nullptr);
            EXPECT_NEAR(image->pY[8], 63, 1) << pictures;
            EXPECT_NEAR(image->pU[8], 102, 1) << pictures;
            EXPECT_NEAR(image->pV[8], 240, 1) << pictures;
            ++pictures;
        } while (movie.Pictures()->DecodeNext(1) == 1);
        EXPECT_EQ(pictures, 10);
    }
}

TEST(Filters, BringHdrToTheLightOfUsualDisplays) {
    for (const char* transfer : {"16", "18"}) { // PQ, HLG
        SCOPED_TRACE(transfer);
        const std::string path =
            Make(std::string("ramp-") + transfer + ".mkv",
                 {"-f", "lavfi", "-i",
                  "color=black:s=256x64:r=25:d=0.2,format=yuv420p10le,geq=lum='64+X*876/255':cb=512:cr=512",
                  "-c:v", "libx265", "-x265-params",
                  std::string("log-level=none:colorprim=9:colormatrix=9:transfer=") + transfer});
        Movie movie(path, {});
        const VideoImage* image = movie.Pictures()->GetCurrentImage();
        ASSERT_NE(image, nullptr);
        const uint8_t* row = image->pY + static_cast<ptrdiff_t>(32) * image->nPitchY;
        EXPECT_NEAR(row[2], 16, 3);
        for (int x = 8; x < 256; x += 8)
            EXPECT_GE(row[x] + 1, row[x - 8]) << x;
        EXPECT_GT(row[128], 110); // some 100 cd/m2: a middle grey, no washed-out one
        EXPECT_LT(row[128], 190);
        for (int x = 0; x < 128; x += 8) {
            EXPECT_NEAR(image->pU[16 * image->nPitchU + x], 128, 2) << x;
            EXPECT_NEAR(image->pV[16 * image->nPitchV + x], 128, 2) << x;
        }
    }
}

TEST(Filters, BringHdrOfOtherMatricesOrNameThem) {
    const std::string path = Make(
        "grey-hdr.mkv", {"-f", "lavfi", "-i", "color=gray:s=64x64:d=0.2,format=yuv420p10le", "-c:v",
                         "libx265", "-x265-params", "log-level=none:colorprim=9:colormatrix=9:transfer=16"});
    const auto convert = [&](const std::string& matrix) {
        Movie movie(Make("grey-hdr-" + matrix + ".mkv",
                         {"-i", path, "-c", "copy", "-bsf:v", "hevc_metadata=matrix_coefficients=" + matrix}),
                    {});
        const VideoImage* image = movie.Pictures()->GetCurrentImage();
        return image != nullptr ? std::to_string(image->pY[0]) : movie.ReadError().Text();
    };
    EXPECT_EQ(convert("10"), convert("9")); // the same but for the constant luminance
    const std::string error = convert("11");
    EXPECT_NE(error.find("smpte2085"), std::string::npos) << error;
}

/// A movie whose second half only shows all of the picture between the borders.
std::string Letterboxed() {
    const std::string pictures =
        "color=black:s=320x240:r=25:d=8,format=yuv420p,geq=lum='if(between(Y,36,199)*between(X,10,299)*"
        "gte(N,if(lt(X,150),20,120)),60+mod(X+Y,120),16)':cb=128:cr=128";
    return Make("letterboxed.mkv",
                {"-f", "lavfi", "-i", pictures, "-c:v", "libx264", "-g", "10", "-qp", "10"});
}

TEST(Borders, AreFoundAllOverTheMovieUpright) {
    const std::string turned =
        Make("letterboxed-turned.mp4", {"-i", Letterboxed(), "-metadata:s:v", "rotate=90", "-c", "copy"});
    const std::string black = Make("black.mkv", {"-f", "lavfi", "-i", "color=black:s=64x64:d=1"});
    const auto find = [](const std::string& path) {
        movieconv::Source source(path, {});
        return movieconv::FindBorders(source);
    };
    const auto crop = find(Letterboxed());
    ASSERT_TRUE(crop);
    EXPECT_EQ(crop->top, 36);
    EXPECT_EQ(crop->bottom, 40);
    EXPECT_EQ(crop->left, 10);
    EXPECT_EQ(crop->right, 20);
    const auto onSide = find(turned);
    ASSERT_TRUE(onSide);
    Movie movie(turned, {.crop = *onSide});
    const VideoImage* image = movie.Pictures()->GetCurrentImage();
    ASSERT_NE(image, nullptr);
    EXPECT_EQ(image->nWidth, 164);
    EXPECT_EQ(image->nHeight, 290);
    EXPECT_FALSE(find(black));
}

TEST(Borders, AreCutOffWhereTheyWereTold) {
    Movie movie(Letterboxed(), {.crop = {.top = 37, .bottom = 40, .left = 10, .right = 20}});
    EXPECT_EQ(movie.Info().pictures->width, 290);
    EXPECT_EQ(movie.Info().pictures->height, 164);
    movie.Pictures()->Seek(5, 1);
    const VideoImage* image = movie.Pictures()->GetCurrentImage();
    ASSERT_NE(image, nullptr);
    EXPECT_EQ(image->nWidth, 290);
    EXPECT_EQ(image->nHeight, 164);
    for (const int y : {0, 163})
        for (const int x : {0, 100, 289})
            EXPECT_NEAR(image->pY[y * image->nPitchY + x], 60 + (x + 10 + y + 36) % 120, 6) << x << ", " << y;
    EXPECT_THROW(Movie(Letterboxed(), {.crop = {.top = 120, .bottom = 110}}), movieconv::CropError);
}

} // namespace
