// Packed 4:2:2 from and to 4:2:0 and RGB, for vectors of any number of lanes.
#ifndef MOVIECONV_COMMON_IMAGE_KERNELS_LANEPACKED_H
#define MOVIECONV_COMMON_IMAGE_KERNELS_LANEPACKED_H

#include "Common/Image/kernels/LaneFromRgb.h"
#include "Common/Image/kernels/LaneToRgb.h"

namespace image {
namespace {

template <class V>
struct LanePacked {
    using Vec = typename V::Vec;
    using From = LaneFromRgb<V>;
    using To = LaneToRgb<V>;
    static constexpr ptrdiff_t kPixels = kLanePixels<V>;

    static Vec LowBytes(Vec words) { return V::And(words, V::Set16(0xFF)); }
    static Vec HighBytes(Vec words) { return V::template Srl16<8>(words); }

    template <PackedOrder kOrder>
    static Vec LumaWords(Vec packed) {
        return kOrder == kYuy2 ? LowBytes(packed) : HighBytes(packed);
    }
    /// Indices that put the luma bytes of a lane at `lumaPlace`, 0 or 8, its chroma bytes at the other.
    template <PackedOrder kOrder>
    static constexpr LaneBytes LumaThenChroma(size_t lumaPlace) {
        LaneBytes indices{};
        for (size_t i = 0; i < 8; ++i) {
            indices[lumaPlace + i] = static_cast<int8_t>(2 * i + (kOrder == kYuy2 ? 0 : 1));
            indices[8 - lumaPlace + i] = static_cast<int8_t>(2 * i + (kOrder == kYuy2 ? 1 : 0));
        }
        return indices;
    }

    /// Words of which the upper byte is chroma, the lower one zero.
    template <PackedOrder kOrder>
    static Vec ChromaAbove(Vec packed) {
        return kOrder == kYuy2 ? V::And(packed, V::Set16(-0x100)) : V::template Sll16<8>(packed);
    }

    /// Stores sixteen pixels a lane from their Y and the bytes U, V, U, V, ...
    template <PackedOrder kOrder>
    static void StorePacked(uint8_t* p, Vec y, Vec uv) {
        StoreInterleaved<V>(p, kOrder == kYuy2 ? y : uv, kOrder == kYuy2 ? uv : y);
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
        ForRowPairs(target, packed, size.height,
                    [&](const PlanesPair& to, RowPair from, ptrdiff_t, ptrdiff_t) {
                        ForBlocks(size.width, kPixels, [&](ptrdiff_t x) {
                            PackedBlockTo420<kOrder>(Advance(to, x), Advance(from, 2 * x));
                        });
                    });
        V::FinishPicture();
    }

    template <PackedOrder kOrder>
    [[gnu::flatten]] static void PackedFrom420(Rows packed, Planes420 source, Size size) {
        if (size.width < kPixels)
            return V::Lower().packedFrom420[kOrder](packed, source, size);
        ForRowPairs(source, packed, size.height,
                    [&](const PlanesPair& from, RowPair to, ptrdiff_t, ptrdiff_t) {
                        ForBlocks(size.width, kPixels, [&](ptrdiff_t x) {
                            const PlanesPair at = Advance(from, x);
                            const RowPair groups = Advance(to, 2 * x);
                            if constexpr (kPastCaches<V>)
                                PrefetchRows(at.y, 2 * source.y.step, kPixels);
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
            [step = rgb.step](uint8_t* to, const uint8_t* from) {
                PrefetchRow(from + step, 3 * kPixels);
                const auto pixels = From::Bgr24::Pixels(From::Bgr24::Load(from));
                StorePacked<kOrder>(
                    to, From::template Luma<FastRgbForm>(pixels),
                    From::template StoredChroma<1>(From::template PixelChroma<FastRgbForm>(pixels)));
            });
    }

    template <PackedOrder kOrder>
    [[gnu::flatten]] static void Bgr24FromPacked(Rows rgb, Rows packed, Size size) {
        ForRowBlocks<3, 2>(
            rgb, packed, size, [](const RowKernels& k) { return k.bgr24FromPacked[kOrder]; },
            [](uint8_t* to, const uint8_t* from) {
                constexpr LaneBytes kLumaFirst = LumaThenChroma<kOrder>(0);
                constexpr LaneBytes kLumaLast = LumaThenChroma<kOrder>(8);
                const Vec first = V::Shuffle8(V::LoadLanes(from, 32), V::Lane(kLumaFirst));
                const Vec second = V::Shuffle8(V::LoadLanes(from + 16, 32), V::Lane(kLumaLast));
                const Vec y = V::template Blend16<0xF0>(first, second);
                const Vec uv = V::MiddleHalves(first, second);
                To::Bgr24Target::Store(
                    to, To::template MakeComponents<FastYuvForm>(y, To::template MakeTerms<FastYuvForm>(uv)));
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
};

} // namespace
} // namespace image

#endif
