// The exported conversions: their checks, where their rows lie, and the kernel that does the work.
#include "Common/Image/ImageConvert.h"

#include "Common/Image/Check.h"
#include "Common/Image/PictureViews.h"
#include "Common/Image/PixelEquations.h"
#include "Common/Image/kernels/RowKernels.h"

#include <algorithm>
#include <cstring>
#include <iterator>

namespace {

using namespace image;

enum class RowOrder { kTopDown, kBottomUp };

/// A picture without rows when its size is zero or less.
Picture MakePicture(uint8_t* bits, int64_t width, int64_t height, int64_t pitch, ptrdiff_t pixelBytes,
                    RowOrder order) {
    if (width <= 0 || height <= 0)
        return {};
    const auto rows = static_cast<ptrdiff_t>(height);
    const auto step = static_cast<ptrdiff_t>(pitch);
    return {order == RowOrder::kBottomUp ? BottomUp(bits, step, rows) : Rows{bits, step},
            {static_cast<ptrdiff_t>(width), rows},
            pixelBytes};
}

Picture Bitmap32(const tagBITMAPINFOHEADER* header, uint8_t* bits, RowOrder order) {
    return MakePicture(bits, header->biWidth, header->biHeight, int64_t{4} * header->biWidth, 4, order);
}

Picture Bitmap24(const tagBITMAPINFOHEADER* header, uint8_t* bits) {
    const int64_t pitch = (int64_t{3} * header->biWidth + 3) & ~int64_t{3};
    return MakePicture(bits, header->biWidth, header->biHeight, pitch, 3, RowOrder::kBottomUp);
}

Planes420 MakePlanes(uint8_t* y, uint8_t* u, uint8_t* v, int pitchY, int pitchU, int pitchV) {
    return {{y, pitchY}, {u, pitchU}, {v, pitchV}};
}

PackedOrder OrderOf(unsigned bYUY2) {
    return bYUY2 != 0 ? kYuy2 : kUyvy;
}

ptrdiff_t EvenBelow(ptrdiff_t x) {
    return x & ~ptrdiff_t{1};
}
ptrdiff_t EvenAbove(ptrdiff_t x) {
    return EvenBelow(x + 1);
}

/// The kernels for a packed picture: those for large ones from about 8 MB on, which 1920x1080 pixels of four
/// bytes are, where writing past the caches pays.
const RowKernels& KernelsFor(const Picture& target) {
    constexpr int64_t kLargeBytes = 8'000'000;
    const RowKernels& kernels = BestRowKernels();
    const bool large = target.Bytes() >= kLargeBytes && kernels.large != nullptr && WritingPastCachesPays() &&
                       target.size.width % kLargeWidthStep == 0 && target.rows.AlignedTo(kLargeAlignment);
    return large ? *kernels.large : kernels;
}

void Convert(To420 RowKernels::*kernel, const Planes420& target, const Picture& source) {
    (BestRowKernels().*kernel)(target, source.rows, source.size);
}

void Convert(To420Alpha RowKernels::*kernel, const Planes420& target, Rows alpha, const Picture& source) {
    (BestRowKernels().*kernel)(target, alpha, source.rows, source.size);
}

void Convert(From420 RowKernels::*kernel, const Picture& target, const Planes420& source) {
    (KernelsFor(target).*kernel)(target.rows, source, target.size);
}

void Convert(From420 (RowKernels::*kernels)[kPackedOrders], PackedOrder order, const Picture& target,
             const Planes420& source) {
    (KernelsFor(target).*kernels)[order](target.rows, source, target.size);
}

void Convert(RowsToRows (RowKernels::*kernels)[kPackedOrders], PackedOrder order, const Picture& target,
             Rows source) {
    (KernelsFor(target).*kernels)[order](target.rows, source, target.size);
}

/// Rows that join up as one.
bool AreJoined(Rows target, Rows source, ptrdiff_t bytes) {
    return target.step == bytes && source.step == bytes;
}

void Copy(Rows target, Rows source, ptrdiff_t bytes, ptrdiff_t height) {
    if (AreJoined(target, source, bytes)) {
        std::memcpy(target.first, source.first, static_cast<size_t>(bytes * height));
        return;
    }
    constexpr ptrdiff_t kShortRow = 1024;
    const RowKernels& kernels = bytes < kShortRow ? BestRowKernels() : kPlainKernels;
    kernels.copy(target, source, {bytes, height});
}

} // namespace

