// Keeps sound on the source's clock: says how much silence to put in, or how much to leave out, before each
// frame.
#ifndef MOVIECONV_HOST_SOURCE_SOUNDTIMELINE_H
#define MOVIECONV_HOST_SOURCE_SOUNDTIMELINE_H

#include <cstdint>
#include <optional>

namespace movieconv {

/// The timeline is a count of samples from the begin time on. Stamps that are off by less than 25 ms are the
/// container's rounding and change nothing; larger gaps are filled and overlaps cut. A single wild stamp is
/// ignored.
class SoundTimeline {
public:
    struct Placement {
        int64_t silence = 0; ///< Samples of silence to put in before the frame.
        int64_t cut = 0;     ///< Samples to leave out at the frame's start, at most its length.
    };

    /// `begin` is the time of sample 0, in media time.
    SoundTimeline(int sampleRate, int64_t begin) : sampleRate_(sampleRate), begin_(begin) {}

    /// Whether the frame of that stamp is to be held back until the next one is known: it lies more than a
    /// second beside the timeline's end, or ahead of its beginning, where a single wild stamp would be.
    bool NeedsWitness(std::optional<int64_t> stamp) const;

    /// Places a frame of so many samples with its stamp in media time, nothing when it has none. `witness`:
    /// the stamp of the next one, by which a step of more than a second is believed. The first frame is
    /// believed without one, and lies before a witness that contradicts it.
    Placement Place(std::optional<int64_t> stamp, int64_t samples,
                    std::optional<int64_t> witness = std::nullopt);

    /// Samples of silence up to that media time, which it takes for placed. 0 when it is past.
    int64_t FillTo(int64_t time);

    /// Samples on the timeline so far.
    int64_t Position() const { return position_; }

    /// Gaps filled and overlaps cut after the first frame.
    int Corrections() const { return corrections_; }

private:
    int64_t OffsetOf(int64_t stamp) const;
    bool IsGap(int64_t offset, bool witnessed);

    const int sampleRate_;
    const int64_t begin_;
    int64_t position_ = 0;
    int corrections_ = 0;
};

} // namespace movieconv

#endif
