/// \file
/// Colour conversion between packed RGB, packed YUV 4:2:2 and planar YUV 4:2:0, in integer arithmetic with
/// results that are the same in every bit on every processor.
///
/// Layouts:
/// - RGB: 3 or 4 bytes a pixel in memory order blue, green, red (, fourth byte). A bitmap that a header
///   describes has rows of 3 * width bytes rounded up to a multiple of 4 (24 bits), or of 4 * width bytes (32
///   bits). "Bottom-up": the first row in memory is the bottom row of the picture; "top-down": it is the top
///   row.
/// - 4:2:0: three planes of bytes, Y at full size, U (Cb) and V (Cr) at half width and half height, rounded
///   up; row 0 is the top. Every plane has its own pitch: the bytes from one row to the next.
/// - 4:2:2: 2 bytes a pixel; the pixels 2k and 2k + 1 share a group of four bytes. bYUY2 nonzero: Y0 U Y1 V,
///   zero: U Y0 V Y1. Pixel x of a row starts at byte 2 * x, rows count from the top.
///
/// Colours are ITU-R BT.601 studio range: Y 16 to 235, U and V 16 to 240 around 128.
///
/// Rules that hold for all of them:
/// - Sources are only read, destinations only written, and they must not overlap. No byte outside the pixels
///   concerned is read or written: neither row padding nor what lies behind a row or a plane.
/// - Any size works, odd ones too, with any pitch and alignment. Where a block of 2 x 2 pixels is cut by an
///   odd last column or row, its chroma is the average of the pixels that exist. A width or height (for the
///   rectangle routines: a size) of zero or less converts nothing.
/// - No state, no allocation (but xTraceImage), no errors returned: they may run on any number of threads at
///   once. A broken precondition that a routine checks writes "file:line: failed assertion" with the
///   condition to standard error and aborts, before anything is written unless noted. Only the checks that a
///   routine names are made.
#ifndef MOVIECONV_COMMON_IMAGE_IMAGECONVERT_H
#define MOVIECONV_COMMON_IMAGE_IMAGECONVERT_H

#include <cstddef>
#include <cstdint>

#pragma pack(push, 2) // in a bitmap file the header follows 14 other bytes

/// The bitmap information header of the GDI. The conversions read biWidth and biHeight, the size in pixels,
/// and, where they check it, biBitCount.
struct tagBITMAPINFOHEADER {
    uint32_t biSize;         ///< Bytes of the header; not read.
    int32_t biWidth;         ///< Width in pixels.
    int32_t biHeight;        ///< Rows; with zero or less nothing is converted.
    uint16_t biPlanes;       ///< Not read.
    uint16_t biBitCount;     ///< Bits of a pixel.
    uint32_t biCompression;  ///< Not read.
    uint32_t biSizeImage;    ///< Not read.
    int32_t biXPelsPerMeter; ///< Not read.
    int32_t biYPelsPerMeter; ///< Not read.
    uint32_t biClrUsed;      ///< Not read.
    uint32_t biClrImportant; ///< Not read.
};
static_assert(sizeof(tagBITMAPINFOHEADER) == 40 && offsetof(tagBITMAPINFOHEADER, biBitCount) == 14);

/// A header with what follows it in memory.
struct tagBITMAPINFO {
    tagBITMAPINFOHEADER bmiHeader; ///< The header.
    unsigned char bmiColors[4];    ///< The first bytes behind it.
};
static_assert(offsetof(tagBITMAPINFO, bmiColors) == 40);

#pragma pack(pop)

struct VideoImage;

#pragma GCC visibility push(default)

// --- RGB to planar 4:2:0
// Every pixel gives its own Y, Cb and Cr, rounded down from 14-bit fixed point; a chroma sample is the
// truncated average of its pixels' values.

/// 32-bit bottom-up bitmap; the fourth byte of a pixel is ignored. Checked: a header of 32 bits, no null
/// pointer.
void Rgb32_2_yuv420(unsigned char* pY, unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U, int nPt_V,
                    tagBITMAPINFOHEADER* lpSrcBmi, unsigned char* lpSrcBits);

/// The same for a top-down bitmap.
void Argb_2_yuv420(unsigned char* pY, unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U, int nPt_V,
                   tagBITMAPINFOHEADER* lpSrcBmi, unsigned char* lpSrcBits);

/// The same for bare pixels with rows nPitchSrc bytes apart. The sign of nHeightSrc gives the row order:
/// positive top-down, negative bottom-up with -nHeightSrc rows. Checked: no null pointer.
void Rgb32_2_yuv420_Ex(unsigned char* pY, unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U,
                       int nPt_V, unsigned char* lpSrcBits, int nWidthSrc, int nHeightSrc, int nPitchSrc);

