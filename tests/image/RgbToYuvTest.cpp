// The exported RGB-to-YUV routines against the equations applied pixel by pixel.
#include "tests/image/TestPicture.h"

#include <algorithm>
#include <functional>
#include <limits>

namespace {

using equations::Rgb;
using equations::Yuv;

using PixelAt = std::function<Rgb(int row, int column)>;

void ExpectPlanes(TestPlanes& planes, PictureSize size, const PixelAt& pixelAt) {
    for (int blockRow = 0; blockRow < (size.height + 1) / 2; ++blockRow) {
        for (int blockColumn = 0; blockColumn < (size.width + 1) / 2; ++blockColumn) {
            int pixels = 0;
            int cb = 0;
            int cr = 0;
            for (int row = 2 * blockRow; row < std::min(2 * blockRow + 2, size.height); ++row) {
                for (int column = 2 * blockColumn; column < std::min(2 * blockColumn + 2, size.width);
                     ++column) {
                    const Yuv yuv = equations::FastYuv(pixelAt(row, column));
                    planes.y.Expect(row, column, yuv.y);
                    cb += yuv.u;
                    cr += yuv.v;
                    ++pixels;
                }
            }
            planes.u.Expect(blockRow, blockColumn, equations::BlockChroma(cb, pixels));
            planes.v.Expect(blockRow, blockColumn, equations::BlockChroma(cr, pixels));
        }
    }
}

struct Source {
    tagBITMAPINFOHEADER header;
    TestRows& rows;
    PictureSize size;
};

/// One routine: how its source lies in memory and how it is called.
struct Routine {
    const char* name;
    int pixelBytes;
    bool bottomUp;
    bool anyPitch;
    bool alpha;
    void (*run)(TestPlanes& to, TestRows& alpha, Source from);
};

// The table reads best with each call spelled out in the same few words.
#define RUN(call) [](TestPlanes& to, [[maybe_unused]] TestRows& alpha, Source from) { call; }
#define PICTURE &from.header, from.rows.Data()

const Routine kRoutines[] = {
    {"Rgb32_2_yuv420", 4, true, false, false, RUN(Rgb32_2_yuv420(PLANES(to), PITCHES(to), PICTURE))},
    {"Argb_2_yuv420", 4, false, false, false, RUN(Argb_2_yuv420(PLANES(to), PITCHES(to), PICTURE))},
    {"Rgb32_2_yuv420_Ex", 4, false, true, false,
     RUN(Rgb32_2_yuv420_Ex(PLANES(to), PITCHES(to), from.rows.Data(), from.size.width, from.size.height,
                           from.rows.Pitch()))},
    {"Rgb32_2_yuv420_Ex, negative height", 4, true, true, false,
     RUN(Rgb32_2_yuv420_Ex(PLANES(to), PITCHES(to), from.rows.Data(), from.size.width, -from.size.height,
                           from.rows.Pitch()))},
    {"Rgb24_2_yuv420", 3, true, false, false, RUN(Rgb24_2_yuv420(PLANES(to), PITCHES(to), PICTURE))},
    {"Rgb32_2_yuv420A", 4, false, false, true,
     RUN(Rgb32_2_yuv420A(PLANES(to), alpha.Data(), PITCHES(to), PICTURE, 0))},
    {"Rgb32_2_yuv420A, bottom-up", 4, true, false, true,
     RUN(Rgb32_2_yuv420A(PLANES(to), alpha.Data(), PITCHES(to), PICTURE, -7))},
    {"Rgb32_2_yuv420A_R", 4, true, false, true,
     RUN(Rgb32_2_yuv420A_R(PLANES(to), alpha.Data(), PITCHES(to), PICTURE))},
};

void CheckRoutine(const Routine& routine, PictureSize size, int padding) {
    const int rowBytes = routine.pixelBytes * size.width;
    const int pitch = routine.anyPitch          ? rowBytes + padding
                      : routine.pixelBytes == 3 ? Stride24(size.width)
                                                : rowBytes;
    TestRows source(rowBytes, size.height, pitch,
                    padding == 0 ? Placement::kEndsAtPage : Placement::kStartsAtPage);
    TestPlanes planes(size.width, size.height, padding);
    TestRows alpha(size.width, size.height, planes.y.Pitch());

    const auto memoryRow = [&](int row) { return routine.bottomUp ? size.height - 1 - row : row; };
    ExpectPlanes(planes, size, [&](int row, int column) {
        return source.PixelAt(memoryRow(row), routine.pixelBytes * column);
    });
    if (routine.alpha) {
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

TEST(Rgb24_2_yuv420Simple, ConvertsWholeBlocksOnly) {
    for (const PictureSize size : PictureSizes()) {
        TestRows source(3 * size.width, size.height, Stride24(size.width));
        TestPlanes to(size.width, size.height, 3);
        for (int row = 0; row + 1 < size.height; row += 2) {
            for (int column = 0; column + 1 < size.width; column += 2) {
                int u = 0;
                int v = 0;
                for (const int r : {row, row + 1}) {
                    for (const int c : {column, column + 1}) {
                        const Yuv yuv = equations::SimpleYuv(source.PixelAt(size.height - 1 - r, 3 * c));
                        to.y.Expect(r, c, yuv.y);
                        u += yuv.u;
                        v += yuv.v;
                    }
                }
                to.u.Expect(row / 2, column / 2, u / 4);
                to.v.Expect(row / 2, column / 2, v / 4);
            }
        }
        auto header = BitmapHeader(size.width, size.height, 32);
        Rgb24_2_yuv420Simple(PLANES(to), PITCHES(to), &header, source.Data());
        to.Check();
        ASSERT_FALSE(testing::Test::HasFatalFailure()) << size.width << " x " << size.height;
    }
}

TEST(Rgb32_2_yuv420, AveragesShiftedValues) {
    unsigned char pixels[]{130, 32, 68, 9, 230, 253, 60, 9}; // the sum before the shift would give U 156
    unsigned char y[2], u, v;
    auto header = BitmapHeader(2, 1, 32);
    Rgb32_2_yuv420(y, &u, &v, 2, 1, 1, &header, pixels);
    EXPECT_EQ(u, 155);
}

TEST(PixelRGB_2_YUV, RoundsAndClamps) {
    struct Row {
        int r, g, b, y, u, v;
    };
    const Row rows[] = {
        {0, 0, 0, 16, 128, 128},   {255, 255, 255, 235, 128, 128}, {255, 0, 0, 81, 90, 240},
        {0, 255, 0, 144, 54, 34},  {0, 0, 255, 41, 240, 110},      {128, 128, 128, 126, 128, 128},
        {-10, 0, 0, 16, 129, 124}, {300, 0, 0, 93, 83, 240},       {0, 3000, 0, 235, 16, 16},
    };
    for (const Row& row : rows) {
        int y = 0, u = 0, v = 0;
        PixelRGB_2_YUV(row.r, row.g, row.b, y, u, v);
        EXPECT_TRUE(y == row.y && u == row.u && v == row.v)
            << row.r << ", " << row.g << ", " << row.b << " gave " << y << ", " << u << ", " << v;
    }
}

TEST(PixelRGB_2_YUV, WrapsAt32Bits) {
    int y = 0, u = 0, v = 0;
    PixelRGB_2_YUV(1 << 30, 0, 0, y, u, v); // 263 * 2^30 is 3 * 2^30 modulo 2^32, negative as a signed sum
    EXPECT_EQ(y, 16);
}

} // namespace
