// The exported routines between RGB and planar YUV against the equations applied pixel by pixel.
#include "tests/image/TestPicture.h"

#include <algorithm>
#include <limits>

namespace {

using equations::Rgb;
using equations::Yuv;

/// What sets a routine apart.
enum : unsigned {
    kToRgb = 1,
    kBottomUp = 2,
    kAnyPitch = 4, ///< of its bitmap; a negative height is allowed too
    kAlpha = 8,    ///< has a plane of it, or makes every pixel opaque
    kSimple = 16,  ///< the simple equations, and whole blocks only
};

struct Bitmap {
    tagBITMAPINFOHEADER header;
    TestRows& rows;
    PictureSize size;
};

struct Routine {
    const char* name;
    int pixelBytes;
    unsigned traits;
    void (*run)(TestPlanes& planes, TestRows& alpha, Bitmap bitmap);

    bool Is(unsigned trait) const { return (traits & trait) != 0; }
};

// The table reads best with each call spelled out in the same few words.
#define RUN(call) [](TestPlanes& p, [[maybe_unused]] TestRows& alpha, Bitmap bitmap) { call; }
#define BITMAP &bitmap.header, bitmap.rows.Data()

const Routine kRoutines[] = {
    {"Rgb32_2_yuv420", 4, kBottomUp, RUN(Rgb32_2_yuv420(PLANES(p), PITCHES(p), BITMAP))},
    {"Argb_2_yuv420", 4, 0, RUN(Argb_2_yuv420(PLANES(p), PITCHES(p), BITMAP))},
    {"Rgb32_2_yuv420_Ex", 4, kAnyPitch,
     RUN(Rgb32_2_yuv420_Ex(PLANES(p), PITCHES(p), bitmap.rows.Data(), bitmap.size.width, bitmap.size.height,
                           bitmap.rows.Pitch()))},
    {"Rgb32_2_yuv420_ExNegativeHeight", 4, kBottomUp | kAnyPitch,
     RUN(Rgb32_2_yuv420_Ex(PLANES(p), PITCHES(p), bitmap.rows.Data(), bitmap.size.width, -bitmap.size.height,
                           bitmap.rows.Pitch()))},
    {"Rgb24_2_yuv420", 3, kBottomUp, RUN(Rgb24_2_yuv420(PLANES(p), PITCHES(p), BITMAP))},
    {"Rgb24_2_yuv420Simple", 3, kBottomUp | kSimple,
     RUN(Rgb24_2_yuv420Simple(PLANES(p), PITCHES(p), BITMAP))},
    {"Rgb32_2_yuv420A", 4, kAlpha, RUN(Rgb32_2_yuv420A(PLANES(p), alpha.Data(), PITCHES(p), BITMAP, 0))},
    {"Rgb32_2_yuv420ABottomUp", 4, kBottomUp | kAlpha,
     RUN(Rgb32_2_yuv420A(PLANES(p), alpha.Data(), PITCHES(p), BITMAP, -7))},
    {"Rgb32_2_yuv420A_R", 4, kBottomUp | kAlpha,
     RUN(Rgb32_2_yuv420A_R(PLANES(p), alpha.Data(), PITCHES(p), BITMAP))},
    {"Yuv420_2_rgb24", 3, kToRgb | kBottomUp, RUN(Yuv420_2_rgb24(BITMAP, PLANES(p), PITCHES(p)))},
    {"Yuv420_2_rgb32", 4, kToRgb | kBottomUp, RUN(Yuv420_2_rgb32(BITMAP, PLANES(p), PITCHES(p)))},
    {"Yuv420_2_Argb", 4, kToRgb | kAlpha, RUN(Yuv420_2_Argb(BITMAP, PLANES(p), PITCHES(p)))},
    {"Yuv420_2_rgb24Simple", 3, kToRgb | kBottomUp | kSimple,
     RUN(Yuv420_2_rgb24Simple(BITMAP, PLANES(p), PITCHES(p)))},
};

class PlanarRgbTest : public testing::TestWithParam<Routine> {
protected:
    void Check(PictureSize size, int padding) const {
        const int rowBytes = routine.pixelBytes * size.width;
        const int pitch = routine.Is(kAnyPitch)     ? rowBytes + padding
                          : routine.pixelBytes == 3 ? Stride24(size.width)
                                                    : rowBytes;
        TestRows bitmap(rowBytes, size.height, pitch,
                        padding == 0 ? Placement::kEndsAtPage : Placement::kStartsAtPage);
        TestPlanes planes(size.width, size.height, padding);
        TestRows alpha(size.width, size.height, planes.y.Pitch());
        if (routine.Is(kToRgb))
            ExpectRgb(bitmap, planes, size);
        else
            ExpectYuv(planes, alpha, bitmap, size);
        routine.run(planes, alpha, {Header(size), bitmap, size});
        planes.Check();
        alpha.Check("alpha");
        bitmap.Check("bitmap");
    }

    tagBITMAPINFOHEADER Header(PictureSize size) const {
        return BitmapHeader(size.width, size.height, 8 * routine.pixelBytes);
    }

    const Routine& routine = GetParam();

private:
    PictureSize Converted(PictureSize size) const {
        return routine.Is(kSimple) ? PictureSize{size.width / 2 * 2, size.height / 2 * 2} : size;
    }
    int MemoryRow(PictureSize size, int row) const {
        return routine.Is(kBottomUp) ? size.height - 1 - row : row;
    }

