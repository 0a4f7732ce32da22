// The exported planar-YUV-to-RGB routines against the equations applied pixel by pixel.
#include "tests/image/TestPicture.h"

#include <limits>

namespace {

using equations::Rgb;
using equations::Yuv;

using Convert = void (*)(tagBITMAPINFOHEADER*, unsigned char*, unsigned char*, unsigned char*, unsigned char*,
                         int, int, int);

struct Routine {
    const char* name;
    Convert convert;
    int pixelBytes;
    bool bottomUp;
    bool opaque;
    bool wholeBlocks;
    Rgb (*equations)(Yuv);
};

const Routine kRoutines[] = {
    {"Yuv420_2_rgb24", Yuv420_2_rgb24, 3, true, false, false, equations::FastRgb},
    {"Yuv420_2_rgb32", Yuv420_2_rgb32, 4, true, false, false, equations::FastRgb},
    {"Yuv420_2_Argb", Yuv420_2_Argb, 4, false, true, false, equations::FastRgb},
    {"Yuv420_2_rgb24Simple", Yuv420_2_rgb24Simple, 3, true, false, true, equations::SimpleRgb},
};

void CheckRoutine(const Routine& routine, PictureSize size, int padding) {
    const int rowBytes = routine.pixelBytes * size.width;
    TestPlanes from(size.width, size.height, padding);
    TestRows to(rowBytes, size.height, routine.pixelBytes == 3 ? Stride24(size.width) : rowBytes);
    const PictureSize covered =
        routine.wholeBlocks ? PictureSize{size.width / 2 * 2, size.height / 2 * 2} : size;
    for (int row = 0; row < covered.height; ++row) {
        const int memoryRow = routine.bottomUp ? size.height - 1 - row : row;
        for (int column = 0; column < covered.width; ++column) {
            const Rgb rgb = routine.equations(
                {from.y.At(row, column), from.u.At(row / 2, column / 2), from.v.At(row / 2, column / 2)});
            const int byte = routine.pixelBytes * column;
            to.ExpectPixel(memoryRow, byte, rgb);
            if (routine.opaque)
                to.Expect(memoryRow, byte + 3, 255);
        }
    }
    auto header = BitmapHeader(size.width, size.height, 8 * routine.pixelBytes);
    routine.convert(&header, to.Data(), PLANES(from), PITCHES(from));
    to.Check(routine.name);
}

class YuvToRgbTest : public testing::TestWithParam<Routine> {};

TEST_P(YuvToRgbTest, EverySizeAndPitch) {
    for (const PictureSize size : PictureSizes()) {
        for (const int padding : kPaddings) {
            CheckRoutine(GetParam(), size, padding);
            if (HasFatalFailure())
                FAIL() << size.width << " x " << size.height << ", padding " << padding;
        }
    }
}

TEST_P(YuvToRgbTest, ConvertsNothingOfSizeZeroOrLess) {
    TestPlanes from(4, 4, 0);
    TestRows to(16, 4, 16);
    constexpr int kLeast = std::numeric_limits<int>::min();
    for (const PictureSize size : {PictureSize{0, 4}, {4, 0}, {-4, 4}, {4, -4}, {kLeast, 4}, {4, kLeast}}) {
        auto header = BitmapHeader(size.width, size.height, 8 * GetParam().pixelBytes);
        GetParam().convert(&header, to.Data(), PLANES(from), PITCHES(from));
    }
    to.Check("bitmap");
}

INSTANTIATE_TEST_SUITE_P(Routines, YuvToRgbTest, testing::ValuesIn(kRoutines),
                         [](const testing::TestParamInfo<Routine>& info) {
                             return std::string(info.param.name);
                         });

TEST(PixelYUV_2_RGB, RoundsClampsAndWrapsAt32Bits) {
    struct {
        Yuv yuv;
        Rgb rgb;
    } const colours[] = {
        {{16, 128, 128}, {0, 0, 0}},
        {{235, 128, 128}, {255, 255, 255}},
        {{128, 128, 128}, {130, 130, 130}},
        {{255, 128, 128}, {255, 255, 255}},
        {{81, 90, 240}, {254, 0, 0}},
        {{-5000, 128, 128}, {0, 0, 0}},
        {{1 << 27, 128, 128}, {255, 255, 255}}, // 1192 * 2^27 is 2^30 modulo 2^32
        {{3 << 26, 128, 128}, {0, 0, 0}},       // 1192 * 3 * 2^26 is -2^29 modulo 2^32
    };
    for (const auto& [yuv, rgb] : colours) {
        int r = -1, g = -1, b = -1;
        PixelYUV_2_RGB(yuv.y, yuv.u, yuv.v, r, g, b);
        EXPECT_TRUE(r == rgb.r && g == rgb.g && b == rgb.b) << "Y " << yuv.y;
    }
}

} // namespace
