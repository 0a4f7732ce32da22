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

/// How an encoder is told a constant quality; less is better.
enum class QualityKind {
    kNone,
    kCrf,        ///< The encoder's option "crf".
    kLimitedCrf, ///< Likewise; an upper rate is its bit rate.
    kCappedCrf,  ///< Likewise, and it always needs one.
    kQuantiser   ///< The quantiser of every picture.
};

struct QualityScale {
    QualityKind kind = QualityKind::kNone;
    double best = 0;
    double worst = 0;
};

/// How an encoder is told how long to look for a smaller file.
struct SpeedScale {
    const char* option = nullptr;        ///< Null: it has no such choice.
    std::array<const char*, 7> values{}; ///< From the slowest.
};

constexpr int kUsualSpeed = 5; ///< On the scale of WriterOptions, where none is chosen.

/// A codec for pictures.
struct PictureCodec {
    uint32_t code = 0;
    AVCodecID id = AV_CODEC_ID_NONE;
    const char* encoder = nullptr;
    /// Of the pictures that the encoder gets; a "J" format: luma covers 0 to 255.
    AVPixelFormat format = AV_PIX_FMT_YUV420P;
    bool deep = false;     ///< Pictures of 10 bits are taken as well.
    bool evenSize = false; ///< Odd widths and heights are not accepted.
    /// Threads for each processor where the caller leaves the choice: 0 for one thread. The output depends on
    /// their number, never on timing.
    double threads = 0;
    QualityScale quality{};
    SpeedScale speed{}; ///< An encoder that has one has to be told how far key frames may lie apart.
    /// Pictures that the encoder takes before it gives the packet of an earlier one, at most, by the speed.
    /// 0: none, or it cannot be told after which picture to cut.
    std::array<int, 7> looksAhead{};
    const char* options = ""; ///< For the encoder in any case, as "name=value,...".
    int longest = 0; ///< Seconds that a picture can be shown before it has to be there again; 0: any time.
    const AVRational* rates = nullptr; ///< All that every player knows, rising, ended by 0; null: any rate.
    bool isBt601 = false; ///< Decoders know but the matrix of BT.601, whatever a container tells.
    double maxRate = 0;   ///< Most pictures a second that players show in time; 0: no limit.
    double mostTold = 0;  ///< Most pictures a second that the encoder can be told; 0: any number.
    const char* otherOptions = nullptr; ///< For pictures that the encoder does not take with `options`.
};

/// A codec for sound.
struct SoundCodec {
    uint32_t code = 0;
    AVCodecID id = AV_CODEC_ID_NONE; ///< For PCM the 16-bit one; the sample size chooses.
    const char* encoder = nullptr;
    int maxChannels = 8;
    double minBits = 0;    ///< Least bits per sample and channel; 0: no limit.
    double maxBits = 0;    ///< Most bits per sample and channel; 0: no bit rate at all.
    int maxSampleRate = 0; ///< 0: as the encoder tells itself.
    /// Loudspeakers that every decoder knows, ended by 0; null: as the encoder tells itself, or any.
    const uint64_t* layouts = nullptr;
};

/// What is not as usual when a container carries a codec.
struct Carriage {
    uint32_t container = 0;
    uint32_t codec = 0;
    uint32_t tag = 0; ///< The stream's tag where the multiplexer's own choice is not the usual one; else 0.
    /// The file's description of the stream is made from its first packet, so that there has to be one.
    bool describedByPacket = false;
    const int* sampleRates = nullptr; ///< The only ones, ended by 0; null: as the codec has them.
    double maxBits = 0; ///< Most bits per sample and channel where that is less than the codec has; else 0.
    bool steadyPictures = false;       ///< Readers find the times of pictures by counting.
    const uint64_t* layouts = nullptr; ///< The only ones that it tells apart; null: as the codec has them.
    bool isBt601 = false;              ///< The matrix is told nowhere, so that players take BT.601's.
};

/// How a file can be kept playable while it grows, and what a container cannot express.
enum class ContainerKind {
    kStreamed,   ///< Playable at every moment as it is.
    kFragmented, ///< Written in fragments and given one index when finished.
    kSteadyRate  ///< As kStreamed, but time is the number of pictures and of samples: both begin at 0.
};

/// What a container does in a way of its own.
enum ContainerWays : uint32_t {
    kTagsInStream = 1,  ///< Texts about the movie belong to its stream.
    kOneComment = 2,    ///< The comment and the description are one text.
    kLanguageTags = 4,  ///< Languages can have a region or a script.
    kShortTags = 8,     ///< A text about the movie has 65535 bytes at most.
    kTinyTags = 16,     ///< It has 255 bytes at most.
    kTrackTexts = 32,   ///< Any text about a track is written.
    kCountsSamples = 64 ///< Sound has no times: packets are heard one behind the other.
};

/// A file format.
struct Container {
    uint32_t code = 0;
    const char* name = nullptr;
    const char* extensions = nullptr;
    const char* muxer = nullptr;
    ContainerKind kind = ContainerKind::kStreamed;
    const char* options = nullptr; ///< The multiplexer's own, as "name=value,..."; null: none.
    uint32_t carries = 0;          ///< kWriterFormat..., but for that of its kind.
    const char* tags = nullptr; ///< Keys of the texts about the movie that are written, by commas; null: any.
    int trackFlags = 0;         ///< AV_DISPOSITION_... that are written, beside the default one.
    /// FFmpeg's names of the codecs for subtitles that fit, that for any text first; null for none.
    const char* subtitles = nullptr;
    /// FFmpeg's names of the codecs for sound whose packets fit as they are; null for none.
    const char* copiedSound = nullptr;
    uint32_t ways = 0;                ///< ContainerWays, together.
    std::array<uint32_t, 12> video{}; ///< Codes of the codecs that fit, the default first, then zeros.
    std::array<uint32_t, 12> audio{};
};

/// Null when the code is not in the table.
const Container* FindContainer(uint32_t code);

/// The codec of that code, its usual other names understood; null when there is none or `container` cannot
/// carry it.
const PictureCodec* FindPictureCodec(const Container& container, uint32_t code);
const SoundCodec* FindSoundCodec(const Container& container, uint32_t code);

/// The codec of that code, whatever carries it; null when there is none.
const PictureCodec* FindPictureCodec(uint32_t code);

/// Whether this FFmpeg build's encoder takes pictures of 10 bits.
bool TakesDeep(const PictureCodec& codec);

/// This FFmpeg build's encoder; null when it has none. `bitsPerSample` chooses among those for PCM.
const AVCodec* FindEncoder(const PictureCodec& codec);
const AVCodec* FindEncoder(const SoundCodec& codec, int bitsPerSample);

/// The codec as which the container carries packets of another one: the same, or for subtitles of text the
/// one that it prefers. AV_CODEC_ID_NONE when it does not carry them.
AVCodecID PacketForm(const Container& container, AVCodecID codec);

/// Whether files hold that text about the movie.
bool CarriesTag(const Container& container, const std::string& key, const std::string& value);

/// Whether files hold that text about a track.
bool CarriesTrackTag(const Container& container, const std::string& key, const std::string& value);

/// How the container carries the codec.
const Carriage& FindCarriage(const Container& container, uint32_t codec);
const Carriage& FindCarriage(const Container& container, AVCodecID soundCodec);

/// kWriterFormat... of the format; 0 when the code is not in the table.
uint32_t FormatTraits(uint32_t code);

/// The table for hosts, ended by an entry with code 0; only what this FFmpeg build can encode.
const FileFormatInfo* FileFormatInfos();

} // namespace writer

#endif
