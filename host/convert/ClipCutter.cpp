#include "host/convert/ClipCutter.h"

#include "host/source/MediaTime.h"
#include "host/source/SoundBlock.h"
#include "host/source/SourceTime.h"

#include <algorithm>
#include <limits>

namespace movieconv {
namespace {

constexpr int64_t kNever = std::numeric_limits<int64_t>::max();
constexpr int kSilenceBlocksPerSecond = 100;

int64_t FrameBytes(const AudioFormat& format) {
    return int64_t{format.nChannels} * format.nBitsPerSample / 8;
}

} // namespace

ClipCutter::ClipCutter(Movie& movie, double begin, std::optional<double> clipLength)
    : movie_(movie),
      clipLength_(clipLength && movie.Pictures() != nullptr ? std::optional(ToMediaTime(*clipLength))
                                                            : std::nullopt),
      begin_(ToMediaTime(begin)),
      end_(begin_ + clipLength_.value_or(0)),
      soundTime_(begin_) {}

void ClipCutter::BeginAt(int64_t base) {
    Begin(base);
    soundTime_ = base;
    movie_.Pictures()->Seek(ToSeconds(base), 1);
    if (movie_.Sound() != nullptr)
        movie_.Sound()->Seek(ToSeconds(base));
}

void ClipCutter::Begin(int64_t base) {
    base_ = base;
    end_ = begin_ + ((base_ - begin_) / *clipLength_ + 1) * *clipLength_;
    first_ = false;
}

bool ClipCutter::Next() {
    const bool reached = clipLength_ && picturesDone_ && movie_.TimeOfNextPicture().has_value();
    if (!reached || movie_.Pictures()->DecodeNext(1) < 1)
        return false;
    Begin(movie_.Pictures()->GetCurrentImage()->llTime);
    picturesDone_ = false;
    movie_.Beside().EndFileAt(BesideBounds::kOpen);
    return true;
}

double ClipCutter::Offset() const {
    return first_ ? 0 : ToSeconds(base_ - begin_);
}

int64_t ClipCutter::Samples(int64_t duration) const {
    const AudioFormat& format = movie_.Sound()->GetAudioInfo()->format;
    return (duration * format.nSampleRate + kTicksPerSecond / 2) / kTicksPerSecond;
}

int64_t ClipCutter::Duration(int64_t samples) const {
    return samples * kTicksPerSecond / movie_.Sound()->GetAudioInfo()->format.nSampleRate;
}

/// Up to where the sound belongs into this clip, as far as that is known: a block that reaches beyond the
/// clip's nominal end is not handed out before the first picture from there on is known.
int64_t ClipCutter::SoundEnd() {
    const std::optional<int64_t> next = movie_.TimeOfNextPicture();
    if (!next)
        return kNever; // no clip follows
    if (*next >= end_)
        return *next;
    return std::max(end_, soundTime_ + Duration(1));
}

bool ClipCutter::TakeSound() {
    if (left_.nLength > 0)
        return true;
    const AudioFrame* block = soundEnded_ ? nullptr : movie_.Sound()->GetNextFrame();
    if (block == nullptr || block->nLength <= 0) {
        soundEnded_ = true;
        return MakeSilence(); // the engine makes none for a clip that has no sound of its own
    }
    left_ = *block;
    soundTime_ = left_.llTime;
    return true;
}

/// Sound up to the end of the pictures. False when it is there already.
bool ClipCutter::MakeSilence() {
    const AudioFormat& format = movie_.Sound()->GetAudioInfo()->format;
    int64_t samples = std::max(format.nSampleRate / kSilenceBlocksPerSecond, 1);
    if (picturesDone_ && !movie_.TimeOfNextPicture())
        samples = std::min(samples, Samples(pictureEnd_ - soundTime_));
    if (samples <= 0)
        return false;
    silence_.assign(static_cast<std::size_t>(samples * FrameBytes(format)), 0);
    left_ = BlockOf(format, kMediaTypeSilence);
    left_.pData = silence_.data();
    left_.nLength = left_.nBufferSize = static_cast<int32_t>(silence_.size());
    return true;
}

VideoSourceInfo* ClipCutter::CutPictures::GetVideoInfo() {
    return owner_.movie_.Pictures()->GetVideoInfo();
}

double ClipCutter::CutPictures::Seek(double seconds, int mode) {
    return owner_.first_ ? owner_.movie_.Pictures()->Seek(seconds, mode) : seconds;
}

VideoImage* ClipCutter::CutPictures::GetCurrentImage() {
    const VideoImage* image = owner_.picturesDone_ ? nullptr : owner_.movie_.Pictures()->GetCurrentImage();
    if (image == nullptr) {
        owner_.picturesDone_ = true;
        return nullptr;
    }
    owner_.pictureEnd_ = image->llTime + image->nDuration;
    image_ = *image;
    image_.llTime -= owner_.base_;
    image_.llTime2 -= owner_.base_;
    return &image_;
}

int ClipCutter::CutPictures::DecodeNext(int mode) {
    const std::optional<int64_t> next = owner_.movie_.TimeOfNextPicture();
    if (next && *next >= owner_.end_) { // it stays where it is until Next
        owner_.picturesDone_ = true;
        owner_.movie_.Beside().EndFileAt(*next);
    } else if (owner_.movie_.Pictures()->DecodeNext(mode) < 1) {
        owner_.picturesDone_ = true;
    }
    return owner_.picturesDone_ ? 0 : 1;
}

AudioSourceInfo* ClipCutter::CutSound::GetAudioInfo() {
    return owner_.movie_.Sound()->GetAudioInfo();
}

double ClipCutter::CutSound::Seek(double seconds) {
    return owner_.first_ ? owner_.movie_.Sound()->Seek(seconds) : seconds;
}

AudioFrame* ClipCutter::CutSound::GetNextFrame() {
    if (!owner_.TakeSound())
        return nullptr;
    AudioFrame& left = owner_.left_;
    const int64_t frameBytes = FrameBytes(owner_.movie_.Sound()->GetAudioInfo()->format);
    int64_t samples = left.nLength / frameBytes;
    if (owner_.soundTime_ + owner_.Duration(samples) > owner_.end_) {
        const int64_t end = owner_.SoundEnd();
        if (end != kNever)
            samples = std::clamp<int64_t>(owner_.Samples(end - owner_.soundTime_), 0, samples);
    }
    if (samples <= 0)
        return nullptr; // the rest is the next clip's
    block_ = left;
    block_.nLength = static_cast<int32_t>(samples * frameBytes);
    block_.nDuration = static_cast<int32_t>(owner_.Duration(samples));
    block_.llTime = block_.llTime2 = owner_.soundTime_ - owner_.base_;
    TellSourceTime(block_.reserved, owner_.soundTime_); // it may be the rest of a block
    left.pData += block_.nLength;
    left.nLength -= block_.nLength;
    left.nBufferSize -= block_.nLength;
    owner_.soundTime_ += owner_.Duration(samples);
    return &block_;
}

} // namespace movieconv
