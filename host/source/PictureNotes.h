// What a coded picture tells beside its pixels and no conversion passes on.
#ifndef MOVIECONV_HOST_SOURCE_PICTURENOTES_H
#define MOVIECONV_HOST_SOURCE_PICTURENOTES_H

#include <atomic>

extern "C" {
#include <libavutil/frame.h>
}

namespace movieconv {

/// Collects them from decoded pictures. One thread looks, any thread asks.
class PictureNotes {
public:
    void Look(const AVFrame& frame);

    /// Whether there were closed captions that say something; broadcasts without captions carry empty ones.
    bool Captioned() const { return captioned_; }

    /// Whether the pictures hold the views of both eyes.
    bool Stereoscopic() const { return stereoscopic_; }

    /// Of the largest picture, as stored.
    int Width() const { return width_; }
    int Height() const { return height_; }

private:
    std::atomic<bool> captioned_{false};
    std::atomic<bool> stereoscopic_{false};
    std::atomic<int> width_{0};
    std::atomic<int> height_{0};
};

} // namespace movieconv

#endif
