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
// which gives the same bytes. Rows shorter than a block go to the next lower level, an odd last column to the
// plain kernels.
#ifndef MOVIECONV_COMMON_IMAGE_KERNELS_LANEKERNELS_H
#define MOVIECONV_COMMON_IMAGE_KERNELS_LANEKERNELS_H

#include "Common/Image/kernels/FixedPoint.h"
#include "Common/Image/kernels/RowKernels.h"

#include <array>

namespace image {

/// The contents of one lane, repeated in all.
using LaneBytes = std::array<int8_t, 16>;

constexpr int8_t kZero = -128; // as a shuffle index: a zero byte

template <class V>
class LaneKernels {
    using Vec = typename V::Vec;
    static constexpr ptrdiff_t kLanes = sizeof(Vec) / 16;
    static constexpr ptrdiff_t kPixels = 16 * kLanes;

    // --- Widths
    // ------------------------------------------------------------------------------------------------------

    /// Calls block(x) so that all columns of an even width are covered; returns how many are: all, or none of
    /// a row that is too short. One place calls the block, so that the compiler keeps its constants in
    /// registers.
    template <class Block>
    static ptrdiff_t ForBlocks(ptrdiff_t width, ptrdiff_t blockPixels, Block block) {
        const ptrdiff_t even = width & ~ptrdiff_t{1};
        const ptrdiff_t last = even - blockPixels;
        if (last < 0)
            return 0;
        for (ptrdiff_t x = 0;; x = x + blockPixels < last ? x + blockPixels : last) {
            block(x);
            if (x == last)
                break;
        }
        V::FinishRow();
        return even;
    }

    /// What converts the columns from `done` on.
    static const RowKernels& Rest(ptrdiff_t done) { return done == 0 ? V::Lower() : kPlainKernels; }

    template <class Byte>
    static RowPair<Byte> Advance(RowPair<Byte> rows, ptrdiff_t bytes) {
        return {rows.first + bytes, rows.second + bytes};
    }

    // --- RGB to YUV
    // --------------------------------------------------------------------------------------------------

    /// Sixteen pixels a lane as four vectors of four pixels each: the words (B, R) and (G, G) of every pixel.
    struct Pixels {
        Vec blueRed[4];
        Vec green[4];
    };

    struct Bgr32 {
        static constexpr ptrdiff_t kBytes = 4;

        static Vec LoadQuad(const uint8_t* p, int quad) { return V::LoadLanes(p + 16 * quad, 64); }

        static Pixels Load(const uint8_t* p) {
            constexpr LaneBytes kGreen{1, kZero, 1, kZero, 5,  kZero, 5,  kZero,
                                       9, kZero, 9, kZero, 13, kZero, 13, kZero};
            Pixels pixels;
            for (int quad = 0; quad < 4; ++quad) {
                const Vec bgrx = LoadQuad(p, quad);
                pixels.blueRed[quad] = V::And(bgrx, V::Set32(0x00FF00FF));
                pixels.green[quad] = V::Shuffle8(bgrx, V::Lane(kGreen));
            }
            return pixels;
        }

        static Vec Alpha(const uint8_t* p) {
            Vec alpha[4];
            for (int quad = 0; quad < 4; ++quad)
                alpha[quad] = V::template Srl32<8>(LoadQuad(p, quad));
            return PackUpperHalves(alpha);
        }
    };

    struct Bgr24 {
        static constexpr ptrdiff_t kBytes = 3;

        static constexpr LaneBytes Indices(int first, int second) {
            LaneBytes indices{};
            for (size_t i = 0; i < 16; ++i) {
                const int component = i % 4 == 0 ? first : second;
                indices[i] =
                    static_cast<int8_t>(i % 2 != 0 ? kZero : 3 * static_cast<int>(i / 4) + component);
            }
            return indices;
        }

        static Pixels Load(const uint8_t* p) {
            // Four pixels are 12 of the 16 bytes loaded. The last four are loaded from 4 bytes before them,
            // so that no byte behind the block is read.
            Pixels pixels;
            for (int quad = 0; quad < 3; ++quad) {
                const Vec bgr = V::LoadLanes(p + 12 * quad, 48);
                pixels.blueRed[quad] = V::Shuffle8(bgr, V::Lane(Indices(0, 2)));
                pixels.green[quad] = V::Shuffle8(bgr, V::Lane(Indices(1, 1)));
            }
            const Vec bgr = V::LoadLanes(p + 32, 48);
            pixels.blueRed[3] = V::Shuffle8(bgr, V::Lane(Indices(4, 6)));
            pixels.green[3] = V::Shuffle8(bgr, V::Lane(Indices(5, 5)));
            return pixels;
        }
    };

