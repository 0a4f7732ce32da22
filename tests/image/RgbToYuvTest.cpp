// The exported RGB-to-YUV routines against the equations applied pixel by pixel.
#include "tests/image/TestPicture.h"

#include <algorithm>
#include <functional>
#include <limits>

namespace {

using equations::Rgb;
using equations::Yuv;

using YuvAt = std::function<Yuv(int row, int column)>;

void ExpectPlanes(TestPlanes& planes, PictureSize size, const YuvAt& yuvAt) {
    for (int top = 0; top < size.height; top += 2) {
        for (int left = 0; left < size.width; left += 2) {
            int pixels = 0;
            int u = 0;
            int v = 0;
            for (int row = top; row < std::min(top + 2, size.height); ++row) {
                for (int column = left; column < std::min(left + 2, size.width); ++column) {
                    const Yuv yuv = yuvAt(row, column);
                    planes.y.Expect(row, column, yuv.y);
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

struct Source {
    tagBITMAPINFOHEADER header;
    TestRows& rows;
    PictureSize size;
};

/// What sets a routine apart.
enum : unsigned {
    kBottomUp = 1,
    kAnyPitch = 2, ///< of its source
    kAlpha = 4,
    kSimple = 8, ///< the simple equations, and whole blocks only
};

struct Routine {
    const char* name;
    int pixelBytes;
    unsigned traits;
    void (*run)(TestPlanes& to, TestRows& alpha, Source from);
    bool Is(unsigned trait) const { return (traits & trait) != 0; }
};

// The table reads best with each call spelled out in the same few words.
#define RUN(call) [](TestPlanes& to, [[maybe_unused]] TestRows& alpha, Source from) { call; }
#define PICTURE &from.header, from.rows.Data()

const Routine kRoutines[] = {
    {"Rgb32_2_yuv420", 4, kBottomUp, RUN(Rgb32_2_yuv420(PLANES(to), PITCHES(to), PICTURE))},
    {"Argb_2_yuv420", 4, 0, RUN(Argb_2_yuv420(PLANES(to), PITCHES(to), PICTURE))},
    {"Rgb32_2_yuv420_Ex", 4, kAnyPitch,
     RUN(Rgb32_2_yuv420_Ex(PLANES(to), PITCHES(to), from.rows.Data(), from.size.width, from.size.height,
                           from.rows.Pitch()))},
    {"Rgb32_2_yuv420_Ex, negative height", 4, kBottomUp | kAnyPitch,
     RUN(Rgb32_2_yuv420_Ex(PLANES(to), PITCHES(to), from.rows.Data(), from.size.width, -from.size.height,
                           from.rows.Pitch()))},
    {"Rgb24_2_yuv420", 3, kBottomUp, RUN(Rgb24_2_yuv420(PLANES(to), PITCHES(to), PICTURE))},
    {"Rgb24_2_yuv420Simple", 3, kBottomUp | kSimple,
     RUN(Rgb24_2_yuv420Simple(PLANES(to), PITCHES(to), PICTURE))},
    {"Rgb32_2_yuv420A", 4, kAlpha, RUN(Rgb32_2_yuv420A(PLANES(to), alpha.Data(), PITCHES(to), PICTURE, 0))},
    {"Rgb32_2_yuv420A, bottom-up", 4, kBottomUp | kAlpha,
     RUN(Rgb32_2_yuv420A(PLANES(to), alpha.Data(), PITCHES(to), PICTURE, -7))},
    {"Rgb32_2_yuv420A_R", 4, kBottomUp | kAlpha,
     RUN(Rgb32_2_yuv420A_R(PLANES(to), alpha.Data(), PITCHES(to), PICTURE))},
};

void CheckRoutine(const Routine& routine, PictureSize size, int padding) {
    const int rowBytes = routine.pixelBytes * size.width;
    const int pitch = routine.Is(kAnyPitch)     ? rowBytes + padding
                      : routine.pixelBytes == 3 ? Stride24(size.width)
                                                : rowBytes;
    TestRows source(rowBytes, size.height, pitch,
                    padding == 0 ? Placement::kEndsAtPage : Placement::kStartsAtPage);
    TestPlanes planes(size.width, size.height, padding);
    TestRows alpha(size.width, size.height, planes.y.Pitch());

    const auto memoryRow = [&](int row) { return routine.Is(kBottomUp) ? size.height - 1 - row : row; };
    const bool simple = routine.Is(kSimple);
    const PictureSize covered = simple ? PictureSize{size.width / 2 * 2, size.height / 2 * 2} : size;
    ExpectPlanes(planes, covered, [&](int row, int column) {
        const Rgb rgb = source.PixelAt(memoryRow(row), routine.pixelBytes * column);
        return simple ? equations::SimpleYuv(rgb) : equations::FastYuv(rgb);
    });
    if (routine.Is(kAlpha)) {
        for (int row = 0; row < size.height; ++row)
            for (int column = 0; column < size.width; ++column)
                alpha.Expect(row, column, source.At(memoryRow(row), 4 * column + 3));
    }

    routine.run(planes, alpha, {BitmapHeader(size.width, size.height, 8 * routine.pixelBytes), source, size});

    planes.Check();
    alpha.Check("alpha");
}

class RgbToYuvTest : public testing::TestWithParam<Routine> {};

TEST_P(RgbToYuvTest, EverySizeAndPitch) {
    for (const PictureSize size : PictureSizes()) {
        for (const int padding : kPaddings) {
            CheckRoutine(GetParam(), size, padding);
            if (HasFatalFailure())
                FAIL() << GetParam().name << " " << size.width << " x " << size.height << ", padding "
                       << padding;
        }
    }
}

TEST_P(RgbToYuvTest, ConvertsNothingOfSizeZeroOrLess) {
    TestPlanes to(4, 4, 0);
    TestRows alpha(4, 4, 4);
    TestRows rows(16, 4, 16);
    constexpr int kLeast = std::numeric_limits<int>::min() + 1;
    for (const PictureSize size : {PictureSize{0, 4}, {4, 0}, {-4, 4}, {kLeast, 4}, {0, kLeast}, {-1, -1}})
        GetParam().run(to, alpha,
                       {BitmapHeader(size.width, size.height, 8 * GetParam().pixelBytes), rows, size});
    to.Check();
    alpha.Check("alpha");
}

INSTANTIATE_TEST_SUITE_P(Routines, RgbToYuvTest, testing::ValuesIn(kRoutines),
                         [](const testing::TestParamInfo<Routine>& info) {
                             return std::to_string(info.index);
                         });

TEST(PixelRGB_2_YUV, RoundsClampsAndWrapsAt32Bits) {
    struct Row {
        int r, g, b, y, u, v;
    };
    const Row rows[] = {
        {0, 0, 0, 16, 128, 128},      {255, 255, 255, 235, 128, 128}, {255, 0, 0, 81, 90, 240},
        {0, 255, 0, 144, 54, 34},     {0, 0, 255, 41, 240, 110},      {128, 128, 128, 126, 128, 128},
        {-10, 0, 0, 16, 129, 124},    {300, 0, 0, 93, 83, 240},       {0, 3000, 0, 235, 16, 16},
        {1 << 30, 0, 0, 16, 128, 16}, // 263 * 2^30 is 3 * 2^30 modulo 2^32, negative as a signed sum
    };
    for (const Row& row : rows) {
        int y = 0, u = 0, v = 0;
        PixelRGB_2_YUV(row.r, row.g, row.b, y, u, v);
        EXPECT_TRUE(y == row.y && u == row.u && v == row.v)
            << row.r << ", " << row.g << ", " << row.b << " gave " << y << ", " << u << ", " << v;
    }
}

} // namespace
