// The vector kernels, written once for every instruction set whose vectors are lanes of 128 bits.
//
// A lane works on 16 pixels of its own and never looks at another lane: lane i of a vector holds the pixels
// 16 i to 16 i + 15 of a block, so that bytes, one a pixel, lie in memory order over all lanes. Rows of more
// bytes a pixel are loaded and stored lane by lane. `V` is the instruction set: its vector type and one
// inline function for each instruction, defined without linkage in the file that makes the table, so that
// nothing compiled for one instruction set is shared with another.
//
// Every kernel is flattened: one loop without a call, its constants in registers.
//
// Widths: whole blocks, then the last whole block of an even width once more over what has been written,
// which gives the same bytes. Pictures narrower than a block go to the next lower level, an odd last column
// to the plain kernels, while its row is near.
#ifndef MOVIECONV_COMMON_IMAGE_KERNELS_LANEKERNELS_H
#define MOVIECONV_COMMON_IMAGE_KERNELS_LANEKERNELS_H

#include "Common/Image/kernels/FixedPoint.h"
#include "Common/Image/kernels/RowKernels.h"

#include <array>

namespace image {

/// The contents of one lane, repeated in all.
using LaneBytes = std::array<int8_t, 16>;

template <class V>
class LaneKernels {
    using Vec = typename V::Vec;
    static constexpr ptrdiff_t kLanes = sizeof(Vec) / 16;
    static constexpr ptrdiff_t kPixels = 16 * kLanes;

    // --- Widths
    // ------------------------------------------------------------------------------------------------------

    /// Calls block(x) so that all columns of an even width are covered, and last(done) for an odd column
    /// behind them. The width is not less than a block. One place calls the block, so that the compiler keeps
    /// its constants in registers.
    template <class Block, class Last>
    static void ForBlocks(ptrdiff_t width, ptrdiff_t blockPixels, Block block, Last last) {
        const ptrdiff_t even = width & ~ptrdiff_t{1};
        const ptrdiff_t lastBlock = even - blockPixels;
        for (ptrdiff_t x = 0; x < lastBlock; x += blockPixels)
            block(x);
        block(lastBlock);
        if (even < width)
            last(even);
    }

    /// Of an even width.
    template <class Block>
    static void ForBlocks(ptrdiff_t width, Block block) {
        ForBlocks(width, kPixels, block, [](ptrdiff_t) {});
    }

    /// The size of what is left of a pair of rows.
    static Size LastColumn(ptrdiff_t row0, ptrdiff_t row1) { return {1, row1 - row0 + 1}; }

    static RowPair Advance(RowPair rows, ptrdiff_t bytes) {
        return {rows.first + bytes, rows.second + bytes};
    }
    static PlanesPair Advance(PlanesPair planes, ptrdiff_t columns) {
        return {Advance(planes.y, columns), planes.u + columns / 2, planes.v + columns / 2};
    }

    /// Asks for what the blocks a little further on will read: with two rows read and up to six written, the
    /// processor does not foresee it all. Past the end of a row it does no harm.
    static void Prefetch(const uint8_t* p, ptrdiff_t blockBytes) {
        constexpr ptrdiff_t kAhead = 2048;
        constexpr ptrdiff_t kCacheLine = 64;
        for (ptrdiff_t i = 0; i < blockBytes; i += kCacheLine)
            __builtin_prefetch(p + kAhead + i);
    }