    /// The words of a's upper halves and b's, alternating.
    static Vec MergeUpperHalves(Vec a, Vec b) {
        return V::template Blend16<0xAA>(V::template Srl32<16>(a), b);
    }

    /// The bytes that stand in the upper halves of four quads, in the order of the pixels.
    static Vec PackUpperHalves(const Vec (&quads)[4]) {
        constexpr LaneBytes kOrder{0, 2, 4, 6, 1, 3, 5, 7, 8, 10, 12, 14, 9, 11, 13, 15};
        const Vec bytes =
            V::PackUs16(MergeUpperHalves(quads[0], quads[1]), MergeUpperHalves(quads[2], quads[3]));
        return V::Shuffle8(bytes, V::Lane(kOrder));
    }

    template <class Form>
    static Vec Rounded(Vec sums) {
        if constexpr (Form::kRounding != 0)
            return V::Add32(sums, V::Set32(Form::kRounding));
        else
            return sums;
    }

    template <class Form>
    static Vec Luma(const Pixels& pixels) {
        const Vec blueRedWeights = V::SetPair(Form::kYBlueWeight, Form::kYRedWeight);
        const Vec greenWeights = V::Set16(Form::kYGreenWeight);
        Vec sums[4];
        for (int quad = 0; quad < 4; ++quad)
            sums[quad] = Rounded<Form>(V::Add32(V::MulAdd16(pixels.blueRed[quad], blueRedWeights),
                                                V::MulAdd16(pixels.green[quad], greenWeights)));
        return V::Add8(PackUpperHalves(sums), V::Set8(16));
    }

    /// Centred Cb and Cr of sixteen pixels a lane, in words: quad 0 and 1 alternating, then quad 2 and 3.
    struct Chroma {
        Vec cb[2];
        Vec cr[2];
    };

    template <class Form>
    static Chroma PixelChroma(const Pixels& pixels) {
        const Vec cbWeights = V::SetPair(Form::kCbBlueWeight, Form::kCbRedWeight);
        const Vec crWeights = V::SetPair(Form::kCrBlueWeight, Form::kCrRedWeight);
        Vec cb[4];
        Vec cr[4];
        for (int quad = 0; quad < 4; ++quad) {
            const Vec difference = V::Sub16(pixels.blueRed[quad], pixels.green[quad]);
            cb[quad] = Rounded<Form>(V::MulAdd16(difference, cbWeights));
            cr[quad] = Rounded<Form>(V::MulAdd16(difference, crWeights));
            if constexpr (Form::kCrSum != 0) {
                static_assert(Form::kCrSum == 4);
                cr[quad] =
                    V::Add32(cr[quad], V::template Srl32<14>(pixels.green[quad])); // G << 16 becomes 4 G
            }
        }
        return {{MergeUpperHalves(cb[0], cb[1]), MergeUpperHalves(cb[2], cb[3])},
                {MergeUpperHalves(cr[0], cr[1]), MergeUpperHalves(cr[2], cr[3])}};
    }

    static Chroma AddRows(const Chroma& a, const Chroma& b) {
        return {{V::Add16(a.cb[0], b.cb[0]), V::Add16(a.cb[1], b.cb[1])},
                {V::Add16(a.cr[0], b.cr[0]), V::Add16(a.cr[1], b.cr[1])}};
    }

    /// The sums of neighbouring pixels: eight words, of the pairs 0, 2, 4, 6, 1, 3, 5, 7.
    static Vec PairSums(const Vec (&words)[2]) {
        const Vec first = V::Add16(words[0], V::template Srl64<32>(words[0]));
        const Vec second = V::Add16(words[1], V::template Sll64<32>(words[1]));
        return V::template Blend16<0xCC>(first, second);
    }