void Rgb32_2_yuv420(unsigned char* pY, unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U, int nPt_V,
                    tagBITMAPINFOHEADER* lpSrcBmi, unsigned char* lpSrcBits) {
    CHECK_AT(652, lpSrcBmi && lpSrcBmi->biBitCount == 32);
    CHECK_AT(653, lpSrcBits && pY && pU && pV);
    Convert(&RowKernels::bgr32To420, MakePlanes(pY, pU, pV, nPt_Y, nPt_U, nPt_V),
            Bitmap32(lpSrcBmi, lpSrcBits, RowOrder::kBottomUp));
}

void Argb_2_yuv420(unsigned char* pY, unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U, int nPt_V,
                   tagBITMAPINFOHEADER* lpSrcBmi, unsigned char* lpSrcBits) {
    CHECK_AT(887, lpSrcBmi && lpSrcBmi->biBitCount == 32);
    CHECK_AT(888, lpSrcBits && pY && pU && pV);
    Convert(&RowKernels::bgr32To420, MakePlanes(pY, pU, pV, nPt_Y, nPt_U, nPt_V),
            Bitmap32(lpSrcBmi, lpSrcBits, RowOrder::kTopDown));
}

void Rgb32_2_yuv420_Ex(unsigned char* pY, unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U,
                       int nPt_V, unsigned char* lpSrcBits, int nWidthSrc, int nHeightSrc, int nPitchSrc) {
    CHECK_AT(761, lpSrcBits && pY && pU && pV);
    const int64_t height = nHeightSrc;
    const Picture source = height < 0
                               ? MakePicture(lpSrcBits, nWidthSrc, -height, nPitchSrc, 4, RowOrder::kBottomUp)
                               : MakePicture(lpSrcBits, nWidthSrc, height, nPitchSrc, 4, RowOrder::kTopDown);
    Convert(&RowKernels::bgr32To420, MakePlanes(pY, pU, pV, nPt_Y, nPt_U, nPt_V), source);
}

void Rgb24_2_yuv420(unsigned char* pY, unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U, int nPt_V,
                    tagBITMAPINFOHEADER* lpSrcBmi, unsigned char* lpSrcBits) {
    CHECK_AT(996, lpSrcBmi && lpSrcBmi->biBitCount == 24);
    CHECK_AT(997, lpSrcBits && pY && pU && pV);
    Convert(&RowKernels::bgr24To420, MakePlanes(pY, pU, pV, nPt_Y, nPt_U, nPt_V),
            Bitmap24(lpSrcBmi, lpSrcBits));
}

void Rgb24_2_yuv420Simple(unsigned char* pY, unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U,
                          int nPt_V, tagBITMAPINFOHEADER* lpSrcBmi, unsigned char* lpSrcBits) {
    Convert(&RowKernels::bgr24To420Simple, MakePlanes(pY, pU, pV, nPt_Y, nPt_U, nPt_V),
            Bitmap24(lpSrcBmi, lpSrcBits).WholeBlocks());
}

void PixelRGB_2_YUV(int R, int G, int B, int& Y, int& U, int& V) {
    Y = SimpleRgbToYuv::Y(R, G, B);
    U = SimpleRgbToYuv::U(R, G, B);
    V = SimpleRgbToYuv::V(R, G, B);
    Y = std::clamp(Y, 16, 235);
    U = std::clamp(U, 16, 240);
    V = std::clamp(V, 16, 240);
}

void Rgb32_2_yuv420A(unsigned char* pY, unsigned char* pU, unsigned char* pV, unsigned char* pA, int nPt_Y,
                     int nPt_U, int nPt_V, tagBITMAPINFOHEADER* lpSrcBmi, unsigned char* lpSrcBits,
                     int bBottomUp) {
    if (bBottomUp != 0) {
        Rgb32_2_yuv420A_R(pY, pU, pV, pA, nPt_Y, nPt_U, nPt_V, lpSrcBmi, lpSrcBits);
        return;
    }
    Convert(&RowKernels::bgra32To420, MakePlanes(pY, pU, pV, nPt_Y, nPt_U, nPt_V), Rows{pA, nPt_Y},
            Bitmap32(lpSrcBmi, lpSrcBits, RowOrder::kTopDown));
}

