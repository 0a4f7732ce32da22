// RGB to 4:2:0, for vectors of any number of lanes.
#ifndef MOVIECONV_COMMON_IMAGE_KERNELS_LANEFROMRGB_H
#define MOVIECONV_COMMON_IMAGE_KERNELS_LANEFROMRGB_H

#include "Common/Image/kernels/FixedPoint.h"
#include "Common/Image/kernels/LaneBlocks.h"

namespace image {
namespace {

template <class V>
struct LaneFromRgb {
    using Vec = typename V::Vec;
    static constexpr ptrdiff_t kPixels = kLanePixels<V>;

    /// Four bytes for every 32 bits, the first lowest.
    static Vec SetBytes(int first, int second, int third, int fourth) {
        return V::Set32((first & 0xFF) | (second & 0xFF) << 8 | (third & 0xFF) << 16 |
                        static_cast<int>(static_cast<unsigned>(fourth) << 24));
    }

    /// Sixteen pixels a lane as four vectors of four pixels each.
    struct Quads {
        Vec part[4];
    };

    /// Indices that make B, R, G, R of four pixels of kBytes each, the first of which begins at `start`.
    template <int kBytes>
    static constexpr LaneBytes BlueRedGreenRed(int start) {
        constexpr int kOrder[4] = {0, 2, 1, 2};
        LaneBytes indices{};
        for (int i = 0; i < 16; ++i)
            indices[static_cast<size_t>(i)] = static_cast<int8_t>(start + i / 4 * kBytes + kOrder[i % 4]);
        return indices;
    }

    struct Bgr32 {
        static constexpr ptrdiff_t kBytes = 4;

        static Quads Load(const uint8_t* p) {
            Quads bytes;
            for (int i = 0; i < 4; ++i)
                bytes.part[i] = V::LoadLanes(p + 16 * i, 64);
            return bytes;
        }

        static Quads Pixels(const Quads& bytes) {
            constexpr LaneBytes kOrder = BlueRedGreenRed<kBytes>(0);
            Quads pixels;
            for (int i = 0; i < 4; ++i)
                pixels.part[i] = V::Shuffle8(bytes.part[i], V::Lane(kOrder));
            return pixels;
        }

        static Vec Alpha(const Quads& bytes) {
            const auto alpha = [&](int i) { return V::template Srl32<24>(bytes.part[i]); };
            return V::PackUs16(V::PackS32(alpha(0), alpha(1)), V::PackS32(alpha(2), alpha(3)));
        }
    };

    struct Bgr24 {
        static constexpr ptrdiff_t kBytes = 3;

        static Quads Load(const uint8_t* p) {
            // Four pixels are 12 of the 16 bytes loaded. The last four are loaded from 4 bytes before them,
            // so that no byte behind the block is read.
            return {{V::LoadLanes(p, 48), V::LoadLanes(p + 12, 48), V::LoadLanes(p + 24, 48),
                     V::LoadLanes(p + 32, 48)}};
        }

        static Quads Pixels(const Quads& bytes) {
            constexpr LaneBytes kOrder = BlueRedGreenRed<kBytes>(0);
            constexpr LaneBytes kOrderLater = BlueRedGreenRed<kBytes>(4);
            Quads pixels;
            for (int i = 0; i < 3; ++i)
                pixels.part[i] = V::Shuffle8(bytes.part[i], V::Lane(kOrder));
            pixels.part[3] = V::Shuffle8(bytes.part[3], V::Lane(kOrderLater));
            return pixels;
        }
    };

    /// The words of a's upper halves and b's, alternating.
    static Vec MergeUpperHalves(Vec a, Vec b) {
        return V::template Blend16<0xAA>(V::template Srl32<16>(a), b);
    }

    template <class Form>
    static Vec Rounded(Vec sums) {
        if constexpr (Form::kRounding != 0)
            return V::Add32(sums, V::Set32(Form::kRounding));
        else
            return sums;
    }

