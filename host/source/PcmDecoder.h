// One stream of sound: packets in, PCM in its place on the source's clock out.
#ifndef MOVIECONV_HOST_SOURCE_PCMDECODER_H
#define MOVIECONV_HOST_SOURCE_PCMDECODER_H

#include "host/source/PacketReader.h"
#include "host/source/SoundTimeline.h"
#include "host/source/SourceInfo.h"
#include "host/source/StreamDecoder.h"
#include "media/MediaRecords.h"

#include <cstdint>
#include <functional>
#include <optional>
#include <vector>

namespace movieconv {

/// For one thread.
class PcmDecoder {
public:
    using Chunk = std::vector<uint8_t>; ///< Whole samples, interleaved, 16 or 32 bits.

    /// Takes what is decoded, in its order; false ends the decoding.
    struct Sink {
        std::function<bool(Chunk chunk)> sound;       ///< Not empty.
        std::function<bool(int64_t samples)> silence; ///< More than none.
    };

    /// `reader` outlives it, `stream` is read here only. Throws SourceError.
    PcmDecoder(const PacketReader& reader, const AVStream& stream, const SoundStreamInfo& sound, Sink sink);

    const AudioFormat& Format() const { return format_; }
    int64_t FrameBytes() const { return frameBytes_; }

    /// Where the first sample lies, in media time. Once, before everything else.
    void Begin(int64_t begin);

    /// Decodes a packet, or the rest when it is null. False when the sink ended it, or with the rest.
    bool Decode(const AVPacket* packet);

    /// Silence up to that media time. False when the sink ended it.
    bool FillTo(int64_t time);

    /// Packets and frames that were damaged, but for those before the begin, where a seek may land amid one.
    int64_t Damaged() const { return decoder_.Damaged() + unconverted_ - damagedBefore_; }

    /// Of the frames that had most of them.
    int Channels() const { return channels_; }

    /// Gaps filled and overlaps cut.
    int Corrections() const { return timeline_ ? timeline_->Corrections() : 0; }

private:
    bool Accept(const AVFrame& frame);
    bool FitResampler(const AVFrame& frame);
    Chunk Resample(const AVFrame* frame);
    bool PushPlaced(std::optional<int64_t> stamp, Chunk chunk);
    bool PushDoubted(std::optional<int64_t> witness);
    bool Push(std::optional<int64_t> stamp, const Chunk& chunk, std::optional<int64_t> witness);

    const PacketReader& reader_;
    const Sink sink_;
    const AVRational timeBase_;
    AudioFormat format_{};
    int64_t frameBytes_; // of one sample of all channels
    int64_t begin_ = 0;
    StreamDecoder decoder_;
    av::Resampler resampler_;
    av::ChannelLayout outputLayout_;
    av::Frame inputForm_; // format, rate and layout that the resampler is made for
    std::optional<SoundTimeline> timeline_;
    struct Doubted {
        int64_t stamp;
        Chunk chunk;
    };
    std::optional<Doubted> doubted_; // waits for a witness
    int channels_ = 0;
    int64_t unconverted_ = 0; // frames of a form that there is no resampler for
    int64_t damagedBefore_ = 0;
};

} // namespace movieconv

#endif