void Rgb32_2_yuv420A_R(unsigned char* pY, unsigned char* pU, unsigned char* pV, unsigned char* pA, int nPt_Y,
                       int nPt_U, int nPt_V, tagBITMAPINFOHEADER* lpSrcBmi, unsigned char* lpSrcBits) {
    CHECK_AT(1683, lpSrcBmi && lpSrcBmi->biBitCount == 32);
    CHECK_AT(1684, lpSrcBits && pY && pU && pV);
    Convert(&RowKernels::bgra32To420, MakePlanes(pY, pU, pV, nPt_Y, nPt_U, nPt_V), Rows{pA, nPt_Y},
            Bitmap32(lpSrcBmi, lpSrcBits, RowOrder::kBottomUp));
}

void Yuv420_2_rgb24(tagBITMAPINFOHEADER* lpDstBmi, unsigned char* lpDstBits, unsigned char* pY,
                    unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U, int nPt_V) {
    CHECK_AT(283, lpDstBmi && lpDstBmi->biBitCount == 24);
    CHECK_AT(284, lpDstBits && pY && pU && pV);
    Convert(&RowKernels::bgr24From420, Bitmap24(lpDstBmi, lpDstBits),
            MakePlanes(pY, pU, pV, nPt_Y, nPt_U, nPt_V));
}

void Yuv420_2_rgb32(tagBITMAPINFOHEADER* lpDstBmi, unsigned char* lpDstBits, unsigned char* pY,
                    unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U, int nPt_V) {
    CHECK_AT(414, lpDstBmi && lpDstBmi->biBitCount == 32);
    CHECK_AT(415, lpDstBits && pY && pU && pV);
    Convert(&RowKernels::bgrxFrom420, Bitmap32(lpDstBmi, lpDstBits, RowOrder::kBottomUp),
            MakePlanes(pY, pU, pV, nPt_Y, nPt_U, nPt_V));
}

void Yuv420_2_Argb(tagBITMAPINFOHEADER* lpDstBmi, unsigned char* lpDstBits, unsigned char* pY,
                   unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U, int nPt_V) {
    CHECK_AT(529, lpDstBmi && lpDstBmi->biBitCount == 32);
    CHECK_AT(530, lpDstBits && pY && pU && pV);
    Convert(&RowKernels::bgraFrom420, Bitmap32(lpDstBmi, lpDstBits, RowOrder::kTopDown),
            MakePlanes(pY, pU, pV, nPt_Y, nPt_U, nPt_V));
}

void Yuv420_2_rgb24Simple(tagBITMAPINFOHEADER* lpDstBmi, unsigned char* lpDstBits, unsigned char* pY,
                          unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U, int nPt_V) {
    Convert(&RowKernels::bgr24From420Simple, Bitmap24(lpDstBmi, lpDstBits).WholeBlocks(),
            MakePlanes(pY, pU, pV, nPt_Y, nPt_U, nPt_V));
}

void PixelYUV_2_RGB(int Y, int U, int V, int& R, int& G, int& B) {
    using E = SimpleYuvToRgb;
    const int64_t luma = E::Luma(Y);
    R = Component<E>(luma, E::Red(V));
    G = Component<E>(luma, E::Green(U, V));
    B = Component<E>(luma, E::Blue(U));
    R = std::clamp(R, 0, 255);
    G = std::clamp(G, 0, 255);
    B = std::clamp(B, 0, 255);
}

namespace {

/// The checks of Rgb24_2_YUY2 in arithmetic that no argument can overflow.
void CheckRgb24_2_YUY2(const uint8_t* lpBitsDst, int64_t nPitchDst, int64_t xDst, int64_t cxDst,
                       const uint8_t* lpBitsSrc, int64_t nPitchSrc, int64_t xSrc) {
    CHECK_AT(1110, lpBitsDst && lpBitsSrc);
    CHECK_AT(1111, (xDst + cxDst) * 2 <= nPitchDst);
    CHECK_AT(1112, nPitchSrc / 3 - xSrc >= cxDst);
}

} // namespace

