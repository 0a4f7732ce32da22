#include "host/source/ColourMatrix.h"

extern "C" {
#include <libavutil/pixdesc.h>
}

namespace movieconv {

bool IsRgb(AVPixelFormat format) {
    const AVPixFmtDescriptor* description = av_pix_fmt_desc_get(format);
    return description != nullptr && (description->flags & (AV_PIX_FMT_FLAG_RGB | AV_PIX_FMT_FLAG_PAL)) != 0;
}

int UsualMatrix(const PictureStreamInfo& pictures) {
    constexpr int kLeastHdHeight = 720;
    constexpr int kBt601 = 6;
    constexpr int kBt2020 = 9;
    if (IsHdr(pictures))
        return kBt2020;
    const bool onSide = pictures.quarterTurns % 2 != 0;
    const int lines = onSide ? pictures.width + pictures.crop.left + pictures.crop.right
                             : pictures.height + pictures.crop.top + pictures.crop.bottom;
    return lines >= kLeastHdHeight ? kMatrixBt709 : kBt601;
}

int HandedOutMatrix(const PictureStreamInfo& pictures, bool keepsHdr) {
    if (IsHdr(pictures) && !keepsHdr)
        return kMatrixBt709;
    const bool isStated = pictures.colorMatrix != kMatrixRgb && pictures.colorMatrix != kMatrixUnstated;
    return isStated ? pictures.colorMatrix : UsualMatrix(pictures);
}

} // namespace movieconv
