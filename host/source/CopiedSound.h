// A stream of sound that goes into the output as it is coded.
#ifndef MOVIECONV_HOST_SOURCE_COPIEDSOUND_H
#define MOVIECONV_HOST_SOURCE_COPIEDSOUND_H

#include "host/source/BesideTrack.h"
#include "host/source/SoundTimeline.h"

#include <cstdint>
#include <deque>
#include <memory>
#include <optional>

struct AVVorbisParseContext;

namespace movieconv {

/// Each packet goes into the file within which it begins: nothing is lost and nothing comes twice where one
/// file ends and the next one begins. Only sound that is not compressed is cut to the sample. The packets lie
/// behind each other, as long as the source's stamps do not tell of a gap.
class CopiedSound final : public BesideTrack {
public:
    CopiedSound(const PacketReader& reader, const AVStream& stream, Demuxer& demuxer,
                const BesideBounds& bounds, Failures& failures);
    ~CopiedSound() override;

    /// What describes the packets: with what decoders need for them, and in `initial_padding` the samples
    /// before those that are heard, where the first file begins with the source. Waits for the first packet;
    /// the bounds and where reading begins are settled. Throws SourceError.
    const AVCodecParameters& Describe();

private:
    struct Held {
        av::Packet packet;
        int64_t begin = 0; ///< In samples from the start of the source.
        int64_t samples = 0;
    };
    class Deframer;

    bool Find(int64_t until, bool closing, Item& item) override;
    bool Cut(Held& first, int64_t until, bool closing);
    void Hold(av::Packet packet);
    bool HasOtherRate(const AVPacket& packet);
    void SettleDoubted(std::optional<int64_t> witness);
    void Settle(Held held, std::optional<int64_t> witness);
    bool Place(Held& held, std::optional<int64_t> witness);
    std::optional<int64_t> StampOf(const Held& held) const;
    int64_t RunUp(const AVPacket& first) const;
    int64_t Samples(const AVPacket& packet);
    int64_t SamplesAt(int64_t time) const;
    int64_t TimeOf(int64_t samples) const;

    const PacketReader& reader_;
    Demuxer& demuxer_;
    const int stream_;
    const AVRational timeBase_;
    av::CodecParameters parameters_;
    const int64_t sampleBytes_; ///< Of one sample of all channels; 0 where it is compressed.
    std::unique_ptr<Deframer> deframer_;
    struct VorbisParserFree {
        void operator()(AVVorbisParseContext* parser) const;
    };
    std::unique_ptr<AVVorbisParseContext, VorbisParserFree> vorbis_;
    std::optional<int> rate_; ///< As the packets tell it.
    std::optional<SoundTimeline> timeline_;
    int64_t origin_ = 0;          ///< Of the timeline, in samples from the start of the source.
    std::optional<Held> doubted_; ///< Waits for a witness.
    std::deque<Held> pending_;
    Held current_; ///< Handed out last.
};

} // namespace movieconv

#endif
