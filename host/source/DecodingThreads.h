// How many threads decode the pictures.
#ifndef MOVIECONV_HOST_SOURCE_DECODINGTHREADS_H
#define MOVIECONV_HOST_SOURCE_DECODINGTHREADS_H

#include "ffmpeg/AvHandles.h"
#include "host/source/ProcessorUse.h"

#include <optional>
#include <vector>

namespace movieconv {

/// Unless the stream is heavy, one thread decodes at first. It costs the least and is mostly enough: the
/// encoder is slower. When the queue keeps running empty, the decoder is the slower one and gets the other
/// processors too, if the program leaves them idle: as soon as that is known, since all is decoded again. The
/// decoding thread's own.
class DecodingThreads {
public:
    /// `bitsPerPixel` of the coded stream, 0 when it is not known.
    explicit DecodingThreads(double bitsPerPixel);

    /// Whether the count may still change.
    bool OnTrial() const { return trial_.has_value(); }

    /// How many to begin with.
    int Count() const { return trial_ ? 1 : Many(); }

    /// For a decoder that is the slower side: more than processors, since they wait for each other.
    static int Many();

    /// The decoding begins now.
    void Begin() { use_ = {}; }

    /// A picture goes to the queue, which is empty before it or not.
    void OnPicture(bool queueIsEmpty);

    /// Call after each packet, while on trial. When it says that Many() threads pay, all packets so far, to
    /// be decoded again; then and when they do not, the trial is over.
    std::optional<std::vector<av::Packet>> Consider(const AVPacket& packet);

private:
    std::optional<std::vector<av::Packet>> trial_; // packets since the start
    int pictures_ = 0;
    int starved_ = 0;
    ProcessorUse use_; // since the warm-up, of the decoding thread
};

} // namespace movieconv

#endif