    // --- RGB to YUV
    // --------------------------------------------------------------------------------------------------

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
    static void RgbBlockTo420(PlanesPair target, RowPair rgb, UseBytes useBytes) {
        const auto convert = [&](RowIndex index, uint8_t* luma, const uint8_t* row) {
            Prefetch(row, Format::kBytes * kPixels);
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

    template <class Format, class Form, To420 RowKernels::*kKernel>
    [[gnu::flatten]] static void RgbTo420(Planes420 target, Rows rgb, Size size) {
        if (size.width < kPixels)
            return (V::Lower().*kKernel)(target, rgb, size);
        ForRowPairs(target, rgb, size.height,
                    [&](PlanesPair to, RowPair from, ptrdiff_t row0, ptrdiff_t row1) {
                        ForBlocks(
                            size.width, kPixels,
                            [&](ptrdiff_t x) {
                                RgbBlockTo420<Format, Form>(Advance(to, x), Advance(from, Format::kBytes * x),
                                                            [](RowIndex, const Quads&) {});
                            },
                            [&](ptrdiff_t x) {
                                (kPlainKernels.*kKernel)(target.At(x, row0), rgb.At(row0, Format::kBytes * x),
                                                         LastColumn(row0, row1));
                            });
                    });
        V::FinishPicture();
    }

    [[gnu::flatten]] static void RgbaTo420(Planes420 target, Rows alpha, Rows bgra, Size size) {
        if (size.width < kPixels)
            return V::Lower().bgra32To420(target, alpha, bgra, size);
        ForRowPairs(
            target, bgra, size.height, [&](PlanesPair to, RowPair from, ptrdiff_t row0, ptrdiff_t row1) {
                ForBlocks(
                    size.width, kPixels,
                    [&](ptrdiff_t x) {
                        const auto storeAlpha = [&](RowIndex row, const Quads& bytes) {
                            V::Store(alpha[row == kFirst ? row0 : row1] + x, Bgr32::Alpha(bytes));
                        };
                        RgbBlockTo420<Bgr32, FastRgbForm>(Advance(to, x), Advance(from, 4 * x), storeAlpha);
                    },
                    [&](ptrdiff_t x) {
                        kPlainKernels.bgra32To420(target.At(x, row0), alpha.At(row0, x), bgra.At(row0, 4 * x),
                                                  LastColumn(row0, row1));
                    });
            });
        V::FinishPicture();
    }

    // --- YUV to RGB
    // --------------------------------------------------------------------------------------------------

    /// The chroma terms of sixteen pixels a lane: a word for every two pixels.
    struct ChromaTerms {
        Vec red, green, blue, blueRest;
    };

    /// From bytes of U and V, alternating. They are centred here, which their multiplication asks for; the
    /// constants make up for it.
    template <class Form>
    static ChromaTerms MakeTerms(Vec uv) {
        using F = Form;
        const Vec centred = V::Xor(uv, V::Set8(-128));
        const auto weighted = [=](int ofU, int ofV) {
            return V::MulAddU8S8(V::Set16(ofU | ofV << 8), centred);
        };
        const auto rest = [=](int ofU, int ofV, int constant) {
            return V::template Sra16<F::kShift>(
                V::Add16(weighted(ofU, ofV), V::Set16(constant + 128 * (ofU + ofV))));
        };
        const auto plus = [](int constant, Vec words) { return V::Add16(words, V::Set16(constant)); };
        const Vec red = plus(F::kRedConstant + 128 * F::kRedWhole,
                             V::Add16(weighted(0, F::kRedWhole), rest(0, F::kRedRest, F::kRedRestConstant)));
        // The whole factors of green are negative, the weights are not.
        const Vec green = plus(F::kGreenConstant + 128 * (F::kGreenUWhole + F::kGreenVWhole),
                               V::Sub16(rest(F::kGreenURest, F::kGreenVRest, F::kGreenRestConstant),
                                        weighted(-F::kGreenUWhole, -F::kGreenVWhole)));
        const Vec blueRest =
            plus(F::kBlueConstant + 128 * F::kBlueWhole,
                 V::Add16(weighted(F::kBlueWhole, 0), rest(F::kBlueRest, 0, F::kBlueRestConstant)));
        return {red, green, V::template Sll16<8>(centred), blueRest};
    }

    /// Bytes of sixteen pixels a lane: the even pixels, then the odd ones, as the chroma terms ask for.
    struct Components {
        Vec blue, green, red;
    };
    static constexpr size_t PlaceOfPixel(size_t pixel) { return pixel / 2 + pixel % 2 * 8; }

    template <class Form>
    static Components MakeComponents(Vec y, const ChromaTerms& terms) {
        const Vec centred = V::Xor(y, V::Set8(-128));
        const Vec offset = V::Set16(128 * Form::kLumaWeight - Form::kBias);
        const Vec even = V::Add16(V::MulAddU8S8(V::Set16(Form::kLumaWeight), centred), offset);
        const Vec odd = V::Add16(V::MulAddU8S8(V::Set16(Form::kLumaWeight << 8), centred), offset);
        const auto component = [](Vec evenSum, Vec oddSum) {
            return V::PackUs16(V::MulHigh16(evenSum, V::Set16(1 << 9)),
                               V::MulHigh16(oddSum, V::Set16(1 << 9)));
        };
        return {component(V::AddSat16(V::AddSat16(even, terms.blue), terms.blueRest),
                          V::AddSat16(V::AddSat16(odd, terms.blue), terms.blueRest)),
                component(V::AddSat16(even, terms.green), V::AddSat16(odd, terms.green)),
                component(V::AddSat16(even, terms.red), V::AddSat16(odd, terms.red))};
    }

    struct Bgr24Target {
        static constexpr ptrdiff_t kBytes = 3;

        /// Byte i of the first, second and third 16 bytes is component (i + j) % 3 of its pixel. One shuffle
        /// of a component serves all three, because it puts each byte where none of the other two needs one.
        static constexpr LaneBytes Spread(size_t component) {
            LaneBytes indices{};
            for (size_t i = 0; i < 48; ++i)
                if (i % 3 == component)
                    indices[i % 16] = static_cast<int8_t>(PlaceOfPixel(i / 3));
            return indices;
        }
        static constexpr LaneBytes EveryThird(size_t first) {
            LaneBytes mask{};
            for (size_t i = first; i < 16; i += 3)
                mask[i] = -1;
            return mask;
        }

        static void Store(uint8_t* p, const Components& c) {
            constexpr LaneBytes kSpread[3] = {Spread(0), Spread(1), Spread(2)};
            constexpr LaneBytes kSecond = EveryThird(1);
            constexpr LaneBytes kThird = EveryThird(2);
            const Vec blue = V::Shuffle8(c.blue, V::Lane(kSpread[0]));
            const Vec green = V::Shuffle8(c.green, V::Lane(kSpread[1]));
            const Vec red = V::Shuffle8(c.red, V::Lane(kSpread[2]));
            const auto weave = [=](Vec at0, Vec at1, Vec at2) {
                return V::Blend8(V::Blend8(at0, at1, V::Lane(kSecond)), at2, V::Lane(kThird));
            };
            const Vec parts[3] = {weave(blue, green, red), weave(green, red, blue), weave(red, blue, green)};
            V::StoreLanes(p, parts);
        }
    };

    template <bool kOpaque>
    struct Bgr32Target {
        static constexpr ptrdiff_t kBytes = 4;

        static Vec InPixelOrder(Vec component) {
            constexpr LaneBytes kPlaces{0, 8, 1, 9, 2, 10, 3, 11, 4, 12, 5, 13, 6, 14, 7, 15};
            return V::Shuffle8(component, V::Lane(kPlaces));
        }

        static void Store(uint8_t* p, const Components& c) {
            const Vec blue = InPixelOrder(c.blue);
            const Vec green = InPixelOrder(c.green);
            const Vec red = InPixelOrder(c.red);
            const Vec fourth = V::Set8(kOpaque ? -1 : 0);
            const Vec blueGreen[2] = {V::UnpackLo8(blue, green), V::UnpackHi8(blue, green)};
            const Vec redFourth[2] = {V::UnpackLo8(red, fourth), V::UnpackHi8(red, fourth)};
            const Vec quads[4] = {
                V::UnpackLo16(blueGreen[0], redFourth[0]), V::UnpackHi16(blueGreen[0], redFourth[0]),
                V::UnpackLo16(blueGreen[1], redFourth[1]), V::UnpackHi16(blueGreen[1], redFourth[1])};
            if constexpr (kOpaque) {
                V::StoreLanes(p, quads);
            } else {
                const Vec kept = V::Set32(static_cast<int32_t>(0xFF000000));
                V::ForVectors(quads, [&](ptrdiff_t offset, Vec pixels) {
                    const Vec target = V::And(V::Load(p + offset), kept);
                    V::Cached::Store(p + offset, V::Or(pixels, target)); // in the cache, as it was read
                });
            }
        }
    };

    template <class Target, class Form, From420 RowKernels::*kKernel>
    [[gnu::flatten]] static void RgbFrom420(Rows rgb, Planes420 source, Size size) {
        if (size.width < kPixels)
            return (V::Lower().*kKernel)(rgb, source, size);
        ForRowPairs(
            source, rgb, size.height, [&](PlanesPair from, RowPair to, ptrdiff_t row0, ptrdiff_t row1) {
                ForBlocks(
                    size.width, kPixels,
                    [&](ptrdiff_t x) {
                        const PlanesPair at = Advance(from, x);
                        const RowPair pixels = Advance(to, Target::kBytes * x);
                        const ChromaTerms terms = MakeTerms<Form>(V::LoadAlternating(at.u, at.v));
                        Target::Store(pixels.first, MakeComponents<Form>(V::Load(at.y.first), terms));
                        Target::Store(pixels.second, MakeComponents<Form>(V::Load(at.y.second), terms));
                    },
                    [&](ptrdiff_t x) {
                        (kPlainKernels.*kKernel)(rgb.At(row0, Target::kBytes * x), source.At(x, row0),
                                                 LastColumn(row0, row1));
                    });
            });
        V::FinishPicture();
    }

    // --- Packed 4:2:2
    // ------------------------------------------------------------------------------------------------

    static Vec LowBytes(Vec words) { return V::And(words, V::Set16(0xFF)); }
    static Vec HighBytes(Vec words) { return V::template Srl16<8>(words); }

    template <PackedOrder kOrder>
    static Vec LumaWords(Vec packed) {
        return kOrder == kYuy2 ? LowBytes(packed) : HighBytes(packed);
    }
    template <PackedOrder kOrder>
    static Vec ChromaWords(Vec packed) {
        return kOrder == kYuy2 ? HighBytes(packed) : LowBytes(packed);
    }

    /// Words of which the upper byte is chroma, the lower one zero.
    template <PackedOrder kOrder>
    static Vec ChromaAbove(Vec packed) {
        return kOrder == kYuy2 ? V::And(packed, V::Set16(-0x100)) : V::template Sll16<8>(packed);
    }

    /// Stores the bytes of two vectors alternating.
    static void StoreInterleaved(uint8_t* p, Vec even, Vec odd) {
        const Vec halves[2] = {V::UnpackLo8(even, odd), V::UnpackHi8(even, odd)};
        V::StoreLanes(p, halves);
    }

    /// Stores sixteen pixels a lane from their Y and the bytes U, V, U, V, ...
    template <PackedOrder kOrder>
    static void StorePacked(uint8_t* p, Vec y, Vec uv) {
        StoreInterleaved(p, kOrder == kYuy2 ? y : uv, kOrder == kYuy2 ? uv : y);
    }

    template <PackedOrder kOrder>
    static void PackedBlockTo420(PlanesPair target, RowPair packed) {
        constexpr LaneBytes kApart{0, 4, 8, 12, 1, 5, 9, 13, 2, 6, 10, 14, 3, 7, 11, 15};
        const auto load = [](const uint8_t* row, int half) { return V::LoadLanes(row + 16 * half, 32); };
        const Vec first[2] = {load(packed.first, 0), load(packed.first, 1)};
        const Vec second[2] = {load(packed.second, 0), load(packed.second, 1)};
        const auto luma = [](const Vec(&halves)[2]) {
            return V::PackUs16(LumaWords<kOrder>(halves[0]), LumaWords<kOrder>(halves[1]));
        };
        // In the upper bytes: without anything below them the average's rounding has no effect there.
        const auto average = [](Vec a, Vec b) {
            return V::Average16(ChromaAbove<kOrder>(a), ChromaAbove<kOrder>(b));
        };
        const Vec chroma = V::Blend8(HighBytes(average(first[0], second[0])), average(first[1], second[1]),
                                     V::Set16(-0x100));
        V::Store(target.y.first, luma(first));
        V::Store(target.y.second, luma(second));
        V::StoreHalves(target.u, target.v, V::ExchangeMiddle(V::Shuffle8(chroma, V::Lane(kApart))));
    }

    template <PackedOrder kOrder>
    [[gnu::flatten]] static void PackedTo420(Planes420 target, Rows packed, Size size) {
        if (size.width < kPixels)
            return V::Lower().packedTo420[kOrder](target, packed, size);
        ForRowPairs(target, packed, size.height, [&](PlanesPair to, RowPair from, ptrdiff_t, ptrdiff_t) {
            ForBlocks(size.width,
                      [&](ptrdiff_t x) { PackedBlockTo420<kOrder>(Advance(to, x), Advance(from, 2 * x)); });
        });
        V::FinishPicture();
    }

    template <PackedOrder kOrder>
    [[gnu::flatten]] static void PackedFrom420(Rows packed, Planes420 source, Size size) {
        if (size.width < kPixels)
            return V::Lower().packedFrom420[kOrder](packed, source, size);
        ForRowPairs(source, packed, size.height, [&](PlanesPair from, RowPair to, ptrdiff_t, ptrdiff_t) {
            ForBlocks(size.width, [&](ptrdiff_t x) {
                const PlanesPair at = Advance(from, x);
                const RowPair groups = Advance(to, 2 * x);
                const Vec uv = V::LoadAlternating(at.u, at.v);
                StorePacked<kOrder>(groups.first, V::Load(at.y.first), uv);
                StorePacked<kOrder>(groups.second, V::Load(at.y.second), uv);
            });
        });
        V::FinishPicture();
    }

    /// Walks single rows of pictures with the given bytes a pixel. `kernel` is this one's in a table.
    template <ptrdiff_t kTargetBytes, ptrdiff_t kSourceBytes, class Kernel, class Block>
    static void ForRowBlocks(Rows target, Rows source, Size size, Kernel kernel, Block block) {
        if (size.width < kPixels)
            return kernel(V::Lower())(target, source, size);
        for (ptrdiff_t row = 0; row < size.height; ++row) {
            uint8_t* const to = target[row];
            const uint8_t* const from = source[row];
            ForBlocks(
                size.width, kPixels,
                [&](ptrdiff_t x) { block(to + kTargetBytes * x, from + kSourceBytes * x); },
                [&](ptrdiff_t x) {
                    kernel(kPlainKernels)(target.At(row, kTargetBytes * x), source.At(row, kSourceBytes * x),
                                          LastColumn(row, row));
                });
        }
        V::FinishPicture();
    }

    template <PackedOrder kOrder>
    [[gnu::flatten]] static void PackedFromBgr24(Rows packed, Rows rgb, Size size) {
        ForRowBlocks<2, 3>(
            packed, rgb, size, [](const RowKernels& k) { return k.packedFromBgr24[kOrder]; },
            [](uint8_t* to, const uint8_t* from) {
                const Quads pixels = Bgr24::Pixels(Bgr24::Load(from));
                StorePacked<kOrder>(to, Luma<FastRgbForm>(pixels),
                                    StoredChroma<1>(PixelChroma<FastRgbForm>(pixels)));
            });
    }

    template <PackedOrder kOrder>
    [[gnu::flatten]] static void Bgr24FromPacked(Rows rgb, Rows packed, Size size) {
        ForRowBlocks<3, 2>(
            rgb, packed, size, [](const RowKernels& k) { return k.bgr24FromPacked[kOrder]; },
            [](uint8_t* to, const uint8_t* from) {
                const Vec halves[2] = {V::LoadLanes(from, 32), V::LoadLanes(from + 16, 32)};
                const Vec y = V::PackUs16(LumaWords<kOrder>(halves[0]), LumaWords<kOrder>(halves[1]));
                const Vec uv = V::PackUs16(ChromaWords<kOrder>(halves[0]), ChromaWords<kOrder>(halves[1]));
                Bgr24Target::Store(to, MakeComponents<FastYuvForm>(y, MakeTerms<FastYuvForm>(uv)));
            });
    }

    [[gnu::flatten]] static void SwapPacked(Rows target, Rows source, Size size) {
        ForRowBlocks<2, 2>(
            target, source, size, [](const RowKernels& k) { return k.swapPacked; },
            [](uint8_t* to, const uint8_t* from) {
                constexpr LaneBytes kSwapped{1, 0, 3, 2, 5, 4, 7, 6, 9, 8, 11, 10, 13, 12, 15, 14};
                for (ptrdiff_t i = 0; i < 2 * kPixels; i += kPixels)
                    V::Store(to + i, V::Shuffle8(V::Load(from + i), V::Lane(kSwapped)));
            });
    }

    /// Stores to whole vectors of memory, but for both ends of a row: a store across a cache line takes two.
    [[gnu::flatten]] static void Copy(Rows target, Rows source, Size size) {
        constexpr ptrdiff_t kBytes = sizeof(Vec);
        const ptrdiff_t last = size.width - kBytes;
        if (last < 0)
            return V::Lower().copy(target, source, size);
        for (ptrdiff_t row = 0; row < size.height; ++row) {
            uint8_t* const to = target[row];
            const uint8_t* const from = source[row];
            const auto misaligned = static_cast<ptrdiff_t>(reinterpret_cast<uintptr_t>(to) % kBytes);
            V::Store(to, V::Load(from));
            for (ptrdiff_t x = kBytes - misaligned; x < last; x += kBytes)
                V::Store(to + x, V::Load(from + x));
            V::Store(to + last, V::Load(from + last));
        }
        V::FinishPicture();
    }

    // --- Planes
    // ------------------------------------------------------------------------------------------------------

    // Blocks of half the size serve planes that are too narrow for a whole one.

    template <class Block>
    static void HalveBy(ptrdiff_t blockPixels, Rows target, Rows source, Size size, Block block) {
        ForRowPairs(size.height, [&](ptrdiff_t row0, ptrdiff_t row1, ptrdiff_t half) {
            const auto from = source.Pair(row0, row1);
            uint8_t* const to = target[half];
            ForBlocks(
                size.width, blockPixels, [&](ptrdiff_t x) { block(to + x / 2, Advance(from, x)); },
                [&](ptrdiff_t x) {
                    kPlainKernels.halve(target.At(half, x / 2), source.At(row0, x), LastColumn(row0, row1));
                });
        });
        V::FinishPicture();
    }

    /// Averages of the four samples in each 2 x 2 of a vector's, as words.
    static Vec BlockAverages(RowPair rows) {
        const Vec ones = V::Set8(1);
        return V::template Srl16<2>(
            V::Add16(V::MulAddU8S8(V::Load(rows.first), ones), V::MulAddU8S8(V::Load(rows.second), ones)));
    }

    [[gnu::flatten]] static void Halve(Rows target, Rows source, Size size) {
        const auto bytes = [](Vec low, Vec high) { return V::ExchangeMiddle(V::PackUs16(low, high)); };
        if (size.width < kPixels)
            V::Lower().halve(target, source, size);
        else if (size.width < 2 * kPixels)
            HalveBy(kPixels, target, source, size, [&](uint8_t* to, RowPair from) {
                const Vec averages = BlockAverages(from);
                V::StoreHalf(to, bytes(averages, averages));
            });
        else
            HalveBy(2 * kPixels, target, source, size, [&](uint8_t* to, RowPair from) {
                V::Store(to, bytes(BlockAverages(from), BlockAverages(Advance(from, kPixels))));
            });
    }

    template <class Block>
    static void DoubleBy(ptrdiff_t blockPixels, Rows target, Rows source, Size size, Block block) {
        for (ptrdiff_t row = 0; row < size.height; ++row) {
            const auto to = target.Pair(2 * row, 2 * row + 1);
            const uint8_t* const from = source[row];
            ForBlocks(
                size.width, blockPixels, [&](ptrdiff_t x) { block(Advance(to, 2 * x), from + x); },
                [&](ptrdiff_t x) {
                    kPlainKernels.doubled(target.At(2 * row, 2 * x), source.At(row, x), LastColumn(row, row));
                });
        }
        V::FinishPicture();
    }

    [[gnu::flatten]] static void Doubled(Rows target, Rows source, Size size) {
        if (size.width < kPixels / 2)
            V::Lower().doubled(target, source, size);
        else if (size.width < kPixels)
            DoubleBy(kPixels / 2, target, source, size, [](RowPair to, const uint8_t* from) {
                const Vec twice = V::LoadAlternating(from, from);
                V::Store(to.first, twice);
                V::Store(to.second, twice);
            });
        else
            DoubleBy(kPixels, target, source, size, [](RowPair to, const uint8_t* from) {
                const Vec samples = V::Load(from);
                StoreInterleaved(to.first, samples, samples);
                StoreInterleaved(to.second, samples, samples);
            });
    }

public:
    static constexpr RowKernels Table(const RowKernels* large = nullptr) {
        return {
            .bgr32To420 = RgbTo420<Bgr32, FastRgbForm, &RowKernels::bgr32To420>,
            .bgr24To420 = RgbTo420<Bgr24, FastRgbForm, &RowKernels::bgr24To420>,
            .bgr24To420Simple = RgbTo420<Bgr24, SimpleRgbForm, &RowKernels::bgr24To420Simple>,
            .bgra32To420 = RgbaTo420,
            .bgr24From420 = RgbFrom420<Bgr24Target, FastYuvForm, &RowKernels::bgr24From420>,
            .bgr24From420Simple = RgbFrom420<Bgr24Target, SimpleYuvForm, &RowKernels::bgr24From420Simple>,
            .bgrxFrom420 = RgbFrom420<Bgr32Target<false>, FastYuvForm, &RowKernels::bgrxFrom420>,
            .bgraFrom420 = RgbFrom420<Bgr32Target<true>, FastYuvForm, &RowKernels::bgraFrom420>,
            .packedTo420 = {PackedTo420<kUyvy>, PackedTo420<kYuy2>},
            .packedFrom420 = {PackedFrom420<kUyvy>, PackedFrom420<kYuy2>},
            .packedFromBgr24 = {PackedFromBgr24<kUyvy>, PackedFromBgr24<kYuy2>},
            .bgr24FromPacked = {Bgr24FromPacked<kUyvy>, Bgr24FromPacked<kYuy2>},
            .swapPacked = SwapPacked,
            .copy = Copy,
            .halve = Halve,
            .doubled = Doubled,
            .large = large,
        };
    }
};

} // namespace image

#endif
