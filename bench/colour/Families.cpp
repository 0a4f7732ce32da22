#include "bench/colour/Families.h"

#include "bench/colour/Swscale.h"

#include <cstring>
#include <libyuv.h>

namespace bench {
namespace {

// ours
// -----------------------------------------------------------------------------------------------------------

/// Calls a routine that makes planes from a bitmap.
template <auto Routine>
void planesFrom(Pictures& p, tagBITMAPINFOHEADER& header, unsigned char* bits) {
    const Planes& t = p.target.planes;
    Routine(t.y, t.u, t.v, t.pitchY, t.pitchChroma, t.pitchChroma, &header, bits);
}

template <auto Routine>
void planesFromRgb32(Pictures& p) {
    planesFrom<Routine>(p, p.header32, p.source.rgb32);
}

template <auto Routine>
void planesFromRgb24(Pictures& p) {
    planesFrom<Routine>(p, p.header24, p.source.rgb24);
}

void planesFromPixels(Pictures& p) {
    const Planes& t = p.target.planes;
    Rgb32_2_yuv420_Ex(t.y, t.u, t.v, t.pitchY, t.pitchChroma, t.pitchChroma, p.source.rgb32, p.width,
                      p.height, p.pitch32);
}

void planesAndAlpha(Pictures& p) {
    const Planes& t = p.target.planes;
    Rgb32_2_yuv420A(t.y, t.u, t.v, p.target.alpha, t.pitchY, t.pitchChroma, t.pitchChroma, &p.header32,
                    p.source.rgb32, 0);
}

void planesAndAlphaBottomUp(Pictures& p) {
    const Planes& t = p.target.planes;
    Rgb32_2_yuv420A_R(t.y, t.u, t.v, p.target.alpha, t.pitchY, t.pitchChroma, t.pitchChroma, &p.header32,
                      p.source.rgb32);
}

/// Calls a routine that makes a bitmap from planes.
template <auto Routine>
void bitmapFrom(Pictures& p, tagBITMAPINFOHEADER& header, unsigned char* bits) {
    const Planes& s = p.source.planes;
    Routine(&header, bits, s.y, s.u, s.v, s.pitchY, s.pitchChroma, s.pitchChroma);
}

template <auto Routine>
void rgb32FromPlanes(Pictures& p) {
    bitmapFrom<Routine>(p, p.header32, p.target.rgb32);
}

template <auto Routine>
void rgb24FromPlanes(Pictures& p) {
    bitmapFrom<Routine>(p, p.header24, p.target.rgb24);
}

void rgb24FromPacked(Pictures& p) {
    YUY2_2_Rgb24(p.target.rgb24, p.height, p.pitch24, 0, 0, p.width, p.height, p.source.packed, p.pitchPacked,
                 1, 0, 0);
}

void packedFromRgb24(Pictures& p) {
    Rgb24_2_YUY2(p.target.packed, p.pitchPacked, 0, 0, p.width, p.height, 1, p.source.rgb24, p.height,
                 p.pitch24, 0, 0);
}

void planesFromPacked(Pictures& p) {
    const Planes& t = p.target.planes;
    YUY2_2_Yuv420(t.y, t.u, t.v, t.pitchY, t.pitchChroma, t.pitchChroma, 0, 0, p.width, p.height,
                  p.source.packed, p.pitchPacked, 1, 0, 0);
}

void packedFromPlanes(Pictures& p) {
    const Planes& s = p.source.planes;
    Yuv420_2_YUY2(p.target.packed, p.pitchPacked, 0, 0, p.width, p.height, 1, s.y, s.u, s.v, s.pitchY,
                  s.pitchChroma, s.pitchChroma, 0, 0);
}

void copyPlanes(Pictures& p) {
    const Planes& s = p.source.planes;
    const Planes& t = p.target.planes;
    YV12_Blt_fast(t.y, t.u, t.v, t.pitchY, t.pitchChroma, t.pitchChroma, 0, 0, p.width, p.height, s.y, s.u,
                  s.v, s.pitchY, s.pitchChroma, s.pitchChroma, 0, 0);
}

template <unsigned SourceOrder>
void copyPacked(Pictures& p) {
    YUY2_Blt_fast(p.target.packed, p.pitchPacked, 0, 0, p.width, p.height, 1, p.source.packed, p.pitchPacked,
                  SourceOrder, 0, 0);
}

void halvePlane(Pictures& p) {
    YUV444_2_420(p.target.planes.u, p.source.rgb24, p.width, p.height);
}

void doublePlane(Pictures& p) {
    YUV420_2_444(p.target.rgb24, p.source.planes.u, p.chromaWidth, p.chromaHeight);
}

void doublePlaneToPicture(Pictures& p) {
    YUV420_2_444Ex(p.target.rgb24, p.source.planes.u, p.width, p.height);
}

// libyuv
// ---------------------------------------------------------------------------------------------------------

void peerPlanesFromRgb32(Pictures& p) {
    const Planes& t = p.target.planes;
    libyuv::ARGBToI420(p.source.rgb32, p.pitch32, t.y, t.pitchY, t.u, t.pitchChroma, t.v, t.pitchChroma,
                       p.width, p.height);
}

void peerPlanesFromRgb24(Pictures& p) {
    const Planes& t = p.target.planes;
    libyuv::RGB24ToI420(p.source.rgb24, p.pitch24, t.y, t.pitchY, t.u, t.pitchChroma, t.v, t.pitchChroma,
                        p.width, p.height);
}

void peerPlanesAndAlpha(Pictures& p) {
    peerPlanesFromRgb32(p);
    libyuv::ARGBExtractAlpha(p.source.rgb32, p.pitch32, p.target.alpha, p.target.planes.pitchY, p.width,
                             p.height);
}

void peerRgb32FromPlanes(Pictures& p) {
    const Planes& s = p.source.planes;
    libyuv::I420ToARGB(s.y, s.pitchY, s.u, s.pitchChroma, s.v, s.pitchChroma, p.target.rgb32, p.pitch32,
                       p.width, p.height);
}

void peerRgb24FromPlanes(Pictures& p) {
    const Planes& s = p.source.planes;
    libyuv::I420ToRGB24(s.y, s.pitchY, s.u, s.pitchChroma, s.v, s.pitchChroma, p.target.rgb24, p.pitch24,
                        p.width, p.height);
}

void peerRgb24FromPacked(Pictures& p) {
    libyuv::YUY2ToARGB(p.source.packed, p.pitchPacked, p.between.rgb32, p.pitch32, p.width, p.height);
    libyuv::ARGBToRGB24(p.between.rgb32, p.pitch32, p.target.rgb24, p.pitch24, p.width, p.height);
}

void peerPackedFromRgb24(Pictures& p) {
    libyuv::RGB24ToARGB(p.source.rgb24, p.pitch24, p.between.rgb32, p.pitch32, p.width, p.height);
    libyuv::ARGBToYUY2(p.between.rgb32, p.pitch32, p.target.packed, p.pitchPacked, p.width, p.height);
}

void peerPlanesFromPacked(Pictures& p) {
    const Planes& t = p.target.planes;
    libyuv::YUY2ToI420(p.source.packed, p.pitchPacked, t.y, t.pitchY, t.u, t.pitchChroma, t.v, t.pitchChroma,
                       p.width, p.height);
}

void peerPackedFromPlanes(Pictures& p) {
    const Planes& s = p.source.planes;
    libyuv::I420ToYUY2(s.y, s.pitchY, s.u, s.pitchChroma, s.v, s.pitchChroma, p.target.packed, p.pitchPacked,
                       p.width, p.height);
}

void peerCopyPlanes(Pictures& p) {
    const Planes& s = p.source.planes;
    const Planes& t = p.target.planes;
    libyuv::I420Copy(s.y, s.pitchY, s.u, s.pitchChroma, s.v, s.pitchChroma, t.y, t.pitchY, t.u, t.pitchChroma,
                     t.v, t.pitchChroma, p.width, p.height);
}

void peerCopyPacked(Pictures& p) {
    std::memcpy(p.target.packed, p.source.packed, static_cast<std::size_t>(p.pitchPacked) * p.height);
}

void peerSwapPacked(Pictures& p) {
    static constexpr unsigned char kSwap[16] = {1, 0, 3, 2, 5, 4, 7, 6, 9, 8, 11, 10, 13, 12, 15, 14};
    libyuv::ARGBShuffle(p.source.packed, p.pitchPacked, p.target.packed, p.pitchPacked, kSwap, p.chromaWidth,
                        p.height);
}

void peerHalvePlane(Pictures& p) {
    libyuv::ScalePlane(p.source.rgb24, p.width, p.width, p.height, p.target.planes.u, p.chromaWidth,
                       p.chromaWidth, p.chromaHeight, libyuv::kFilterBox);
}

void peerDoublePlane(Pictures& p) {
    libyuv::ScalePlane(p.source.planes.u, p.chromaWidth, p.chromaWidth, p.chromaHeight, p.target.rgb24,
                       p.width, p.width, p.height, libyuv::kFilterNone);
}

// swscale
// -------------------------------------------------------------------------------------------------------

template <Layout From, Layout To>
void accurate(Pictures& p) {
    convertAccurately(p, From, To);
}
constexpr auto kPlanesFromRgb32 = accurate<Layout::Rgb32, Layout::Planes>;
constexpr auto kPlanesFromRgb24 = accurate<Layout::Rgb24, Layout::Planes>;
constexpr auto kRgb32FromPlanes = accurate<Layout::Planes, Layout::Rgb32>;
constexpr auto kRgb24FromPlanes = accurate<Layout::Planes, Layout::Rgb24>;
constexpr auto kRgb24FromPacked = accurate<Layout::Packed, Layout::Rgb24>;
constexpr auto kPackedFromRgb24 = accurate<Layout::Rgb24, Layout::Packed>;

// From the caches instructions decide, at the largest size memory.
constexpr Goals kAtPar{1.0, 1.0, 1.0};
constexpr Goals kFromRgb{0.9, 0.9, 1.0};
constexpr Goals kTo24{1.3, 1.3, 1.3};

constexpr Family kFamilies[] = {
    {"Rgb32_2_yuv420", Kind::RgbToYuv, planesFromRgb32<Rgb32_2_yuv420>, "ARGBToI420", peerPlanesFromRgb32,
     kFromRgb, kPlanesFromRgb32},
    {"Argb_2_yuv420", Kind::RgbToYuv, planesFromRgb32<Argb_2_yuv420>, "ARGBToI420", peerPlanesFromRgb32,
     kFromRgb, kPlanesFromRgb32},
    {"Rgb32_2_yuv420_Ex", Kind::RgbToYuv, planesFromPixels, "ARGBToI420", peerPlanesFromRgb32, kFromRgb,
     kPlanesFromRgb32},
    {"Rgb24_2_yuv420", Kind::RgbToYuv, planesFromRgb24<Rgb24_2_yuv420>, "RGB24ToI420", peerPlanesFromRgb24,
     kFromRgb, kPlanesFromRgb24},
    {"Rgb24_2_yuv420Simple", Kind::RgbToYuv, planesFromRgb24<Rgb24_2_yuv420Simple>, "RGB24ToI420",
     peerPlanesFromRgb24, kFromRgb},
    {"Rgb32_2_yuv420A", Kind::RgbToYuv, planesAndAlpha, "ARGBToI420 + ARGBExtractAlpha", peerPlanesAndAlpha,
     kFromRgb},
    {"Rgb32_2_yuv420A_R", Kind::RgbToYuv, planesAndAlphaBottomUp, "ARGBToI420 + ARGBExtractAlpha",
     peerPlanesAndAlpha, kFromRgb},
    {"Yuv420_2_Argb", Kind::YuvToRgb, rgb32FromPlanes<Yuv420_2_Argb>, "I420ToARGB", peerRgb32FromPlanes,
     kAtPar, kRgb32FromPlanes},
    {"Yuv420_2_rgb32",
     Kind::YuvToRgb,
     rgb32FromPlanes<Yuv420_2_rgb32>,
     "I420ToARGB",
     peerRgb32FromPlanes,
     {1.0, 1.0, 0.9}},
    {"Yuv420_2_rgb24", Kind::YuvToRgb, rgb24FromPlanes<Yuv420_2_rgb24>, "I420ToRGB24", peerRgb24FromPlanes,
     kTo24, kRgb24FromPlanes},
    {"Yuv420_2_rgb24Simple", Kind::YuvToRgb, rgb24FromPlanes<Yuv420_2_rgb24Simple>, "I420ToRGB24",
     peerRgb24FromPlanes, kTo24},
    {"YUY2_2_Rgb24", Kind::YuvToRgb, rgb24FromPacked, "YUY2ToARGB + ARGBToRGB24", peerRgb24FromPacked, kTo24,
     kRgb24FromPacked},
    {"Rgb24_2_YUY2", Kind::RgbToYuv, packedFromRgb24, "RGB24ToARGB + ARGBToYUY2", peerPackedFromRgb24, kAtPar,
     kPackedFromRgb24},
    {"YUY2_2_Yuv420", Kind::Average, planesFromPacked, "YUY2ToI420", peerPlanesFromPacked, kAtPar},
    {"Yuv420_2_YUY2", Kind::Move, packedFromPlanes, "I420ToYUY2", peerPackedFromPlanes, kAtPar},
    {"YV12_Blt_fast", Kind::Move, copyPlanes, "I420Copy", peerCopyPlanes, kAtPar},
    {"YUY2_Blt_fast", Kind::Move, copyPacked<1>, "memcpy", peerCopyPacked, kAtPar},
    {"YUY2_Blt_fast, swapping", Kind::Move, copyPacked<0>, "ARGBShuffle", peerSwapPacked, kAtPar},
    {"YUV444_2_420", Kind::Average, halvePlane, "ScalePlane, box", peerHalvePlane, kAtPar},
    {"YUV420_2_444", Kind::Move, doublePlane, "ScalePlane, point", peerDoublePlane, kAtPar},
    {"YUV420_2_444Ex", Kind::Move, doublePlaneToPicture, "ScalePlane, point", peerDoublePlane, kAtPar},
};

} // namespace

std::span<const Family> families() {
    return kFamilies;
}

} // namespace bench
