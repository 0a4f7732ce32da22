#include "EngineModel.h"

#include <algorithm>
#include <cmath>
#include <optional>

namespace {

constexpr int64_t kSecond = 10'000'000;
constexpr int64_t kFrameBytes = 4;

/// The state that the loop keeps from iteration to iteration, and the calls that it has made.
class Model {
public:
    explicit Model(const ModelSource& source)
        : source_(source), bytesPerSecond_(source.sampleRate * kFrameBytes) {}

    std::vector<ModelClip> Run() {
        const int count =
            source_.pictureTimes.empty() ? source_.pictures : static_cast<int>(source_.pictureTimes.size());
        for (int picture = 0; picture < count; ++picture) {
            if (clips_.empty() || clipClosed_)
                OpenClip();
            WritePicture(picture);
            if (source_.splitMilliseconds > 0 &&
                static_cast<int>((position_ - clipStart_) * 1000.0) >= source_.splitMilliseconds)
                CloseClip();
        }
        if (clipClosed_)
            OpenClip();
        while (!soundDone_ && ReadSound(0)) {
        }
        return clips_;
    }

private:
    int64_t Rounded(int64_t time) const {
        return (time + source_.stampRounding / 2) / source_.stampRounding * source_.stampRounding;
    }

    int64_t PictureTime(int picture) const {
        return source_.pictureTimes.empty() ? std::llround(picture * 1e7 / source_.fps)
                                            : source_.pictureTimes[static_cast<size_t>(picture)];
    }

    void OpenClip() {
        clips_.emplace_back();
        clipClosed_ = false;
    }

    void CloseClip() {
        clipClosed_ = true;
        clipStart_ = position_;
        audioOut_ = 0;
        audioBytes_ = 0;
    }

    void WritePicture(int picture) {
        const int64_t time = PictureTime(picture);
        const int64_t stamp = Rounded(time);
        if (!soundDone_) {
            while (audioSource_ < stamp && ReadSound(stamp)) {
            }
        } else {
            WriteSilence(stamp);
        }
        clips_.back().push_back({true, false, stamp + videoShift_, time, 0});
    }

    /// One block of real sound; false at its end.
    bool ReadSound(int64_t picture) {
        const auto total = static_cast<int64_t>(source_.soundSeconds * source_.sampleRate);
        const int64_t samples = std::min<int64_t>(source_.blockSamples, total - samplesRead_);
        if (samples <= 0) {
            soundDone_ = true;
            return false;
        }
        const int64_t time = source_.soundOffset + samplesRead_ * kSecond / source_.sampleRate;
        const int64_t stamp = Rounded(time);
        if (!origin_) {
            origin_ = stamp - picture;
            audioOut_ = *origin_;
        }
        const int64_t bytes = samples * kFrameBytes;
        clips_.back().push_back({false, false, audioOut_, time, bytes});
        position_ += static_cast<double>(bytes) / static_cast<double>(bytesPerSecond_);
        audioSource_ = stamp;
        videoShift_ = audioOut_ - stamp;
        audioBytes_ += bytes;
        audioOut_ = audioBytes_ * kSecond / bytesPerSecond_ + *origin_;
        samplesRead_ += samples;
        return true;
    }

    void WriteSilence(int64_t picture) {
        const int64_t gap = picture - audioSource_;
        for (int64_t covered = 0; covered < gap;) {
            const int64_t step = std::min<int64_t>(gap - covered, 400'000);
            const int64_t bytes =
                std::llround(static_cast<double>(step) / 1e7 * static_cast<double>(bytesPerSecond_));
            clips_.back().push_back({false, true, audioOut_ + covered, 0, bytes});
            audioBytes_ += bytes;
            audioSource_ += step;
            covered += step;
        }
        if (gap > 0) {
            audioOut_ += gap;
            position_ += static_cast<double>(gap) / 1e7;
        }
    }

    const ModelSource& source_;
    const int64_t bytesPerSecond_;
    std::vector<ModelClip> clips_;
    bool clipClosed_ = false;
    bool soundDone_ = false;
    std::optional<int64_t> origin_;
    int64_t audioOut_ = -1;
    int64_t audioSource_ = -1;
    int64_t videoShift_ = 0;
    int64_t audioBytes_ = 0;
    int64_t samplesRead_ = 0;
    double position_ = 0;
    double clipStart_ = 0;
};

} // namespace

std::vector<ModelClip> RunEngineModel(const ModelSource& source) {
    return Model(source).Run();
}
