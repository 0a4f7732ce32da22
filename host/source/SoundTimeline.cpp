#include "host/source/SoundTimeline.h"

#include "host/source/MediaTime.h"

#include <algorithm>
#include <cstdlib>

extern "C" {
#include <libavutil/mathematics.h>
}

namespace movieconv {

SoundTimeline::Placement SoundTimeline::Place(std::optional<int64_t> stamp, int64_t samples) {
    Placement placement;
    if (stamp) {
        const int64_t offset = av_rescale(*stamp - begin_, sampleRate_, kTicksPerSecond) - position_;
        if (position_ == 0 || IsGap(offset)) {
            placement.silence = std::max<int64_t>(offset, 0);
            placement.cut = std::clamp<int64_t>(-offset, 0, samples);
        }
    }
    position_ += placement.silence + samples - placement.cut;
    return placement;
}

int64_t SoundTimeline::FillTo(int64_t time) {
    const int64_t silence =
        std::max<int64_t>(av_rescale(time - begin_, sampleRate_, kTicksPerSecond) - position_, 0);
    position_ += silence;
    return silence;
}

/// Whether a frame that lies `offset` samples ahead of the timeline's end really does.
bool SoundTimeline::IsGap(int64_t offset) {
    constexpr int64_t kRoundingParts = 40; // of a second
    if (std::abs(offset) * kRoundingParts <= sampleRate_) {
        suspected_.reset();
        return false;
    }
    const bool large = std::abs(offset) > sampleRate_;
    const bool confirmed = !large || (suspected_ && std::abs(offset - *suspected_) * 2 <= sampleRate_);
    suspected_ = large ? std::optional(offset) : std::nullopt;
    corrections_ += confirmed ? 1 : 0;
    return confirmed;
}

} // namespace movieconv
