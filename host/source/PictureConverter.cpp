#include "host/source/PictureConverter.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <new>
#include <utility>

extern "C" {
#include <libavutil/imgutils.h>
#include <libavutil/opt.h>
}

namespace movieconv {
namespace {

av::Frame NewPicture(AVPixelFormat format, int width, int height) {
    av::Frame picture = av::NewFrame();
    picture->format = format;
    picture->width = width;
    picture->height = height;
    picture->color_range = AVCOL_RANGE_MPEG;
    if (av_frame_get_buffer(picture.get(), 0) < 0)
        throw std::bad_alloc();
    return picture;
}

bool IsOnSide(int quarterTurns) {
    return quarterTurns % 2 != 0;
}

/// The picture in the middle of a black one.
av::Frame Bordered(const AVFrame& picture, int width, int height) {
    const auto format = static_cast<AVPixelFormat>(picture.format);
    av::Frame whole = NewPicture(format, width, height);
    const ptrdiff_t pitches[4] = {whole->linesize[0], whole->linesize[1], whole->linesize[2], 0};
    av_image_fill_black(whole->data, pitches, format, AVCOL_RANGE_MPEG, width, height);
    const int left = (width - picture.width) / 4 * 2;
    const int top = (height - picture.height) / 4 * 2;
    const int sampleBytes = format == AV_PIX_FMT_YUV420P10 ? 2 : 1;
    for (int plane = 0; plane < 3; ++plane) {
        const int part = plane == 0 ? 1 : 2;
        uint8_t* begin = whole->data[plane] + static_cast<ptrdiff_t>(top / part) * whole->linesize[plane] +
                         left / part * sampleBytes;
        av_image_copy_plane(begin, whole->linesize[plane], picture.data[plane], picture.linesize[plane],
                            (picture.width + part - 1) / part * sampleBytes,
                            (picture.height + part - 1) / part);
    }
    return whole;
}

bool IsNearlySame(double shape, double other) {
    constexpr double kTolerance = 0.02;
    return std::abs(shape / other - 1) < kTolerance;
}

bool IsFullRange(const AVFrame& picture) {
    return picture.color_range == AVCOL_RANGE_JPEG || picture.format == AV_PIX_FMT_YUVJ420P;
}

/// Whether luma and chroma of that matrix are sums of red, green and blue, whose coefficients the scaler
/// knows.
bool IsLinear(int matrix) {
    constexpr std::array kLinear{AVCOL_SPC_BT709,     AVCOL_SPC_FCC,       AVCOL_SPC_BT470BG,
                                 AVCOL_SPC_SMPTE170M, AVCOL_SPC_SMPTE240M, AVCOL_SPC_BT2020_NCL};
    return std::find(kLinear.begin(), kLinear.end(), matrix) != kLinear.end();
}

bool HaveSameCoefficients(int matrix, int other) {
    return std::equal(sws_getCoefficients(matrix), sws_getCoefficients(matrix) + 4,
                      sws_getCoefficients(other));
}

/// Copies a plane so that target pixel (x, y) is source pixel `origin` + x * `stepX` + y * `stepY`; the steps
/// count samples.
template <typename Sample>
struct Walk {
    const Sample* origin;
    ptrdiff_t stepX;
    ptrdiff_t stepY;
};

template <typename Sample>
Walk<Sample> WalkFor(const Sample* plane, ptrdiff_t pitch, int width, int height, int quarterTurns,
                     bool mirrored) {
    Walk<Sample> walk{plane, 1, pitch};
    if (mirrored) {
        walk.origin += width - 1;
        walk.stepX = -1;
    }
    // A clockwise turn: the target's rows run up the source's columns.
    for (int turn = 0; turn < quarterTurns; ++turn) {
        walk = {walk.origin + walk.stepY * (height - 1), -walk.stepY, walk.stepX};
        std::swap(width, height);
    }
    return walk;
}

template <typename Sample>
void CopyPlane(const Walk<Sample>& walk, Sample* target, ptrdiff_t pitch, int width, int height) {
    constexpr int kBlock = 32; // pixels; keeps the columns that a turned row crosses in the cache
    for (int top = 0; top < height; top += kBlock) {
        for (int left = 0; left < width; left += kBlock) {
            for (int y = top; y < height && y < top + kBlock; ++y) {
                const Sample* source = walk.origin + walk.stepY * y + walk.stepX * left;
                Sample* row = target + pitch * y;
                for (int x = left; x < width && x < left + kBlock; ++x, source += walk.stepX)
                    row[x] = *source;
            }
        }
    }
}

/// All planes of `picture`, mirrored and turned, into `turned`, which has the size for it.
template <typename Sample>
void TurnPlanes(const AVFrame& picture, AVFrame& turned, int quarterTurns, bool mirrored) {
    constexpr int kBytes = sizeof(Sample);
    for (int plane = 0; plane < 3; ++plane) {
        const int shift = plane == 0 ? 0 : 1;
        const auto part = [&](int size) { return (size + shift) >> shift; };
        const auto walk =
            WalkFor(reinterpret_cast<const Sample*>(picture.data[plane]), picture.linesize[plane] / kBytes,
                    part(picture.width), part(picture.height), quarterTurns, mirrored);
        CopyPlane(walk, reinterpret_cast<Sample*>(turned.data[plane]), turned.linesize[plane] / kBytes,
                  part(turned.width), part(turned.height));
    }
}

} // namespace

PictureConverter::PictureConverter(const PictureStreamInfo& stream, const SourceChoice& choice,
                                   bool drawnInto)
    : quarterTurns_(stream.quarterTurns),
      mirrored_(stream.mirrored),
      crop_(stream.crop),
      matrix_(HandedOutMatrix(stream, choice.keepHdr)),
      matrixByPicture_(stream.matrixByPicture),
      format_(choice.deep && stream.depth > 8 ? AV_PIX_FMT_YUV420P10 : AV_PIX_FMT_YUV420P),
      codedAspect_(stream.codedAspect),
      stored_(StoredSize(stream)),
      oneSize_(drawnInto || !crop_.CutsNothing()) {}

av::Frame PictureConverter::Convert(AVFrame& picture) {
    const bool hasSize = WholeSize(picture) == Size{picture.width, picture.height} && Widening(picture) == 1;
    av::Frame converted;
    if (picture.format == format_ && !IsFullRange(picture) && hasSize && MatrixOf(picture) == matrix_) {
        converted = av::NewFrame();
        av_frame_move_ref(converted.get(), &picture);
    } else {
        converted = Scale(picture);
    }
    const bool upright = quarterTurns_ == 0 && !mirrored_;
    if (converted && !upright)
        converted = Turn(*converted);
    if (converted && !crop_.CutsNothing())
        Cut(*converted);
    return converted;
}

/// Moves the edges, not the pixels.
void PictureConverter::Cut(AVFrame& picture) const {
    picture.crop_top = static_cast<size_t>(crop_.top);
    picture.crop_bottom = static_cast<size_t>(crop_.bottom);
    picture.crop_left = static_cast<size_t>(crop_.left);
    picture.crop_right = static_cast<size_t>(crop_.right);
    av_frame_apply_cropping(&picture, AV_FRAME_CROP_UNALIGNED);
}

PictureConverter::Size PictureConverter::StoredSize(const PictureStreamInfo& stream) {
    const Size whole{stream.width + stream.crop.left + stream.crop.right,
                     stream.height + stream.crop.top + stream.crop.bottom};
    return IsOnSide(stream.quarterTurns) ? Size{whole.height, whole.width} : whole;
}

/// By how much wider the picture's pixels are than those of the stream; 1 when nearly the same. The container
/// may tell another shape than the pictures do, but for all of them, and a picture that tells none has the
/// stream's.
double PictureConverter::Widening(const AVFrame& picture) const {
    if (picture.sample_aspect_ratio.num <= 0)
        return 1;
    const auto shape = [](AVRational aspect) {
        return aspect.num > 0 && aspect.den > 0 ? av_q2d(aspect) : 1;
    };
    const double widening = shape(picture.sample_aspect_ratio) / shape(codedAspect_);
    return IsNearlySame(widening, 1) ? 1 : widening;
}

/// Of what the picture becomes.
PictureConverter::Size PictureConverter::WholeSize(const AVFrame& picture) const {
    return oneSize_ || Widening(picture) != 1 ? stored_ : Size{picture.width, picture.height};
}

/// How large the picture becomes in one of the size `whole`, where it keeps its shape unless that is nearly
/// the same.
PictureConverter::Size PictureConverter::SizeWithin(const Size& whole, const AVFrame& picture) const {
    const double widening = Widening(picture);
    const double scaleX = whole.width / (picture.width * widening);
    const double scaleY = static_cast<double>(whole.height) / picture.height;
    if (IsNearlySame(scaleX, scaleY))
        return whole;
    const auto even = [](double length) { return std::max(2, static_cast<int>(length / 2) * 2); };
    return scaleX < scaleY ? Size{whole.width, even(picture.height * scaleX)}
                           : Size{even(picture.width * widening * scaleY), whole.height};
}

/// By which the picture's luma and chroma stand for its colours: the stream's, unless the picture may state
/// another one, as in a recording where one programme follows another. What a container states holds for all
/// pictures.
int PictureConverter::MatrixOf(const AVFrame& picture) const {
    const int stated = picture.colorspace;
    const bool isAnother = matrixByPicture_ && !IsRgb(static_cast<AVPixelFormat>(picture.format)) &&
                           IsLinear(stated) && IsLinear(matrix_) && !HaveSameCoefficients(stated, matrix_);
    return isAnother ? stated : matrix_;
}

/// The range is told before the rest is set up: swscale then decides whether pictures that keep their size
/// are copied, levels and all, and what it is told later does not change that.
av::Scaler PictureConverter::NewScaler(const Scaling& scaling) const {
    av::Scaler scaler(sws_alloc_context());
    if (!scaler)
        return nullptr;
    const std::pair<const char*, int64_t> options[] = {
        {"srcw", scaling.from.width},   {"srch", scaling.from.height},
        {"src_format", scaling.format}, {"src_range", scaling.fullRange && !IsRgb(scaling.format) ? 1 : 0},
        {"dstw", scaling.to.width},     {"dsth", scaling.to.height},
        {"dst_format", format_},        {"sws_flags", SWS_BICUBIC | SWS_ACCURATE_RND},
    };
    for (const auto& [name, value] : options)
        av_opt_set_int(scaler.get(), name, value, 0);
    if (sws_init_context(scaler.get(), nullptr, nullptr) < 0)
        return nullptr;
    sws_setColorspaceDetails(scaler.get(), sws_getCoefficients(scaling.matrix), scaling.fullRange ? 1 : 0,
                             sws_getCoefficients(matrix_), 0, 0, 1 << 16, 1 << 16);
    return scaler;
}

av::Frame PictureConverter::Scale(const AVFrame& picture) {
    const auto format = static_cast<AVPixelFormat>(picture.format);
    const Size whole = WholeSize(picture);
    const Size size = SizeWithin(whole, picture);
    const Scaling scaling{
        {picture.width, picture.height}, format, IsFullRange(picture), MatrixOf(picture), size};
    if (!scaler_ || scaling_ != scaling) {
        scaler_ = NewScaler(scaling);
        scaling_ = scaling;
    }
    av::Frame converted = NewPicture(format_, size.width, size.height);
    if (!scaler_)
        return nullptr;
    const int rows = sws_scale(scaler_.get(), picture.data, picture.linesize, 0, picture.height,
                               converted->data, converted->linesize);
    if (rows <= 0)
        return nullptr;
    narrowed_ = narrowed_ || (scaling.fullRange && !IsRgb(format));
    return size == whole ? std::move(converted) : Bordered(*converted, whole.width, whole.height);
}

av::Frame PictureConverter::Turn(const AVFrame& picture) const {
    const bool onSide = IsOnSide(quarterTurns_);
    const int width = onSide ? picture.height : picture.width;
    const int height = onSide ? picture.width : picture.height;
    av::Frame turned = NewPicture(format_, width, height);
    const auto turn = format_ == AV_PIX_FMT_YUV420P10 ? TurnPlanes<uint16_t> : TurnPlanes<uint8_t>;
    turn(picture, *turned, quarterTurns_, mirrored_);
    return turned;
}

} // namespace movieconv