/// 24-bit bottom-up bitmap. Checked: a header of 24 bits, no null pointer.
void Rgb24_2_yuv420(unsigned char* pY, unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U, int nPt_V,
                    tagBITMAPINFOHEADER* lpSrcBmi, unsigned char* lpSrcBits);

/// 24-bit bottom-up bitmap by the equations of PixelRGB_2_YUV; values may differ by one from those of
/// Rgb24_2_yuv420. Converts whole 2 x 2 blocks only: an odd last column or row is left as it was in the
/// planes. Nothing is checked; biBitCount is taken to be 24.
void Rgb24_2_yuv420Simple(unsigned char* pY, unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U,
                          int nPt_V, tagBITMAPINFOHEADER* lpSrcBmi, unsigned char* lpSrcBits);

/// One pixel in 10-bit fixed point, rounded to the nearest. Components outside 0 to 255 are accepted; Y is
/// clamped to 16 to 235, U and V to 16 to 240.
void PixelRGB_2_YUV(int R, int G, int B, int& Y, int& U, int& V);

/// Rgb32_2_yuv420 (bBottomUp nonzero) or Argb_2_yuv420 (zero) with the fourth byte of every pixel copied into
/// the plane pA, which has the size and the pitch of the Y plane. Checked only when bBottomUp is nonzero: as
/// Rgb32_2_yuv420A_R.
void Rgb32_2_yuv420A(unsigned char* pY, unsigned char* pU, unsigned char* pV, unsigned char* pA, int nPt_Y,
                     int nPt_U, int nPt_V, tagBITMAPINFOHEADER* lpSrcBmi, unsigned char* lpSrcBits,
                     int bBottomUp);

/// The bottom-up form of Rgb32_2_yuv420A. Checked: a header of 32 bits, no null pointer (pA is not looked
/// at).
void Rgb32_2_yuv420A_R(unsigned char* pY, unsigned char* pU, unsigned char* pV, unsigned char* pA, int nPt_Y,
                       int nPt_U, int nPt_V, tagBITMAPINFOHEADER* lpSrcBmi, unsigned char* lpSrcBits);

// --- Planar 4:2:0 to RGB
// A chroma sample serves its 2 x 2 pixels unchanged. 13-bit fixed point, rounded down, clamped to 0 to
// 255.

/// Into a 24-bit bottom-up bitmap; the padding of its rows is not touched. Checked: a header of 24 bits, no
/// null pointer.
void Yuv420_2_rgb24(tagBITMAPINFOHEADER* lpDstBmi, unsigned char* lpDstBits, unsigned char* pY,
                    unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U, int nPt_V);

/// Into a 32-bit bottom-up bitmap. The fourth byte of every pixel keeps its value; it may be written with the
/// value it holds, so it must not be changed by another thread meanwhile. Checked: a header of 32 bits, no
/// null pointer.
void Yuv420_2_rgb32(tagBITMAPINFOHEADER* lpDstBmi, unsigned char* lpDstBits, unsigned char* pY,
                    unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U, int nPt_V);

/// Into a 32-bit top-down bitmap with a fourth byte of 255. Checked: a header of 32 bits, no null pointer.
void Yuv420_2_Argb(tagBITMAPINFOHEADER* lpDstBmi, unsigned char* lpDstBits, unsigned char* pY,
                   unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U, int nPt_V);

/// Into a 24-bit bottom-up bitmap by the equations of PixelYUV_2_RGB; values may differ by one from those of
/// Yuv420_2_rgb24. Converts whole 2 x 2 blocks only: an odd last column or row is left as it was in the
/// bitmap. Nothing is checked; biBitCount is taken to be 24.
void Yuv420_2_rgb24Simple(tagBITMAPINFOHEADER* lpDstBmi, unsigned char* lpDstBits, unsigned char* pY,
                          unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U, int nPt_V);

/// One pixel in 10-bit fixed point, rounded to the nearest and clamped to 0 to 255.
void PixelYUV_2_RGB(int Y, int U, int V, int& R, int& G, int& B);

// --- Packed 4:2:2
// A rectangle of cx x cy pixels goes from (xSrc, ySrc) to (xDst, yDst), pixels from the top left; pitches
// are in bytes.

/// 24-bit bottom-up picture of nHeightSrc rows to 4:2:2; a group's chroma is the truncated average of its two
/// pixels'. Groups are written whole: an odd xDst starts one column to the left, with the pixel xSrc, and
/// takes one pixel more, and a half-filled last group repeats its pixel. Checked: no null pointer, and the
/// rectangle as given against both pitches.
void Rgb24_2_YUY2(unsigned char* lpBitsDst, int nPitchDst, int xDst, int yDst, int cxDst, int cyDst,
                  unsigned int bYUY2, unsigned char* lpBitsSrc, int nHeightSrc, int nPitchSrc, int xSrc,
                  int ySrc);

