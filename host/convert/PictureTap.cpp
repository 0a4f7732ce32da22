#include "host/convert/PictureTap.h"

#include "Common/Image/ImageConvert.h"
#include "host/source/ColourMatrix.h"
#include "host/source/SourceError.h"

#include <algorithm>
#include <new>
#include <utility>

namespace movieconv {
namespace {

std::size_t Half(int size) {
    return static_cast<std::size_t>(size + 1) / 2;
}

void CopyPlane(std::vector<uint8_t>& target, const uint8_t* plane, int pitch, std::size_t width,
               std::size_t height) {
    for (std::size_t y = 0; y < height; ++y) {
        const uint8_t* row = plane + static_cast<ptrdiff_t>(y) * pitch;
        target.insert(target.end(), row, row + width);
    }
}

} // namespace

void PictureTap::Expect(const PictureStreamInfo& source, bool keepsHdr) {
    if (keepsHdr)
        filter_.emplace(source, SourceChoice{.deinterlace = Deinterlace::kNone});
    const int matrix = HandedOutMatrix(source, false); // where HDR is kept, the filter takes it away
    matrix_ = matrix == AVCOL_SPC_SMPTE170M ? SWS_CS_ITU601 : matrix; // the same one
}

bool PictureTap::Offer(const VideoImage& image) noexcept {
    const int64_t interval = interval_;
    const Clock::time_point now = Clock::now();
    const std::lock_guard lock(mutex_);
    if (interval == kNone || now - offered_ < std::chrono::milliseconds(interval))
        return false;
    offered_ = now;
    Copy(image);
    return fresh_;
}

void PictureTap::OfferLast(const VideoImage& image) noexcept {
    const std::lock_guard lock(mutex_);
    Copy(image);
}

void PictureTap::Copy(const VideoImage& image) noexcept {
    if (image.nWidth <= 0 || image.nHeight <= 0)
        return;
    try {
        fresh_ = false;
        latest_.width = image.nWidth;
        latest_.height = image.nHeight;
        latest_.deep = image.nFormat == kPictureFormatPlanar420Deep;
        latest_.bytes.clear();
        const std::size_t sampleBytes = latest_.deep ? 2 : 1;
        const auto width = static_cast<std::size_t>(image.nWidth) * sampleBytes;
        const auto height = static_cast<std::size_t>(image.nHeight);
        const std::size_t chromaWidth = Half(image.nWidth) * sampleBytes;
        CopyPlane(latest_.bytes, image.pY, image.nPitchY, width, height);
        CopyPlane(latest_.bytes, image.pU, image.nPitchU, chromaWidth, Half(image.nHeight));
        CopyPlane(latest_.bytes, image.pV, image.nPitchV, chromaWidth, Half(image.nHeight));
        fresh_ = true;
    } catch (const std::bad_alloc&) {
        return;
    }
}

/// As usual displays show it: of 8 bits. Null when it cannot be made so.
av::Frame PictureTap::Usual(const Planes& planes) {
    av::Frame frame = av::NewFrame();
    frame->format = planes.deep ? AV_PIX_FMT_YUV420P10 : AV_PIX_FMT_YUV420P;
    frame->width = planes.width;
    frame->height = planes.height;
    if (av_frame_get_buffer(frame.get(), 0) < 0)
        return nullptr;
    const uint8_t* source = planes.bytes.data();
    for (int plane = 0; plane < 3; ++plane) {
        const std::size_t samples = plane == 0 ? static_cast<std::size_t>(planes.width) : Half(planes.width);
        const std::size_t rows = plane == 0 ? static_cast<std::size_t>(planes.height) : Half(planes.height);
        const std::size_t bytes = samples * (planes.deep ? 2 : 1);
        for (std::size_t row = 0; row < rows; ++row, source += bytes)
            std::copy_n(source, bytes,
                        frame->data[plane] + static_cast<ptrdiff_t>(row) * frame->linesize[plane]);
    }
    if (!filter_)
        return converter_.Convert(*frame);
    av::Frame shown;
    try {
        filter_->Push(*frame, std::nullopt, [&](AVFrame& picture, std::optional<int64_t>) {
            shown = av::NewFrame();
            av_frame_move_ref(shown.get(), &picture);
            return true;
        });
    } catch (const SourceError&) { // without filters
    }
    return shown;
}

std::shared_ptr<const ShownPicture> PictureTap::Take() {
    {
        const std::lock_guard lock(mutex_);
        if (!std::exchange(fresh_, false))
            return nullptr;
        std::swap(taken_, latest_);
    }
    auto shown = std::make_shared<ShownPicture>();
    shown->width = taken_.width;
    shown->height = taken_.height;
    shown->bgra.resize(static_cast<std::size_t>(taken_.width) * static_cast<std::size_t>(taken_.height) * 4);
    const av::Frame usual = Usual(taken_);
    return usual && Paint(*usual, shown->bgra.data()) ? shown : nullptr;
}

/// False when it cannot be painted.
bool PictureTap::Paint(const AVFrame& picture, uint8_t* bgra) {
    if (matrix_ != SWS_CS_ITU601) {
        scaler_.reset(sws_getCachedContext(scaler_.release(), picture.width, picture.height,
                                           AV_PIX_FMT_YUV420P, picture.width, picture.height, AV_PIX_FMT_BGRA,
                                           SWS_BICUBIC | SWS_ACCURATE_RND | SWS_FULL_CHR_H_INT, nullptr,
                                           nullptr, nullptr));
        if (!scaler_)
            return false;
        const int* matrix = sws_getCoefficients(matrix_);
        sws_setColorspaceDetails(scaler_.get(), matrix, 0, matrix, 0, 0, 1 << 16, 1 << 16);
        const int pitch = picture.width * 4;
        return sws_scale(scaler_.get(), picture.data, picture.linesize, 0, picture.height, &bgra, &pitch) > 0;
    }
    tagBITMAPINFOHEADER header{};
    header.biSize = sizeof header;
    header.biWidth = picture.width;
    header.biHeight = picture.height;
    header.biPlanes = 1;
    header.biBitCount = 32;
    Yuv420_2_Argb(&header, bgra, picture.data[0], picture.data[1], picture.data[2], picture.linesize[0],
                  picture.linesize[1], picture.linesize[2]);
    return true;
}

} // namespace movieconv
