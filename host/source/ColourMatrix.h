// By which matrix luma and chroma stand for red, green and blue; numbers as in ISO/IEC 23091-2.
#ifndef MOVIECONV_HOST_SOURCE_COLOURMATRIX_H
#define MOVIECONV_HOST_SOURCE_COLOURMATRIX_H

#include "host/source/SourceInfo.h"

extern "C" {
#include <libavutil/pixfmt.h>
}

namespace movieconv {

constexpr int kMatrixRgb = 0; ///< None: the pictures are red, green and blue.
constexpr int kMatrixBt709 = 1;
constexpr int kMatrixUnstated = 2;

/// Whether pixels of that format are red, green and blue.
bool IsRgb(AVPixelFormat format);

/// The matrix by which players show such pictures when none is stated; RGB becomes luma and chroma by it.
int UsualMatrix(const PictureStreamInfo& pictures);

/// The matrix of the pictures as they are handed out.
int HandedOutMatrix(const PictureStreamInfo& pictures, bool keepsHdr);

} // namespace movieconv

#endif
