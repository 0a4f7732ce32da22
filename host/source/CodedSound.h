// What packets of coded sound tell by themselves.
#ifndef MOVIECONV_HOST_SOURCE_CODEDSOUND_H
#define MOVIECONV_HOST_SOURCE_CODEDSOUND_H

extern "C" {
#include <libavcodec/codec_par.h>
#include <libavcodec/packet.h>
}

#include <cstdint>
#include <optional>

namespace movieconv {

/// Samples at 48 kHz in a packet of Opus.
int64_t OpusSamples(const AVPacket& packet);

/// Bytes of one sample of all channels; 0 where the sound is compressed.
int64_t SampleBytes(const AVCodecParameters& parameters);

/// A FLAC header tells length and digest of all sound; of a part they are not known.
void ForgetWhole(AVCodecParameters& parameters);

/// Whether it is AAC with a header of its own, as in broadcasts.
bool HasAdtsHeader(const AVPacket& packet);

/// What all headers of one form of AAC have in common. Of a packet that has one.
int AdtsForm(const AVPacket& packet);

/// Whether a packet comes with another description of the sound than `parameters` are.
bool DescribesAnew(const AVPacket& packet, const AVCodecParameters& parameters);

/// Samples per second by the header of a frame; nothing where it has none that tells.
std::optional<int> RateTold(const AVPacket& packet, AVCodecID codec);

/// Samples in a frame of E-AC-3; 0 where its header cannot be read.
int Eac3Samples(const AVPacket& packet);

/// Whether it is the rest of a frame whose start is missing, as at the start of a recording that was cut.
bool IsTail(const AVPacket& packet, AVCodecID codec);

} // namespace movieconv

#endif
