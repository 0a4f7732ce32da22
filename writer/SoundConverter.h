// Brings interleaved PCM of any rate, channel count and sample size to the encoder's format, cut into its
// frames.
#ifndef MOVIECONV_WRITER_SOUNDCONVERTER_H
#define MOVIECONV_WRITER_SOUNDCONVERTER_H

#include "ffmpeg/AvHandles.h"

#include <cstddef>
#include <cstdint>
#include <vector>

namespace writer {

/// Interleaved little-endian PCM as AudioFrame describes it: 8 bits unsigned, 16, 24 or 32 bits signed.
struct PcmFormat {
    int rate = 0;
    int channels = 0;
    int bits = 0;

    bool operator==(const PcmFormat&) const = default;
    bool Valid() const;
    int BytesPerFrame() const { return channels * bits / 8; }
    int64_t BytesPerSecond() const { return static_cast<int64_t>(BytesPerFrame()) * rate; }
};

/// Not thread-safe. Throws WriterFailure (kWriterErrorEncode) when a format cannot be converted.
class SoundConverter {
public:
    /// What the encoder takes, and the loudspeakers of what comes: WriterOptions::nChannelMask.
    SoundConverter(int rate, const AVChannelLayout& layout, AVSampleFormat format, uint64_t speakers);

    /// How many bytes of `format` are pushed at a time to keep little waiting here: about 16384 of the
    /// encoder's sample frames, or one of the format's.
    size_t PieceSize(const PcmFormat& format) const;

    /// Appends PCM. The format may change from call to call; bytes that do not fill a sample frame wait for
    /// the next call of the same format.
    void Push(const PcmFormat& format, const uint8_t* data, size_t size);

    /// Appends silence, in sample frames of the encoder's rate.
    void PushSilence(int64_t samples);

    /// No more will come: what the conversion still holds back is made available.
    void Finish();

    /// Sample frames that can be taken.
    int Available() const { return av_audio_fifo_size(fifo_.get()); }

    /// The next `samples` (at most Available()) sample frames, in memory of their own.
    av::Frame Take(int samples);

private:
    void Prepare(const PcmFormat& format);
    int MakeResampler(const PcmFormat& format, uint64_t speakers);
    void Convert(const uint8_t* data, int frames);
    void Drain();
    void Keep(const av::Frame& frame, int made);
    av::Frame NewFrame(int samples) const;

    const int rate_;
    av::ChannelLayout layout_;
    const AVSampleFormat format_;
    const uint64_t speakers_;
    PcmFormat source_;
    int used_ = 0; ///< Channels of the source that go into the resampler.
    av::Resampler resampler_;
    int64_t pushed_ = 0; ///< Sample frames that went into the resampler,
    int64_t made_ = 0;   ///< and that came out of it.
    av::SampleFifo fifo_;
    std::vector<uint8_t> rest_;     ///< Bytes that do not fill a sample frame yet.
    std::vector<uint8_t> repacked_; ///< Samples as the resampler takes them.
};

} // namespace writer

#endif
