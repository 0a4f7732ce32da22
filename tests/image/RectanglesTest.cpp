// The routines on rectangles of packed 4:2:2 and of planes, against their definition pixel by pixel.
#include "tests/image/TestPicture.h"

#include <utility>

namespace {

using equations::Yuv;

struct Rectangle {
    int xDst, yDst, cx, cy, xSrc, ySrc;
};

constexpr int kWidth = 150;
constexpr int kHeight = 10;

template <class Check>
void ForRectangles(Check check) {
    for (const unsigned order : {0U, 1U, 0x80000000U}) {
        for (const int xDst : {0, 1, 2, 3}) {
            for (const int xSrc : {0, 1, 2, 3}) {
                for (const int cx : {1, 2, 3, 4, 17, 32, 33, 70, 101}) {
                    const Rectangle r{xDst, xDst % 3, cx, 1 + (xSrc + cx) % 5, xSrc, (xSrc + xDst) % 4};
                    check(order, r);
                    if (testing::Test::HasFatalFailure())
                        FAIL() << "order " << order << ", " << cx << " x " << r.cy << " from " << xSrc << ", "
                               << r.ySrc << " to " << xDst << ", " << r.yDst;
                }
            }
        }
    }
}

/// Byte of a sample in a packed row; V stands two bytes behind U.
int YByte(unsigned order, int column) {
    return column / 2 * 4 + column % 2 * 2 + (order != 0 ? 0 : 1);
}
int UByte(unsigned order, int column) {
    return column / 2 * 4 + (order != 0 ? 1 : 0);
}

/// A pixel of a packed row; both of a group have its chroma.
Yuv PackedAt(const TestRows& packed, unsigned order, int row, int column) {
    const int u = UByte(order, column);
    return {packed.At(row, YByte(order, column)), packed.At(row, u), packed.At(row, u + 2)};
}
void ExpectPacked(TestRows& packed, unsigned order, int row, int column, Yuv yuv) {
    const int u = UByte(order, column);
    packed.Expect(row, YByte(order, column), yuv.y);
    packed.Expect(row, u, yuv.u);
    packed.Expect(row, u + 2, yuv.v);
}

TEST(Rgb24_2_YUY2, Rectangles) {
    ForRectangles([](unsigned order, const Rectangle& r) {
        TestRows from(3 * kWidth, kHeight, 3 * kWidth + 2);
        TestRows to(2 * kWidth, kHeight, 2 * kWidth + 6);
        const int start = r.xDst / 2 * 2;
        const int width = r.cx + r.xDst % 2;
        for (int row = 0; row < r.cy; ++row) {
            for (int column = 0; column < width; column += 2) {
                const auto yuvAt = [&](int x) {
                    return equations::FastYuv(from.PixelAt(kHeight - 1 - r.ySrc - row, 3 * (r.xSrc + x)));
                };
                const Yuv first = yuvAt(column);
                const Yuv second = column + 1 == width ? first : yuvAt(column + 1);
                const int u = (first.u + second.u) / 2;
                const int v = (first.v + second.v) / 2;
                ExpectPacked(to, order, r.yDst + row, start + column, {first.y, u, v});
                ExpectPacked(to, order, r.yDst + row, start + column + 1, {second.y, u, v});
            }
        }
        Rgb24_2_YUY2(to.Data(), to.Pitch(), r.xDst, r.yDst, r.cx, r.cy, order, from.Data(), kHeight,
                     from.Pitch(), r.xSrc, r.ySrc);
        to.Check("packed");
    });
}

TEST(YUY2_2_Rgb24, Rectangles) {
    ForRectangles([](unsigned order, const Rectangle& r) {
        TestRows from(2 * kWidth, kHeight, 2 * kWidth + 2);
        TestRows to(3 * kWidth, kHeight, 3 * kWidth + 1);
        for (int row = 0; row < r.cy; ++row) {
            for (int column = 0; column < r.cx; ++column) {
                const Yuv yuv = PackedAt(from, order, r.ySrc + row, r.xSrc / 2 * 2 + column);
                to.ExpectPixel(kHeight - 1 - r.yDst - row, 3 * (r.xDst + column), equations::FastRgb(yuv));
            }
        }
        YUY2_2_Rgb24(to.Data(), kHeight, to.Pitch(), r.xDst, r.yDst, r.cx, r.cy, from.Data(), from.Pitch(),
                     order, r.xSrc, r.ySrc);
        to.Check("bitmap");
    });
}

TEST(YUY2_2_Yuv420, Rectangles) {
    ForRectangles([](unsigned order, const Rectangle& r) {
        TestRows from(2 * kWidth, kHeight, 2 * kWidth + 4);
        TestPlanes to(kWidth, kHeight, 3);
        const int lastV = (r.yDst / 2 + (r.cy - 1) / 2) * to.v.Pitch() + r.xDst / 2 + (r.cx - 1) / 2;
        if (lastV > (r.ySrc + r.cy) * to.v.Pitch())
            return; // fails the check; another test's business
        for (int row = 0; row < (r.cy + 1) / 2 * 2; ++row) {
            for (int column = 0; column < (r.cx + 1) / 2 * 2; ++column) {
                const auto yuvAt = [&](int y) {
                    return PackedAt(from, order, r.ySrc + y, r.xSrc / 2 * 2 + column);
                };
                const Yuv top = yuvAt(row / 2 * 2);
                const Yuv bottom = yuvAt(row / 2 * 2 + 1);
                to.y.Expect(r.yDst + row, r.xDst + column, yuvAt(row).y);
                to.u.Expect(r.yDst / 2 + row / 2, r.xDst / 2 + column / 2, (top.u + bottom.u) / 2);
                to.v.Expect(r.yDst / 2 + row / 2, r.xDst / 2 + column / 2, (top.v + bottom.v) / 2);
            }
        }
        YUY2_2_Yuv420(PLANES(to), PITCHES(to), r.xDst, r.yDst, r.cx, r.cy, from.Data(), from.Pitch(), order,
                      r.xSrc, r.ySrc);
        to.Check();
    });
}

TEST(Yuv420_2_YUY2, Rectangles) {
    ForRectangles([](unsigned order, const Rectangle& r) {
        TestPlanes from(kWidth, kHeight, 3);
        TestRows to(2 * kWidth, kHeight, 2 * kWidth + 4);
        for (int row = 0; row < (r.cy + 1) / 2 * 2; ++row) {
            for (int column = 0; column < (r.cx + 1) / 2 * 2; ++column) {
                const int chromaRow = r.ySrc / 2 + row / 2;
                const int chromaColumn = r.xSrc / 2 + column / 2;
                ExpectPacked(to, order, r.yDst + row, r.xDst / 2 * 2 + column,
                             {from.y.At(r.ySrc + row, r.xSrc + column), from.u.At(chromaRow, chromaColumn),
                              from.v.At(chromaRow, chromaColumn)});
            }
        }
        Yuv420_2_YUY2(to.Data(), to.Pitch(), r.xDst, r.yDst, r.cx, r.cy, order, PLANES(from), PITCHES(from),
                      r.xSrc, r.ySrc);
        to.Check("packed");
    });
}

TEST(YUY2_Blt_fast, CopiesOrSwaps) {
    ForRectangles([](unsigned order, const Rectangle& r) {
        for (const unsigned orderDst : {order, order + 1}) {
            const bool swap = orderDst != order;
            const int bytes = swap ? (r.cx + 1) / 2 * 4 : 2 * r.cx;
            const auto rows = [bytes](int x, int padding) { // rows that touch may be taken as one
                const int rowBytes = x == 0 ? bytes : 2 * kWidth;
                return TestRows(rowBytes, kHeight, x == 0 ? bytes : rowBytes + padding);
            };
            TestRows from = rows(r.xSrc, 4);
            TestRows to = rows(r.xDst, 2);
            for (int row = 0; row < r.cy; ++row)
                for (int i = 0; i < bytes; ++i)
                    to.Expect(r.yDst + row, 2 * r.xDst + i,
                              from.At(r.ySrc + row, 2 * r.xSrc + (swap ? i ^ 1 : i)));
            YUY2_Blt_fast(to.Data(), to.Pitch(), r.xDst, r.yDst, r.cx, r.cy, orderDst, from.Data(),
                          from.Pitch(), order, r.xSrc, r.ySrc);
            to.Check(swap ? "swapped" : "copied");
        }
    });
}

TEST(YV12_Blt_fast, Rectangles) {
    ForRectangles([](unsigned /*order*/, const Rectangle& r) {
        // Rows that touch may be taken as one.
        TestPlanes from(r.xSrc == 0 ? r.cx : kWidth, kHeight, r.xSrc == 0 ? 0 : 2);
        TestPlanes to(r.xDst == 0 ? r.cx : kWidth, kHeight, r.xDst == 0 ? 0 : 5);
        for (int row = 0; row < (r.cy + 1) / 2 * 2; ++row) {
            for (int column = 0; column < r.cx; ++column) {
                const int toRow = r.yDst / 2 + row / 2;
                const int toColumn = (r.xDst + 1) / 2 + column / 2;
                const int fromRow = r.ySrc / 2 + row / 2;
                const int fromColumn = (r.xSrc + 1) / 2 + column / 2;
                to.y.Expect(r.yDst + row, r.xDst + column, from.y.At(r.ySrc + row, r.xSrc + column));
                to.u.Expect(toRow, toColumn, from.u.At(fromRow, fromColumn));
                to.v.Expect(toRow, toColumn, from.v.At(fromRow, fromColumn));
            }
        }
        YV12_Blt_fast(PLANES(to), PITCHES(to), r.xDst, r.yDst, r.cx, r.cy, PLANES(from), PITCHES(from),
                      r.xSrc, r.ySrc);
        to.Check();
    });
}

TEST(Rectangles, OfSizeZeroOrLessAreLeftAlone) {
    TestPlanes from(8, 4, 0);
    TestPlanes to(8, 4, 0);
    TestRows packed(16, 4, 16);
    TestRows bitmap(24, 4, 24);
    for (const auto& [cx, cy] : {std::pair{0, 2}, {2, 0}, {-3, 2}, {2, -3}}) {
        Rgb24_2_YUY2(packed.Data(), 16, 1, 0, cx, cy, 1, bitmap.Data(), 4, 24, 0, 0);
        YUY2_2_Rgb24(bitmap.Data(), 4, 24, 0, 0, cx, cy, packed.Data(), 16, 1, 0, 0);
        YUY2_2_Yuv420(PLANES(to), PITCHES(to), 1, 0, cx, cy, packed.Data(), 16, 1, 0, 0);
        Yuv420_2_YUY2(packed.Data(), 16, 1, 0, cx, cy, 1, PLANES(from), PITCHES(from), 0, 0);
        YUY2_Blt_fast(packed.Data(), 16, 0, 0, cx, cy, 0, bitmap.Data(), 24, 1, 0, 0);
        YUY2_Blt_fast(packed.Data(), 16, 0, 0, cx, cy, 1, bitmap.Data(), 24, 1, 0, 0);
        YV12_Blt_fast(PLANES(to), PITCHES(to), 0, 0, cx, cy, PLANES(from), PITCHES(from), 0, 0);
        YUV444_2_420(to.y.Data(), from.y.Data(), cx, cy);
        YUV420_2_444(to.y.Data(), from.y.Data(), cx, cy);
        YUV420_2_444Ex(to.y.Data(), from.y.Data(), cx, cy);
    }
    to.Check();
    packed.Check("packed");
    bitmap.Check("bitmap");
}

} // namespace
