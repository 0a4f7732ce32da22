// One stream's codec: packets in, decoded frames out.
#ifndef MOVIECONV_HOST_SOURCE_STREAMDECODER_H
#define MOVIECONV_HOST_SOURCE_STREAMDECODER_H

#include "ffmpeg/AvHandles.h"

#include <cstdint>
#include <functional>

namespace movieconv {

class StreamDecoder {
public:
    /// Takes a frame by moving its content out; false ends the decoding.
    using Sink = std::function<bool(AVFrame& frame)>;

    /// Opens the decoder of a stream with these parameters, whose packets' stamps count in `timeBase`, with
    /// so many threads. Throws SourceError.
    StreamDecoder(const AVCodecParameters& parameters, AVRational timeBase, int threads);

    /// Decodes one packet, or the rest when `packet` is null, and hands every frame to `sink`. Damaged data
    /// is skipped and counted. False when the sink ended it or everything has been decoded. Throws
    /// std::bad_alloc.
    bool Decode(const AVPacket* packet, const Sink& sink);

    /// Packets and frames that were damaged.
    int64_t Damaged() const { return damaged_; }

private:
    bool Receive(const Sink& sink);
    bool Drain(const Sink& sink);

    av::CodecContext context_;
    av::Frame frame_;
    int64_t damaged_ = 0;
};

} // namespace movieconv

#endif
