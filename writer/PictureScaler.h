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
    struct Settings {
        // Of the output's pictures.
        int width; ///< In pixels, as `height`, without what is padded.
        int height;
        int padWidth; ///< 0 or 1: so many times the last column is repeated; `padHeight`: the last row.
        int padHeight;
        AVPixelFormat format;
        bool fullRange;              ///< Luma covers 0 to 255.
        int matrix = SWS_CS_DEFAULT; ///< FFmpeg's SWS_CS_..., where the format is not RGB.
        // Of the source's.
        AVRational sourceAspect; ///< Shape of their pixels.
        bool sourceFullRange;
        int sourceMatrix = SWS_CS_DEFAULT;
        bool stretch; ///< See FitPicture.
    };

    explicit PictureScaler(const Settings& settings) : settings_(settings) {}

    /// The picture as the encoder takes it: `picture` itself when nothing needs to change. Planar 4:2:0 only.
    av::Frame Convert(av::Frame picture);

private:
    void PrepareFor(const AVFrame& picture);
    void Scale(const AVFrame& picture, AVFrame& scaled);

    const Settings settings_;
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
