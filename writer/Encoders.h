// The encoders for pictures and for sound. Each belongs to one thread.
#ifndef MOVIECONV_WRITER_ENCODERS_H
#define MOVIECONV_WRITER_ENCODERS_H

#include "ffmpeg/AvHandles.h"
#include "writer/FormatTable.h"

#include <cstdint>
#include <deque>
#include <functional>

namespace writer {

/// Takes one encoded packet; its time stamps are in the unit that the encoder documents.
using PacketTaker = std::function<void(AVPacket&)>;

/// What the container asks of an encoder.
struct EncoderFlags {
    bool globalHeader; ///< Parameters belong into the file's header, not into the stream.
    bool bitExact;
};

/// Parameters of a picture encoder.
struct VideoSettings {
    int width;
    int height;
    AVRational rate;
    AVRational sampleAspect;
    int64_t bitrate;    ///< Bits per second.
    int64_t maxBitrate; ///< Upper rate; 0: no limit.
    int threads;
    bool inOrder;   ///< Pictures are coded in the order in which they are shown.
    bool fullRange; ///< Luma covers 0 to 255.
    AVColorPrimaries primaries;
    AVColorTransferCharacteristic transfer;
    AVColorSpace matrix;
};

/// Parameters of a sound encoder, as asked for.
struct AudioSettings {
    int sampleRate;
    int channels;
    int bitsPerSample;
    int64_t bitrate;
    int64_t maxBitrate; ///< Upper rate; 0: no limit.
    bool flashRates;    ///< Only 11025, 22050 and 44100 Hz.
};

/// The encoder itself only counts pictures, so that its rate control sees a steady rate and no codec's limits
/// on time bases matter; packets carry the ticks that were given with the pictures.
class VideoEncoder {
public:
    /// Throws WriterFailure (kWriterErrorCodec). `ticksPerPicture` is the usual distance of two pictures.
    VideoEncoder(const VideoCodec& codec, const VideoSettings& settings, EncoderFlags flags,
                 int ticksPerPicture);

    /// Encodes a picture that is shown from `tick` on; ticks rise. Throws WriterFailure (kWriterErrorEncode).
    void Encode(AVFrame& frame, int64_t tick, const PacketTaker& take);

    /// Hands out what is still inside. Nothing can be encoded afterwards.
    void Finish(const PacketTaker& take);

    const AVCodecContext& Context() const { return *context_; }

private:
    void Send(AVFrame* frame, const PacketTaker& take);
    int64_t TickOf(int64_t index) const;

    const int ticksPerPicture_;
    av::CodecContext context_;
    av::Packet packet_;
    std::deque<int64_t> ticks_; ///< Ticks of pictures that packets may still name, from firstIndex_ on.
    int64_t firstIndex_ = 0;
    int64_t nextIndex_ = 0;
};

/// Packets carry the time of their first sample, in sample frames since the first one; it can be below 0
/// where a codec needs a run-up.
class AudioEncoder {
public:
    /// Rate and channels are brought to what the codec takes: the nearest higher rate, at most its channels.
    /// Throws WriterFailure (kWriterErrorCodec).
    AudioEncoder(const AudioCodec& codec, const AudioSettings& settings, EncoderFlags flags);

    /// Encodes a frame of FrameSize() sample frames; only the last may be shorter. Throws WriterFailure
    /// (kWriterErrorEncode).
    void Encode(AVFrame& frame, const PacketTaker& take);

    /// Hands out what is still inside. Nothing can be encoded afterwards.
    void Finish(const PacketTaker& take);

    int FrameSize() const { return frameSize_; }

    const AVCodecContext& Context() const { return *context_; }

private:
    av::CodecContext context_;
    av::Packet packet_;
    int frameSize_ = 0;
    int64_t samples_ = 0;
};

} // namespace writer

#endif
