#include "writer/SoundConverter.h"

#include "ffmpeg/Loudspeakers.h"
#include "writer/WriterFailure.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <new>
#include <string>
#include <utility>

namespace writer {
namespace {

constexpr int kMostChannels = 64;
constexpr int kMostRate = 768'000;
constexpr int kFramesAtOnce = 16384;

AVSampleFormat SampleFormatOf(int bits) {
    switch (bits) {
    case 8:
        return AV_SAMPLE_FMT_U8;
    case 16:
        return AV_SAMPLE_FMT_S16;
    default:
        return AV_SAMPLE_FMT_S32;
    }
}

/// Takes the first `channels` channels; 24-bit samples go into the upper bytes of 32-bit ones.
void Repack(const PcmFormat& format, int channels, const uint8_t* data, int frames,
            std::vector<uint8_t>& out) {
    const size_t fromSize = format.bits / 8;
    const size_t toSize = format.bits == 24 ? 4 : fromSize;
    out.assign(static_cast<size_t>(frames) * channels * toSize, 0);
    uint8_t* to = out.data() + (toSize - fromSize);
    for (int frame = 0; frame < frames; ++frame, data += format.BytesPerFrame())
        for (int channel = 0; channel < channels; ++channel, to += toSize)
            std::copy_n(data + channel * fromSize, fromSize, to);
}

/// At least as many sample frames as the resampler's filter takes in.
int LongestFilter(int from, int to) {
    return 64 + 64 * (from / to);
}

[[noreturn]] void ThrowUnconvertible(const PcmFormat& format, int error) {
    av::CheckMemory(error);
    throw WriterFailure(kWriterErrorEncode, "Sound of " + std::to_string(format.rate) + " Hz with " +
                                                std::to_string(format.channels) + " channels of " +
                                                std::to_string(format.bits) +
                                                " bits cannot be converted: " + av::ErrorText(error) + ".");
}

} // namespace

bool PcmFormat::Valid() const {
    return rate > 0 && rate <= kMostRate && channels > 0 && channels <= kMostChannels &&
           (bits == 8 || bits == 16 || bits == 24 || bits == 32);
}

SoundConverter::SoundConverter(int rate, const AVChannelLayout& layout, AVSampleFormat format,
                               uint64_t speakers)
    : rate_(rate),
      format_(format),
      speakers_(speakers),
      fifo_(av_audio_fifo_alloc(format, layout.nb_channels, 4096)) {
    if (!fifo_ || av_channel_layout_copy(layout_.Get(), &layout) < 0)
        throw std::bad_alloc();
}

size_t SoundConverter::PieceSize(const PcmFormat& format) const {
    const int64_t frames = int64_t{kFramesAtOnce} * format.rate / rate_;
    return static_cast<size_t>(std::max<int64_t>(1, frames) * format.BytesPerFrame());
}

void SoundConverter::Push(const PcmFormat& format, const uint8_t* data, size_t size) {
    if (!(format == source_))
        Prepare(format);
    const auto frameSize = static_cast<size_t>(format.BytesPerFrame());
    if (!rest_.empty()) {
        const size_t missing = std::min(frameSize - rest_.size(), size);
        rest_.insert(rest_.end(), data, data + missing);
        data += missing;
        size -= missing;
        if (rest_.size() < frameSize)
            return;
        const std::vector<uint8_t> whole = std::exchange(rest_, {});
        Convert(whole.data(), 1);
    }
    const size_t frames = size / frameSize;
    for (size_t done = 0; done < frames; done += kFramesAtOnce) {
        const size_t count = std::min<size_t>(kFramesAtOnce, frames - done);
        Convert(data + done * frameSize, static_cast<int>(count));
    }
    rest_.assign(data + frames * frameSize, data + size);
}

void SoundConverter::PushSilence(int64_t samples) {
    while (samples > 0) {
        const int count = static_cast<int>(std::min<int64_t>(samples, kFramesAtOnce));
        const av::Frame frame = NewFrame(count);
        av_samples_set_silence(frame->extended_data, 0, count, layout_.Channels(), format_);
        if (av_audio_fifo_write(fifo_.get(), reinterpret_cast<void**>(frame->extended_data), count) < count)
            throw std::bad_alloc();
        samples -= count;
    }
}

void SoundConverter::Finish() {
    Drain();
    rest_.clear();
    source_ = {};
}

av::Frame SoundConverter::Take(int samples) {
    av::Frame frame = NewFrame(samples);
    if (av_audio_fifo_read(fifo_.get(), reinterpret_cast<void**>(frame->extended_data), samples) < samples)
        throw WriterFailure(kWriterErrorInternal, "The sound buffer holds less than it said.");
    return frame;
}

/// Makes a resampler for `format`; what the one before still holds comes first.
void SoundConverter::Prepare(const PcmFormat& format) {
    Finish();
    int error = MakeResampler(format, av::SpeakersFor(format.channels, speakers_));
    if (error < 0) // nor does FFmpeg mix every layout
        error = MakeResampler(format, av::UsualSpeakers(format.channels));
    if (error < 0)
        ThrowUnconvertible(format, error);
    source_ = format;
    pushed_ = 0;
    made_ = 0;
}

/// For sound of these loudspeakers, or of the first two channels as stereo where those are not known.
int SoundConverter::MakeResampler(const PcmFormat& format, uint64_t speakers) {
    used_ = speakers != 0 ? format.channels : 2;
    av::ChannelLayout source;
    av_channel_layout_from_mask(source.Get(), speakers != 0 ? speakers : AV_CH_LAYOUT_STEREO);
    SwrContext* context = nullptr;
    const int error = swr_alloc_set_opts2(&context, layout_.Get(), format_, rate_, source.Get(),
                                          SampleFormatOf(format.bits), format.rate, 0, nullptr);
    resampler_.reset(context);
    return error < 0 ? error : swr_init(context);
}

void SoundConverter::Convert(const uint8_t* data, int frames) {
    if (source_.bits == 24 || used_ != source_.channels) {
        Repack(source_, used_, data, frames, repacked_);
        data = repacked_.data();
    }
    const av::Frame frame = NewFrame(std::max(1, swr_get_out_samples(resampler_.get(), frames)));
    const uint8_t* const input[AV_NUM_DATA_POINTERS] = {data};
    const int made = swr_convert(resampler_.get(), frame->extended_data, frame->nb_samples,
                                 const_cast<const uint8_t**>(input), frames);
    pushed_ += frames;
    Keep(frame, made);
}

/// Appends what the resampler made, if it made anything.
void SoundConverter::Keep(const av::Frame& frame, int made) {
    if (made < 0)
        ThrowUnconvertible(source_, made);
    if (av_audio_fifo_write(fifo_.get(), reinterpret_cast<void**>(frame->extended_data), made) < made)
        throw std::bad_alloc();
    made_ += made;
}

void SoundConverter::Drain() {
    if (!resampler_)
        return;
    // Sound that is shorter than its filter the resampler would not give out: silence makes it long enough.
    int64_t most = INT64_MAX;
    if (made_ == 0) {
        most = av_rescale_rnd(pushed_, rate_, source_.rate, AV_ROUND_UP);
        if (swr_inject_silence(resampler_.get(), LongestFilter(source_.rate, rate_)) < 0)
            throw std::bad_alloc();
    }
    while (made_ < most) {
        const int left = swr_get_out_samples(resampler_.get(), 0);
        if (left <= 0)
            break;
        const av::Frame frame = NewFrame(left);
        const int made = swr_convert(resampler_.get(), frame->extended_data, left, nullptr, 0);
        Keep(frame, static_cast<int>(std::min<int64_t>(made, most - made_)));
        if (made == 0)
            break;
    }
    resampler_.reset();
}

av::Frame SoundConverter::NewFrame(int samples) const {
    av::Frame frame = av::NewFrame();
    frame->nb_samples = samples;
    frame->format = format_;
    frame->sample_rate = rate_;
    if (av_channel_layout_copy(&frame->ch_layout, layout_.Get()) < 0 ||
        av_frame_get_buffer(frame.get(), 0) < 0)
        throw std::bad_alloc();
    return frame;
}

} // namespace writer
