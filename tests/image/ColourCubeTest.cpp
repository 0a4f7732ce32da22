// The kernels of every level against the equations, over the RGB and YUV cubes: a part of them by default,
// all 2^24 colours when MOVIECONV_ENDURANCE is set.
#include "tests/image/Equations.h"
#include "tests/image/Levels.h"

#include <cstdlib>
#include <vector>

namespace {

using namespace image;
using equations::Rgb;
using equations::Yuv;

uint8_t Byte(int value) {
    return static_cast<uint8_t>(value);
}

class ColourCubeTest : public LevelTest {
protected:
    /// A row for each red and green with every blue twice, so that each block has one colour and its chroma
    /// is that colour's.
    template <int kPixelBytes, class Expect>
    static void ExpectYuv(To420 kernel, int step, Expect expect) {
        constexpr size_t kWidth = 512;
        std::vector<uint8_t> row(kWidth * kPixelBytes);
        std::vector<uint8_t> y(2 * kWidth), u(kWidth / 2), v(kWidth / 2);
        for (int r = 0; r < 256; r += step) {
            for (int g = 0; g < 256; g += step) {
                for (size_t x = 0; x < kWidth; ++x) {
                    uint8_t* const pixel = row.data() + kPixelBytes * x;
                    pixel[0] = static_cast<uint8_t>(x / 2);
                    pixel[1] = Byte(g);
                    pixel[2] = Byte(r);
                    if constexpr (kPixelBytes == 4)
                        pixel[3] = static_cast<uint8_t>(37 * x);
                }
                kernel({{y.data(), kWidth}, {u.data(), 0}, {v.data(), 0}}, {row.data(), 0}, {kWidth, 2});
                for (size_t b = 0; b < 256; ++b) {
                    const Yuv want = expect(Rgb{r, g, static_cast<int>(b)});
                    ASSERT_TRUE(y[2 * b] == want.y && y[2 * b + 1] == want.y && y[kWidth + 2 * b] == want.y &&
                                y[kWidth + 2 * b + 1] == want.y && u[b] == want.u && v[b] == want.v)
                        << "red " << r << ", green " << g << ", blue " << b;
                }
            }
        }
    }

    /// A row of every Y for each U and V.
    template <int kPixelBytes, class Expect>
    static void ExpectRgb(From420 kernel, int step, Expect expect) {
        constexpr size_t kWidth = 256;
        constexpr size_t kRowBytes = kWidth * kPixelBytes;
        std::vector<uint8_t> y(kWidth), rgb(2 * kRowBytes);
        for (size_t i = 0; i < kWidth; ++i)
            y[i] = static_cast<uint8_t>(i);
        for (int cb = 0; cb < 256; cb += step) {
            for (int cr = 0; cr < 256; cr += step) {
                std::vector<uint8_t> u(kWidth / 2, Byte(cb)), v(kWidth / 2, Byte(cr));
                kernel({rgb.data(), kRowBytes}, {{y.data(), 0}, {u.data(), 0}, {v.data(), 0}}, {kWidth, 2});
                for (size_t i = 0; i < kWidth; ++i) {
                    const Rgb want = expect(Yuv{static_cast<int>(i), cb, cr});
                    for (const size_t row : {0, 1}) {
                        const uint8_t* const pixel = rgb.data() + row * kRowBytes + kPixelBytes * i;
                        ASSERT_TRUE(pixel[0] == want.b && pixel[1] == want.g && pixel[2] == want.r)
                            << "Y " << i << ", U " << cb << ", V " << cr;
                    }
                }
            }
        }
    }

    void ExpectCubes(int step) const {
        ExpectYuv<4>(kernels->bgr32To420, step, equations::FastYuv);
        ExpectYuv<3>(kernels->bgr24To420, step, equations::FastYuv);
        ExpectYuv<3>(kernels->bgr24To420Simple, step, equations::SimpleYuv);
        ExpectRgb<3>(kernels->bgr24From420, step, equations::FastRgb);
        ExpectRgb<4>(kernels->bgraFrom420, step, equations::FastRgb);
        ExpectRgb<3>(kernels->bgr24From420Simple, step, equations::SimpleRgb);
    }
};

TEST_P(ColourCubeTest, ColoursAreExact) {
    constexpr int kSomeColours = 15; // divides 255, so that both ends are in
    ExpectCubes(std::getenv("MOVIECONV_ENDURANCE") == nullptr ? kSomeColours : 1);
}

INSTANTIATE_TEST_SUITE_P(Levels, ColourCubeTest, testing::ValuesIn(AllKernels()), KernelsName);

} // namespace
