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

/// The matrix by which players show the source's pictures when none is stated: it goes by how many lines they
/// are stored in, before they are turned and cropped. RGB becomes luma and chroma by it.
int UsualMatrix(const PictureStreamInfo& pictures);

/// The matrix of the pictures as they are handed out: always a certain one, since what they become may have
/// another size, by which players would take another one.
int HandedOutMatrix(const PictureStreamInfo& pictures, bool keepsHdr);

} // namespace movieconv

#endif
