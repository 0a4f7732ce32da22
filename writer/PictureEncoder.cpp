#include "writer/PictureEncoder.h"

#include "writer/WriterFailure.h"

extern "C" {
#include <libavutil/imgutils.h>
#include <libavutil/opt.h>
}

#include <algorithm>
#include <array>
#include <cmath>
#include <new>
#include <string>
#include <utility>

namespace writer {
namespace {

/// Longest distance of key frames, for codecs that choose it themselves: as much can be lost when a file is
/// cut off.
constexpr int kKeyFrameSeconds = 5;

void SetOption(AVCodecContext& context, const char* name, const std::string& value) {
    av::CheckMemory(av_opt_set(&context, name, value.c_str(), AV_OPT_SEARCH_CHILDREN));
}

/// Options as the table has them, the encoder's own and those that all have.
void SetOptions(AVCodecContext& context, const std::string& options) {
    for (std::size_t at = 0; at < options.size();) {
        const std::size_t end = std::min(options.find(',', at), options.size());
        const std::size_t equals = options.find('=', at);
        SetOption(context, options.substr(at, equals - at).c_str(),
                  options.substr(equals + 1, end - equals - 1));
        at = end + 1;
    }
}

/// The parameters of x265 among `options`, with what it is to say about the light.
std::string LightParameters(const std::string& options, const HdrLight& light) {
    std::string parameters = options.substr(options.find('=') + 1);
    if (light.display)
        parameters += ":master-display=" + MasteringText(*light.display);
    if (light.brightestPixel > 0 || light.brightestPicture > 0)
        parameters +=
            ":max-cll=" + std::to_string(light.brightestPixel) + "," + std::to_string(light.brightestPicture);
    return parameters;
}

/// With AVX-512, x264 reads memory that nobody wrote where a row of macroblocks is no multiple of eight, and
/// what was there before decides about bits. The code for AVX2 is as fast and gives what every processor
/// does.
void LeaveOutAvx512([[maybe_unused]] AVCodecContext& context) {
#if defined(__x86_64__) || defined(__i386__)
    if (__builtin_cpu_supports("avx512f"))
        SetOption(context, "x264-params", "asm=avx2");
#endif
}

void SetSpeed(AVCodecContext& context, const SpeedScale& scale, const PictureSettings& settings) {
    if (scale.option == nullptr)
        return;
    SetOption(context, scale.option, scale.values.at(static_cast<std::size_t>(settings.speed)));
    context.gop_size = std::max(1, static_cast<int>(std::lround(av_q2d(settings.rate) * kKeyFrameSeconds)));
}

/// Those that can choose otherwise make a key frame that was asked for one where decoding can begin.
void SetKeyFrames(AVCodecContext& context) {
    constexpr const char* kOption = "forced-idr";
    if (av_opt_find(context.priv_data, kOption, nullptr, 0, 0) != nullptr)
        SetOption(context, kOption, "1");
}

/// The rate beside a constant quality, which the upper one limits and the usual one does not.
int64_t RateBeside(const QualityScale& scale, const PictureSettings& settings) {
    constexpr double kUncodedBits = 12; // of a pixel: what no quality needs
    constexpr double kMost = 1e9;       // that encoders reckon with
    const int64_t upper = std::max<int64_t>(settings.maxBitrate, 0);
    switch (scale.kind) {
    case QualityKind::kQuantiser:
        return upper > 0 ? std::min<int64_t>(upper, settings.bitrate) : settings.bitrate;
    case QualityKind::kCappedCrf:
        return upper > 0 ? upper
                         : std::llround(std::min(kMost, kUncodedBits * settings.width * settings.height *
                                                            av_q2d(settings.rate)));
    case QualityKind::kLimitedCrf:
        return upper;
    case QualityKind::kNone:
    case QualityKind::kCrf:
        break;
    }
    return 0;
}

/// Pictures a second, as many as the encoder takes.
double RateTold(const PictureCodec& codec, const PictureSettings& settings) {
    const double rate = av_q2d(settings.rate);
    return codec.mostTold > 0 ? std::min(rate, codec.mostTold) : rate;
}

/// Where the encoder is told fewer pictures a second, each is to get no more bits for it.
void SetRates(AVCodecContext& context, const PictureCodec& codec, const PictureSettings& settings) {
    const double share = RateTold(codec, settings) / av_q2d(settings.rate);
    const auto told = [&](int64_t rate) { return std::llround(static_cast<double>(rate) * share); };
    context.bit_rate = told(settings.quality ? RateBeside(codec.quality, settings) : settings.bitrate);
    if (settings.maxBitrate <= 0)
        return;
    context.rc_max_rate = std::max<int64_t>(told(settings.maxBitrate), context.bit_rate);
    context.rc_buffer_size = static_cast<int>(std::min<int64_t>(context.rc_max_rate * 2, INT32_MAX));
    // SVT-AV1 takes equal ones for a constant rate, which it has only where pictures are coded in their
    // order.
    if (codec.id == AV_CODEC_ID_AV1 && context.rc_max_rate == context.bit_rate)
        ++context.rc_max_rate;
}

void SetQuality(AVCodecContext& context, const QualityScale& scale, double quality) {
    if (scale.kind == QualityKind::kQuantiser) {
        context.flags |= AV_CODEC_FLAG_QSCALE;
        context.global_quality = static_cast<int>(std::lround(FF_QP2LAMBDA * quality));
    } else if (scale.kind != QualityKind::kNone) {
        SetOption(context, "crf", std::to_string(quality));
    }
}

/// With these options of the codec. Throws WriterFailure.
av::CodecContext OpenWith(const PictureCodec& codec, const PictureSettings& settings, EncoderFlags flags,
                          const char* options) {
    av::CodecContext opened = NewEncoder(FindEncoder(codec), codec.code, flags);
    AVCodecContext& context = *opened;
    context.width = settings.width;
    context.height = settings.height;
    context.pix_fmt = settings.format;
    // Some codecs limit the terms of the rate to 16 bits.
    context.framerate = av_d2q(RateTold(codec, settings), 60000);
    context.time_base = av_inv_q(context.framerate);
    context.sample_aspect_ratio = settings.sampleAspect;
    SetRates(context, codec, settings);
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
    SetOptions(context, options);
    if (codec.id == AV_CODEC_ID_H264)
        LeaveOutAvx512(context);
    if (settings.light && codec.id == AV_CODEC_ID_HEVC) // which also tells it in its own stream
        SetOption(context, "x265-params", LightParameters(options, *settings.light));
    SetSpeed(context, codec.speed, settings);
    SetKeyFrames(context);
    if (settings.profile != nullptr)
        SetOption(context, "profile", settings.profile);
    if (settings.quality)
        SetQuality(context, codec.quality, *settings.quality);
    OpenEncoder(context, codec.code,
                "pictures of " + std::to_string(settings.width) + "x" + std::to_string(settings.height) +
                    " at " + std::to_string(av_q2d(settings.rate)) + " a second and " +
                    std::to_string(settings.bitrate) + " bits a second");
    return opened;
}

av::CodecContext OpenAsTaken(const PictureCodec& codec, const PictureSettings& settings, EncoderFlags flags) {
    try {
        return OpenWith(codec, settings, flags, codec.options);
    } catch (const WriterFailure&) {
        if (codec.otherOptions == nullptr)
            throw;
    }
    return OpenWith(codec, settings, flags, codec.otherOptions);
}

/// SVT-AV1 is never closed unless it has had a picture: it waits for what it would make of it.
void EndWithABlackPicture(AVCodecContext& context, AVPacket& packet) noexcept {
    try {
        const av::Frame picture = av::NewFrame();
        picture->format = context.pix_fmt;
        picture->width = context.width;
        picture->height = context.height;
        av::CheckMemory(av_frame_get_buffer(picture.get(), 0));
        std::array<ptrdiff_t, 4> pitches{};
        std::copy_n(picture->linesize, pitches.size(), pitches.begin());
        av_image_fill_black(picture->data, pitches.data(), context.pix_fmt, context.color_range,
                            context.width, context.height);
        writer::Encode(context, picture.get(), packet, [](AVPacket&) {});
        writer::Encode(context, nullptr, packet, [](AVPacket&) {});
    } catch (...) { // nothing is lost by it
    }
}

} // namespace

PictureEncoder::PictureEncoder(const PictureCodec& codec, const PictureSettings& settings, EncoderFlags flags,
                               int ticksPerPicture, bool isCut)
    : ticksPerPicture_(ticksPerPicture),
      context_(OpenAsTaken(codec, settings, flags)),
      packet_(av::NewPacket()),
      keyFrames_(context_->gop_size, ticksPerPicture,
                 std::llround(av_q2d(settings.rate) * ticksPerPicture * kKeyFrameSeconds)),
      holds_(isCut) {}

PictureEncoder::~PictureEncoder() {
    if (!HasBegun() && context_->codec_id == AV_CODEC_ID_AV1)
        EndWithABlackPicture(*context_, *packet_);
}

void PictureEncoder::Encode(AVFrame& frame, int64_t tick, int64_t stay, const PacketTaker& take) {
    if (HasAll())
        return;
    ticks_.push_back(tick);
    stay_ = stay;
    if (!waiting_.empty())
        waiting_.front()->duration = std::min<int64_t>(ticksPerPicture_, tick - waiting_.front()->pts);
    HandOutWaiting(take);
    frame.pts = nextIndex_++;
    frame.pict_type = keyFrames_.IsDue(tick) ? AV_PICTURE_TYPE_I : AV_PICTURE_TYPE_NONE;
    frame.quality = context_->global_quality;
    if (!holds_)
        return Send(&frame, take);
    av::Frame next = av::CopyOf(frame);
    SendHeld(take);
    held_ = std::move(next);
}

/// Nothing before the cut may build on what lies behind it: so the last picture is of the kind that builds on
/// earlier ones only, before which no later one is coded.
void PictureEncoder::CutHere(const PacketTaker& take) {
    const bool isKeyFrame = held_ && (held_->pts == 0 || held_->pict_type == AV_PICTURE_TYPE_I);
    if (held_ && !isKeyFrame) // which builds on none
        held_->pict_type = AV_PICTURE_TYPE_P;
    SendHeld(take);
    holds_ = false;
    cut_ = nextIndex_;
}

void PictureEncoder::Finish(const PacketTaker& take) {
    SendHeld(take);
    if (HasBegun() && !HasAll())
        Send(nullptr, take);
    // Where a file knows only how long it is until the next picture is decoded, the one decoded last tells
    // it.
    if (!cut_ && !waiting_.empty())
        waiting_.back()->duration = stay_;
    HandOutWaiting(take);
}

/// Whether a picture has reached the encoder.
bool PictureEncoder::HasBegun() const {
    return nextIndex_ > (held_ ? 1 : 0);
}

bool PictureEncoder::HasAll() const {
    return cut_ && handedOut_ == *cut_;
}

void PictureEncoder::SendHeld(const PacketTaker& take) {
    if (held_)
        Send(held_.get(), take);
    held_.reset();
}

void PictureEncoder::Send(AVFrame* frame, const PacketTaker& take) {
    writer::Encode(*context_, frame, *packet_, [&](AVPacket& packet) {
        const int64_t decodingIndex = packet.dts;
        if (cut_ && packet.pts >= *cut_)
            return;
        ++handedOut_;
        const bool isLatest = packet.pts == nextIndex_ - 1;
        packet.duration = StayOf(packet.pts);
        packet.pts = TickOf(packet.pts);
        packet.dts = TickOf(decodingIndex);
        if (frame == nullptr)
            HandOutWaiting(take);
        if (frame == nullptr || isLatest || !waiting_.empty())
            Wait(packet);
        else
            take(packet);
        // Nothing that comes later is decoded or shown before this.
        for (; firstIndex_ < decodingIndex; ++firstIndex_)
            ticks_.pop_front();
    });
}

void PictureEncoder::Wait(AVPacket& packet) {
    waiting_.push_back(av::NewPacket());
    av_packet_move_ref(waiting_.back().get(), &packet);
}

void PictureEncoder::HandOutWaiting(const PacketTaker& take) {
    for (; !waiting_.empty(); waiting_.pop_front())
        take(*waiting_.front());
}

/// In ticks; of the picture that came last as if it were the movie's.
int64_t PictureEncoder::StayOf(int64_t index) const {
    return index == nextIndex_ - 1 ? stay_
                                   : std::min<int64_t>(ticksPerPicture_, TickOf(index + 1) - TickOf(index));
}

int64_t PictureEncoder::TickOf(int64_t index) const {
    // Decoding starts before the first picture is shown when a codec reorders pictures.
    if (index < firstIndex_)
        return ticks_.front() - (firstIndex_ - index) * ticksPerPicture_;
    return ticks_.at(static_cast<size_t>(index - firstIndex_));
}

} // namespace writer
