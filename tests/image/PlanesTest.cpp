// Copies and resampling of planes.
#include "tests/image/TestPicture.h"

#include <algorithm>

namespace {

TEST(YV12_Blt_fast, Rectangles) {
    constexpr int kWidth = 80;
    constexpr int kHeight = 12;
    for (const int xDst : {0, 1, 2}) {
        for (const int xSrc : {0, 2, 3}) {
            for (const int cx : {1, 2, 5, 33, 64}) {
                for (const int cy : {1, 2, 5}) {
                    const int yDst = xSrc;
                    const int ySrc = 4 - xDst;
                    // Rows that touch may be taken as one.
                    TestPlanes from(xSrc == 0 ? cx : kWidth, kHeight, xSrc == 0 ? 0 : 2);
                    TestPlanes to(xDst == 0 ? cx : kWidth, kHeight, xDst == 0 ? 0 : 5);
                    const int rows = (cy + 1) / 2 * 2;
                    for (int row = 0; row < rows; ++row)
                        for (int column = 0; column < cx; ++column)
                            to.y.Expect(yDst + row, xDst + column, from.y.At(ySrc + row, xSrc + column));
                    for (int row = 0; row < rows / 2; ++row) {
                        for (int column = 0; column < (cx + 1) / 2; ++column) {
                            const int toColumn = (xDst + 1) / 2 + column;
                            const int fromColumn = (xSrc + 1) / 2 + column;
                            to.u.Expect(yDst / 2 + row, toColumn, from.u.At(ySrc / 2 + row, fromColumn));
                            to.v.Expect(yDst / 2 + row, toColumn, from.v.At(ySrc / 2 + row, fromColumn));
                        }
                    }
                    YV12_Blt_fast(PLANES(to), PITCHES(to), xDst, yDst, cx, cy, PLANES(from), PITCHES(from),
                                  xSrc, ySrc);
                    to.Check();
                    ASSERT_FALSE(HasFatalFailure()) << cx << " x " << cy << " from " << xSrc << ", " << ySrc
                                                    << " to " << xDst << ", " << yDst;
                }
            }
        }
    }
}

TEST(YUV444_2_420, AveragesTheSamplesThatExist) {
    for (const PictureSize size : PictureSizes()) {
        TestRows from(size.width, size.height, size.width);
        const int width = (size.width + 1) / 2;
        TestRows to(width, (size.height + 1) / 2, width);
        for (int row = 0; row < (size.height + 1) / 2; ++row) {
            for (int column = 0; column < width; ++column) {
                int sum = 0;
                int samples = 0;
                for (int r = 2 * row; r < std::min(2 * row + 2, size.height); ++r) {
                    for (int c = 2 * column; c < std::min(2 * column + 2, size.width); ++c) {
                        sum += from.At(r, c);
                        ++samples;
                    }
                }
                to.Expect(row, column, sum / samples);
            }
        }
        YUV444_2_420(to.Data(), from.Data(), size.width, size.height);
        to.Check("plane");
        ASSERT_FALSE(HasFatalFailure()) << size.width << " x " << size.height;
    }
}

TEST(YUV420_2_444, DoublesEverySample) {
    for (const PictureSize size : PictureSizes()) {
        TestRows from(size.width, size.height, size.width);
        TestRows to(2 * size.width, 2 * size.height, 2 * size.width);
        for (int row = 0; row < 2 * size.height; ++row)
            for (int column = 0; column < 2 * size.width; ++column)
                to.Expect(row, column, from.At(row / 2, column / 2));
        YUV420_2_444(to.Data(), from.Data(), size.width, size.height);
        to.Check("plane");
        ASSERT_FALSE(HasFatalFailure()) << size.width << " x " << size.height;
    }
}

TEST(YUV420_2_444Ex, LeavesAnOddLastColumnAndRow) {
    for (const PictureSize size : PictureSizes()) {
        TestRows from((size.width + 1) / 2, (size.height + 1) / 2, (size.width + 1) / 2);
        TestRows to(size.width, size.height, size.width);
        for (int row = 0; row < size.height / 2 * 2; ++row)
            for (int column = 0; column < size.width / 2 * 2; ++column)
                to.Expect(row, column, from.At(row / 2, column / 2));
        YUV420_2_444Ex(to.Data(), from.Data(), size.width, size.height);
        to.Check("plane");
        ASSERT_FALSE(HasFatalFailure()) << size.width << " x " << size.height;
    }
}

TEST(Planes, ConvertNothingOfSizeZeroOrLess) {
    TestPlanes from(8, 4, 0);
    TestPlanes to(8, 4, 0);
    for (const auto& [cx, cy] : {std::pair{0, 2}, {2, 0}, {-3, 2}, {2, -3}}) {
        YV12_Blt_fast(PLANES(to), PITCHES(to), 0, 0, cx, cy, PLANES(from), PITCHES(from), 0, 0);
        YUV444_2_420(to.y.Data(), from.y.Data(), cx, cy);
        YUV420_2_444(to.y.Data(), from.y.Data(), cx, cy);
        YUV420_2_444Ex(to.y.Data(), from.y.Data(), cx, cy);
    }
    to.Check();
}

} // namespace
