#include "host/source/CueDrawer.h"
#include "host/source/MediaTime.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <limits>
#include <utility>

namespace movieconv {
namespace {

constexpr int kPixelBytes = 4;

struct SubtitleFree {
    void operator()(AVSubtitle* subtitle) const {
        avsubtitle_free(subtitle);
        delete subtitle;
    }
};

/// How what was made for pictures of one size lies in those of another.
struct Placement {
    double scaleX;
    double scaleY;
    double offsetX;
    double offsetY;
};

/// Pictures of another shape than the subtitles were made for are taken for a part of those.
Placement PlacementFor(int madeWidth, int madeHeight, int width, int height) {
    constexpr double kSameShape = 0.02;
    Placement place{static_cast<double>(width) / madeWidth, static_cast<double>(height) / madeHeight, 0, 0};
    if (std::abs(place.scaleX / place.scaleY - 1) > kSameShape) {
        place.scaleX = place.scaleY = std::max(place.scaleX, place.scaleY);
        place.offsetX = (width - madeWidth * place.scaleX) / 2;
        place.offsetY = (height - madeHeight * place.scaleY) / 2;
    }
    return place;
}

/// Moved into `length` from where it sticks out, as far as there is room.
int Inside(int begin, int size, int length) {
    return std::max(0, std::min(begin, length - size));
}

class BitmapDrawer final : public CueDrawer {
public:
    BitmapDrawer(CueList list, PictureStreamInfo pictures)
        : list_(std::move(list)),
          pictures_(std::move(pictures)),
          decoder_(list_.OpenDecoder({1, kTicksPerSecond})) {}

    bool Changes(int64_t time) override {
        Advance(time);
        const bool isShown = latest_ && from_ <= time && time < until_;
        const bool changes = isShown != shown_ || (isShown && fresh_);
        shown_ = isShown;
        if (isShown)
            fresh_ = false;
        return changes;
    }

    Canvas Draw(int64_t /*time*/) override {
        if (!shown_)
            return {};
        std::vector<uint8_t> all(static_cast<std::size_t>(Width()) * static_cast<std::size_t>(Height()) *
                                 kPixelBytes);
        for (unsigned i = 0; i < latest_->num_rects; ++i)
            Lay(*latest_->rects[i], all);
        Canvas canvas = Trimmed(all.data(), Width() * kPixelBytes, Width(), Height());
        canvas.x = Inside(canvas.x - pictures_.crop.left, canvas.width, pictures_.width);
        canvas.y = Inside(canvas.y - pictures_.crop.top, canvas.height, pictures_.height);
        return canvas;
    }

    int64_t NextChange(int64_t time) override {
        Advance(time);
        int64_t next = next_ < list_.cues.size() ? list_.cues[next_].begin : kNever;
        for (const int64_t change : {from_, until_})
            if (latest_ && change > time)
                next = std::min(next, change);
        return next;
    }

private:
    void Advance(int64_t time) {
        for (; next_ < list_.cues.size() && list_.cues[next_].begin <= time; ++next_)
            Decode(list_.cues[next_]);
    }

    /// Of the whole pictures.
    int Width() const { return pictures_.width + pictures_.crop.left + pictures_.crop.right; }
    int Height() const { return pictures_.height + pictures_.crop.top + pictures_.crop.bottom; }

    void Decode(const CueList::Cue& cue) {
        constexpr int64_t kMillisecond = kTicksPerSecond / 1000;
        std::unique_ptr<AVSubtitle, SubtitleFree> decoded(new AVSubtitle{});
        int got = 0;
        av::CheckMemory(avcodec_decode_subtitle2(decoder_.get(), decoded.get(), &got, cue.packet.get()));
        if (got == 0)
            return;
        from_ = cue.begin + decoded->start_display_time * kMillisecond;
        const bool ends = decoded->end_display_time > decoded->start_display_time &&
                          decoded->end_display_time != std::numeric_limits<uint32_t>::max();
        until_ = cue.end > cue.begin ? cue.end
                 : ends              ? cue.begin + decoded->end_display_time * kMillisecond
                                     : std::numeric_limits<int64_t>::max();
        latest_ = std::move(decoded);
        fresh_ = true;
    }

