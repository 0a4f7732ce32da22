// Brings decoded pictures into the form that the engine takes: upright planar 4:2:0, video range, of 8 bits
// or of 10.
#ifndef MOVIECONV_HOST_SOURCE_PICTURECONVERTER_H
#define MOVIECONV_HOST_SOURCE_PICTURECONVERTER_H

#include "ffmpeg/AvHandles.h"
#include "host/source/ColourMatrix.h"
#include "host/source/SourceInfo.h"

namespace movieconv {

class PictureConverter {
public:
    /// Pictures of such a stream are mirrored, turned and cropped as it says. `deep`: they get 10 bits.
    PictureConverter(const PictureStreamInfo& stream, bool deep)
        : quarterTurns_(stream.quarterTurns),
          mirrored_(stream.mirrored),
          crop_(stream.crop),
          rgbMatrix_(UsualMatrix(stream)),
          format_(deep ? AV_PIX_FMT_YUV420P10 : AV_PIX_FMT_YUV420P) {}

    /// The picture in the engine's form. One that has it already is passed on without a copy. Null when it
    /// cannot be converted, as with a damaged size.
    av::Frame Convert(AVFrame& picture);

private:
    av::Frame Scale(const AVFrame& picture);
    av::Frame Turn(const AVFrame& picture) const;
    void Cut(AVFrame& picture) const;

    const int quarterTurns_;
    const bool mirrored_;
    const Crop crop_;
    const int rgbMatrix_;
    const AVPixelFormat format_;
    av::Scaler scaler_;
};

} // namespace movieconv

#endif
