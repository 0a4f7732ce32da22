#include "writer/CodecRows.h"

namespace writer {
namespace {

constexpr QualityScale kCrf51{.kind = QualityKind::kCrf, .best = 0, .worst = 51};
constexpr QualityScale kCrf63{.kind = QualityKind::kCrf, .best = 0, .worst = 63};
constexpr QualityScale kLimited63{.kind = QualityKind::kLimitedCrf, .best = 0, .worst = 63};
constexpr QualityScale kCapped63{.kind = QualityKind::kCappedCrf, .best = 4, .worst = 63};
constexpr QualityScale kQuantiser{.kind = QualityKind::kQuantiser, .best = 1, .worst = 31};

constexpr SpeedScale kX26Speeds{
    .option = "preset", .values = {"veryslow", "slower", "slow", "medium", "fast", "veryfast", "ultrafast"}};
constexpr SpeedScale kVpxSpeeds{.option = "cpu-used", .values = {"0", "1", "2", "3", "4", "5", "8"}};
constexpr SpeedScale kAv1Speeds{.option = "preset", .values = {"2", "4", "6", "8", "10", "11", "12"}};

constexpr const char* kVpxOptions = "deadline=good";

constexpr std::array kMpeg2Rates{AVRational{24000, 1001}, AVRational{24, 1}, AVRational{25, 1},
                                 AVRational{30000, 1001}, AVRational{30, 1}, AVRational{50, 1},
                                 AVRational{60000, 1001}, AVRational{60, 1}, AVRational{0, 1}};

constexpr std::array kPictureRows{
    PictureCodec{.code = kXvid, .id = AV_CODEC_ID_MPEG4, .encoder = "mpeg4", .quality = kQuantiser},
    PictureCodec{
        .code = kH264,
        .id = AV_CODEC_ID_H264,
        .encoder = "libx264",
        .evenSize = true,
        .threads = 2,
        .quality = kCrf51,
        .speed = kX26Speeds,
        .looksAhead = {70, 70, 56, 46, 36, 16, 0},
    },
    PictureCodec{
        .code = kHevc,
        .id = AV_CODEC_ID_HEVC,
        .encoder = "libx265",
        .deep = true,
        .evenSize = true,
        .quality = kCrf51,
        .speed = kX26Speeds,
        .looksAhead = {50, 50, 34, 26, 21, 21, 10},
        // Frames encoded side by side can wait for each other for ever at the end; rows still are.
        .options = "x265-params=log-level=none:frame-threads=1",
    },
    PictureCodec{
        .code = kMjpg,
        .id = AV_CODEC_ID_MJPEG,
        .encoder = "mjpeg",
        .format = AV_PIX_FMT_YUVJ420P,
        .quality = kQuantiser,
        .isBt601 = true,
    },
    PictureCodec{
        .code = kVp8,
        .id = AV_CODEC_ID_VP8,
        .encoder = "libvpx",
        .threads = 1,
        .quality = kCapped63,
        .speed = kVpxSpeeds,
        .options = kVpxOptions,
        .isBt601 = true,
    },
    PictureCodec{
        .code = kVp9,
        .id = AV_CODEC_ID_VP9,
        .encoder = "libvpx-vp9",
        .deep = true,
        .threads = 1,
        .quality = kLimited63,
        .speed = kVpxSpeeds,
        .options = kVpxOptions,
    },
    PictureCodec{
        .code = kAv1,
        .id = AV_CODEC_ID_AV1,
        .encoder = "libsvtav1",
        .deep = true,
        .evenSize = true,
        .quality = kCrf63,
        .speed = kAv1Speeds,
        .mostTold = 240,
    },
    PictureCodec{
        .code = kFfv1,
        .id = AV_CODEC_ID_FFV1,
        .encoder = "ffv1",
        .deep = true,
        .threads = 1,
        .options = "level=3,g=1,slicecrc=1", // every picture by itself, with a check sum
        .otherOptions = "level=1,g=1",       // undivided, for pictures with too few columns for the slices
    },
    PictureCodec{
        .code = kMpeg2,
        .id = AV_CODEC_ID_MPEG2VIDEO,
        .encoder = "mpeg2video",
        .quality = kQuantiser,
        .rates = kMpeg2Rates.data(),
    },
    PictureCodec{
        .code = kFlv1,
        .id = AV_CODEC_ID_FLV1,
        .encoder = "flv",
        .quality = kQuantiser,
        .isBt601 = true,
    },
    PictureCodec{
        .code = kGif,
        .id = AV_CODEC_ID_GIF,
        .encoder = "gif",
        .format = AV_PIX_FMT_PAL8,
        .longest = 600,
        .maxRate = 50,
    },
};

constexpr std::array<uint64_t, 10> kAacLayouts{AV_CH_LAYOUT_MONO,         AV_CH_LAYOUT_STEREO,
                                               AV_CH_LAYOUT_2POINT1,      AV_CH_LAYOUT_SURROUND,
                                               AV_CH_LAYOUT_4POINT0,      AV_CH_LAYOUT_QUAD,
                                               AV_CH_LAYOUT_5POINT0_BACK, AV_CH_LAYOUT_5POINT1_BACK,
                                               AV_CH_LAYOUT_7POINT1,      0};
// FFmpeg's encoder for Opus interchanges the channels of 5.0 and 6.1.
constexpr std::array<uint64_t, 7> kOpusLayouts{AV_CH_LAYOUT_MONO,
                                               AV_CH_LAYOUT_STEREO,
                                               AV_CH_LAYOUT_SURROUND,
                                               AV_CH_LAYOUT_QUAD,
                                               AV_CH_LAYOUT_5POINT1_BACK,
                                               AV_CH_LAYOUT_7POINT1,
                                               0};
constexpr std::array<uint64_t, 9> kVorbisLayouts{
    AV_CH_LAYOUT_MONO,    AV_CH_LAYOUT_STEREO,       AV_CH_LAYOUT_SURROUND,
    AV_CH_LAYOUT_QUAD,    AV_CH_LAYOUT_5POINT0_BACK, AV_CH_LAYOUT_5POINT1_BACK,
    AV_CH_LAYOUT_6POINT1, AV_CH_LAYOUT_7POINT1,      0};

constexpr std::array kSoundRows{
    SoundCodec{
        .code = kAac,
        .id = AV_CODEC_ID_AAC,
        .encoder = "aac",
        .minBits = 0.5,
        .maxBits = 6.0, // the format's: 6144 bits for a frame of 1024 samples; the others are the encoders'
        .layouts = kAacLayouts.data(),
    },
    SoundCodec{
        .code = kMp3,
        .id = AV_CODEC_ID_MP3,
        .encoder = "libmp3lame",
        .maxChannels = 2,
        .minBits = 0.5,
        .maxBits = 8.0,
    },
    SoundCodec{
        .code = kAc3,
        .id = AV_CODEC_ID_AC3,
        .encoder = "ac3",
        .maxChannels = 6,
        .minBits = 0.5,
        .maxBits = 14.0,
    },
    SoundCodec{.code = kFlac, .id = AV_CODEC_ID_FLAC, .encoder = "flac"},
    SoundCodec{.code = kAlac, .id = AV_CODEC_ID_ALAC, .encoder = "alac"},
    SoundCodec{
        .code = kMp2,
        .id = AV_CODEC_ID_MP2,
        .encoder = "mp2",
        .maxChannels = 2,
        .minBits = 0.3,
        .maxBits = 8.0,
    },
    SoundCodec{
        .code = kOpus,
        .id = AV_CODEC_ID_OPUS,
        .encoder = "libopus",
        .minBits = 0.2,
        .maxBits = 5.3,
        .layouts = kOpusLayouts.data(),
    },
    SoundCodec{
        .code = kVorbis,
        .id = AV_CODEC_ID_VORBIS,
        .encoder = "libvorbis",
        .minBits = 1.0,
        .maxBits = 3.8,
        .maxSampleRate = 48000,
        .layouts = kVorbisLayouts.data(),
    },
    SoundCodec{.code = kPcm, .id = AV_CODEC_ID_PCM_S16LE, .encoder = "pcm_s16le"},
};

constexpr std::array kAliasRows{
    CodecAlias{FourCC("DIVX"), kXvid}, CodecAlias{FourCC("DX50"), kXvid}, CodecAlias{FourCC("FMP4"), kXvid},
    CodecAlias{FourCC("MP4V"), kXvid}, CodecAlias{FourCC("AVC1"), kH264}, CodecAlias{FourCC("X264"), kH264},
    CodecAlias{FourCC("H265"), kHevc}, CodecAlias{FourCC("HVC1"), kHevc}, CodecAlias{FourCC("HEV1"), kHevc},
    CodecAlias{FourCC("X265"), kHevc}, CodecAlias{FourCC("JPEG"), kMjpg}, CodecAlias{FourCC("VP8 "), kVp8},
    CodecAlias{FourCC("VP9 "), kVp9},  CodecAlias{FourCC("VP09"), kVp9},  CodecAlias{FourCC("MP2V"), kMpeg2},
    CodecAlias{FourCC("AV1 "), kAv1},  CodecAlias{FourCC("MP4A"), kAac},  CodecAlias{FourCC(".MP3"), kMp3},
    CodecAlias{FourCC("AC-3"), kAc3},  CodecAlias{FourCC("LPCM"), kPcm},  CodecAlias{FourCC("SOWT"), kPcm},
};

} // namespace

std::span<const PictureCodec> PictureCodecs() {
    return kPictureRows;
}

std::span<const SoundCodec> SoundCodecs() {
    return kSoundRows;
}

std::span<const CodecAlias> CodecAliases() {
    return kAliasRows;
}

} // namespace writer
