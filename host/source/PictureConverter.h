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
    /// Pictures of such a stream are mirrored, turned and cropped as it says. Where they are cropped or
    /// `drawnInto`, those of other sizes are brought to the one that the stream tells, for which the places
    /// are meant; and those that tell another shape of their pixels always.
    PictureConverter(const PictureStreamInfo& stream, const SourceChoice& choice, bool drawnInto);

    /// The picture in the engine's form. One that has it already is passed on without a copy. Null when it
    /// cannot be converted, as with a damaged size.
    av::Frame Convert(AVFrame& picture);

    /// Whether any picture had the full range of levels, of which the usual range that it got has fewer.
    bool Narrowed() const { return narrowed_; }

private:
    struct Size {
        int width = 0;
        int height = 0;
        bool operator==(const Size&) const = default;
    };

    /// What a scaler is made for.
    struct Scaling {
        Size from;
        AVPixelFormat format = AV_PIX_FMT_NONE;
        bool fullRange = false;
        int matrix = kMatrixUnstated;
        Size to;
        bool operator==(const Scaling&) const = default;
    };

    static Size StoredSize(const PictureStreamInfo& stream);
    Size WholeSize(const AVFrame& picture) const;
    double Widening(const AVFrame& picture) const;
    Size SizeWithin(const Size& whole, const AVFrame& picture) const;
    int MatrixOf(const AVFrame& picture) const;
    av::Scaler NewScaler(const Scaling& scaling) const;
    av::Frame Scale(const AVFrame& picture);
    av::Frame Turn(const AVFrame& picture) const;
    void Cut(AVFrame& picture) const;

    const int quarterTurns_;
    const bool mirrored_;
    const Crop crop_;
    const int matrix_; // of what is handed out
    const bool matrixByPicture_;
    const AVPixelFormat format_;
    const AVRational codedAspect_; // of the stream's pictures, as they tell it
    const Size stored_;
    const bool oneSize_; // otherwise pictures of the same shape of pixels keep their own size
    av::Scaler scaler_;
    Scaling scaling_; // of scaler_
    bool narrowed_ = false;
};

} // namespace movieconv

#endif
