#include "host/source/SoundDecoder.h"

#include "host/source/MediaTime.h"
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

AVSampleFormat OutputFormat(const AudioFormat& sound) {
    return sound.nBitsPerSample == 32 ? AV_SAMPLE_FMT_S32 : AV_SAMPLE_FMT_S16;
}

/// A layout with places for its channels: some sources tell only how many there are.
void CopyLayout(AVChannelLayout& target, const AVChannelLayout& source) {
    if (source.order == AV_CHANNEL_ORDER_UNSPEC) {
        av_channel_layout_uninit(&target);
        av_channel_layout_default(&target, source.nb_channels);
    } else {
        av_channel_layout_copy(&target, &source);
    }
}

} // namespace

SoundDecoder::SoundDecoder(const Source& source, Demuxer& demuxer, Failures& failures)
    : reader_(source.Reader()),
      demuxer_(demuxer),
      failures_(failures),
      stream_(source.SoundStream()->index),
      timeBase_(source.SoundStream()->time_base),
      decoder_(*source.SoundStream()->codecpar, timeBase_, 1),
      inputForm_(av::NewFrame()),
      queue_(1 << 12,
             static_cast<std::size_t>(source.Info().sound->sampleRate) *
                 static_cast<std::size_t>(source.Info().sound->channels) * 2 / kQueuesPerSecond,
             {L"Movie::The sound decoder waits for the conversion",
              L"Movie::The conversion waits for the sound decoder"}) {
    const SoundStreamInfo& sound = *source.Info().sound;
    frameBytes_ = static_cast<int64_t>(sound.channels) * sound.bitsPerSample / 8;
    blockBytes_ = BlockSamples(source.Info()) * frameBytes_;
    info_.format = {sound.sampleRate, sound.channels, sound.bitsPerSample,
                    static_cast<int32_t>(sound.sampleRate * frameBytes_),
                    std::max(sound.duration, kShortestTold)};
    CopyLayout(*outputLayout_.Get(), source.SoundStream()->codecpar->ch_layout);
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

AudioFrame* SoundDecoder::GetNextFrame() {
    if (!thread_.joinable() &&
        !failures_.Attempt([this] { thread_ = std::thread(&SoundDecoder::Run, this); }))
        return nullptr;
    while (used_ == static_cast<int64_t>(current_.size())) {
        std::optional<Chunk> next = queue_.Pop();
        if (!next)
            return nullptr;
        current_ = std::move(*next);
        used_ = 0;
    }
    const int64_t left = static_cast<int64_t>(current_.size()) - used_;
    const int64_t bytes = std::min(left, blockBytes_);
    const AudioFormat& format = info_.format;
    block_ = {};
    block_.nType = kMediaTypeSound;
    block_.nSampleRate = format.nSampleRate;
    block_.nChannels = format.nChannels;
    block_.nBitsPerSample = format.nBitsPerSample;
    block_.pData = current_.data() + used_;
    block_.nLength = static_cast<int32_t>(bytes);
    block_.nBufferSize = static_cast<int32_t>(left);
    block_.llTime = block_.llTime2 =
        begin_ + av_rescale(samplesDelivered_, kTicksPerSecond, format.nSampleRate);
    TellSourceTime(block_.reserved, block_.llTime);
    block_.nDuration =
        static_cast<int32_t>(av_rescale(bytes / frameBytes_, kTicksPerSecond, format.nSampleRate));
    used_ += bytes;
    samplesDelivered_ += bytes / frameBytes_;
    return &block_;
}

void SoundDecoder::Run() {
    timeline_.emplace(info_.format.nSampleRate, begin_);
    failures_.Attempt([this] { DecodeAll(); });
    ranDry_ = !refused_;
    corrections_ = timeline_->Corrections();
    queue_.Finish();
}

void SoundDecoder::DecodeAll() {
    const auto accept = [this](AVFrame& frame) { return Accept(frame); };
    bool goesOn = true;
    while (goesOn) {
        const auto taken = demuxer_.TakeOrSilence(stream_);
        if (const int64_t* silentUntil = std::get_if<int64_t>(&taken)) {
            goesOn = PushSilence(timeline_->FillTo(*silentUntil));
            continue;
        }
        const av::Packet& packet = std::get<av::Packet>(taken);
        goesOn = decoder_.Decode(packet.get(), accept) && packet;
        if (begin_ > 0 && timeline_->Position() == 0)
            damagedBefore_ = decoder_.Damaged();
        damaged_ = decoder_.Damaged() - damagedBefore_;
    }
    if (resampler_)
        PushPlaced(std::nullopt, Resample(nullptr));
}

bool SoundDecoder::Accept(const AVFrame& frame) {
    if (frame.nb_samples <= 0 || !FitResampler(frame))
        return true;
    std::optional<int64_t> stamp;
    if (frame.best_effort_timestamp != AV_NOPTS_VALUE)
        stamp = reader_.MediaTime(frame.best_effort_timestamp, timeBase_);
    return PushPlaced(stamp, Resample(&frame));
}

/// Makes a resampler for the frame's form if the last frame had another one. False when there is none for it.
bool SoundDecoder::FitResampler(const AVFrame& frame) {
    const bool fits = resampler_ && frame.format == inputForm_->format &&
                      frame.sample_rate == inputForm_->sample_rate &&
                      frame.ch_layout.nb_channels == inputForm_->ch_layout.nb_channels;
    if (fits)
        return true;
    if (resampler_)
        PushPlaced(std::nullopt, Resample(nullptr));
    inputForm_->format = frame.format;
    inputForm_->sample_rate = frame.sample_rate;
    CopyLayout(inputForm_->ch_layout, frame.ch_layout);
    SwrContext* resampler = resampler_.release();
    int result = swr_alloc_set_opts2(
        &resampler, outputLayout_.Get(), OutputFormat(info_.format), info_.format.nSampleRate,
        &inputForm_->ch_layout, static_cast<AVSampleFormat>(frame.format), frame.sample_rate, 0, nullptr);
    resampler_.reset(resampler);
    if (result >= 0)
        result = swr_init(resampler_.get());
    if (result < 0) {
        resampler_.reset();
        av::CheckMemory(result);
    }
    return result >= 0;
}

/// The frame's samples in the engine's form; without a frame, what the resampler still holds.
SoundDecoder::Chunk SoundDecoder::Resample(const AVFrame* frame) {
    const int inputSamples = frame != nullptr ? frame->nb_samples : 0;
    const int room = swr_get_out_samples(resampler_.get(), inputSamples);
    if (room <= 0)
        return {};
    Chunk chunk(static_cast<std::size_t>(room * frameBytes_));
    uint8_t* output = chunk.data();
    const auto** input = frame != nullptr ? const_cast<const uint8_t**>(frame->extended_data) : nullptr;
    const int samples = swr_convert(resampler_.get(), &output, room, input, inputSamples);
    av::CheckMemory(samples);
    chunk.resize(static_cast<std::size_t>(std::max(samples, 0) * frameBytes_));
    return chunk;
}

/// Queues the samples at their place on the timeline. False when nobody takes them any more.
bool SoundDecoder::PushPlaced(std::optional<int64_t> stamp, const Chunk& chunk) {
    const auto placement = timeline_->Place(stamp, static_cast<int64_t>(chunk.size()) / frameBytes_);
    if (!PushSilence(placement.silence))
        return false;
    return Push(Chunk(chunk.begin() + placement.cut * frameBytes_, chunk.end()));
}

bool SoundDecoder::PushSilence(int64_t samples) {
    while (samples > 0) {
        const int64_t part = std::min<int64_t>(samples, info_.format.nSampleRate / 10 + 1);
        if (!Push(Chunk(static_cast<std::size_t>(part * frameBytes_))))
            return false;
        samples -= part;
    }
    return true;
}

bool SoundDecoder::Push(Chunk chunk) {
    const std::size_t bytes = chunk.size();
    refused_ = bytes > 0 && !queue_.Push(std::move(chunk), bytes);
    return !refused_;
}

} // namespace movieconv
