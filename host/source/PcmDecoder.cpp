#include "host/source/PcmDecoder.h"

#include "host/source/SoundBlock.h"

#include <algorithm>
#include <utility>

namespace movieconv {
namespace {

AVSampleFormat OutputFormat(const AudioFormat& sound) {
    return sound.nBitsPerSample == 32 ? AV_SAMPLE_FMT_S32 : AV_SAMPLE_FMT_S16;
}

/// A layout with places for its channels: some sources tell only how many there are. `known`, of a stream
/// that has as many, tells it then.
void CopyLayout(AVChannelLayout& target, const AVChannelLayout& source,
                const AVChannelLayout* known = nullptr) {
    if (source.order != AV_CHANNEL_ORDER_NATIVE && known != nullptr &&
        known->nb_channels == source.nb_channels) {
        av_channel_layout_copy(&target, known);
    } else if (source.order == AV_CHANNEL_ORDER_UNSPEC) {
        av_channel_layout_uninit(&target);
        av_channel_layout_default(&target, source.nb_channels);
    } else {
        av_channel_layout_copy(&target, &source);
    }
}

} // namespace

PcmDecoder::PcmDecoder(const PacketReader& reader, const AVStream& stream, const SoundStreamInfo& sound,
                       Sink sink)
    : reader_(reader),
      sink_(std::move(sink)),
      timeBase_(stream.time_base),
      frameBytes_(static_cast<int64_t>(sound.channels) * sound.bitsPerSample / 8),
      decoder_(*stream.codecpar, timeBase_, 1),
      inputForm_(av::NewFrame()) {
    format_ = {sound.sampleRate, sound.channels, sound.bitsPerSample,
               static_cast<int32_t>(sound.sampleRate * frameBytes_), sound.duration};
    CopyLayout(*outputLayout_.Get(), stream.codecpar->ch_layout);
}

void PcmDecoder::Begin(int64_t begin) {
    begin_ = begin;
    timeline_.emplace(format_.nSampleRate, begin);
}

bool PcmDecoder::Decode(const AVPacket* packet) {
    const bool goesOn = decoder_.Decode(packet, [this](AVFrame& frame) { return Accept(frame); });
    if (begin_ > 0 && timeline_->Position() == 0)
        damagedBefore_ = decoder_.Damaged() + unconverted_;
    if (packet == nullptr && resampler_)
        PushPlaced(std::nullopt, Resample(nullptr));
    return goesOn && packet != nullptr;
}

bool PcmDecoder::FillTo(int64_t time) {
    if (doubted_ && doubted_->stamp <= time) { // the others have come there, too
        const int64_t samples = static_cast<int64_t>(doubted_->chunk.size()) / frameBytes_;
        if (!PushDoubted(doubted_->stamp + TimeOfSamples(samples, format_.nSampleRate)))
            return false;
    }
    const int64_t samples = timeline_->FillTo(time);
    return samples == 0 || sink_.silence(samples);
}

bool PcmDecoder::Accept(const AVFrame& frame) {
    if (frame.nb_samples <= 0)
        return true;
    if (!FitResampler(frame)) {
        ++unconverted_;
        return true;
    }
    std::optional<int64_t> stamp;
    if (frame.best_effort_timestamp != AV_NOPTS_VALUE)
        stamp = reader_.MediaTime(frame.best_effort_timestamp, timeBase_);
    return PushPlaced(stamp, Resample(&frame));
}

/// Makes a resampler for the frame's form if the last frame had another one. False when there is none for it.
bool PcmDecoder::FitResampler(const AVFrame& frame) {
    av::ChannelLayout layout;
    CopyLayout(*layout.Get(), frame.ch_layout, outputLayout_.Get());
    const bool fits = resampler_ && frame.format == inputForm_->format &&
                      frame.sample_rate == inputForm_->sample_rate &&
                      av_channel_layout_compare(&inputForm_->ch_layout, layout.Get()) == 0;
    if (fits)
        return true;
    if (resampler_)
        PushPlaced(std::nullopt, Resample(nullptr));
    channels_ = std::max(channels_, frame.ch_layout.nb_channels);
    inputForm_->format = frame.format;
    inputForm_->sample_rate = frame.sample_rate;
    av_channel_layout_copy(&inputForm_->ch_layout, layout.Get());
    SwrContext* resampler = resampler_.release();
    int result = swr_alloc_set_opts2(
        &resampler, outputLayout_.Get(), OutputFormat(format_), format_.nSampleRate, &inputForm_->ch_layout,
        static_cast<AVSampleFormat>(frame.format), frame.sample_rate, 0, nullptr);
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
PcmDecoder::Chunk PcmDecoder::Resample(const AVFrame* frame) {
    const int inputSamples = frame != nullptr ? frame->nb_samples : 0;
    const int room = swr_get_out_samples(resampler_.get(), inputSamples);
    if (room <= 0)
        return {};
    Chunk chunk(static_cast<std::size_t>(room * frameBytes_));
    uint8_t* output = chunk.data();
    const auto** input = frame != nullptr ? const_cast<const uint8_t**>(frame->extended_data) : nullptr;
    const int samples = swr_convert(resampler_.get(), &output, room, input, inputSamples);
    av::CheckMemory(samples);
    unconverted_ += samples < 0 ? 1 : 0;
    chunk.resize(static_cast<std::size_t>(std::max(samples, 0) * frameBytes_));
    return chunk;
}

/// Hands out the samples at their place on the timeline, once it is known. False when nobody takes them any
/// more.
bool PcmDecoder::PushPlaced(std::optional<int64_t> stamp, Chunk chunk) {
    if (!PushDoubted(stamp))
        return false;
    if (!timeline_->NeedsWitness(stamp))
        return Push(stamp, chunk, std::nullopt);
    doubted_ = Doubted{*stamp, std::move(chunk)};
    return true;
}

bool PcmDecoder::PushDoubted(std::optional<int64_t> witness) {
    const std::optional<Doubted> doubted = std::exchange(doubted_, std::nullopt);
    return !doubted || Push(doubted->stamp, doubted->chunk, witness);
}

bool PcmDecoder::Push(std::optional<int64_t> stamp, const Chunk& chunk, std::optional<int64_t> witness) {
    const auto placement = timeline_->Place(stamp, static_cast<int64_t>(chunk.size()) / frameBytes_, witness);
    if (placement.silence > 0 && !sink_.silence(placement.silence))
        return false;
    if (placement.cut * frameBytes_ == static_cast<int64_t>(chunk.size()))
        return true;
    return sink_.sound(Chunk(chunk.begin() + placement.cut * frameBytes_, chunk.end()));
}

} // namespace movieconv
