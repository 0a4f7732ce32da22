#include "writer/StampNormaliser.h"

#include "media/MediaRecords.h"

#include <algorithm>
#include <cstdlib>

namespace writer {
namespace {

/// Sound that may come before the first picture of a file until the file is taken to begin with its sound.
constexpr int64_t kLongestWait = 10 * kTicksPerSecond;

/// How far ahead of all sound a picture can be and still be on the sound's timeline: sound is always written
/// first.
constexpr int64_t kFarthestAhead = kTicksPerSecond / 2;

/// The longest that one picture stands, or sound begins before or after the pictures. A stamp that says more
/// is wrong: following it could take a file of any size.
constexpr int64_t kLongestGap = int64_t{6} * 3600 * kTicksPerSecond;

/// Distance of two stamps. Stamps can be anything; one that is farther off than times can add up to is wrong
/// anyway.
int64_t Step(int64_t from, int64_t to) {
    constexpr int64_t kFarthest = int64_t{1} << 60;
    int64_t step = 0;
    if (__builtin_sub_overflow(to, from, &step))
        step = to > from ? kFarthest : -kFarthest;
    return std::clamp(step, -kFarthest, kFarthest);
}

} // namespace

StampNormaliser::StampNormaliser(int64_t pictureLength, bool hasPictures) : pictureLength_(pictureLength) {
    if (!hasPictures)
        soundStart_ = 0;
}

int64_t StampNormaliser::SoundLength() const {
    // Split, so that the product fits for any byte rate and length.
    const int64_t seconds = segmentBytes_ / bytesPerSecond_;
    const int64_t rest = segmentBytes_ % bytesPerSecond_;
    return segmentStart_ + seconds * kTicksPerSecond + rest * kTicksPerSecond / bytesPerSecond_;
}

void StampNormaliser::AddSound(int64_t stamp, int64_t bytes, int64_t bytesPerSecond, bool silence) {
    if (bytesPerSecond != bytesPerSecond_) {
        segmentStart_ = SoundLength();
        segmentBytes_ = 0;
        bytesPerSecond_ = bytesPerSecond;
    }
    if (!silence)
        reference_ = Reference{stamp, SoundLength()};
    segmentBytes_ += bytes;
    if (!soundStart_ && SoundLength() - lengthAtLast_ > kLongestWait)
        Finish();
}

int64_t StampNormaliser::AddPicture(int64_t stamp) {
    const int64_t time = last_ ? PlaceNext(stamp, *last_) : PlaceFirst(stamp);
    last_ = Picture{stamp, time};
    lengthAtLast_ = SoundLength();
    return time;
}

void StampNormaliser::Finish() {
    if (!soundStart_)
        soundStart_ = 0;
}

int64_t StampNormaliser::PlaceFirst(int64_t stamp) {
    int64_t time = 0;
    if (reference_) {
        time = reference_->position + Step(reference_->stamp, stamp);
        if (std::abs(time) > kLongestGap) {
            time = 0;
            ++repairs_;
        }
        if (!soundStart_)
            soundStart_ = std::max<int64_t>(0, -time);
    } else if (SoundLength() > 0) {
        Finish();
    }
    return std::max<int64_t>(0, time);
}

int64_t StampNormaliser::PlaceNext(int64_t stamp, const Picture& before) {
    const int64_t continued = Continue(stamp, before);
    if (!reference_) {
        if (!soundStart_ && SoundLength() > 0)
            soundStart_ = std::max<int64_t>(0, continued - SoundLength());
        return continued;
    }
    const int64_t fromStart = reference_->position + Step(reference_->stamp, stamp);
    if (!soundStart_) {
        // The first picture after sound in this file; those before carried another timeline, so its own step
        // is unknown.
        const int64_t time = before.time + pictureLength_;
        const int64_t gap = time - fromStart;
        soundStart_ = gap > kLongestGap ? 0 : std::max<int64_t>(0, gap);
        ++repairs_;
        return time;
    }
    const int64_t ideal = *soundStart_ + fromStart;
    if (ideal > *soundStart_ + SoundLength() + kFarthestAhead) {
        repairs_ += continued == ideal ? 0 : 1;
        return continued;
    }
    // A picture that should already have been shown catches up at no more than twice the usual speed.
    const int64_t earliest =
        before.time + std::max<int64_t>(1, std::min(continued - before.time, pictureLength_) / 2);
    repairs_ += ideal < earliest ? 1 : 0;
    return std::max(ideal, earliest);
}

/// The time that keeps the picture's step from the one before; a step that cannot be is replaced by the usual
/// one.
int64_t StampNormaliser::Continue(int64_t stamp, const Picture& before) const {
    const int64_t step = Step(before.stamp, stamp);
    return before.time + (step > 0 && step <= kLongestGap ? step : pictureLength_);
}

} // namespace writer
