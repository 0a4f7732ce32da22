#include "host/convert/PictureTap.h"

#include "Common/Image/ImageConvert.h"

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
        latest_.bytes.clear();
        const auto width = static_cast<std::size_t>(image.nWidth);
        const auto height = static_cast<std::size_t>(image.nHeight);
        CopyPlane(latest_.bytes, image.pY, image.nPitchY, width, height);
        CopyPlane(latest_.bytes, image.pU, image.nPitchU, Half(image.nWidth), Half(image.nHeight));
        CopyPlane(latest_.bytes, image.pV, image.nPitchV, Half(image.nWidth), Half(image.nHeight));
        fresh_ = true;
    } catch (const std::bad_alloc&) {
        return;
    }
}

std::shared_ptr<const ShownPicture> PictureTap::Take() {
    {
        const std::lock_guard lock(mutex_);
        if (!std::exchange(fresh_, false))
            return nullptr;
        std::swap(taken_, latest_);
    }
    tagBITMAPINFOHEADER header{};
    header.biSize = sizeof header;
    header.biWidth = taken_.width;
    header.biHeight = taken_.height;
    header.biPlanes = 1;
    header.biBitCount = 32;
    const auto width = static_cast<std::size_t>(taken_.width);
    const auto height = static_cast<std::size_t>(taken_.height);
    auto shown = std::make_shared<ShownPicture>();
    shown->width = taken_.width;
    shown->height = taken_.height;
    shown->bgra.resize(width * height * 4);
    uint8_t* luma = taken_.bytes.data();
    uint8_t* blue = luma + width * height;
    uint8_t* red = blue + Half(taken_.width) * Half(taken_.height);
    const int chromaPitch = static_cast<int>(Half(taken_.width));
    Yuv420_2_Argb(&header, shown->bgra.data(), luma, blue, red, taken_.width, chromaPitch, chromaPitch);
    return shown;
}

} // namespace movieconv