    /// Y of pixels given as B, R, G, R.
    template <class Form>
    static Vec Luma(const Quads& pixels) {
        constexpr LaneBytes kOrder{0, 2, 4, 6, 1, 3, 5, 7, 8, 10, 12, 14, 9, 11, 13, 15};
        const Vec inner =
            SetBytes(Form::kYInnerBlue, Form::kYBesideBlue, Form::kYInnerGreen, Form::kYBesideGreen);
        const Vec outer = V::SetPair(Form::kYOuterBlue, Form::kYOuterGreen);
        Vec sums[4];
        for (int i = 0; i < 4; ++i)
            sums[i] = Rounded<Form>(V::MulAdd16(V::MulAddU8S8(pixels.part[i], inner), outer));
        const Vec luma = V::PackUs16(MergeUpperHalves(sums[0], sums[1]), MergeUpperHalves(sums[2], sums[3]));
        return V::Add8(V::Shuffle8(luma, V::Lane(kOrder)), V::Set8(16));
    }

    /// Centred Cb and Cr of such pixels, in alternating words.
    template <class Form>
    static Quads PixelChroma(const Quads& pixels) {
        const Vec cbWeights = V::SetPair(Form::kCbBlueWeight, Form::kCbGreenWeight);
        const Vec crWeights = V::SetPair(Form::kCrBlueWeight, Form::kCrGreenWeight);
        Quads chroma;
        for (int i = 0; i < 4; ++i) {
            const Vec differences = V::MulAddU8S8(pixels.part[i], SetBytes(1, -1, 1, -1));
            const Vec cb = Rounded<Form>(V::MulAdd16(differences, cbWeights));
            Vec cr = Rounded<Form>(V::MulAdd16(differences, crWeights));
            if constexpr (Form::kCrSum != 0) {
                // 4 R, and of G what is less than the step of a sum
                static_assert(Form::kCrSum == 4 && Form::kScale == 4);
                cr = V::Add32(cr, V::template Srl32<22>(pixels.part[i]));
            }
            chroma.part[i] = MergeUpperHalves(cb, cr);
        }
        return chroma;
    }

    static Quads AddRows(const Quads& a, const Quads& b) {
        Quads sums;
        for (int i = 0; i < 4; ++i)
            sums.part[i] = V::Add16(a.part[i], b.part[i]);
        return sums;
    }

    /// U and V in alternating bytes: averages of 1 << kLog2 values of neighbours.
    template <int kLog2>
    static Vec StoredChroma(const Quads& chroma) {
        const auto averages = [](Vec a, Vec b) {
            return V::template Sra16<kLog2>(V::Add16(V::EvenDwords(a, b), V::OddDwords(a, b)));
        };
        return V::Add8(
            V::PackS16(averages(chroma.part[0], chroma.part[1]), averages(chroma.part[2], chroma.part[3])),
            V::Set8(-128));
    }

    /// Stores bytes that alternate between two planes.
    static void StoreAlternating(uint8_t* even, uint8_t* odd, Vec bytes) {
        constexpr LaneBytes kApart{0, 2, 4, 6, 8, 10, 12, 14, 1, 3, 5, 7, 9, 11, 13, 15};
        V::StoreHalves(even, odd, V::ExchangeMiddle(V::Shuffle8(bytes, V::Lane(kApart))));
    }

    enum RowIndex { kFirst, kSecond };

    /// `useBytes` is called with the index of each row and its pixels as they were loaded.
    template <class Format, class Form, class UseBytes>
    static void RgbBlockTo420(PlanesPair target, RowPair rgb, ptrdiff_t toNextRows, UseBytes useBytes) {
        const auto convert = [&](RowIndex index, uint8_t* luma, const uint8_t* row) {
            PrefetchRow(row + toNextRows, Format::kBytes * kPixels);
            const Quads bytes = Format::Load(row);
            useBytes(index, bytes);
            const Quads pixels = Format::Pixels(bytes);
            V::Store(luma, Luma<Form>(pixels));
            return PixelChroma<Form>(pixels);
        };
        const Quads first = convert(kFirst, target.y.first, rgb.first);
        const Quads second = convert(kSecond, target.y.second, rgb.second);
        StoreAlternating(target.u, target.v, StoredChroma<2>(AddRows(first, second)));
    }