    /// U of the pairs as above, then V: averages of kPixelsOfBlock = 1 << kLog2 values, with the offset of
    /// 128.
    template <int kLog2>
    static Vec StoredChroma(const Chroma& chroma) {
        const Vec offset = V::Set16(128 << kLog2);
        return V::PackUs16(V::template Srl16<kLog2>(V::Add16(PairSums(chroma.cb), offset)),
                           V::template Srl16<kLog2>(V::Add16(PairSums(chroma.cr), offset)));
    }

    template <class Format, class Form>
    static void RgbBlockTo420(RowPair<uint8_t> y, uint8_t* u, uint8_t* v, RowPair<const uint8_t> rgb) {
        constexpr LaneBytes kOrder{0, 4, 1, 5, 2, 6, 3, 7, 8, 12, 9, 13, 10, 14, 11, 15};
        const Pixels first = Format::Load(rgb.first);
        V::Store(y.first, Luma<Form>(first));
        const Chroma firstChroma = PixelChroma<Form>(first);
        const Pixels second = Format::Load(rgb.second);
        V::Store(y.second, Luma<Form>(second));
        const Chroma chroma = AddRows(firstChroma, PixelChroma<Form>(second));
        V::StoreHalves(u, v, V::Shuffle8(StoredChroma<2>(chroma), V::Lane(kOrder)));
    }

    template <class Format, class Form, To420 RowKernels::*kRest>
    [[gnu::flatten]] static void RgbTo420(RowPair<uint8_t> y, uint8_t* u, uint8_t* v,
                                          RowPair<const uint8_t> rgb, ptrdiff_t width) {
        const ptrdiff_t done = ForBlocks(width, kPixels, [&](ptrdiff_t x) {
            RgbBlockTo420<Format, Form>(Advance(y, x), u + x / 2, v + x / 2,
                                        Advance(rgb, Format::kBytes * x));
        });
        if (done < width)
            (Rest(done).*kRest)(Advance(y, done), u + done / 2, v + done / 2,
                                Advance(rgb, Format::kBytes * done), width - done);
    }

    [[gnu::flatten]] static void RgbaTo420(RowPair<uint8_t> y, uint8_t* u, uint8_t* v, RowPair<uint8_t> alpha,
                                           RowPair<const uint8_t> rgba, ptrdiff_t width) {
        const ptrdiff_t done = ForBlocks(width, kPixels, [&](ptrdiff_t x) {
            RgbBlockTo420<Bgr32, FastRgbForm>(Advance(y, x), u + x / 2, v + x / 2, Advance(rgba, 4 * x));
            V::Store(alpha.first + x, Bgr32::Alpha(rgba.first + 4 * x));
            V::Store(alpha.second + x, Bgr32::Alpha(rgba.second + 4 * x));
        });
        if (done < width)
            Rest(done).bgra32To420(Advance(y, done), u + done / 2, v + done / 2, Advance(alpha, done),
                                   Advance(rgba, 4 * done), width - done);
    }

    // --- YUV to RGB
    // --------------------------------------------------------------------------------------------------

    /// The chroma terms of sixteen pixels a lane: those of the pixels 0 to 7, and of 8 to 15.
    struct ChromaTerms {
        Vec red[2];
        Vec green[2];
        Vec blue[2];
        Vec blueRest[2];
    };

    /// From words of U and V, eight a lane.
    template <class Form>
    static ChromaTerms MakeTerms(Vec u, Vec v) {
        using F = Form;
        const auto times = [](Vec words, int factor) { return V::Mul16(words, V::Set16(factor)); };
        const auto rest = [](Vec sum, int constant) {
            return V::template Sra16<F::kShift>(V::Add16(sum, V::Set16(constant)));
        };
        const Vec red = V::Add16(V::Add16(times(v, F::kRedWhole), V::Set16(F::kRedConstant)),
                                 rest(times(v, F::kRedRest), F::kRedRestConstant));
        const Vec green = V::Add16(
            V::Add16(V::Add16(times(u, F::kGreenUWhole), times(v, F::kGreenVWhole)),
                     V::Set16(F::kGreenConstant)),
            rest(V::Add16(times(u, F::kGreenURest), times(v, F::kGreenVRest)), F::kGreenRestConstant));
        const Vec blue = V::Xor(V::template Sll16<8>(u), V::Set16(-0x8000));
        const Vec blueRest = V::Add16(V::Add16(times(u, F::kBlueWhole), V::Set16(F::kBlueConstant)),
                                      rest(times(u, F::kBlueRest), F::kBlueRestConstant));
        return {{V::UnpackLo16(red, red), V::UnpackHi16(red, red)},
                {V::UnpackLo16(green, green), V::UnpackHi16(green, green)},
                {V::UnpackLo16(blue, blue), V::UnpackHi16(blue, blue)},
                {V::UnpackLo16(blueRest, blueRest), V::UnpackHi16(blueRest, blueRest)}};
    }