void Rgb24_2_YUY2(unsigned char* lpBitsDst, int nPitchDst, int xDst, int yDst, int cxDst, int cyDst,
                  unsigned int bYUY2, unsigned char* lpBitsSrc, int nHeightSrc, int nPitchSrc, int xSrc,
                  int ySrc) {
    CheckRgb24_2_YUY2(lpBitsDst, nPitchDst, xDst, cxDst, lpBitsSrc, nPitchSrc, xSrc);
    if (cxDst <= 0 || cyDst <= 0)
        return;
    const ptrdiff_t start = EvenBelow(xDst);
    const Picture target{Rows{lpBitsDst, nPitchDst}.At(yDst, 2 * start), {cxDst + (xDst - start), cyDst}, 2};
    Convert(&RowKernels::packedFromBgr24, OrderOf(bYUY2), target,
            BottomUp(lpBitsSrc, nPitchSrc, nHeightSrc).At(ySrc, ptrdiff_t{3} * xSrc));
}

void YUY2_2_Rgb24(unsigned char* lpBitsDst, int nHeightDst, int nPitchDst, int xDst, int yDst, int cx, int cy,
                  unsigned char* lpBitsSrc, int nPitchSrc, unsigned int bYUY2, int xSrc, int ySrc) {
    CHECK_AT(1232, lpBitsDst && lpBitsSrc);
    if (cx <= 0 || cy <= 0)
        return;
    const Picture target{
        BottomUp(lpBitsDst, nPitchDst, nHeightDst).At(yDst, ptrdiff_t{3} * xDst), {cx, cy}, 3};
    Convert(&RowKernels::bgr24FromPacked, OrderOf(bYUY2), target,
            Rows{lpBitsSrc, nPitchSrc}.At(ySrc, 2 * EvenBelow(xSrc)));
}

void YUY2_2_Yuv420(unsigned char* pY, unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U, int nPt_V,
                   int xDst, int yDst, int cx, int cy, unsigned char* lpBitsSrc, int nPitchSrc,
                   unsigned int bYUY2, int xSrc, int ySrc) {
    if (cx <= 0 || cy <= 0)
        return;
    const Planes420 target = MakePlanes(pY, pU, pV, nPt_Y, nPt_U, nPt_V).At(xDst, yDst);
    const Rows source = Rows{lpBitsSrc, nPitchSrc}.At(ySrc, 2 * EvenBelow(xSrc));
    const To420 kernel = BestRowKernels().packedTo420[OrderOf(bYUY2)];
    const Size size{EvenAbove(cx), EvenAbove(cy)};
    // Each group is checked before it is written: its V sample must not lie behind the last one allowed.
    const auto groupsAllowed = [&](ptrdiff_t chromaRow) {
        const int64_t lastSample = (int64_t{ySrc} + cy) * nPt_V;
        const int64_t firstSample = (int64_t{yDst / 2} + chromaRow) * nPt_V + xDst / 2;
        return std::clamp<int64_t>(lastSample - firstSample + 1, 0, size.width / 2);
    };
    ptrdiff_t chromaRow = 0;
    while (chromaRow < size.height / 2 && groupsAllowed(chromaRow) == size.width / 2)
        ++chromaRow;
    kernel(target, source, {size.width, 2 * chromaRow});
    if (chromaRow < size.height / 2) {
        kernel(target.At(0, 2 * chromaRow), source.At(2 * chromaRow, 0),
               {static_cast<ptrdiff_t>(2 * groupsAllowed(chromaRow)), 2});
        CheckFailed(1452, "(char*)V <= ((char*)pV + (ySrc + cy) * nPt_V)");
    }
}

