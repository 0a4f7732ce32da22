#include "writer/SoundStage.h"

#include "writer/MediaTime.h"

#include <algorithm>
#include <optional>
#include <utility>

namespace writer {
namespace {

/// Blocks come in stretches of about 50 ms, so that this is about a second of sound.
constexpr size_t kMostBlocks = 20;
constexpr size_t kMostBytes = size_t{16} << 20;

} // namespace

SoundStage::SoundStage(const AudioPlan& plan, EncoderFlags flags, bool fillsStart)
    : fillsStart_(fillsStart),
      encoder_(*plan.codec, plan.settings, flags),
      converter_(Encoder().sample_rate, Encoder().ch_layout, Encoder().sample_fmt),
      queue_(kMostBlocks, kMostBytes,
             {L"MediaWriter::The conversion waits for the sound encoder",
              L"MediaWriter::The sound encoder waits for the conversion"}) {}

SoundStage::~SoundStage() {
    Cancel();
    Join();
}

void SoundStage::Start(int64_t start, PacketTaker take, Encoded encoded, StageFailure failed) {
    take_ = std::move(take);
    encoded_ = std::move(encoded);
    thread_ = std::thread([this, start, failed = std::move(failed)] {
        try {
            Run(start);
        } catch (...) {
            failed(std::current_exception());
        }
    });
}

bool SoundStage::Push(SoundBlock block) {
    const size_t size = block.data.size();
    return queue_.Push(std::move(block), size);
}

void SoundStage::Join() {
    if (thread_.joinable())
        thread_.join();
}

void SoundStage::Run(int64_t start) {
    int64_t shift = av_rescale(start, Encoder().sample_rate, kUnitsPerSecond);
    if (fillsStart_)
        converter_.PushSilence(std::exchange(shift, 0));
    const PacketTaker take = [this, shift](AVPacket& packet) {
        packet.pts += shift;
        packet.dts += shift;
        take_(packet);
    };
    while (const std::optional<SoundBlock> block = queue_.Pop()) {
        converter_.Push(block->format, block->data.data(), block->data.size());
        EncodeAvailable(encoder_.FrameSize(), take);
    }
    converter_.Finish();
    EncodeAvailable(1, take);
    encoder_.Finish(take);
}

/// Encodes what has been converted in whole frames, as long as there are `least` sample frames.
void SoundStage::EncodeAvailable(int least, const PacketTaker& take) {
    while (converter_.Available() >= least) {
        const av::Frame frame = converter_.Take(std::min(converter_.Available(), encoder_.FrameSize()));
        const int samples = frame->nb_samples;
        encoder_.Encode(*frame, take);
        encoded_(samples);
    }
}

} // namespace writer