/// 4:2:2 to a 24-bit bottom-up picture of nHeightDst rows. Reading starts at xSrc rounded down to even; an
/// odd cx takes the even pixel of its last group alone. Checked: no null pointer.
void YUY2_2_Rgb24(unsigned char* lpBitsDst, int nHeightDst, int nPitchDst, int xDst, int yDst, int cx, int cy,
                  unsigned char* lpBitsSrc, int nPitchSrc, unsigned int bYUY2, int xSrc, int ySrc);

/// 4:2:2 to planar 4:2:0; a chroma sample is the truncated average of two rows'. An odd cx or cy is rounded
/// up, and both sides must have room for it. Reading starts at xSrc rounded down to even. Checked before
/// every group: the V sample lies at or before pV + (ySrc + cy) * nPt_V; what comes before a failing group
/// has been written.
void YUY2_2_Yuv420(unsigned char* pY, unsigned char* pU, unsigned char* pV, int nPt_Y, int nPt_U, int nPt_V,
                   int xDst, int yDst, int cx, int cy, unsigned char* lpBitsSrc, int nPitchSrc,
                   unsigned int bYUY2, int xSrc, int ySrc);

/// Planar 4:2:0 to 4:2:2; two rows share the chroma of theirs. An odd cx or cy is rounded up, and both sides
/// must have room for it. Writing starts at xDst rounded down to even. Nothing is checked.
void Yuv420_2_YUY2(unsigned char* lpBitsDst, int nPitchDst, int xDst, int yDst, int cx, int cy,
                   unsigned int bYUY2, unsigned char* pY, unsigned char* pU, unsigned char* pV, int nPt_Y,
                   int nPt_U, int nPt_V, int xSrc, int ySrc);

// --- Copies and resampling; nothing is checked

/// Copies a rectangle of a planar 4:2:0 picture. An odd cy is rounded up, in Y too. Chroma starts at column
/// (x + 1) / 2 and row y / 2 on each side and is (cx + 1) / 2 wide.
void YV12_Blt_fast(unsigned char* pYDst, unsigned char* pUDst, unsigned char* pVDst, int nPt_YDst,
                   int nPt_UDst, int nPt_VDst, int xDst, int yDst, int cx, int cy, unsigned char* pYSrc,
                   unsigned char* pUSrc, unsigned char* pVSrc, int nPt_YSrc, int nPt_USrc, int nPt_VSrc,
                   int xSrc, int ySrc);

/// Copies a rectangle of a 4:2:2 picture. When the two flags are different values, the bytes of each pair
/// change places, and an odd cx is rounded up.
void YUY2_Blt_fast(unsigned char* lpBitsDst, int nPitchDst, int xDst, int yDst, int cx, int cy,
                   unsigned int bYUY2Dst, unsigned char* lpBitsSrc, int nPitchSrc, unsigned int bYUY2Src,
                   int xSrc, int ySrc);

/// Reduces a packed plane of cx x cy samples to one of (cx + 1) / 2 x (cy + 1) / 2 by truncated averages of 2
/// x 2 samples; at an odd edge, of the samples that exist.
void YUV444_2_420(unsigned char* pDst, unsigned char* pSrc, int cx, int cy);

/// Enlarges a packed plane of w x h samples to one of 2w x 2h: each sample four times.
void YUV420_2_444(unsigned char* pDst, unsigned char* pSrc, int w, int h);

/// Enlarges the packed chroma plane, (W + 1) / 2 bytes a row, of a W x H picture to a packed plane of W bytes
/// a row. The odd last column and row of the destination are not written.
void YUV420_2_444Ex(unsigned char* pDst, unsigned char* pSrc, int W, int H);

// --- Kernels

/// The instruction set that the routines use in this process: "plain" (none in particular), "sse4.1",
/// "avx2" or "avx512", on 64-bit ARM "neon". It is the highest that the processor has, unless the environment
/// variable MOVIECONV_COLOUR_LEVEL holds another of these names when the first routine, or this function, is
/// called; a name that is unknown or that the processor lacks is passed over. The results are the same with
/// all of them. The text is never freed.
const char* ImageConvertLevel();

// --- Trace
// Convert a picture with Yuv420_2_rgb24 into a bitmap of their own, which is released at once. A size of
// zero or less, or a bitmap for which there is no memory, converts nothing.

/// A decoded picture (media/MediaRecords.h); anything but nType 1 returns at once, anything but nFormat 2 is
/// not converted.
void xTraceImage(const VideoImage* image);

/// A bitmap header whose pixels are a packed YV12 picture (Y, V, U), at `bits` or, when that is null, behind
/// the header.
void xTraceImage(tagBITMAPINFO* bmi, unsigned char* bits);

#pragma GCC visibility pop

#endif
