// Planes: copied, halved and doubled, for vectors of any number of lanes.
#ifndef MOVIECONV_COMMON_IMAGE_KERNELS_LANEPLANES_H
#define MOVIECONV_COMMON_IMAGE_KERNELS_LANEPLANES_H

#include "Common/Image/kernels/LaneBlocks.h"

namespace image {
namespace {

template <class V>
struct LanePlanes {
    using Vec = typename V::Vec;
    static constexpr ptrdiff_t kPixels = kLanePixels<V>;

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

    // Blocks of half the size serve planes that are too narrow for a whole one.

    template <class Block>
    static void HalveBy(ptrdiff_t blockPixels, Rows target, Rows source, Size size, Block block) {
        ForRowPairs(size.height, [&](ptrdiff_t row0, ptrdiff_t row1, ptrdiff_t half) {
            const auto from = source.Pair(row0, row1);
            uint8_t* const to = target[half];
            ForBlocks(
                size.width, blockPixels, [&](ptrdiff_t x) { block(to + x / 2, Advance(from, x)); },
                [&](ptrdiff_t x) {
                    to[x / 2] = static_cast<uint8_t>((from.first[x] + from.second[x]) >> 1);
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
                    to.first[2 * x] = to.first[2 * x + 1] = from[x];
                    to.second[2 * x] = to.second[2 * x + 1] = from[x];
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
                StoreInterleaved<V>(to.first, samples, samples);
                StoreInterleaved<V>(to.second, samples, samples);
            });
    }
};

} // namespace
} // namespace image

#endif