    /// One pixel in each of two rows, an odd last column, by the equations as they are.
    template <class Form>
    static void RgbPixelsTo420(PlanesPair target, RowPair rgb) {
        const auto sum = [](const uint8_t* p, int blue, int green, int red) {
            return (blue * p[0] + green * p[1] + red * p[2] + Form::kRounding) >> 16;
        };
        const auto luma = [&](const uint8_t* p) {
            constexpr int kBlue = Form::kYOuterBlue * Form::kYInnerBlue;
            constexpr int kGreen = Form::kYOuterGreen * Form::kYInnerGreen;
            constexpr int kRed =
                Form::kYOuterBlue * Form::kYBesideBlue + Form::kYOuterGreen * Form::kYBesideGreen;
            return static_cast<uint8_t>(sum(p, kBlue, kGreen, kRed) + 16);
        };
        const auto average = [&](int blue, int green, int all) {
            const int red = all - blue - green;
            const int both = sum(rgb.first, blue, green, red) + sum(rgb.second, blue, green, red);
            return static_cast<uint8_t>((both >> 1) + 128);
        };
        *target.y.first = luma(rgb.first);
        *target.y.second = luma(rgb.second);
        *target.u = average(Form::kCbBlueWeight, Form::kCbGreenWeight, 0);
        *target.v = average(Form::kCrBlueWeight, Form::kCrGreenWeight, Form::kCrSum);
    }

    template <class Format, class Form, To420 RowKernels::*kKernel>
    [[gnu::flatten]] static void RgbTo420(Planes420 target, Rows rgb, Size size) {
        if (size.width < kPixels)
            return (V::Lower().*kKernel)(target, rgb, size);
        ForRowPairs(target, rgb, size.height, [&](const PlanesPair& to, RowPair from, ptrdiff_t, ptrdiff_t) {
            ForBlocks(
                size.width, kPixels,
                [&](ptrdiff_t x) {
                    RgbBlockTo420<Format, Form>(Advance(to, x), Advance(from, Format::kBytes * x),
                                                2 * rgb.step, [](RowIndex, const Quads&) {});
                },
                [&](ptrdiff_t x) {
                    RgbPixelsTo420<Form>(Advance(to, x), Advance(from, Format::kBytes * x));
                });
        });
        V::FinishPicture();
    }

    [[gnu::flatten]] static void RgbaTo420(Planes420 target, Rows alpha, Rows bgra, Size size) {
        if (size.width < kPixels)
            return V::Lower().bgra32To420(target, alpha, bgra, size);
        ForRowPairs(target, bgra, size.height,
                    [&](const PlanesPair& to, RowPair from, ptrdiff_t row0, ptrdiff_t row1) {
                        ForBlocks(
                            size.width, kPixels,
                            [&](ptrdiff_t x) {
                                const auto storeAlpha = [&](RowIndex row, const Quads& bytes) {
                                    V::Store(alpha[row == kFirst ? row0 : row1] + x, Bgr32::Alpha(bytes));
                                };
                                RgbBlockTo420<Bgr32, FastRgbForm>(Advance(to, x), Advance(from, 4 * x),
                                                                  2 * bgra.step, storeAlpha);
                            },
                            [&](ptrdiff_t x) {
                                const RowPair pixels = Advance(from, 4 * x);
                                alpha[row0][x] = pixels.first[3];
                                alpha[row1][x] = pixels.second[3];
                                RgbPixelsTo420<FastRgbForm>(Advance(to, x), pixels);
                            });
                    });
        V::FinishPicture();
    }
};

} // namespace
} // namespace image

#endif