    /// Bytes of sixteen pixels a lane.
    struct Components {
        Vec blue, green, red;
    };

    /// `luma`: the terms of the pixels 0 to 7, and of 8 to 15.
    static Components AddTerms(const Vec (&luma)[2], const ChromaTerms& terms) {
        const auto component = [](Vec low, Vec high) {
            return V::PackUs16(V::template Sra16<7>(low), V::template Sra16<7>(high));
        };
        return {component(V::AddSat16(V::AddSat16(luma[0], terms.blue[0]), terms.blueRest[0]),
                          V::AddSat16(V::AddSat16(luma[1], terms.blue[1]), terms.blueRest[1])),
                component(V::AddSat16(luma[0], terms.green[0]), V::AddSat16(luma[1], terms.green[1])),
                component(V::AddSat16(luma[0], terms.red[0]), V::AddSat16(luma[1], terms.red[1]))};
    }

    template <class Form>
    static Components FromPlanarLuma(Vec y, const ChromaTerms& terms) {
        const Vec centred = V::Xor(y, V::Set8(-128));
        const Vec weights = V::Set16(Form::kLumaWeight | Form::kLumaConstant << 8);
        const Vec luma[2] = {V::MulAddU8S8(weights, V::UnpackLo8(centred, V::Set8(127))),
                             V::MulAddU8S8(weights, V::UnpackHi8(centred, V::Set8(127)))};
        return AddTerms(luma, terms);
    }

    struct Bgr24Target {
        static constexpr ptrdiff_t kBytes = 3;

        /// Byte i of the first, second and third 16 bytes is component (i + j) % 3 of its pixel. One shuffle
        /// of a component serves all three, because it puts each byte where none of the other two needs one.
        static constexpr LaneBytes Spread(size_t component) {
            LaneBytes indices{};
            for (size_t i = 0; i < 48; ++i)
                if (i % 3 == component)
                    indices[i % 16] = static_cast<int8_t>(i / 3);
            return indices;
        }
        static constexpr LaneBytes EveryThird(size_t first) {
            LaneBytes mask{};
            for (size_t i = first; i < 16; i += 3)
                mask[i] = -1;
            return mask;
        }

        static void Store(uint8_t* p, const Components& c) {
            const Vec blue = V::Shuffle8(c.blue, V::Lane(Spread(0)));
            const Vec green = V::Shuffle8(c.green, V::Lane(Spread(1)));
            const Vec red = V::Shuffle8(c.red, V::Lane(Spread(2)));
            const auto weave = [](Vec at0, Vec at1, Vec at2) {
                return V::Blend8(V::Blend8(at0, at1, V::Lane(EveryThird(1))), at2, V::Lane(EveryThird(2)));
            };
            const Vec parts[3] = {weave(blue, green, red), weave(green, red, blue), weave(red, blue, green)};
            V::StoreLanes(p, parts);
        }
    };

    template <bool kOpaque>
    struct Bgr32Target {
        static constexpr ptrdiff_t kBytes = 4;

        static void Store(uint8_t* p, const Components& c) {
            const Vec fourth = V::Set8(-1);
            const Vec blueGreen[2] = {V::UnpackLo8(c.blue, c.green), V::UnpackHi8(c.blue, c.green)};
            const Vec redFourth[2] = {V::UnpackLo8(c.red, fourth), V::UnpackHi8(c.red, fourth)};
            Vec quads[4] = {
                V::UnpackLo16(blueGreen[0], redFourth[0]), V::UnpackHi16(blueGreen[0], redFourth[0]),
                V::UnpackLo16(blueGreen[1], redFourth[1]), V::UnpackHi16(blueGreen[1], redFourth[1])};
            if constexpr (kOpaque) {
                V::StoreLanes(p, quads);
            } else {
                const Vec kept = V::Set32(static_cast<int32_t>(0xFF000000));
                for (int quad = 0; quad < 4; ++quad)
                    quads[quad] = V::Blend8(quads[quad], V::LoadLanes(p + 16 * quad, 64), kept);
                V::Cached::StoreLanes(p, quads); // what has been read is in the cache
            }
        }
    };