    /// Scales a bitmap and lays it over what is there already.
    void Lay(const AVSubtitleRect& rect, std::vector<uint8_t>& all) {
        if (rect.type != SUBTITLE_BITMAP || rect.w <= 0 || rect.h <= 0 || rect.data[0] == nullptr ||
            rect.data[1] == nullptr)
            return;
        const Placement place =
            PlacementFor(decoder_->width > 0 ? decoder_->width : Width(),
                         decoder_->height > 0 ? decoder_->height : Height(), Width(), Height());
        const int width = std::clamp(static_cast<int>(std::lround(rect.w * place.scaleX)), 1, Width());
        const int height = std::clamp(static_cast<int>(std::lround(rect.h * place.scaleY)), 1, Height());
        const std::vector<uint8_t> pixels = Scaled(Colours(rect), rect.w, rect.h, width, height);
        const int left = static_cast<int>(std::lround(rect.x * place.scaleX + place.offsetX));
        const int top = static_cast<int>(std::lround(rect.y * place.scaleY + place.offsetY));
        const int x = Inside(left, width, Width());
        const int y = Inside(top, height, Height());
        for (int row = 0; row < height; ++row) {
            const uint8_t* from = &pixels[static_cast<std::size_t>(row * width) * kPixelBytes];
            uint8_t* to = &all[(static_cast<std::size_t>(y + row) * static_cast<std::size_t>(Width()) +
                                static_cast<std::size_t>(x)) *
                               kPixelBytes];
            for (int i = 0; i < width * kPixelBytes; ++i) {
                const int rest = 255 - from[i / kPixelBytes * kPixelBytes + 3];
                to[i] = static_cast<uint8_t>(std::min(from[i] + (to[i] * rest + 127) / 255, 255));
            }
        }
    }

    /// Of the palette's numbers, multiplied by their opacity.
    static std::vector<uint8_t> Colours(const AVSubtitleRect& rect) {
        std::vector<uint8_t> pixels;
        pixels.reserve(static_cast<std::size_t>(rect.w) * static_cast<std::size_t>(rect.h) * kPixelBytes);
        const auto* palette = reinterpret_cast<const uint32_t*>(rect.data[1]);
        for (int y = 0; y < rect.h; ++y) {
            const uint8_t* row = rect.data[0] + static_cast<std::ptrdiff_t>(rect.linesize[0]) * y;
            for (int x = 0; x < rect.w; ++x) {
                const uint32_t colour = palette[row[x]];
                const uint32_t opacity = colour >> 24;
                for (const int shift : {16, 8, 0})
                    pixels.push_back(static_cast<uint8_t>(((colour >> shift & 0xFF) * opacity + 127) / 255));
                pixels.push_back(static_cast<uint8_t>(opacity));
            }
        }
        return pixels;
    }

    std::vector<uint8_t> Scaled(std::vector<uint8_t> pixels, int width, int height, int newWidth,
                                int newHeight) {
        if (width == newWidth && height == newHeight)
            return pixels;
        scaler_.reset(sws_getCachedContext(scaler_.release(), width, height, AV_PIX_FMT_RGBA, newWidth,
                                           newHeight, AV_PIX_FMT_RGBA, SWS_BILINEAR, nullptr, nullptr,
                                           nullptr));
        std::vector<uint8_t> scaled(static_cast<std::size_t>(newWidth) * static_cast<std::size_t>(newHeight) *
                                    kPixelBytes);
        if (!scaler_)
            return scaled;
        const uint8_t* from[] = {pixels.data(), nullptr, nullptr, nullptr};
        uint8_t* to[] = {scaled.data(), nullptr, nullptr, nullptr};
        const int fromPitch[] = {width * kPixelBytes, 0, 0, 0};
        const int toPitch[] = {newWidth * kPixelBytes, 0, 0, 0};
        sws_scale(scaler_.get(), from, fromPitch, 0, height, to, toPitch);
        return scaled;
    }

    const CueList list_;
    const PictureStreamInfo pictures_;
    av::CodecContext decoder_;
    av::Scaler scaler_;
    std::size_t next_ = 0;
    std::unique_ptr<AVSubtitle, SubtitleFree> latest_;
    int64_t from_ = 0;
    int64_t until_ = 0;
    bool fresh_ = false; // not drawn yet
    bool shown_ = false;
};

} // namespace

std::unique_ptr<CueDrawer> MakeBitmapDrawer(CueList list, const PictureStreamInfo& pictures) {
    return std::make_unique<BitmapDrawer>(std::move(list), pictures);
}

} // namespace movieconv
