// 4:2:0 to RGB, for vectors of any number of lanes.
#ifndef MOVIECONV_COMMON_IMAGE_KERNELS_LANETORGB_H
#define MOVIECONV_COMMON_IMAGE_KERNELS_LANETORGB_H

#include "Common/Image/kernels/FixedPoint.h"
#include "Common/Image/kernels/LaneBlocks.h"

namespace image {
namespace {

template <class V>
struct LaneToRgb {
    using Vec = typename V::Vec;
    static constexpr ptrdiff_t kPixels = kLanePixels<V>;

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
        const auto plus = [](int constant, Vec words) { return V::Add16(words, V::Set16(constant)); };
        const auto seeded = [=](const SeededTerm& term, int constant, Vec samples) {
            return plus(constant, V::MulRounded16(samples, V::Set16(term.weight)));
        };
        const Vec u = V::Or(V::template Sll16<8>(centred), V::Set16(F::kBlue.seed));
        const Vec v = V::Or(V::And(centred, V::Set16(-0x100)), V::Set16(F::kRed.seed));
        // The whole factors of green are negative, the weights are not.
        const Vec greenRest =
            V::template Sra16<F::kShift>(plus(F::kGreenRestConstant + 128 * (F::kGreenURest + F::kGreenVRest),
                                              weighted(F::kGreenURest, F::kGreenVRest)));
        const Vec green = plus(F::kGreenConstant + 128 * (F::kGreenUWhole + F::kGreenVWhole),
                               V::Sub16(greenRest, weighted(-F::kGreenUWhole, -F::kGreenVWhole)));
        return {seeded(F::kRed, F::kRed.constant, v), green, u, seeded(F::kBlue, F::kBlueRestConstant, u)};
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
        static constexpr bool kReads = false;
        static constexpr bool kFourPixelsALane = false;

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
        static constexpr bool kReads = !kOpaque;
        static constexpr bool kFourPixelsALane = true;

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
            for (const Vec& pixels : quads) {
                if constexpr (kOpaque) {
                    V::Store(p, pixels);
                } else {
                    const Vec kept = V::Set32(static_cast<int32_t>(0xFF000000));
                    V::Cached::Store(p, V::Blend8(pixels, V::Load(p), kept)); // in the cache, as it was read
                }
                p += sizeof(Vec);
            }
        }
    };

    // Pixels of four bytes are stored four a lane at a time, so those that a lane holds come from there.

    template <class Target>
    static Vec LoadLuma(const uint8_t* y) {
        return Target::kFourPixelsALane ? V::LoadByFours(y) : V::Load(y);
    }
    template <class Target>
    static Vec LoadChroma(const uint8_t* u, const uint8_t* v) {
        return Target::kFourPixelsALane ? V::LoadAlternatingByFours(u, v) : V::LoadAlternating(u, v);
    }

    template <class Target, class Form, From420 RowKernels::*kKernel>
    [[gnu::flatten]] static void RgbFrom420(Rows rgb, Planes420 source, Size size) {
        if (size.width < kPixels)
            return (V::Lower().*kKernel)(rgb, source, size);
        ForRowPairs(source, rgb, size.height,
                    [&](const PlanesPair& from, RowPair to, ptrdiff_t row0, ptrdiff_t row1) {
                        ForBlocks(
                            size.width, kPixels,
                            [&](ptrdiff_t x) {
                                const PlanesPair at = Advance(from, x);
                                const RowPair pixels = Advance(to, Target::kBytes * x);
                                if constexpr (Target::kReads)
                                    PrefetchRows(pixels, 2 * rgb.step, Target::kBytes * kPixels);
                                if constexpr (kPastCaches<V>)
                                    PrefetchRows(at.y, 2 * source.y.step, kPixels);
                                const ChromaTerms terms = MakeTerms<Form>(LoadChroma<Target>(at.u, at.v));
                                Target::Store(pixels.first,
                                              MakeComponents<Form>(LoadLuma<Target>(at.y.first), terms));
                                Target::Store(pixels.second,
                                              MakeComponents<Form>(LoadLuma<Target>(at.y.second), terms));
                            },
                            [&](ptrdiff_t x) {
                                (kPlainKernels.*kKernel)(rgb.At(row0, Target::kBytes * x), source.At(x, row0),
                                                         LastColumn(row0, row1));
                            });
                    });
        V::FinishPicture();
    }
};

} // namespace
} // namespace image

#endif
