#include "writer/SoundStage.h"

#include "media/MediaRecords.h"

#include <algorithm>
#include <optional>
#include <utility>

namespace writer {
namespace {

/// Blocks come in stretches of about 50 ms, so that this is about a second of sound.
constexpr size_t kMostBlocks = 20;
constexpr size_t kMostBytes = size_t{16} << 20;

/// Samples of silence before late sound that are held at a time.
constexpr int64_t kSilenceAtOnce = 65536;

} // namespace

SoundStage::SoundStage(const SoundPlan& plan, EncoderFlags flags)
    : plan_(plan),
      encoder_(*plan.codec, plan.settings, flags),
      converter_(Encoder().sample_rate, Encoder().ch_layout, Encoder().sample_fmt, plan.settings.speakers),
      thread_(kMostBlocks, kMostBytes,
              {L"MediaWriter::The conversion waits for the sound encoder",
               L"MediaWriter::The sound encoder waits for the conversion"}) {}

void SoundStage::Start(int64_t start, PacketTaker take, Encoded encoded, StageFailure failed) {
    take_ = std::move(take);
    encoded_ = std::move(encoded);
    thread_.Start([this, start] { Run(start); }, std::move(failed));
}

bool SoundStage::Push(SoundBlock block) {
    const size_t size = block.data.size();
    return thread_.Queue().Push(std::move(block), size);
}

void SoundStage::Run(int64_t start) {
    int64_t shift = av_rescale(start, Encoder().sample_rate, kTicksPerSecond);
    int64_t silence = plan_.fillsStart ? std::exchange(shift, 0) : 0;
    const PacketTaker take = [this, shift](AVPacket& packet) {
        packet.pts += shift;
        packet.dts += shift;
        take_(packet);
    };
    while (silence > 0 && !thread_.Cancelled()) {
        const int64_t part = std::min(silence, kSilenceAtOnce);
        converter_.PushSilence(part);
        EncodeAvailable(encoder_.FrameSize(), take);
        silence -= part;
    }
    while (const std::optional<SoundBlock> block = thread_.Queue().Pop())
        Encode(*block, take);
    converter_.Finish();
    if (plan_.neverEmpty && empty_ && converter_.Available() == 0)
        converter_.PushSilence(1);
    EncodeAvailable(1, take);
    encoder_.Finish(take);
}

/// In pieces: a block of a low rate is far longer in the encoder's samples.
void SoundStage::Encode(const SoundBlock& block, const PacketTaker& take) {
    const size_t pieceSize = converter_.PieceSize(block.format);
    for (size_t done = 0; done < block.data.size() && !thread_.Cancelled(); done += pieceSize) {
        converter_.Push(block.format, block.data.data() + done,
                        std::min(pieceSize, block.data.size() - done));
        EncodeAvailable(encoder_.FrameSize(), take);
    }
}

/// Encodes what has been converted in whole frames, as long as there are `least` sample frames.
void SoundStage::EncodeAvailable(int least, const PacketTaker& take) {
    while (converter_.Available() >= least) {
        const av::Frame frame = converter_.Take(std::min(converter_.Available(), encoder_.FrameSize()));
        const int samples = frame->nb_samples;
        encoder_.Encode(*frame, take);
        empty_ = false;
        encoded_(samples);
    }
}

} // namespace writer
