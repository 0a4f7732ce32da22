// Brings pictures of any size and pitch to the encoder's size and format.
#ifndef MOVIECONV_WRITER_PICTURESCALER_H
#define MOVIECONV_WRITER_PICTURESCALER_H

#include "ffmpeg/AvHandles.h"

#include <cstdint>
#include <memory>

namespace writer {

/// How a picture is fitted into the output: a rectangle of the output picture, the rest is black.
struct PictureFit {
    int width = 0; ///< Output picture in pixels.
    int height = 0;
    int left = 0; ///< The rectangle; its corner is even.
    int top = 0;
    int fittedWidth = 0;
    int fittedHeight = 0;
    AVRational sampleAspect{1, 1}; ///< Shape of the output's pixels.
};

/// Fits a picture of `width` by `height` pixels of shape `sampleAspect` into `outWidth` by `outHeight`.
///
/// `stretch` fills the output; the pixels' shape changes, so that players still show the picture undistorted.
/// Otherwise pixels become square unless the output has the source's proportions, and black borders fill what
/// is left over.
PictureFit FitPicture(int width, int height, AVRational sampleAspect, int outWidth, int outHeight,
                      bool stretch);

/// Recycles the memory of pictures of one size and format.
class FramePool {
public:
    FramePool() = default;
    FramePool(const FramePool&) = delete;
    FramePool& operator=(const FramePool&) = delete;
    ~FramePool();

    /// A frame whose memory comes from the pool and goes back to it, from any thread. Throws std::bad_alloc.
    av::Frame Get(AVPixelFormat format, int width, int height);

private:
    AVBufferPool* pool_ = nullptr;
    AVPixelFormat format_ = AV_PIX_FMT_NONE;
    int width_ = 0;
    int height_ = 0;
};

/// Not thread-safe. A change of size or depth in mid-stream is taken as it comes.
class PictureScaler {
public:
    /// Output pictures of `width` by `height`, or of one pixel more where `padWidth` and `padHeight` say so:
    /// the last column and row are then repeated.
    struct Output {
        int width;
        int height;
        int padWidth;
        int padHeight;
        AVPixelFormat format;
        bool fullRange;
        int sourceMatrix = SWS_CS_DEFAULT; ///< FFmpeg's SWS_CS_...
        int matrix = SWS_CS_DEFAULT;       ///< Likewise, where the format is not RGB.
    };

    PictureScaler(const Output& output, AVRational sampleAspect, bool stretch, bool sourceFullRange);

    /// The picture as the encoder takes it: `picture` itself when nothing needs to change. Planar 4:2:0 only.
    av::Frame Convert(av::Frame picture);

private:
    void PrepareFor(const AVFrame& picture);
    void Scale(const AVFrame& picture, AVFrame& scaled);

    const Output output_;
    const AVRational sampleAspect_;
    const bool stretch_;
    const bool sourceFullRange_;
    PictureFit fit_;
    int sourceWidth_ = 0;
    int sourceHeight_ = 0;
    int sourceFormat_ = AV_PIX_FMT_NONE;
    av::Scaler scaler_;
    FramePool pool_;
    FramePool fittedPool_; ///< Of pictures that get borders.
};

} // namespace writer

#endif
