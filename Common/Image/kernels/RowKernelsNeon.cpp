// NEON, which every 64-bit ARM processor has. Loads and stores take the components of pixels apart and put
// them together, so that a register holds 16 bytes of one component. Widths and flattening as in
// LaneBlocks.h.
#include "Common/Image/kernels/LaneBlocks.h"
#include "Common/Image/kernels/NeonColours.h"

#include <type_traits>

namespace image {
namespace {

/// Stores the bytes of some registers in turns. (In some compilers the operations themselves are macros,
/// which take no braces.)
template <class... Bytes>
void StoreInTurns(uint8_t* p, Bytes... bytes) {
    constexpr bool kWhole = (std::is_same_v<Bytes, uint8x16_t> && ...);
    if constexpr (kWhole && sizeof...(bytes) == 2) {
        const uint8x16x2_t parts{{bytes...}};
        vst2q_u8(p, parts);
    } else if constexpr (kWhole && sizeof...(bytes) == 3) {
        const uint8x16x3_t parts{{bytes...}};
        vst3q_u8(p, parts);
    } else if constexpr (kWhole) {
        const uint8x16x4_t parts{{bytes...}};
        vst4q_u8(p, parts);
    } else {
        const uint8x8x4_t parts{{bytes...}};
        vst4_u8(p, parts);
    }
}

/// Pixels of most blocks: one register of bytes.
constexpr ptrdiff_t kBlock = 16;

// RGB to 4:2:0 ----------------------------------------------------------------------------------------------

struct Bgr24 {
    static constexpr ptrdiff_t kBytes = 3;
    static Pixels Load(const uint8_t* p) {
        const uint8x16x3_t bgr = vld3q_u8(p);
        return {bgr.val[0], bgr.val[1], bgr.val[2]};
    }
};

struct Bgr32 {
    static constexpr ptrdiff_t kBytes = 4;
    static Pixels Load(const uint8_t* p) {
        const uint8x16x4_t bgra = vld4q_u8(p);
        return {bgra.val[0], bgra.val[1], bgra.val[2]};
    }
};

template <class Form>
void PixelsTo420(const ChromaWeights<Form>& weights, const PlanesPair& to, const Pixels& first,
                 const Pixels& second) {
    vst1q_u8(to.y.first, Luma<Form>(first));
    vst1q_u8(to.y.second, Luma<Form>(second));
    const PixelChroma upper = Chroma(weights, first);
    const PixelChroma lower = Chroma(weights, second);
    vst1_u8(to.u, StoredSamples<2>(vpadalq_s8(vpaddlq_s8(upper.cb), lower.cb)));
    vst1_u8(to.v, StoredSamples<2>(vpadalq_s8(vpaddlq_s8(upper.cr), lower.cr)));
}

template <class Format, class Form, To420 RowKernels::*kKernel>
[[gnu::flatten]] void RgbTo420(Planes420 target, Rows rgb, Size size) {
    if (size.width < kBlock)
        return (kPlainKernels.*kKernel)(target, rgb, size);
    const ChromaWeights<Form> weights;
    ForRowPairs(target, rgb, size.height,
                [&](const PlanesPair& to, RowPair from, ptrdiff_t r0, ptrdiff_t r1) {
                    ForBlocks(
                        size.width, kBlock,
                        [&](ptrdiff_t x) {
                            const RowPair pixels = Advance(from, Format::kBytes * x);
                            PixelsTo420(weights, Advance(to, x), Format::Load(pixels.first),
                                        Format::Load(pixels.second));
                        },
                        [&](ptrdiff_t x) {
                            (kPlainKernels.*kKernel)(target.At(x, r0), rgb.At(r0, Format::kBytes * x),
                                                     LastColumn(r0, r1));
                        });
                });
}

[[gnu::flatten]] void Bgra32To420(Planes420 target, Rows alpha, Rows bgra, Size size) {
    if (size.width < kBlock)
        return kPlainKernels.bgra32To420(target, alpha, bgra, size);
    const ChromaWeights<FastSplitForm> weights;
    const auto load = [](const uint8_t* pixels, uint8_t* alphaRow) {
        const uint8x16x4_t parts = vld4q_u8(pixels);
        vst1q_u8(alphaRow, parts.val[3]);
        return Pixels{parts.val[0], parts.val[1], parts.val[2]};
    };
    ForRowPairs(target, bgra, size.height,
                [&](const PlanesPair& to, RowPair from, ptrdiff_t r0, ptrdiff_t r1) {
                    ForBlocks(
                        size.width, kBlock,
                        [&](ptrdiff_t x) {
                            const Pixels first = load(from.first + 4 * x, alpha[r0] + x);
                            const Pixels second = load(from.second + 4 * x, alpha[r1] + x);
                            PixelsTo420(weights, Advance(to, x), first, second);
                        },
                        [&](ptrdiff_t x) {
                            kPlainKernels.bgra32To420(target.At(x, r0), alpha.At(r0, x), bgra.At(r0, 4 * x),
                                                      LastColumn(r0, r1));
                        });
                });
}

// 4:2:0 to RGB ----------------------------------------------------------------------------------------------

struct Bgr24Target {
    static constexpr ptrdiff_t kBytes = 3;
    static void Store(uint8_t* p, const Pixels& pixels) {
        StoreInTurns(p, pixels.blue, pixels.green, pixels.red);
    }
};

struct BgraTarget {
    static constexpr ptrdiff_t kBytes = 4;
    static void Store(uint8_t* p, const Pixels& pixels) {
        StoreInTurns(p, pixels.blue, pixels.green, pixels.red, vdupq_n_u8(255));
    }
};

/// Keeps the fourth bytes.
struct BgrxTarget {
    static constexpr ptrdiff_t kBytes = 4;
    static void Store(uint8_t* p, const Pixels& pixels) {
        StoreInTurns(p, pixels.blue, pixels.green, pixels.red, vld4q_u8(p).val[3]);
    }
};

template <class Target, class Form, From420 RowKernels::*kKernel>
[[gnu::flatten]] void RgbFrom420(Rows rgb, Planes420 source, Size size) {
    if (size.width < kBlock)
        return (kPlainKernels.*kKernel)(rgb, source, size);
    ForRowPairs(source, rgb, size.height,
                [&](const PlanesPair& from, RowPair to, ptrdiff_t r0, ptrdiff_t r1) {
                    ForBlocks(
                        size.width, kBlock,
                        [&](ptrdiff_t x) {
                            const PlanesPair at = Advance(from, x);
                            const RowPair pixels = Advance(to, Target::kBytes * x);
                            const ChromaTerms terms = MakeTerms<Form>(vld1_u8(at.u), vld1_u8(at.v));
                            const uint8x8x2_t first = vld2_u8(at.y.first);
                            Target::Store(pixels.first, ToRgb<Form>(first.val[0], first.val[1], terms));
                            const uint8x8x2_t second = vld2_u8(at.y.second);
                            Target::Store(pixels.second, ToRgb<Form>(second.val[0], second.val[1], terms));
                        },
                        [&](ptrdiff_t x) {
                            (kPlainKernels.*kKernel)(rgb.At(r0, Target::kBytes * x), source.At(x, r0),
                                                     LastColumn(r0, r1));
                        });
                });
}

// Packed 4:2:2 ----------------------------------------------------------------------------------------------

/// Where the samples of a group stand.
template <PackedOrder kOrder>
struct Group {
    static constexpr int kY0 = kOrder == kYuy2 ? 0 : 1;
    static constexpr int kU = 1 - kY0;
    static constexpr int kY1 = kY0 + 2;
    static constexpr int kV = kU + 2;
};

/// Of whole registers of each sample of a group.
constexpr ptrdiff_t kGroupBlock = 32;

template <PackedOrder kOrder>
[[gnu::flatten]] void PackedTo420(Planes420 target, Rows packed, Size size) {
    using G = Group<kOrder>;
    if (size.width < kGroupBlock)
        return kPlainKernels.packedTo420[kOrder](target, packed, size);
    ForRowPairs(target, packed, size.height, [&](const PlanesPair& to, RowPair from, ptrdiff_t, ptrdiff_t) {
        ForBlocks(size.width, kGroupBlock, [&](ptrdiff_t x) {
            const PlanesPair at = Advance(to, x);
            const uint8x16x4_t first = vld4q_u8(from.first + 2 * x);
            const uint8x16x4_t second = vld4q_u8(from.second + 2 * x);
            StoreInTurns(at.y.first, first.val[G::kY0], first.val[G::kY1]);
            StoreInTurns(at.y.second, second.val[G::kY0], second.val[G::kY1]);
            vst1q_u8(at.u, vhaddq_u8(first.val[G::kU], second.val[G::kU]));
            vst1q_u8(at.v, vhaddq_u8(first.val[G::kV], second.val[G::kV]));
        });
    });
}

template <PackedOrder kOrder, class Bytes>
void StoreGroups(uint8_t* p, Bytes y0, Bytes y1, Bytes u, Bytes v) {
    if constexpr (kOrder == kYuy2)
        StoreInTurns(p, y0, u, y1, v);
    else
        StoreInTurns(p, u, y0, v, y1);
}

template <PackedOrder kOrder>
[[gnu::flatten]] void PackedFrom420(Rows packed, Planes420 source, Size size) {
    if (size.width < kGroupBlock)
        return kPlainKernels.packedFrom420[kOrder](packed, source, size);
    ForRowPairs(source, packed, size.height, [&](const PlanesPair& from, RowPair to, ptrdiff_t, ptrdiff_t) {
        ForBlocks(size.width, kGroupBlock, [&](ptrdiff_t x) {
            const PlanesPair at = Advance(from, x);
            const uint8x16_t u = vld1q_u8(at.u);
            const uint8x16_t v = vld1q_u8(at.v);
            const auto store = [&](uint8_t* groups, const uint8_t* luma) {
                const uint8x16x2_t y = vld2q_u8(luma);
                StoreGroups<kOrder>(groups, y.val[0], y.val[1], u, v);
            };
            store(to.first + 2 * x, at.y.first);
            store(to.second + 2 * x, at.y.second);
        });
    });
}

/// Walks single rows of pictures with the given bytes a pixel. `kernel` is this one's in a table.
template <ptrdiff_t kTargetBytes, ptrdiff_t kSourceBytes, class Kernel, class Block>
void ForRowBlocks(Rows target, Rows source, Size size, Kernel kernel, Block block) {
    if (size.width < kBlock)
        return kernel(kPlainKernels)(target, source, size);
    for (ptrdiff_t row = 0; row < size.height; ++row) {
        uint8_t* const to = target[row];
        const uint8_t* const from = source[row];
        ForBlocks(
            size.width, kBlock, [&](ptrdiff_t x) { block(to + kTargetBytes * x, from + kSourceBytes * x); },
            [&](ptrdiff_t x) {
                kernel(kPlainKernels)(target.At(row, kTargetBytes * x), source.At(row, kSourceBytes * x),
                                      LastColumn(row, row));
            });
    }
}

template <PackedOrder kOrder>
[[gnu::flatten]] void PackedFromBgr24(Rows packed, Rows rgb, Size size) {
    const ChromaWeights<FastSplitForm> weights;
    ForRowBlocks<2, 3>(
        packed, rgb, size, [](const RowKernels& k) { return k.packedFromBgr24[kOrder]; },
        [&](uint8_t* to, const uint8_t* from) {
            const Pixels pixels = Bgr24::Load(from);
            const uint8x16_t y = Luma<FastSplitForm>(pixels);
            const PixelChroma chroma = Chroma(weights, pixels);
            StoreGroups<kOrder>(to, vget_low_u8(vuzp1q_u8(y, y)), vget_low_u8(vuzp2q_u8(y, y)),
                                StoredSamples<1>(vpaddlq_s8(chroma.cb)),
                                StoredSamples<1>(vpaddlq_s8(chroma.cr)));
        });
}

template <PackedOrder kOrder>
[[gnu::flatten]] void Bgr24FromPacked(Rows rgb, Rows packed, Size size) {
    using G = Group<kOrder>;
    ForRowBlocks<3, 2>(
        rgb, packed, size, [](const RowKernels& k) { return k.bgr24FromPacked[kOrder]; },
        [](uint8_t* to, const uint8_t* from) {
            const uint8x8x4_t groups = vld4_u8(from);
            const ChromaTerms terms = MakeTerms<FastYuvForm>(groups.val[G::kU], groups.val[G::kV]);
            Bgr24Target::Store(to, ToRgb<FastYuvForm>(groups.val[G::kY0], groups.val[G::kY1], terms));
        });
}

[[gnu::flatten]] void SwapPacked(Rows target, Rows source, Size size) {
    ForRowBlocks<2, 2>(
        target, source, size, [](const RowKernels& k) { return k.swapPacked; },
        [](uint8_t* to, const uint8_t* from) {
            vst1q_u8(to, vrev16q_u8(vld1q_u8(from)));
            vst1q_u8(to + kBlock, vrev16q_u8(vld1q_u8(from + kBlock)));
        });
}

// Planes ----------------------------------------------------------------------------------------------------

void Copy(Rows target, Rows source, Size size) {
    const ptrdiff_t last = size.width - kBlock;
    if (last < 0)
        return kPlainKernels.copy(target, source, size);
    for (ptrdiff_t row = 0; row < size.height; ++row) {
        uint8_t* const to = target[row];
        const uint8_t* const from = source[row];
        for (ptrdiff_t x = 0; x < last; x += kBlock)
            vst1q_u8(to + x, vld1q_u8(from + x));
        vst1q_u8(to + last, vld1q_u8(from + last));
    }
}

[[gnu::flatten]] void Halve(Rows target, Rows source, Size size) {
    if (size.width < kGroupBlock)
        return kPlainKernels.halve(target, source, size);
    ForRowPairs(size.height, [&](ptrdiff_t row0, ptrdiff_t row1, ptrdiff_t half) {
        const RowPair from = source.Pair(row0, row1);
        uint8_t* const to = target[half];
        ForBlocks(
            size.width, kGroupBlock,
            [&](ptrdiff_t x) {
                const auto sums = [&](ptrdiff_t skipped) {
                    return vpadalq_u8(vpaddlq_u8(vld1q_u8(from.first + x + skipped)),
                                      vld1q_u8(from.second + x + skipped));
                };
                const uint16x8_t low = sums(0);
                vst1q_u8(to + x / 2, vshrn_high_n_u16(vshrn_n_u16(low, 2), sums(kBlock), 2));
            },
            [&](ptrdiff_t x) {
                kPlainKernels.halve(target.At(half, x / 2), source.At(row0, x), LastColumn(row0, row1));
            });
    });
}

[[gnu::flatten]] void Doubled(Rows target, Rows source, Size size) {
    if (size.width < kBlock)
        return kPlainKernels.doubled(target, source, size);
    for (ptrdiff_t row = 0; row < size.height; ++row) {
        const RowPair to = target.Pair(2 * row, 2 * row + 1);
        const uint8_t* const from = source[row];
        ForBlocks(
            size.width, kBlock,
            [&](ptrdiff_t x) {
                const uint8x16_t samples = vld1q_u8(from + x);
                StoreInTurns(to.first + 2 * x, samples, samples);
                StoreInTurns(to.second + 2 * x, samples, samples);
            },
            [&](ptrdiff_t x) {
                kPlainKernels.doubled(target.At(2 * row, 2 * x), source.At(row, x), LastColumn(row, row));
            });
    }
}

} // namespace

constinit const RowKernels kNeonKernels = {
    .bgr32To420 = RgbTo420<Bgr32, FastSplitForm, &RowKernels::bgr32To420>,
    .bgr24To420 = RgbTo420<Bgr24, FastSplitForm, &RowKernels::bgr24To420>,
    .bgr24To420Simple = RgbTo420<Bgr24, SimpleSplitForm, &RowKernels::bgr24To420Simple>,
    .bgra32To420 = Bgra32To420,
    .bgr24From420 = RgbFrom420<Bgr24Target, FastYuvForm, &RowKernels::bgr24From420>,
    .bgr24From420Simple = RgbFrom420<Bgr24Target, SimpleYuvForm, &RowKernels::bgr24From420Simple>,
    .bgrxFrom420 = RgbFrom420<BgrxTarget, FastYuvForm, &RowKernels::bgrxFrom420>,
    .bgraFrom420 = RgbFrom420<BgraTarget, FastYuvForm, &RowKernels::bgraFrom420>,
    .packedTo420 = {PackedTo420<kUyvy>, PackedTo420<kYuy2>},
    .packedFrom420 = {PackedFrom420<kUyvy>, PackedFrom420<kYuy2>},
    .packedFromBgr24 = {PackedFromBgr24<kUyvy>, PackedFromBgr24<kYuy2>},
    .bgr24FromPacked = {Bgr24FromPacked<kUyvy>, Bgr24FromPacked<kYuy2>},
    .swapPacked = SwapPacked,
    .copy = Copy,
    .halve = Halve,
    .doubled = Doubled,
};

} // namespace image
