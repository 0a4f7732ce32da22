// The table of the vector kernels that are written once for every instruction set of 128-bit lanes.
#ifndef MOVIECONV_COMMON_IMAGE_KERNELS_LANEKERNELS_H
#define MOVIECONV_COMMON_IMAGE_KERNELS_LANEKERNELS_H

#include "Common/Image/kernels/LanePacked.h"
#include "Common/Image/kernels/LanePlanes.h"

namespace image {
namespace {

template <class V>
constexpr RowKernels MakeLaneKernels(const RowKernels* large = nullptr) {
    using From = LaneFromRgb<V>;
    using To = LaneToRgb<V>;
    using Packed = LanePacked<V>;
    using Planes = LanePlanes<V>;
    return {
        .bgr32To420 = From::template RgbTo420<typename From::Bgr32, FastRgbForm, &RowKernels::bgr32To420>,
        .bgr24To420 = From::template RgbTo420<typename From::Bgr24, FastRgbForm, &RowKernels::bgr24To420>,
        .bgr24To420Simple =
            From::template RgbTo420<typename From::Bgr24, SimpleRgbForm, &RowKernels::bgr24To420Simple>,
        .bgra32To420 = From::RgbaTo420,
        .bgr24From420 =
            To::template RgbFrom420<typename To::Bgr24Target, FastYuvForm, &RowKernels::bgr24From420>,
        .bgr24From420Simple =
            To::template RgbFrom420<typename To::Bgr24Target, SimpleYuvForm, &RowKernels::bgr24From420Simple>,
        .bgrxFrom420 = To::template RgbFrom420<typename To::template Bgr32Target<false>, FastYuvForm,
                                               &RowKernels::bgrxFrom420>,
        .bgraFrom420 = To::template RgbFrom420<typename To::template Bgr32Target<true>, FastYuvForm,
                                               &RowKernels::bgraFrom420>,
        .packedTo420 = {Packed::template PackedTo420<kUyvy>, Packed::template PackedTo420<kYuy2>},
        .packedFrom420 = {Packed::template PackedFrom420<kUyvy>, Packed::template PackedFrom420<kYuy2>},
        .packedFromBgr24 = {Packed::template PackedFromBgr24<kUyvy>, Packed::template PackedFromBgr24<kYuy2>},
        .bgr24FromPacked = {Packed::template Bgr24FromPacked<kUyvy>, Packed::template Bgr24FromPacked<kYuy2>},
        .swapPacked = Packed::SwapPacked,
        .copy = Planes::Copy,
        .halve = Planes::Halve,
        .doubled = Planes::Doubled,
        .large = large,
    };
}

} // namespace
} // namespace image

#endif
