// The resampling of planes.
#include "tests/image/TestPicture.h"

#include <algorithm>

namespace {

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
        // Ex takes the target's size, and leaves an odd last column and row.
        for (const bool ex : {false, true}) {
            const PictureSize target = ex ? size : PictureSize{2 * size.width, 2 * size.height};
            const int sourceWidth = (target.width + 1) / 2;
            TestRows from(sourceWidth, (target.height + 1) / 2, sourceWidth);
            TestRows to(target.width, target.height, target.width);
            for (int row = 0; row < target.height / 2 * 2; ++row)
                for (int column = 0; column < target.width / 2 * 2; ++column)
                    to.Expect(row, column, from.At(row / 2, column / 2));
            (ex ? YUV420_2_444Ex : YUV420_2_444)(to.Data(), from.Data(), size.width, size.height);
            to.Check(ex ? "Ex" : "plain");
            ASSERT_FALSE(HasFatalFailure()) << size.width << " x " << size.height;
        }
    }
}

} // namespace