    void ExpectYuv(TestPlanes& planes, TestRows& alpha, const TestRows& bitmap, PictureSize size) const {
        const auto [width, height] = Converted(size);
        for (int top = 0; top < height; top += 2) {
            for (int left = 0; left < width; left += 2) {
                int pixels = 0;
                int u = 0;
                int v = 0;
                for (int row = top; row < std::min(top + 2, height); ++row) {
                    for (int column = left; column < std::min(left + 2, width); ++column) {
                        const int memoryRow = MemoryRow(size, row);
                        const Rgb rgb = bitmap.PixelAt(memoryRow, routine.pixelBytes * column);
                        const Yuv yuv =
                            routine.Is(kSimple) ? equations::SimpleYuv(rgb) : equations::FastYuv(rgb);
                        planes.y.Expect(row, column, yuv.y);
                        if (routine.Is(kAlpha))
                            alpha.Expect(row, column, bitmap.At(memoryRow, 4 * column + 3));
                        u += yuv.u;
                        v += yuv.v;
                        ++pixels;
                    }
                }
                planes.u.Expect(top / 2, left / 2, u / pixels);
                planes.v.Expect(top / 2, left / 2, v / pixels);
            }
        }
    }

    void ExpectRgb(TestRows& bitmap, const TestPlanes& planes, PictureSize size) const {
        const auto [width, height] = Converted(size);
        for (int row = 0; row < height; ++row) {
            for (int column = 0; column < width; ++column) {
                const Yuv yuv{planes.y.At(row, column), planes.u.At(row / 2, column / 2),
                              planes.v.At(row / 2, column / 2)};
                const int byte = routine.pixelBytes * column;
                bitmap.ExpectPixel(MemoryRow(size, row), byte,
                                   routine.Is(kSimple) ? equations::SimpleRgb(yuv) : equations::FastRgb(yuv));
                if (routine.Is(kAlpha))
                    bitmap.Expect(MemoryRow(size, row), byte + 3, 255);
            }
        }
    }
};

TEST_P(PlanarRgbTest, EverySizeAndPitch) {
    for (const PictureSize size : PictureSizes()) {
        for (const int padding : {0, 1, 5}) {
            Check(size, padding);
            ASSERT_FALSE(HasFatalFailure()) << size.width << " x " << size.height << ", padding " << padding;
        }
    }
}

TEST_P(PlanarRgbTest, ConvertsNothingOfSizeZeroOrLess) {
    TestPlanes planes(4, 4, 0);
    TestRows alpha(4, 4, 4);
    TestRows bitmap(16, 4, 16);
    constexpr int kLeast = std::numeric_limits<int>::min() + 1; // its negative is a number too
    for (const PictureSize size : {PictureSize{0, 4}, {4, 0}, {-4, 4}, {kLeast, 4}, {0, kLeast}, {-1, -1}})
        routine.run(planes, alpha, {Header(size), bitmap, size});
    if (!routine.Is(kAnyPitch)) {
        for (const PictureSize size : {PictureSize{4, -4}, {4, kLeast}})
            routine.run(planes, alpha, {Header(size), bitmap, size});
    }
    planes.Check();
    alpha.Check("alpha");
    bitmap.Check("bitmap");
}

INSTANTIATE_TEST_SUITE_P(Routines, PlanarRgbTest, testing::ValuesIn(kRoutines),
                         [](const testing::TestParamInfo<Routine>& info) {
                             return std::string(info.param.name);
                         });

struct Colour {
    Rgb rgb;
    Yuv yuv;
};

TEST(PixelRGB_2_YUV, RoundsClampsAndWrapsAt32Bits) {
    const Colour colours[] = {
        {{0, 0, 0}, {16, 128, 128}},
        {{255, 255, 255}, {235, 128, 128}},
        {{255, 0, 0}, {81, 90, 240}},
        {{0, 255, 0}, {144, 54, 34}},
        {{0, 0, 255}, {41, 240, 110}},
        {{128, 128, 128}, {126, 128, 128}},
        {{-10, 0, 0}, {16, 129, 124}},
        {{300, 0, 0}, {93, 83, 240}},
        {{0, 3000, 0}, {235, 16, 16}},
        {{1 << 30, 0, 0}, {16, 128, 16}}, // 263 * 2^30 is 3 * 2^30 modulo 2^32, negative as a signed sum
    };
    for (const auto& [rgb, yuv] : colours) {
        int y = 0, u = 0, v = 0;
        PixelRGB_2_YUV(rgb.r, rgb.g, rgb.b, y, u, v);
        EXPECT_TRUE(y == yuv.y && u == yuv.u && v == yuv.v)
            << rgb.r << ", " << rgb.g << ", " << rgb.b << " gave " << y << ", " << u << ", " << v;
    }
}

TEST(PixelYUV_2_RGB, RoundsClampsAndWrapsAt32Bits) {
    const Colour colours[] = {
        {{0, 0, 0}, {16, 128, 128}},
        {{255, 255, 255}, {235, 128, 128}},
        {{130, 130, 130}, {128, 128, 128}},
        {{255, 255, 255}, {255, 128, 128}},
        {{254, 0, 0}, {81, 90, 240}},
        {{0, 0, 0}, {-5000, 128, 128}},
        {{255, 255, 255}, {1 << 27, 128, 128}}, // 1192 * 2^27 is 2^30 modulo 2^32
        {{0, 0, 0}, {3 << 26, 128, 128}},       // 1192 * 3 * 2^26 is -2^29 modulo 2^32
    };
    for (const auto& [rgb, yuv] : colours) {
        int r = -1, g = -1, b = -1;
        PixelYUV_2_RGB(yuv.y, yuv.u, yuv.v, r, g, b);
        EXPECT_TRUE(r == rgb.r && g == rgb.g && b == rgb.b)
            << yuv.y << ", " << yuv.u << ", " << yuv.v << " gave " << r << ", " << g << ", " << b;
    }
}

} // namespace
