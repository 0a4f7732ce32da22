#include "writer/Encoders.h"

#include "writer/WriterFailure.h"
#include "writer/WriterStatus.h"

extern "C" {
#include <libavutil/opt.h>
}

#include <algorithm>
#include <array>
#include <cmath>
#include <cstring>
#include <new>
#include <string>

namespace writer {
namespace {

/// Sample frames in a frame of codecs that take any number.
constexpr int kFreeFrameSize = 1024;

/// Longest distance of key frames, for codecs that choose it themselves: as much can be lost when a file is
/// cut off.
constexpr int kKeyFrameSeconds = 5;

[[noreturn]] void ThrowEncodeFailure(const AVCodecContext& context, int error) {
    av::CheckMemory(error);
    throw WriterFailure(kWriterErrorEncode, std::string("The encoder ") + context.codec->name +
                                                " failed: " + av::ErrorText(error) + ".");
}

av::CodecContext NewContext(const AVCodec* codec, uint32_t code, EncoderFlags flags) {
    if (codec == nullptr)
        throw WriterFailure(kWriterErrorCodec,
                            "This build of FFmpeg cannot encode \"" + CodeText(code) + "\".");
    av::CodecContext context(avcodec_alloc_context3(codec));
    if (!context)
        throw std::bad_alloc();
    if (flags.globalHeader)
        context->flags |= AV_CODEC_FLAG_GLOBAL_HEADER;
    if (flags.bitExact)
        context->flags |= AV_CODEC_FLAG_BITEXACT;
    return context;
}

void Open(AVCodecContext& context, uint32_t code, const std::string& parameters) {
    const int error = avcodec_open2(&context, context.codec, nullptr);
    av::CheckMemory(error);
    if (error < 0)
        throw WriterFailure(kWriterErrorCodec, "The encoder for \"" + CodeText(code) + "\" does not accept " +
                                                   parameters + ": " + av::ErrorText(error) + ".");
}

/// Sends one frame, or null to end, and hands out the packets that are ready.
template <typename Take>
void Pump(AVCodecContext& context, AVFrame* frame, AVPacket& packet, Take take) {
    int error = avcodec_send_frame(&context, frame);
    while (error >= 0) {
        error = avcodec_receive_packet(&context, &packet);
        if (error < 0)
            break;
        take(packet);
        av_packet_unref(&packet);
    }
    if (error < 0 && error != AVERROR(EAGAIN) && error != AVERROR_EOF)
        ThrowEncodeFailure(context, error);
}

/// Speed and quality of the encoders that leave the choice to the caller.
void SetPreset(AVCodecContext& context, AVRational rate) {
    const auto set = [&](const char* name, const char* value) {
        av::CheckMemory(av_opt_set(context.priv_data, name, value, 0));
    };
    const int keyDistance = std::max(1, static_cast<int>(std::lround(av_q2d(rate) * kKeyFrameSeconds)));
    const char* encoder = context.codec->name;
    if (std::strcmp(encoder, "libx264") == 0) {
        set("preset", "fast");
        context.gop_size = keyDistance;
    } else if (std::strcmp(encoder, "libx265") == 0) {
        set("preset", "fast");
        // Frames encoded side by side can wait for each other for ever at the end; rows still are.
        set("x265-params", "log-level=none:frame-threads=1");
        context.gop_size = keyDistance;
    } else if (std::strncmp(encoder, "libvpx", 6) == 0) {
        set("deadline", "good");
        set("cpu-used", "4");
        context.gop_size = keyDistance;
    }
}

int ChooseSampleRate(const AVCodec& codec, int asked, bool flashRates) {
    static constexpr std::array kFlashRates{44100, 22050, 11025, 0};
    const int* rates = flashRates ? kFlashRates.data() : codec.supported_samplerates;
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

bool TakesLayout(const AVCodec& codec, const AVChannelLayout& layout) {
    if (codec.ch_layouts == nullptr)
        return true;
    for (const AVChannelLayout* known = codec.ch_layouts; known->nb_channels != 0; ++known)
        if (av_channel_layout_compare(known, &layout) == 0)
            return true;
    return false;
}

/// The usual layout of the largest number of channels, at most `asked`, that the codec takes; every one in
/// the table takes one channel.
void ChooseLayout(const AVCodec& codec, int asked, AVChannelLayout& layout) {
    for (int channels = asked; channels > 0; --channels) {
        const av::ChannelLayout candidate(channels);
        if (candidate.Get()->order != AV_CHANNEL_ORDER_UNSPEC && TakesLayout(codec, *candidate.Get())) {
            av_channel_layout_copy(&layout, candidate.Get());
            return;
        }
    }
}

AVSampleFormat ChooseSampleFormat(const AVCodec& codec, int bitsPerSample) {
    if (codec.sample_fmts == nullptr)
        return AV_SAMPLE_FMT_S16;
    for (const AVSampleFormat* format = codec.sample_fmts; *format != AV_SAMPLE_FMT_NONE; ++format)
        if (bitsPerSample > 16 && *format == AV_SAMPLE_FMT_S32)
            return *format;
    return codec.sample_fmts[0];
}

int64_t ClampBitrate(const AudioCodec& codec, int64_t asked, const AVCodecContext& context) {
    const double samples = static_cast<double>(context.sample_rate) * context.ch_layout.nb_channels;
    const auto most = static_cast<int64_t>(codec.maxBits * samples);
    const auto least = static_cast<int64_t>(codec.minBits * samples);
    return std::clamp(asked, least, most);
}

} // namespace

VideoEncoder::VideoEncoder(const VideoCodec& codec, const VideoSettings& settings, EncoderFlags flags,
                           int ticksPerPicture)
    : ticksPerPicture_(ticksPerPicture),
      context_(NewContext(FindEncoder(codec), codec.code, flags)),
      packet_(av::NewPacket()) {
    AVCodecContext& context = *context_;
    context.width = settings.width;
    context.height = settings.height;
    context.pix_fmt = codec.fullRange ? AV_PIX_FMT_YUVJ420P : AV_PIX_FMT_YUV420P;
    // Some codecs limit the terms of the rate to 16 bits.
    context.framerate = av_d2q(av_q2d(settings.rate), 60000);
    context.time_base = av_inv_q(context.framerate);
    context.sample_aspect_ratio = settings.sampleAspect;
    context.bit_rate = settings.bitrate;
    if (settings.maxBitrate > 0) {
        context.rc_max_rate = std::max(settings.maxBitrate, settings.bitrate);
        context.rc_buffer_size = static_cast<int>(std::min<int64_t>(context.rc_max_rate * 2, INT32_MAX));
    }
    context.thread_count = settings.threads;
    if (settings.inOrder) {
        context.max_b_frames = 0;
        if (codec.id == AV_CODEC_ID_MPEG2VIDEO) // whose readers otherwise allow for one picture of reordering
            context.flags |= AV_CODEC_FLAG_LOW_DELAY;
    }
    context.color_range = settings.fullRange ? AVCOL_RANGE_JPEG : AVCOL_RANGE_MPEG;
    context.color_primaries = settings.primaries;
    context.color_trc = settings.transfer;
    context.colorspace = settings.matrix;
    SetPreset(context, settings.rate);
    Open(context, codec.code,
         "pictures of " + std::to_string(settings.width) + "x" + std::to_string(settings.height) + " at " +
             std::to_string(av_q2d(settings.rate)) + " a second and " + std::to_string(settings.bitrate) +
             " bits a second");
}

void VideoEncoder::Encode(AVFrame& frame, int64_t tick, const PacketTaker& take) {
    ticks_.push_back(tick);
    frame.pts = nextIndex_++;
    frame.pict_type = AV_PICTURE_TYPE_NONE;
    Send(&frame, take);
}

void VideoEncoder::Finish(const PacketTaker& take) {
    Send(nullptr, take);
}

void VideoEncoder::Send(AVFrame* frame, const PacketTaker& take) {
    Pump(*context_, frame, *packet_, [&](AVPacket& packet) {
        const int64_t decodingIndex = packet.dts;
        packet.pts = TickOf(packet.pts);
        packet.dts = TickOf(decodingIndex);
        packet.duration = ticksPerPicture_;
        take(packet);
        // Nothing that comes later is decoded or shown before this.
        for (; firstIndex_ < decodingIndex; ++firstIndex_)
            ticks_.pop_front();
    });
}

int64_t VideoEncoder::TickOf(int64_t index) const {
    // Decoding starts before the first picture is shown when a codec reorders pictures.
    if (index < firstIndex_)
        return ticks_.front() - (firstIndex_ - index) * ticksPerPicture_;
    return ticks_.at(static_cast<size_t>(index - firstIndex_));
}

AudioEncoder::AudioEncoder(const AudioCodec& codec, const AudioSettings& settings, EncoderFlags flags)
    : context_(NewContext(FindEncoder(codec, settings.bitsPerSample), codec.code, flags)),
      packet_(av::NewPacket()) {
    AVCodecContext& context = *context_;
    const int rate =
        codec.maxSampleRate > 0 ? std::min(settings.sampleRate, codec.maxSampleRate) : settings.sampleRate;
    context.sample_rate = ChooseSampleRate(*context.codec, rate, settings.flashRates);
    context.time_base = {1, context.sample_rate};
    context.sample_fmt = ChooseSampleFormat(*context.codec, settings.bitsPerSample);
    ChooseLayout(*context.codec, std::min(settings.channels, codec.maxChannels), context.ch_layout);
    if (codec.maxBits > 0) {
        context.bit_rate = ClampBitrate(codec, settings.bitrate, context);
        context.rc_max_rate = settings.maxBitrate > 0 ? std::max(settings.maxBitrate, context.bit_rate) : 0;
    }
    context.thread_count = 1;
    Open(context, codec.code,
         "sound of " + std::to_string(context.sample_rate) + " Hz with " +
             std::to_string(context.ch_layout.nb_channels) + " channels at " +
             std::to_string(context.bit_rate) + " bits a second");
    frameSize_ = context.frame_size > 0 ? context.frame_size : kFreeFrameSize;
}

void AudioEncoder::Encode(AVFrame& frame, const PacketTaker& take) {
    frame.pts = samples_;
    samples_ += frame.nb_samples;
    Pump(*context_, &frame, *packet_, take);
}

void AudioEncoder::Finish(const PacketTaker& take) {
    Pump(*context_, nullptr, *packet_, take);
}

} // namespace writer
