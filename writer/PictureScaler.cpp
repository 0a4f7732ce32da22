#include "writer/PictureScaler.h"

#include "writer/WriterFailure.h"
#include "writer/WriterStatus.h"

extern "C" {
#include <libavutil/imgutils.h>
#include <libavutil/pixdesc.h>
}

#include <algorithm>
#include <cmath>
#include <cstring>
#include <new>

namespace writer {
namespace {

constexpr int kAlignment = 64;

/// Columns that FFmpeg's MPEG encoders keep beside their pictures, together.
constexpr int kEncoderEdges = 32;

/// The distance of rows at which those encoders take pictures of whole macroblocks as they are, without a
/// copy of their own: all planes on whole cache lines, room for the edges.
int AlignedWidth(int width) {
    return FFALIGN(width + kEncoderEdges, 2 * kAlignment);
}

int EvenDown(int value) {
    return value & ~1;
}

/// Largest whole size at most `limit` in the proportion; at least 1.
int Proportional(double value, int limit) {
    return std::clamp(static_cast<int>(std::lround(value)), 1, limit);
}

void PaintBlack(AVFrame& frame, bool fullRange) {
    ptrdiff_t linesize[4];
    std::copy_n(frame.linesize, 4, linesize);
    const AVColorRange range = fullRange ? AVCOL_RANGE_JPEG : AVCOL_RANGE_MPEG;
    av_image_fill_black(frame.data, linesize, static_cast<AVPixelFormat>(frame.format), range, frame.width,
                        frame.height);
}

/// The picture becomes the rectangle of `fit`.
void PutInto(AVFrame& frame, const AVFrame& picture, const PictureFit& fit) {
    const auto format = static_cast<AVPixelFormat>(frame.format);
    const int chromaShift = av_pix_fmt_desc_get(format)->log2_chroma_h;
    for (int plane = 0; plane < av_pix_fmt_count_planes(format); ++plane) {
        const int shift = plane == 0 ? 0 : chromaShift;
        uint8_t* corner = frame.data[plane] +
                          static_cast<ptrdiff_t>(fit.top >> shift) * frame.linesize[plane] +
                          av_image_get_linesize(format, fit.left, plane);
        av_image_copy_plane(corner, frame.linesize[plane], picture.data[plane], picture.linesize[plane],
                            av_image_get_linesize(format, picture.width, plane),
                            AV_CEIL_RSHIFT(picture.height, shift));
    }
}

/// Repeats the last column and row of a picture that is `padWidth` and `padHeight` smaller than its frame.
template <typename Sample>
void RepeatEdges(AVFrame& frame, int padWidth, int padHeight) {
    // One more luma column or row never adds a chroma sample: 4:2:0 rounds up.
    for (int row = 0; padWidth > 0 && row < frame.height; ++row) {
        uint8_t* pixels = frame.data[0] + static_cast<ptrdiff_t>(row) * frame.linesize[0];
        auto* end = reinterpret_cast<Sample*>(pixels) + frame.width - 1;
        end[0] = end[-1];
    }
    if (padHeight > 0) {
        uint8_t* last = frame.data[0] + static_cast<ptrdiff_t>(frame.height - 1) * frame.linesize[0];
        std::memcpy(last, last - frame.linesize[0], static_cast<size_t>(frame.width) * sizeof(Sample));
    }
}

} // namespace

PictureFit FitPicture(int width, int height, AVRational sampleAspect, int outWidth, int outHeight,
                      bool stretch) {
    PictureFit fit;
    fit.width = fit.fittedWidth = outWidth;
    fit.height = fit.fittedHeight = outHeight;
    // Sizes are whole pixels: proportions that differ by less than one pixel are the same.
    const double sameHeight = static_cast<double>(height) * outWidth / width;
    const double sameWidth = static_cast<double>(width) * outHeight / height;
    if (std::abs(sameHeight - outHeight) < 1 || std::abs(sameWidth - outWidth) < 1) {
        fit.sampleAspect = sampleAspect;
        return fit;
    }
    const double display = av_q2d(sampleAspect) * width / height;
    if (stretch) {
        const double shape = display * outHeight / outWidth;
        fit.sampleAspect =
            std::abs(display * outHeight - outWidth) < 1 ? AVRational{1, 1} : av_d2q(shape, 1000);
        return fit;
    }
    if (display * outHeight <= outWidth)
        fit.fittedWidth = Proportional(display * outHeight, outWidth);
    else
        fit.fittedHeight = Proportional(outWidth / display, outHeight);
    fit.left = EvenDown((outWidth - fit.fittedWidth) / 2);
    fit.top = EvenDown((outHeight - fit.fittedHeight) / 2);
    return fit;
}

FramePool::~FramePool() {
    av_buffer_pool_uninit(&pool_);
}

av::Frame FramePool::Get(AVPixelFormat format, int width, int height) {
    if (pool_ == nullptr || format != format_ || width != width_ || height != height_) {
        av_buffer_pool_uninit(&pool_);
        const int size = av_image_get_buffer_size(format, AlignedWidth(width), height, kAlignment);
        pool_ = size < 0 ? nullptr : av_buffer_pool_init(static_cast<size_t>(size) + kAlignment, nullptr);
        format_ = format;
        width_ = width;
        height_ = height;
    }
    av::Frame frame = av::NewFrame();
    frame->buf[0] = pool_ != nullptr ? av_buffer_pool_get(pool_) : nullptr;
    if (frame->buf[0] == nullptr)
        throw std::bad_alloc();
    frame->format = format;
    frame->width = width;
    frame->height = height;
    av_image_fill_arrays(frame->data, frame->linesize, frame->buf[0]->data, format, AlignedWidth(width),
                         height, kAlignment);
    return frame;
}

av::Frame PictureScaler::Convert(av::Frame picture) {
    const bool padded = settings_.padWidth > 0 || settings_.padHeight > 0;
    const bool sameFormat = picture->format == settings_.format &&
                            settings_.sourceFullRange == settings_.fullRange &&
                            settings_.sourceMatrix == settings_.matrix;
    if (sameFormat && !padded && picture->width == settings_.width && picture->height == settings_.height)
        return picture;
    PrepareFor(*picture);
    av::Frame frame = pool_.Get(settings_.format, settings_.width + settings_.padWidth,
                                settings_.height + settings_.padHeight);
    av_frame_copy_props(frame.get(), picture.get());
    if (fit_.fittedWidth == fit_.width && fit_.fittedHeight == fit_.height) {
        Scale(*picture, *frame);
    } else { // not straight into the frame: the scaler also writes behind its rows
        const av::Frame fitted = fittedPool_.Get(settings_.format, fit_.fittedWidth, fit_.fittedHeight);
        Scale(*picture, *fitted);
        PaintBlack(*frame, settings_.fullRange);
        PutInto(*frame, *fitted, fit_);
    }
    const auto repeat =
        settings_.format == AV_PIX_FMT_YUV420P10 ? RepeatEdges<uint16_t> : RepeatEdges<uint8_t>;
    repeat(*frame, settings_.padWidth, settings_.padHeight);
    return frame;
}

void PictureScaler::Scale(const AVFrame& picture, AVFrame& scaled) {
    if (sws_scale(scaler_.get(), picture.data, picture.linesize, 0, picture.height, scaled.data,
                  scaled.linesize) < 0)
        throw std::bad_alloc();
}

void PictureScaler::PrepareFor(const AVFrame& picture) {
    if (scaler_ && picture.width == sourceWidth_ && picture.height == sourceHeight_ &&
        picture.format == sourceFormat_)
        return;
    sourceWidth_ = picture.width;
    sourceHeight_ = picture.height;
    sourceFormat_ = picture.format;
    fit_ = FitPicture(picture.width, picture.height, settings_.sourceAspect, settings_.width,
                      settings_.height, settings_.stretch);
    scaler_.reset(sws_getContext(picture.width, picture.height, static_cast<AVPixelFormat>(picture.format),
                                 fit_.fittedWidth, fit_.fittedHeight, settings_.format,
                                 SWS_BICUBIC | SWS_ACCURATE_RND | SWS_BITEXACT, nullptr, nullptr, nullptr));
    if (!scaler_)
        throw WriterFailure(kWriterErrorEncode, "Pictures of " + std::to_string(picture.width) + "x" +
                                                    std::to_string(picture.height) + " cannot be scaled.");
    sws_setColorspaceDetails(scaler_.get(), sws_getCoefficients(settings_.sourceMatrix),
                             settings_.sourceFullRange ? 1 : 0, sws_getCoefficients(settings_.matrix),
                             settings_.fullRange ? 1 : 0, 0, 1 << 16, 1 << 16);
}

} // namespace writer
