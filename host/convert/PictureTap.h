// Takes pictures for display out of a conversion.
#ifndef MOVIECONV_HOST_CONVERT_PICTURETAP_H
#define MOVIECONV_HOST_CONVERT_PICTURETAP_H

#include "host/convert/Observer.h"
#include "host/source/PictureConverter.h"
#include "host/source/PictureFilter.h"
#include "media/MediaRecords.h"

#include <atomic>
#include <chrono>
#include <cstdint>
#include <memory>
#include <mutex>
#include <optional>
#include <vector>

namespace movieconv {

class PictureTap {
public:
    using Clock = std::chrono::steady_clock;
    using Interval = std::optional<std::chrono::milliseconds>;

    explicit PictureTap(Interval interval) { SetInterval(interval); }

    /// The shortest time between two pictures; nothing: none is taken. Any thread.
    void SetInterval(Interval interval) { interval_ = interval ? interval->count() : kNone; }
    bool Wants() const { return interval_ != kNone; }

    /// Which colours the pictures will mean: the source's, or BT.709 where its HDR ones are not kept. Before
    /// the first.
    void Expect(const PictureStreamInfo& source, bool keepsHdr);

    /// Copies a planar 4:2:0 picture unless the last one is too recent; without memory it is not shown. True
    /// when there is one to take now. Any thread.
    bool Offer(const VideoImage& image) noexcept;

    /// Likewise, whenever the last one was.
    void OfferLast(const VideoImage& image) noexcept;

    /// The latest picture that was not taken yet, ready for display; null without one. One thread.
    std::shared_ptr<const ShownPicture> Take();

private:
    static constexpr int64_t kNone = -1;

    struct Planes {
        int width = 0;
        int height = 0;
        bool deep = false;
        std::vector<uint8_t> bytes; // Y, U, V without gaps
    };

    void Copy(const VideoImage& image) noexcept;
    av::Frame Usual(const Planes& planes);
    bool Paint(const AVFrame& picture, uint8_t* bgra);

    std::atomic<int64_t> interval_; // milliseconds
    std::mutex mutex_;
    Planes latest_;
    bool fresh_ = false;
    Clock::time_point offered_{};

    // The taking thread's.
    Planes taken_;
    std::optional<PictureFilter> filter_;
    PictureConverter converter_{PictureStreamInfo{}, SourceChoice{}, false};
    int matrix_ = SWS_CS_ITU601; // FFmpeg's SWS_CS_...
    av::Scaler scaler_;          // where it is another one
};

} // namespace movieconv

#endif
