#include "host/source/SoundTimeline.h"

#include "host/source/SoundBlock.h"

#include <algorithm>
#include <cstdlib>

namespace movieconv {

int64_t SoundTimeline::OffsetOf(int64_t stamp) const {
    return SamplesIn(stamp - begin_, sampleRate_) - position_;
}

bool SoundTimeline::NeedsWitness(std::optional<int64_t> stamp) const {
    return stamp && (position_ > 0 ? std::abs(OffsetOf(*stamp)) : OffsetOf(*stamp)) > sampleRate_;
}

SoundTimeline::Placement SoundTimeline::Place(std::optional<int64_t> stamp, int64_t samples,
                                              std::optional<int64_t> witness) {
    Placement placement;
    if (stamp) {
        int64_t offset = OffsetOf(*stamp);
        const bool witnessed = witness && std::abs(OffsetOf(*witness) - offset - samples) * 2 <= sampleRate_;
        if (position_ == 0 && witness && offset > sampleRate_ && !witnessed)
            offset = OffsetOf(*witness) - samples;
        if (position_ == 0 || IsGap(offset, witnessed)) {
            placement.silence = std::max<int64_t>(offset, 0);
            placement.cut = std::clamp<int64_t>(-offset, 0, samples);
        }
    }
    position_ += placement.silence + samples - placement.cut;
    return placement;
}

int64_t SoundTimeline::FillTo(int64_t time) {
    const int64_t silence = std::max<int64_t>(OffsetOf(time), 0);
    position_ += silence;
    return silence;
}

/// Whether a frame that lies `offset` samples ahead of the timeline's end really does.
bool SoundTimeline::IsGap(int64_t offset, bool witnessed) {
    constexpr int64_t kRoundingParts = 40; // of a second
    if (std::abs(offset) * kRoundingParts <= sampleRate_ || (std::abs(offset) > sampleRate_ && !witnessed))
        return false;
    ++corrections_;
    return true;
}

} // namespace movieconv
