#include "writer/SoundEncoder.h"

#include "ffmpeg/Loudspeakers.h"

#include <algorithm>
#include <array>
#include <bit>
#include <new>
#include <string>
#include <tuple>
#include <vector>

namespace writer {
namespace {

/// Sample frames in a frame of codecs that take any number.
constexpr int kFreeFrameSize = 1024;

/// The nearest of `rates`, ended by 0, that is not below `asked`, else the highest.
int ChooseSampleRate(const int* rates, int asked) {
    if (rates == nullptr)
        return asked;
    int above = 0;
    int highest = 0;
    for (; *rates != 0; ++rates) {
        highest = std::max(highest, *rates);
        if (*rates >= asked && (above == 0 || *rates < above))
            above = *rates;
    }
    return above != 0 ? above : highest;
}

/// What can be chosen; every codec in the table takes one channel. One that takes any gets the usual ones and
/// `wanted`, unless these are loudspeakers of which no file tells.
std::vector<uint64_t> Layouts(const AVCodec& codec, const uint64_t* only, int most, uint64_t wanted) {
    constexpr uint64_t kToldInFiles = (1 << 18) - 1; // from the front left one to the top back right one
    std::vector<uint64_t> layouts;
    if (only != nullptr) {
        for (; *only != 0; ++only)
            layouts.push_back(*only);
    } else if (codec.ch_layouts != nullptr) {
        for (const AVChannelLayout* known = codec.ch_layouts; known->nb_channels != 0; ++known)
            layouts.push_back(av::SpeakersOf(*known));
    } else {
        for (int channels = 1; channels <= most; ++channels)
            layouts.push_back(av::UsualSpeakers(channels));
        if ((wanted & ~kToldInFiles) == 0)
            layouts.push_back(wanted);
    }
    std::erase_if(layouts, [most](uint64_t layout) { return std::popcount(layout) > most; });
    return layouts;
}

/// How much of `wanted` a layout keeps in its place; the deep tones least of all. What comes from behind can
/// come from one loudspeaker as well as from two.
int Kept(uint64_t layout, uint64_t wanted) {
    constexpr uint64_t kBehind = AV_CH_BACK_LEFT | AV_CH_BACK_CENTER;
    layout = av::AlikeSpeakers(layout);
    wanted = av::AlikeSpeakers(wanted);
    const uint64_t kept = layout & wanted;
    const bool behind = (layout & kBehind) != 0 && (wanted & kBehind) != 0;
    return 2 * std::popcount(kept) - ((kept & AV_CH_LOW_FREQUENCY) != 0 ? 1 : 0) + (behind ? 2 : 0);
}

/// The layout that is asked for, or the one of those at hand that keeps most of it, with the fewest channels.
/// Other loudspeakers may stay silent in it, unless a number of channels is asked for.
void ChooseLayout(const AVCodec& codec, const SoundSettings& settings, int most, AVChannelLayout& layout) {
    const bool isSources = std::popcount(settings.speakers) == settings.channels;
    const int channels = isSources ? most : std::min(settings.channels, most);
    uint64_t wanted = av::SpeakersFor(settings.channels, settings.speakers);
    if (wanted == 0) // of which the first two channels are used
        wanted = channels > 1 ? AV_CH_LAYOUT_STEREO : AV_CH_LAYOUT_MONO;
    const auto worth = [wanted](uint64_t one) {
        const int count = std::popcount(one);
        return std::tuple(Kept(one, wanted), one == wanted, -count, one == av::UsualSpeakers(count));
    };
    const std::vector<uint64_t> layouts = Layouts(codec, settings.layouts, channels, wanted);
    const auto best = std::max_element(layouts.begin(), layouts.end(), [&](uint64_t one, uint64_t other) {
        return worth(one) < worth(other);
    });
    av_channel_layout_from_mask(&layout, *best);
}

AVSampleFormat ChooseSampleFormat(const AVCodec& codec, int bitsPerSample, bool lossless) {
    const AVSampleFormat wanted = bitsPerSample > 16 ? AV_SAMPLE_FMT_S32
                                  : lossless         ? AV_SAMPLE_FMT_S16
                                                     : AV_SAMPLE_FMT_NONE;
    if (codec.sample_fmts == nullptr)
        return AV_SAMPLE_FMT_S16;
    for (const AVSampleFormat* format = codec.sample_fmts; *format != AV_SAMPLE_FMT_NONE; ++format)
        if (av_get_packed_sample_fmt(*format) == wanted)
            return *format;
    return codec.sample_fmts[0];
}

/// The lowest rate of MPEG audio layer 2 that is not below `asked`, or the highest; it has no others.
int64_t NearestMp2Rate(int64_t asked, int sampleRate) {
    static constexpr std::array kRates{32, 48, 56, 64, 80, 96, 112, 128, 160, 192, 224, 256, 320, 384};
    static constexpr std::array kRatesBelow32kHz{8, 16, 24, 32, 40, 48, 56, 64, 80, 96, 112, 128, 144, 160};
    const auto& rates = sampleRate < 32000 ? kRatesBelow32kHz : kRates;
    for (const int rate : rates)
        if (rate * 1000 >= asked)
            return rate * 1000;
    return rates.back() * 1000;
}

int64_t ClampBitrate(const SoundCodec& codec, const SoundSettings& settings, const AVCodecContext& context) {
    const double samples = static_cast<double>(context.sample_rate) * context.ch_layout.nb_channels;
    const double bits = settings.maxBits > 0 ? std::min(codec.maxBits, settings.maxBits) : codec.maxBits;
    const auto most = static_cast<int64_t>(bits * samples);
    const auto least = static_cast<int64_t>(codec.minBits * samples);
    return std::clamp(settings.bitrate, least, most);
}

} // namespace

SoundEncoder::SoundEncoder(const SoundCodec& codec, const SoundSettings& settings, EncoderFlags flags)
    : context_(NewEncoder(FindEncoder(codec, settings.bitsPerSample), codec.code, flags)),
      packet_(av::NewPacket()) {
    AVCodecContext& context = *context_;
    const int rate =
        codec.maxSampleRate > 0 ? std::min(settings.sampleRate, codec.maxSampleRate) : settings.sampleRate;
    context.sample_rate = ChooseSampleRate(
        settings.sampleRates != nullptr ? settings.sampleRates : context.codec->supported_samplerates, rate);
    context.time_base = {1, context.sample_rate};
    context.sample_fmt = ChooseSampleFormat(*context.codec, settings.bitsPerSample, codec.maxBits == 0);
    ChooseLayout(*context.codec, settings, codec.maxChannels, context.ch_layout);
    if (codec.maxBits > 0) {
        context.bit_rate = ClampBitrate(codec, settings, context);
        if (codec.id == AV_CODEC_ID_MP2)
            context.bit_rate = NearestMp2Rate(context.bit_rate, context.sample_rate);
        context.rc_max_rate = settings.maxBitrate > 0 ? std::max(settings.maxBitrate, context.bit_rate) : 0;
    }
    context.thread_count = 1;
    OpenEncoder(context, codec.code,
                "sound of " + std::to_string(context.sample_rate) + " Hz with " +
                    std::to_string(context.ch_layout.nb_channels) + " channels at " +
                    std::to_string(context.bit_rate) + " bits a second");
    frameSize_ = context.frame_size > 0 ? context.frame_size : kFreeFrameSize;
}

void SoundEncoder::Encode(AVFrame& frame, const PacketTaker& take) {
    const int samples = frame.nb_samples;
    if (samples < frameSize_ && KeepsTheEnd()) // after a shorter one the encoder would take no more
        Send(*FillUp(&frame), take);
    else
        Send(frame, take);
    samples_ += samples;
}

void SoundEncoder::Send(AVFrame& frame, const PacketTaker& take) {
    frame.pts = samples_;
    writer::Encode(*context_, &frame, *packet_, take);
}

/// Encoders that hold nothing back and yet delay the sound keep its end unless more follows.
bool SoundEncoder::KeepsTheEnd() const {
    return (context_->codec->capabilities & AV_CODEC_CAP_DELAY) == 0 && context_->initial_padding > 0;
}

/// A whole frame that begins with the samples of `beginning`.
av::Frame SoundEncoder::FillUp(const AVFrame* beginning) const {
    av::Frame frame = av::NewFrame();
    const int channels = context_->ch_layout.nb_channels;
    frame->nb_samples = frameSize_;
    frame->format = context_->sample_fmt;
    frame->sample_rate = context_->sample_rate;
    av::CheckMemory(av_channel_layout_copy(&frame->ch_layout, &context_->ch_layout));
    av::CheckMemory(av_frame_get_buffer(frame.get(), 0));
    av_samples_set_silence(frame->extended_data, 0, frameSize_, channels, context_->sample_fmt);
    if (beginning != nullptr)
        av_samples_copy(frame->extended_data, beginning->extended_data, 0, 0, beginning->nb_samples, channels,
                        context_->sample_fmt);
    return frame;
}

void SoundEncoder::Finish(const PacketTaker& take) {
    const int64_t filledUp = (frameSize_ - samples_ % frameSize_) % frameSize_;
    if (samples_ > 0 && KeepsTheEnd() && filledUp < context_->initial_padding) {
        samples_ += filledUp;
        Send(*FillUp(nullptr), take);
    }
    writer::Encode(*context_, nullptr, *packet_, take);
}

} // namespace writer
