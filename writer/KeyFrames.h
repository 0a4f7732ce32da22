// Where an encoder that counts pictures is asked for a key frame.
#ifndef MOVIECONV_WRITER_KEYFRAMES_H
#define MOVIECONV_WRITER_KEYFRAMES_H

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <deque>

namespace writer {

/// Encoders make a key frame after so many pictures at the latest. Pictures that come seldom would leave much
/// time between two of them, in which a player cannot begin and a fragment of a file does not end.
class KeyFrames {
public:
    /// `pictures`: the encoder's own greatest distance of two key frames. `most`: what it is to be in ticks.
    /// Up to a picture more, as long as usual, is let pass: whole pictures seldom fill a time exactly.
    KeyFrames(int pictures, int64_t ticksPerPicture, int64_t most)
        : pictures_(static_cast<std::size_t>(std::max(1, pictures))), most_(most + ticksPerPicture) {}

    /// Whether the picture of `tick` has to be a key frame although the encoder may not make it one by
    /// itself. Once for every picture, in order.
    bool IsDue(int64_t tick) {
        if (recent_.empty())
            latest_ = tick;
        // One of the recent ones is a key frame.
        const bool isDue = !recent_.empty() && tick - recent_.front() > most_ && tick - latest_ > most_;
        if (isDue)
            latest_ = tick;
        recent_.push_back(tick);
        if (recent_.size() > pictures_)
            recent_.pop_front();
        return isDue;
    }

private:
    const std::size_t pictures_;
    const int64_t most_;
    std::deque<int64_t> recent_; ///< Ticks of as many pictures.
    int64_t latest_ = 0;         ///< Of the key frame that was asked for last, or the first picture.
};

} // namespace writer

#endif
