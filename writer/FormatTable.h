// What can be written: containers, codecs by four-character code, their encoders, and which fits where.
#ifndef MOVIECONV_WRITER_FORMATTABLE_H
#define MOVIECONV_WRITER_FORMATTABLE_H

#include "media/EncodeParam.h"

extern "C" {
#include <libavcodec/avcodec.h>
}

#include <array>
#include <cstdint>
#include <string>

namespace writer {

/// A codec for pictures.
struct VideoCodec {
    uint32_t code;
    AVCodecID id;
    const char* encoder;
    bool evenSize;  ///< Odd widths and heights are not accepted.
    bool fullRange; ///< Luma covers 0 to 255.
    bool parallel;  ///< Expensive enough for threads of its own; the output depends on their number, never on
                    ///< timing.
};

/// A codec for sound.
struct AudioCodec {
    uint32_t code;
    AVCodecID id; ///< For PCM the 16-bit one; the sample size chooses.
    const char* encoder;
    int maxChannels;
    double minBits;        ///< Least bits per sample and channel; 0: no limit.
    double maxBits;        ///< Most bits per sample and channel; 0: no bit rate at all.
    int maxSampleRate = 0; ///< 0: as the encoder tells itself.
};

/// How a file can be kept playable while it grows, and what a container cannot express.
enum class ContainerKind {
    kStreamed,   ///< Playable at every moment as it is.
    kFragmented, ///< Written in fragments and given one index when finished.
    kSteadyRate  ///< As kStreamed, but time is the number of pictures and of samples: both begin at 0.
};

/// A file format.
struct Container {
    uint32_t code;
    const char* name;
    const char* extensions;
    const char* muxer;
    ContainerKind kind;
    std::array<uint32_t, 10> video; ///< Codes of the codecs that fit, the default first, then zeros.
    std::array<uint32_t, 10> audio;
};

/// Null when the code is not in the table.
const Container* FindContainer(uint32_t code);

/// The codec of that code, its usual other names understood; null when there is none or `container` cannot
/// carry it.
const VideoCodec* FindVideoCodec(const Container& container, uint32_t code);
const AudioCodec* FindAudioCodec(const Container& container, uint32_t code);

/// This FFmpeg build's encoder; null when it has none. `bitsPerSample` chooses among those for PCM.
const AVCodec* FindEncoder(const VideoCodec& codec);
const AVCodec* FindEncoder(const AudioCodec& codec, int bitsPerSample);

/// Whether the container takes the codec at 11025, 22050 and 44100 Hz only.
bool NeedsFlashRates(const Container& container, const AudioCodec& codec);

/// The tag that the container gives the codec when the multiplexer's own choice is not the usual one; else 0.
uint32_t StreamTag(const Container& container, AVCodecID id);

/// The four characters of a code, for messages.
std::string CodeText(uint32_t code);

/// The table for hosts, ended by an entry with code 0; only what this FFmpeg build can encode.
const FileFormatInfo* FileFormatInfos();

} // namespace writer

#endif