    template <class Target, class Form, From420 RowKernels::*kRest>
    [[gnu::flatten]] static void RgbFrom420(RowPair<uint8_t> rgb, RowPair<const uint8_t> y, const uint8_t* u,
                                            const uint8_t* v, ptrdiff_t width) {
        const ptrdiff_t done = ForBlocks(width, kPixels, [&](ptrdiff_t x) {
            const ChromaTerms terms = MakeTerms<Form>(V::LoadWords(u + x / 2), V::LoadWords(v + x / 2));
            Target::Store(rgb.first + Target::kBytes * x, FromPlanarLuma<Form>(V::Load(y.first + x), terms));
            Target::Store(rgb.second + Target::kBytes * x,
                          FromPlanarLuma<Form>(V::Load(y.second + x), terms));
        });
        if (done < width)
            (Rest(done).*kRest)(Advance(rgb, Target::kBytes * done), Advance(y, done), u + done / 2,
                                v + done / 2, width - done);
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

    /// Stores sixteen pixels a lane from their Y and the bytes U, V, U, V, ...
    template <PackedOrder kOrder>
    static void StorePacked(uint8_t* p, Vec y, Vec uv) {
        const Vec even = kOrder == kYuy2 ? y : uv;
        const Vec odd = kOrder == kYuy2 ? uv : y;
        const Vec halves[2] = {V::UnpackLo8(even, odd), V::UnpackHi8(even, odd)};
        V::StoreLanes(p, halves);
    }

    template <PackedOrder kOrder>
    [[gnu::flatten]] static void PackedTo420(RowPair<uint8_t> y, uint8_t* u, uint8_t* v,
                                             RowPair<const uint8_t> packed, ptrdiff_t width) {
        const ptrdiff_t done = ForBlocks(width, kPixels, [&](ptrdiff_t x) {
            Vec lumaFirst[2];
            Vec lumaSecond[2];
            Vec chroma[2];
            for (int half = 0; half < 2; ++half) {
                const Vec first = V::LoadLanes(packed.first + 2 * x + 16 * half, 32);
                const Vec second = V::LoadLanes(packed.second + 2 * x + 16 * half, 32);
                lumaFirst[half] = LumaWords<kOrder>(first);
                lumaSecond[half] = LumaWords<kOrder>(second);
                chroma[half] =
                    V::template Srl16<1>(V::Add16(ChromaWords<kOrder>(first), ChromaWords<kOrder>(second)));
            }
            V::Store(y.first + x, V::PackUs16(lumaFirst[0], lumaFirst[1]));
            V::Store(y.second + x, V::PackUs16(lumaSecond[0], lumaSecond[1]));
            const Vec uv = V::PackUs16(chroma[0], chroma[1]);
            V::StoreHalves(u + x / 2, v + x / 2, V::PackUs16(LowBytes(uv), HighBytes(uv)));
        });
        if (done < width)
            Rest(done).packedTo420[kOrder](Advance(y, done), u + done / 2, v + done / 2,
                                           Advance(packed, 2 * done), width - done);
    }

    template <PackedOrder kOrder>
    [[gnu::flatten]] static void PackedFrom420(RowPair<uint8_t> packed, RowPair<const uint8_t> y,
                                               const uint8_t* u, const uint8_t* v, ptrdiff_t width) {
        const ptrdiff_t done = ForBlocks(width, kPixels, [&](ptrdiff_t x) {
            const Vec uv = V::Or(V::LoadWords(u + x / 2), V::template Sll16<8>(V::LoadWords(v + x / 2)));
            StorePacked<kOrder>(packed.first + 2 * x, V::Load(y.first + x), uv);
            StorePacked<kOrder>(packed.second + 2 * x, V::Load(y.second + x), uv);
        });
        if (done < width)
            Rest(done).packedFrom420[kOrder](Advance(packed, 2 * done), Advance(y, done), u + done / 2,
                                             v + done / 2, width - done);
    }

    template <PackedOrder kOrder>
    [[gnu::flatten]] static void PackedFromBgr24(uint8_t* packed, const uint8_t* rgb, ptrdiff_t width) {
        constexpr LaneBytes kUvOrder{0, 8, 4, 12, 1, 9, 5, 13, 2, 10, 6, 14, 3, 11, 7, 15};
        const ptrdiff_t done = ForBlocks(width, kPixels, [&](ptrdiff_t x) {
            const Pixels pixels = Bgr24::Load(rgb + 3 * x);
            const Vec uv = V::Shuffle8(StoredChroma<1>(PixelChroma<FastRgbForm>(pixels)), V::Lane(kUvOrder));
            StorePacked<kOrder>(packed + 2 * x, Luma<FastRgbForm>(pixels), uv);
        });
        if (done < width)
            Rest(done).packedFromBgr24[kOrder](packed + 2 * done, rgb + 3 * done, width - done);
    }

    template <PackedOrder kOrder>
    [[gnu::flatten]] static void Bgr24FromPacked(uint8_t* rgb, const uint8_t* packed, ptrdiff_t width) {
        using Form = FastYuvForm;
        const ptrdiff_t done = ForBlocks(width, kPixels, [&](ptrdiff_t x) {
            const Vec halves[2] = {V::LoadLanes(packed + 2 * x, 32), V::LoadLanes(packed + 2 * x + 16, 32)};
            const Vec uv = V::PackUs16(ChromaWords<kOrder>(halves[0]), ChromaWords<kOrder>(halves[1]));
            const ChromaTerms terms = MakeTerms<Form>(LowBytes(uv), HighBytes(uv));
            Vec luma[2];
            for (int half = 0; half < 2; ++half)
                luma[half] = V::Sub16(V::Mul16(LumaWords<kOrder>(halves[half]), V::Set16(Form::kLumaWeight)),
                                      V::Set16(Form::kBias));
            Bgr24Target::Store(rgb + 3 * x, AddTerms(luma, terms));
        });
        if (done < width)
            Rest(done).bgr24FromPacked[kOrder](rgb + 3 * done, packed + 2 * done, width - done);
    }

    [[gnu::flatten]] static void SwapPacked(uint8_t* target, const uint8_t* source, ptrdiff_t width) {
        constexpr LaneBytes kSwapped{1, 0, 3, 2, 5, 4, 7, 6, 9, 8, 11, 10, 13, 12, 15, 14};
        const ptrdiff_t done = ForBlocks(width, kPixels, [&](ptrdiff_t x) {
            for (ptrdiff_t i = 2 * x; i < 2 * x + 2 * kPixels; i += kPixels)
                V::Store(target + i, V::Shuffle8(V::Load(source + i), V::Lane(kSwapped)));
        });
        if (done < width)
            Rest(done).swapPacked(target + 2 * done, source + 2 * done, width - done);
    }

    // --- Planes
    // ------------------------------------------------------------------------------------------------------

    [[gnu::flatten]] static void Halve(uint8_t* target, RowPair<const uint8_t> source, ptrdiff_t width) {
        const auto average = [](const uint8_t* first, const uint8_t* second) {
            const Vec ones = V::Set8(1);
            return V::template Srl16<2>(V::Add16(V::MulAddU8S8(V::LoadLanes(first, 32), ones),
                                                 V::MulAddU8S8(V::LoadLanes(second, 32), ones)));
        };
        const ptrdiff_t done = ForBlocks(width, 2 * kPixels, [&](ptrdiff_t x) {
            const uint8_t* const first = source.first + x;
            const uint8_t* const second = source.second + x;
            V::Store(target + x / 2, V::PackUs16(average(first, second), average(first + 16, second + 16)));
        });
        if (done < width)
            Rest(done).halve(target + done / 2, Advance(source, done), width - done);
    }

    [[gnu::flatten]] static void Doubled(RowPair<uint8_t> target, const uint8_t* source, ptrdiff_t width) {
        const ptrdiff_t done = ForBlocks(width, kPixels, [&](ptrdiff_t x) {
            const Vec samples = V::Load(source + x);
            const Vec halves[2] = {V::UnpackLo8(samples, samples), V::UnpackHi8(samples, samples)};
            V::StoreLanes(target.first + 2 * x, halves);
            V::StoreLanes(target.second + 2 * x, halves);
        });
        if (done < width)
            Rest(done).doubled(Advance(target, 2 * done), source + done, width - done);
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
            .halve = Halve,
            .doubled = Doubled,
            .large = large,
        };
    }
};

} // namespace image

#endif
