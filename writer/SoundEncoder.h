// The encoder for sound. It belongs to one thread.
#ifndef MOVIECONV_WRITER_SOUNDENCODER_H
#define MOVIECONV_WRITER_SOUNDENCODER_H

#include "writer/Encoder.h"
#include "writer/FormatTable.h"

#include <cstdint>

namespace writer {

/// Parameters of a sound encoder, as asked for.
struct SoundSettings {
    int sampleRate;
    int channels;
    int bitsPerSample;
    int64_t bitrate;
    int64_t maxBitrate;      ///< Upper rate; 0: no limit.
    const int* sampleRates;  ///< The only ones, ended by 0; null: as the encoder has them.
    uint64_t speakers;       ///< Of the source; see WriterOptions::nChannelMask.
    const uint64_t* layouts; ///< The only ones, ended by 0; null: as the codec has them.
    double maxBits;          ///< Most bits per sample and channel beside the codec's own limit; 0: none.
};

/// Packets carry the time of their first sample, in sample frames since the first one; it can be below 0
/// where a codec needs a run-up.
class SoundEncoder {
public:
    /// Rate and channels are brought to what the codec takes: the nearest higher rate, the layout that keeps
    /// most of the source's.
    /// Throws WriterFailure (kWriterErrorCodec).
    SoundEncoder(const SoundCodec& codec, const SoundSettings& settings, EncoderFlags flags);

    /// Encodes a frame of FrameSize() sample frames; only the last may be shorter. Throws WriterFailure
    /// (kWriterErrorEncode).
    void Encode(AVFrame& frame, const PacketTaker& take);

    /// Hands out what is still inside. Nothing can be encoded afterwards.
    void Finish(const PacketTaker& take);

    int FrameSize() const { return frameSize_; }

    const AVCodecContext& Context() const { return *context_; }

private:
    void Send(AVFrame& frame, const PacketTaker& take);
    bool KeepsTheEnd() const;
    av::Frame FillUp(const AVFrame* beginning) const;

    av::CodecContext context_;
    av::Packet packet_;
    int frameSize_ = 0;
    int64_t samples_ = 0;
};

} // namespace writer

#endif
