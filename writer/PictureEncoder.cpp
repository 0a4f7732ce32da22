#include "writer/PictureEncoder.h"

extern "C" {
#include <libavutil/opt.h>
}

#include <algorithm>
#include <cmath>
#include <string>

namespace writer {
namespace {

/// Longest distance of key frames, for codecs that choose it themselves: as much can be lost when a file is
/// cut off.
constexpr int kKeyFrameSeconds = 5;

/// Speed and quality of the encoders that leave the choice to the caller.
void SetPreset(AVCodecContext& context, const PictureCodec& codec, AVRational rate) {
    if (codec.options == nullptr)
        return;
    av::CheckMemory(av_set_options_string(context.priv_data, codec.options, "=", ","));
    context.gop_size = std::max(1, static_cast<int>(std::lround(av_q2d(rate) * kKeyFrameSeconds)));
}

} // namespace

PictureEncoder::PictureEncoder(const PictureCodec& codec, const PictureSettings& settings, EncoderFlags flags,
                               int ticksPerPicture)
    : ticksPerPicture_(ticksPerPicture),
      context_(NewEncoder(FindEncoder(codec), codec.code, flags)),
      packet_(av::NewPacket()) {
    AVCodecContext& context = *context_;
    context.width = settings.width;
    context.height = settings.height;
    context.pix_fmt = settings.format;
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
    SetPreset(context, codec, settings.rate);
    OpenEncoder(context, codec.code,
                "pictures of " + std::to_string(settings.width) + "x" + std::to_string(settings.height) +
                    " at " + std::to_string(av_q2d(settings.rate)) + " a second and " +
                    std::to_string(settings.bitrate) + " bits a second");
}

void PictureEncoder::Encode(AVFrame& frame, int64_t tick, const PacketTaker& take) {
    ticks_.push_back(tick);
    frame.pts = nextIndex_++;
    frame.pict_type = AV_PICTURE_TYPE_NONE;
    Send(&frame, take);
}

void PictureEncoder::Finish(const PacketTaker& take) {
    Send(nullptr, take);
}

void PictureEncoder::Send(AVFrame* frame, const PacketTaker& take) {
    writer::Encode(*context_, frame, *packet_, [&](AVPacket& packet) {
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

int64_t PictureEncoder::TickOf(int64_t index) const {
    // Decoding starts before the first picture is shown when a codec reorders pictures.
    if (index < firstIndex_)
        return ticks_.front() - (firstIndex_ - index) * ticksPerPicture_;
    return ticks_.at(static_cast<size_t>(index - firstIndex_));
}

} // namespace writer