void Yuv420_2_YUY2(unsigned char* lpBitsDst, int nPitchDst, int xDst, int yDst, int cx, int cy,
                   unsigned int bYUY2, unsigned char* pY, unsigned char* pU, unsigned char* pV, int nPt_Y,
                   int nPt_U, int nPt_V, int xSrc, int ySrc) {
    if (cx <= 0 || cy <= 0)
        return;
    const Picture target{
        Rows{lpBitsDst, nPitchDst}.At(yDst, 2 * EvenBelow(xDst)), {EvenAbove(cx), EvenAbove(cy)}, 2};
    Convert(&RowKernels::packedFrom420, OrderOf(bYUY2), target,
            MakePlanes(pY, pU, pV, nPt_Y, nPt_U, nPt_V).At(xSrc, ySrc));
}

void YV12_Blt_fast(unsigned char* pYDst, unsigned char* pUDst, unsigned char* pVDst, int nPt_YDst,
                   int nPt_UDst, int nPt_VDst, int xDst, int yDst, int cx, int cy, unsigned char* pYSrc,
                   unsigned char* pUSrc, unsigned char* pVSrc, int nPt_YSrc, int nPt_USrc, int nPt_VSrc,
                   int xSrc, int ySrc) {
    if (cx <= 0 || cy <= 0)
        return;
    const ptrdiff_t rows = EvenAbove(cy);
    const ptrdiff_t chromaWidth = EvenAbove(cx) / 2;
    const ptrdiff_t chromaDst = (ptrdiff_t{xDst} + 1) / 2;
    const ptrdiff_t chromaSrc = (ptrdiff_t{xSrc} + 1) / 2;
    Copy(Rows{pYDst, nPt_YDst}.At(yDst, xDst), Rows{pYSrc, nPt_YSrc}.At(ySrc, xSrc), cx, rows);
    Copy(Rows{pUDst, nPt_UDst}.At(yDst / 2, chromaDst), Rows{pUSrc, nPt_USrc}.At(ySrc / 2, chromaSrc),
         chromaWidth, rows / 2);
    Copy(Rows{pVDst, nPt_VDst}.At(yDst / 2, chromaDst), Rows{pVSrc, nPt_VSrc}.At(ySrc / 2, chromaSrc),
         chromaWidth, rows / 2);
}

void YUY2_Blt_fast(unsigned char* lpBitsDst, int nPitchDst, int xDst, int yDst, int cx, int cy,
                   unsigned int bYUY2Dst, unsigned char* lpBitsSrc, int nPitchSrc, unsigned int bYUY2Src,
                   int xSrc, int ySrc) {
    if (cx <= 0 || cy <= 0)
        return;
    const Rows target = Rows{lpBitsDst, nPitchDst}.At(yDst, ptrdiff_t{2} * xDst);
    const Rows source = Rows{lpBitsSrc, nPitchSrc}.At(ySrc, ptrdiff_t{2} * xSrc);
    if (bYUY2Dst == bYUY2Src) {
        Copy(target, source, ptrdiff_t{2} * cx, cy);
        return;
    }
    const ptrdiff_t width = EvenAbove(cx);
    const bool joined = AreJoined(target, source, 2 * width);
    const Size size = joined ? Size{width * cy, 1} : Size{width, cy};
    KernelsFor({target, size, 2}).swapPacked(target, source, size);
}

void YUV444_2_420(unsigned char* pDst, unsigned char* pSrc, int cx, int cy) {
    if (cx <= 0 || cy <= 0)
        return;
    BestRowKernels().halve({pDst, EvenAbove(cx) / 2}, {pSrc, cx}, {cx, cy});
}

void YUV420_2_444(unsigned char* pDst, unsigned char* pSrc, int w, int h) {
    if (w <= 0 || h <= 0)
        return;
    BestRowKernels().doubled({pDst, ptrdiff_t{2} * w}, {pSrc, w}, {w, h});
}

void YUV420_2_444Ex(unsigned char* pDst, unsigned char* pSrc, int W, int H) {
    if (W <= 1 || H <= 1)
        return;
    BestRowKernels().doubled({pDst, W}, {pSrc, EvenAbove(W) / 2}, {W / 2, H / 2});
}

const char* ImageConvertLevel() {
    const RowKernels* const used = &BestRowKernels();
    return std::find_if(std::begin(kKernelLevels), std::end(kKernelLevels),
                        [=](const NamedLevel& each) { return RowKernelsFor(each.level) == used; })
        ->name;
}
