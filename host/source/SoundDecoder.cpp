#include "host/source/SoundDecoder.h"

#include "host/source/SoundBlock.h"
#include "host/source/SourceTime.h"

#include <algorithm>

namespace movieconv {
namespace {

constexpr int kBlocksPerSecond = 100;
constexpr int kSmallestBlock = 16;          // samples
constexpr std::size_t kQueuesPerSecond = 3; // the packets of pictures wait as long as sound is decoded ahead

/// Samples in one block: 10 ms, and always less than half a picture, so that pictures and sound interleave
/// finely.
int BlockSamples(const SourceInfo& info) {
    int samples = info.sound->sampleRate / kBlocksPerSecond;
    if (info.pictures) {
        const double halfPicture = info.sound->sampleRate / info.pictures->frameRate / 2;
        samples = std::min(samples, static_cast<int>(halfPicture) - 1);
    }
    return std::max(samples, kSmallestBlock);
}

} // namespace

SoundDecoder::SoundDecoder(const Source& source, Demuxer& demuxer, Failures& failures)
    : demuxer_(demuxer),
      failures_(failures),
      stream_(source.SoundStream()->index),
      besidePictures_(source.Info().pictures.has_value()),
      decoder_(source.Reader(), *source.SoundStream(), *source.Info().sound,
               {[this](PcmDecoder::Chunk chunk) { return PushSound(std::move(chunk)); },
                [this](int64_t samples) { return PushSilence(samples); }}),
      queue_(1 << 12,
             static_cast<std::size_t>(source.Info().sound->sampleRate) *
                 static_cast<std::size_t>(source.Info().sound->channels) * 2 / kQueuesPerSecond,
             {L"Movie::The sound decoder waits for the conversion",
              L"Movie::The conversion waits for the sound decoder"}) {
    info_.format = decoder_.Format();
    frameBytes_ = decoder_.FrameBytes();
    blockBytes_ = BlockSamples(source.Info()) * frameBytes_;
    info_.format.dDuration = std::max(source.Info().sound->duration, kShortestTold);
}

SoundDecoder::~SoundDecoder() {
    Stop();
    demuxer_.Stop();
    if (thread_.joinable())
        thread_.join();
}

double SoundDecoder::Seek(double seconds) {
    if (!thread_.joinable()) {
        begin_ = ToMediaTime(seconds);
        if (seconds > 0)
            demuxer_.Seek(seconds);
    }
    return seconds;
}

double SoundDecoder::SecondsDelivered() const {
    return static_cast<double>(samplesDelivered_) / info_.format.nSampleRate;
}

/// Of the next block at most; 0 or less where the sound is to end.
int64_t SoundDecoder::MostBytes() const {
    if (!end_)
        return blockBytes_;
    const int64_t samples = SamplesIn(*end_ - begin_, info_.format.nSampleRate);
    return std::min(blockBytes_, (samples - samplesDelivered_) * frameBytes_);
}

AudioFrame* SoundDecoder::GetNextFrame() {
    if (!thread_.joinable() && !failures_.Attempt([this] { thread_ = NewThread([this] { Run(); }); }))
        return nullptr;
    const int64_t most = MostBytes();
    if (most <= 0)
        return nullptr;
    while (used_ == static_cast<int64_t>(current_.size())) {
        std::optional<PcmDecoder::Chunk> next = queue_.Pop();
        if (!next)
            return nullptr;
        current_ = std::move(*next);
        used_ = 0;
    }
    const int64_t left = static_cast<int64_t>(current_.size()) - used_;
    const int64_t bytes = std::min(left, most);
    const AudioFormat& format = info_.format;
    block_ = BlockOf(format, kMediaTypeSound);
    block_.pData = current_.data() + used_;
    block_.nLength = static_cast<int32_t>(bytes);
    block_.nBufferSize = static_cast<int32_t>(left);
    block_.llTime = block_.llTime2 =
        begin_ + av_rescale_rnd(samplesDelivered_, kTicksPerSecond, format.nSampleRate,
                                AV_ROUND_DOWN); // as the writer
    TellSourceTime(block_.reserved, block_.llTime);
    block_.nDuration = static_cast<int32_t>(TimeOfSamples(bytes / frameBytes_, format.nSampleRate));
    used_ += bytes;
    samplesDelivered_ += bytes / frameBytes_;
    return &block_;
}

void SoundDecoder::Run() {
    decoder_.Begin(begin_);
    failures_.Attempt([this] { DecodeAll(); });
    ranDry_ = !refused_;
    corrections_ = decoder_.Corrections();
    channels_ = decoder_.Channels();
    queue_.Finish();
}

void SoundDecoder::DecodeAll() {
    bool goesOn = true;
    while (goesOn) {
        const auto taken = demuxer_.TakeOrSilence(stream_);
        if (const int64_t* silentUntil = std::get_if<int64_t>(&taken)) {
            goesOn = decoder_.FillTo(*silentUntil);
            continue;
        }
        goesOn = decoder_.Decode(std::get<av::Packet>(taken).get());
        damaged_ = decoder_.Damaged();
    }
    // Begun behind the sound's end: a block to say where, or the silence for the pictures would begin at 0.
    if (begin_ > 0 && besidePictures_ && samplesPushed_ == 0)
        Push(PcmDecoder::Chunk(static_cast<std::size_t>(blockBytes_)));
}

bool SoundDecoder::PushSilence(int64_t samples) {
    while (samples > 0) {
        const int64_t part = std::min<int64_t>(samples, info_.format.nSampleRate / 10 + 1);
        if (!Push(PcmDecoder::Chunk(static_cast<std::size_t>(part * frameBytes_))))
            return false;
        samples -= part;
    }
    return true;
}

bool SoundDecoder::PushSound(PcmDecoder::Chunk chunk) {
    const bool isTaken = Push(std::move(chunk));
    decodedTo_ = begin_ + TimeOfSamples(samplesPushed_, info_.format.nSampleRate);
    return isTaken;
}

bool SoundDecoder::Push(PcmDecoder::Chunk chunk) {
    const std::size_t bytes = chunk.size();
    samplesPushed_ += static_cast<int64_t>(bytes) / frameBytes_;
    refused_ = !queue_.Push(std::move(chunk), bytes);
    return !refused_;
}

} // namespace movieconv
