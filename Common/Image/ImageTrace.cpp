// The trace routines. Nothing shows or keeps their bitmap: it is made and released.
#include "Common/Image/ImageConvert.h"
#include "media/MediaRecords.h"

#include <limits>
#include <memory>
#include <new>

namespace {

/// Completes the header for a 24-bit bitmap of its size and allocates the pixels; null when the size is zero
/// or less or there is no memory for it.
std::unique_ptr<unsigned char[]> MakeBitmap24(tagBITMAPINFOHEADER& header) {
    if (header.biWidth <= 0 || header.biHeight <= 0)
        return nullptr;
    const uint64_t pitch = (uint64_t{3} * static_cast<uint32_t>(header.biWidth) + 3) & ~uint64_t{3};
    const uint64_t bytes = pitch * static_cast<uint32_t>(header.biHeight);
    header.biBitCount = 24;
    header.biCompression = 0;
    header.biSizeImage = static_cast<uint32_t>(bytes);
    if (bytes > static_cast<uint64_t>(std::numeric_limits<ptrdiff_t>::max()))
        return nullptr;
    return std::unique_ptr<unsigned char[]>(new (std::nothrow) unsigned char[static_cast<size_t>(bytes)]);
}

} // namespace

void xTraceImage(const VideoImage* image) {
    if (image->nType != kMediaTypePicture)
        return;
    tagBITMAPINFOHEADER header{};
    header.biWidth = image->nWidth;
    header.biHeight = image->nHeight;
    const auto pixels = MakeBitmap24(header);
    if (!pixels || image->nFormat != kPictureFormatPlanar420)
        return;
    Yuv420_2_rgb24(&header, pixels.get(), image->pY, image->pU, image->pV, image->nPitchY, image->nPitchU,
                   image->nPitchV);
}

void xTraceImage(tagBITMAPINFO* bmi, unsigned char* bits) {
    tagBITMAPINFOHEADER header = bmi->bmiHeader;
    const auto pixels = MakeBitmap24(header);
    if (!pixels)
        return;
    const int pitch = header.biWidth;
    const int chromaPitch = pitch / 2 + pitch % 2;
    const ptrdiff_t rows = header.biHeight;
    unsigned char* const y = bits ? bits : reinterpret_cast<unsigned char*>(bmi) + sizeof bmi->bmiHeader;
    unsigned char* const v = y + rows * pitch;
    unsigned char* const u = v + (rows + 1) / 2 * chromaPitch;
    Yuv420_2_rgb24(&header, pixels.get(), y, u, v, pitch, chromaPitch, chromaPitch);
}
