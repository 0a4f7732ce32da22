#include "writer/FormatTable.h"

#include "media/FourCC.h"
#include "writer/WriterStatus.h"

extern "C" {
#include <libavformat/avformat.h>
#include <libavutil/avstring.h>
}

#include <algorithm>
#include <cctype>
#include <cstring>
#include <limits>
#include <string_view>
#include <utility>

namespace writer {
namespace {

constexpr uint32_t kXvid = FourCC("XVID");
constexpr uint32_t kH264 = FourCC("H264");
constexpr uint32_t kHevc = FourCC("HEVC");
constexpr uint32_t kMjpg = FourCC("MJPG");
constexpr uint32_t kVp8 = FourCC("VP80");
constexpr uint32_t kVp9 = FourCC("VP90");
constexpr uint32_t kAv1 = FourCC("AV01");
constexpr uint32_t kFfv1 = FourCC("FFV1");
constexpr uint32_t kMpeg2 = FourCC("MPG2");
constexpr uint32_t kFlv1 = FourCC("FLV1");
constexpr uint32_t kGif = FourCC("GIF ");
constexpr uint32_t kAac = FourCC("AAC ");
constexpr uint32_t kMp3 = FourCC("MP3 ");
constexpr uint32_t kAc3 = FourCC("AC3 ");
constexpr uint32_t kFlac = FourCC("FLAC");
constexpr uint32_t kAlac = FourCC("ALAC");
constexpr uint32_t kMp2 = FourCC("MP2 ");
constexpr uint32_t kOpus = FourCC("OPUS");
constexpr uint32_t kVorbis = FourCC("VORB");
constexpr uint32_t kPcm = FourCC("PCM ");
constexpr uint32_t kEac3 = FourCC("EAC3"); // copied only

// clang-format off
constexpr AVPixelFormat kPlanar = AV_PIX_FMT_YUV420P;
constexpr AVPixelFormat kPlanarFull = AV_PIX_FMT_YUVJ420P;
constexpr AVPixelFormat kPalette = AV_PIX_FMT_PAL8;

constexpr QualityScale kNoQuality{QualityKind::kNone, 0, 0};
constexpr QualityScale kCrf51{QualityKind::kCrf, 0, 51};
constexpr QualityScale kCrf63{QualityKind::kCrf, 0, 63};
constexpr QualityScale kCapped63{QualityKind::kCappedCrf, 4, 63};
constexpr QualityScale kQuantiser{QualityKind::kQuantiser, 1, 31};

constexpr SpeedScale kOneSpeed{nullptr, {}};
constexpr SpeedScale kX26Speeds{"preset", {"veryslow", "slower", "slow", "medium", "fast", "veryfast", "ultrafast"}};
constexpr SpeedScale kVpxSpeeds{"cpu-used", {"0", "1", "2", "3", "4", "5", "8"}};
constexpr SpeedScale kAv1Speeds{"preset", {"2", "4", "6", "8", "10", "11", "12"}};

constexpr std::array<int, 7> kNotAhead{};
constexpr std::array<int, 7> kX264Ahead{70, 70, 56, 46, 36, 16, 0};
constexpr std::array<int, 7> kX265Ahead{50, 50, 34, 26, 21, 21, 10};

// Frames encoded side by side can wait for each other for ever at the end; rows still are.
constexpr const char* kX265Options = "x265-params=log-level=none:frame-threads=1";
constexpr const char* kVpxOptions = "deadline=good";
constexpr const char* kFfv1Options = "level=3,g=1,slicecrc=1"; // every picture by itself, with a check sum

constexpr std::array kMpeg2Rates{AVRational{24000, 1001}, AVRational{24, 1}, AVRational{25, 1},
                                 AVRational{30000, 1001}, AVRational{30, 1}, AVRational{50, 1},
                                 AVRational{60000, 1001}, AVRational{60, 1}, AVRational{0, 1}};
constexpr std::array kPictureCodecs{
    PictureCodec{kXvid,  AV_CODEC_ID_MPEG4,      "mpeg4",      kPlanar,     false, false, 0.0, kQuantiser, kOneSpeed, kNotAhead, ""},
    PictureCodec{kH264,  AV_CODEC_ID_H264,       "libx264",    kPlanar,     false, true,  2.0, kCrf51, kX26Speeds, kX264Ahead, ""},
    PictureCodec{kHevc,  AV_CODEC_ID_HEVC,       "libx265",    kPlanar,     true,  true,  0.0, kCrf51, kX26Speeds, kX265Ahead, kX265Options},
    PictureCodec{kMjpg,  AV_CODEC_ID_MJPEG,      "mjpeg",      kPlanarFull, false, false, 0.0, kQuantiser, kOneSpeed, kNotAhead, "", 0, nullptr, true},
    PictureCodec{kVp8,   AV_CODEC_ID_VP8,        "libvpx",     kPlanar,     false, false, 1.0, kCapped63, kVpxSpeeds, kNotAhead, kVpxOptions, 0, nullptr, true},
    PictureCodec{kVp9,   AV_CODEC_ID_VP9,        "libvpx-vp9", kPlanar,     true,  false, 1.0, kCrf63, kVpxSpeeds, kNotAhead, kVpxOptions},
    PictureCodec{kAv1,   AV_CODEC_ID_AV1,        "libsvtav1",  kPlanar,     true,  true,  0.0, kCrf63, kAv1Speeds, kNotAhead, ""},
    PictureCodec{kFfv1,  AV_CODEC_ID_FFV1,       "ffv1",       kPlanar,     true,  false, 1.0, kNoQuality, kOneSpeed, kNotAhead, kFfv1Options},
    PictureCodec{kMpeg2, AV_CODEC_ID_MPEG2VIDEO, "mpeg2video", kPlanar,     false, false, 0.0, kQuantiser, kOneSpeed, kNotAhead, "", 0, kMpeg2Rates.data()},
    PictureCodec{kFlv1,  AV_CODEC_ID_FLV1,       "flv",        kPlanar,     false, false, 0.0, kQuantiser, kOneSpeed, kNotAhead, "", 0, nullptr, true},
    PictureCodec{kGif,   AV_CODEC_ID_GIF,        "gif",        kPalette,    false, false, 0.0, kNoQuality, kOneSpeed, kNotAhead, "", 600, nullptr, false, 50.0},
};

constexpr std::array<uint64_t, 9> kUsualLayouts{ // where only their number is told
    AV_CH_LAYOUT_MONO, AV_CH_LAYOUT_STEREO, AV_CH_LAYOUT_2POINT1, AV_CH_LAYOUT_4POINT0, AV_CH_LAYOUT_5POINT0_BACK,
    AV_CH_LAYOUT_5POINT1_BACK, AV_CH_LAYOUT_6POINT1, AV_CH_LAYOUT_7POINT1, 0};
constexpr std::array<uint64_t, 10> kAacLayouts{
    AV_CH_LAYOUT_MONO, AV_CH_LAYOUT_STEREO, AV_CH_LAYOUT_2POINT1, AV_CH_LAYOUT_SURROUND, AV_CH_LAYOUT_4POINT0,
    AV_CH_LAYOUT_QUAD, AV_CH_LAYOUT_5POINT0_BACK, AV_CH_LAYOUT_5POINT1_BACK, AV_CH_LAYOUT_7POINT1, 0};
// FFmpeg's encoder for Opus interchanges the channels of 5.0 and 6.1.
constexpr std::array<uint64_t, 7> kOpusLayouts{
    AV_CH_LAYOUT_MONO, AV_CH_LAYOUT_STEREO, AV_CH_LAYOUT_SURROUND, AV_CH_LAYOUT_QUAD, AV_CH_LAYOUT_5POINT1_BACK,
    AV_CH_LAYOUT_7POINT1, 0};
constexpr std::array<uint64_t, 9> kVorbisLayouts{
    AV_CH_LAYOUT_MONO, AV_CH_LAYOUT_STEREO, AV_CH_LAYOUT_SURROUND, AV_CH_LAYOUT_QUAD, AV_CH_LAYOUT_5POINT0_BACK,
    AV_CH_LAYOUT_5POINT1_BACK, AV_CH_LAYOUT_6POINT1, AV_CH_LAYOUT_7POINT1, 0};
constexpr std::array<uint64_t, 9> kFlacLayouts{
    AV_CH_LAYOUT_MONO, AV_CH_LAYOUT_STEREO, AV_CH_LAYOUT_SURROUND, AV_CH_LAYOUT_QUAD, AV_CH_LAYOUT_5POINT0,
    AV_CH_LAYOUT_5POINT1, AV_CH_LAYOUT_6POINT1, AV_CH_LAYOUT_7POINT1, 0};
// The limits of AAC are the format's (6144 bits for a frame of 1024 samples), those of the others their encoders'.
constexpr std::array kSoundCodecs{
    SoundCodec{kAac,    AV_CODEC_ID_AAC,       "aac",        8, 0.5, 6.0, 0, kAacLayouts.data()},
    SoundCodec{kMp3,    AV_CODEC_ID_MP3,       "libmp3lame", 2, 0.5, 8.0},
    SoundCodec{kAc3,    AV_CODEC_ID_AC3,       "ac3",        6, 0.5, 14.0},
    SoundCodec{kFlac,   AV_CODEC_ID_FLAC,      "flac",       8, 0.0, 0.0},
    SoundCodec{kAlac,   AV_CODEC_ID_ALAC,      "alac",       8, 0.0, 0.0},
    SoundCodec{kMp2,    AV_CODEC_ID_MP2,       "mp2",        2, 0.3, 8.0},
    SoundCodec{kOpus,   AV_CODEC_ID_OPUS,      "libopus",    8, 0.2, 5.3, 0, kOpusLayouts.data()},
    SoundCodec{kVorbis, AV_CODEC_ID_VORBIS,    "libvorbis",  8, 1.0, 3.8, 48000, kVorbisLayouts.data()},
    SoundCodec{kPcm,    AV_CODEC_ID_PCM_S16LE, "pcm_s16le",  8, 0.0, 0.0},
};

using enum ContainerKind;
constexpr uint32_t kTags = kWriterFormatTags;
constexpr uint32_t kChapters = kWriterFormatChapters;
constexpr uint32_t kCover = kWriterFormatCover;
constexpr uint32_t kCoverText = kWriterFormatCoverText;
constexpr uint32_t kFiles = kWriterFormatAttachments;
constexpr uint32_t kTracks = kWriterFormatTracks;
constexpr uint32_t kLanguages = kWriterFormatLanguages;
constexpr uint32_t kTitles = kWriterFormatTrackTitles;
constexpr uint32_t kTimecode = kWriterFormatTimecode;
constexpr uint32_t kChapterTexts = kWriterFormatChapterTexts;
// What the multiplexers write of all that can be said about a movie.
constexpr const char* kMp4Tags = "title,artist,album,album_artist,composer,genre,date,track,disc,comment,description,"
                                 "synopsis,copyright,creation_time,location,lyrics,grouping,show,season_number,"
                                 "episode_id,episode_sort,network,keywords,media_type,compilation,gapless_playback,"
                                 "hd_video";
constexpr const char* kMovTags = "title,artist,author,album,genre,date,comment,copyright,creation_time,location,make,"
                                 "model";
constexpr const char* kRiffTags = "title,artist,album,comment,copyright,date,genre,encoded_by,language,track";
constexpr const char* kServiceTags = "title,service_name,service_provider";
constexpr const char* kAnyTags = nullptr;
constexpr const char* kNoTags = "";
constexpr int kNoFlags = 0;
constexpr int kSenses = AV_DISPOSITION_HEARING_IMPAIRED | AV_DISPOSITION_VISUAL_IMPAIRED;
constexpr int kMp4Flags = AV_DISPOSITION_FORCED | AV_DISPOSITION_COMMENT | AV_DISPOSITION_DUB | kSenses;
constexpr int kMatroskaFlags = AV_DISPOSITION_FORCED | AV_DISPOSITION_COMMENT | AV_DISPOSITION_ORIGINAL |
                               AV_DISPOSITION_DUB | kSenses;
constexpr const char* kMp4Subtitles = "mov_text";
constexpr const char* kMatroskaSubtitles = "subrip,ass,ssa,text,webvtt,hdmv_pgs_subtitle,hdmv_text_subtitle,"
                                           "dvd_subtitle,dvb_subtitle";
constexpr const char* kMp4Sound = "aac,mp3,mp2,ac3,eac3,opus,vorbis,alac,dts";
constexpr const char* kMovSound = "aac,mp3,ac3,eac3,alac,pcm_s16le,pcm_s16be,pcm_s24le,pcm_s24be,pcm_s32le,pcm_s32be,"
                                  "pcm_f32le,pcm_f32be,pcm_u8,pcm_s8,pcm_alaw,pcm_mulaw";
constexpr const char* kMatroskaSound = "aac,mp3,mp2,ac3,eac3,dts,truehd,mlp,flac,alac,opus,vorbis,tta,wavpack,"
                                       "pcm_s16le,pcm_s24le,pcm_s32le,pcm_s16be,pcm_s24be,pcm_s32be,pcm_f32le,"
                                       "pcm_f64le,pcm_u8";
constexpr const char* kAviSound = "mp3,mp2,ac3,dts,aac,pcm_s16le,pcm_s24le,pcm_s32le,pcm_u8,pcm_alaw,pcm_mulaw";
constexpr const char* kTsSound = "aac,aac_latm,mp3,mp2,ac3,eac3,dts,truehd,opus";
constexpr const char* kWavSound = "pcm_s16le,pcm_s24le,pcm_s32le,pcm_f32le,pcm_f64le,pcm_u8,pcm_alaw,pcm_mulaw,mp3,ac3";
constexpr const char* kClusters = "cluster_time_limit=1000"; // what is lost at most when a file is cut off
constexpr std::array kContainers{
    Container{FourCC("MP4 "), "MP4 (MPEG-4 Part 14)", "mp4,m4v", "mp4", kFragmented, nullptr,
              kTags | kChapters | kCover | kTracks | kLanguages | kTitles | kTimecode, kMp4Tags, kMp4Flags, kMp4Subtitles, kMp4Sound, kLanguageTags,
              {kXvid, kH264, kHevc, kMjpg, kVp9, kMpeg2, kAv1}, {kAac, kMp3, kAc3, kOpus, kVorbis}},
    Container{FourCC("MOV "), "QuickTime", "mov,qt", "mov", kFragmented, nullptr,
              kTags | kChapters | kTracks | kLanguages | kTitles | kTimecode, kMovTags, kNoFlags, kMp4Subtitles, kMovSound, kLanguageTags | kShortTags,
              {kXvid, kH264, kHevc, kMjpg, kMpeg2}, {kAac, kMp3, kAc3, kAlac, kPcm}},
    Container{FourCC("MKV "), "Matroska", "mkv", "matroska", kStreamed, kClusters,
              kTags | kChapters | kCover | kCoverText | kFiles | kTracks | kLanguages | kTitles | kTimecode, kAnyTags, kMatroskaFlags,
              kMatroskaSubtitles, kMatroskaSound, kLanguageTags | kTrackTexts,
              {kXvid, kH264, kHevc, kMjpg, kVp8, kVp9, kMpeg2, kFlv1, kAv1, kFfv1},
              {kAac, kMp3, kAc3, kFlac, kOpus, kVorbis, kAlac, kMp2, kPcm}},
    Container{FourCC("MKA "), "Matroska audio", "mka", "matroska", kStreamed, kClusters,
              kTags | kChapters | kCover | kCoverText | kFiles | kTracks | kLanguages | kTitles, kAnyTags, kMatroskaFlags,
              kMatroskaSubtitles, kMatroskaSound, kLanguageTags | kTrackTexts,
              {},
              {kAac, kMp3, kAc3, kFlac, kOpus, kVorbis, kAlac, kMp2, kPcm}},
    Container{FourCC("AVI "), "AVI (Audio Video Interleaved)", "avi,divx", "avi", kSteadyRate, nullptr,
              kTags | kTracks | kTitles, kRiffTags, kNoFlags, nullptr, kAviSound, kCountsSamples,
              {kXvid, kH264, kMjpg, kVp8, kMpeg2, kFlv1}, {kMp3, kAac, kAc3, kPcm}},
    Container{FourCC("WEBM"), "WebM", "webm", "webm", kStreamed, kClusters,
              kTags | kChapters | kTracks | kLanguages | kTitles | kTimecode, kAnyTags, AV_DISPOSITION_FORCED, "webvtt", "vorbis,opus", kLanguageTags | kTrackTexts,
              {kVp8, kVp9, kAv1}, {kVorbis, kOpus}},
    Container{FourCC("FLV "), "Flash Video", "flv", "flv", kStreamed, nullptr,
              kTags, kAnyTags, kNoFlags, nullptr, "aac,mp3", kShortTags, {kH264, kFlv1}, {kAac, kMp3}},
    Container{FourCC("TS  "), "MPEG transport stream", "ts", "mpegts", kStreamed, nullptr,
              kTags | kTracks | kLanguages, kServiceTags, kSenses, "dvb_subtitle", kTsSound, kTinyTags,
              {kH264, kHevc, kXvid, kMpeg2}, {kAac, kMp3, kAc3, kOpus, kMp2}},
    Container{FourCC("M2TS"), "MPEG transport stream of discs and camcorders", "m2ts,mts", "mpegts", kStreamed, "mpegts_m2ts_mode=1",
              kTags | kTracks | kLanguages, kServiceTags, kSenses, "hdmv_pgs_subtitle", "ac3,eac3,dts,truehd", kTinyTags,
              {kH264, kHevc, kMpeg2}, {kAc3}},
    Container{FourCC("MPG "), "MPEG program stream", "mpg,mpeg,vob", "vob", kStreamed, nullptr,
              0, kNoTags, kNoFlags, nullptr, "mp2,mp3,ac3,dts", 0, {kMpeg2}, {kMp2, kAc3}},
    Container{kGif, "GIF (animated)", "gif", "gif", kStreamed, nullptr, 0, kNoTags, kNoFlags, nullptr, nullptr,
              0, {kGif}, {}},
    Container{FourCC("M4A "), "MPEG-4 audio", "m4a,m4b", "ipod", kFragmented, nullptr,
              kTags | kChapters | kCover | kTracks | kLanguages, kMp4Tags, kNoFlags, kMp4Subtitles, "aac,alac,ac3", kLanguageTags,
              {}, {kAac, kAc3, kAlac}},
    Container{FourCC("MP3 "), "MP3", "mp3", "mp3", kStreamed, nullptr,
              kTags | kCover | kCoverText, kAnyTags, kNoFlags, nullptr, "mp3", kCountsSamples, {}, {kMp3}},
    Container{FourCC("WAV "), "WAV (RIFF wave)", "wav", "wav", kSteadyRate, "rf64=auto",
              kTags, kRiffTags, kNoFlags, nullptr, kWavSound, kCountsSamples, {}, {kPcm, kMp3, kAc3}},
    Container{FourCC("FLAC"), "FLAC", "flac", "flac", kStreamed, nullptr,
              kTags | kCover | kCoverText | kChapterTexts, kAnyTags, kNoFlags, nullptr, "flac", kOneComment | kCountsSamples, {}, {kFlac}},
    Container{FourCC("OGG "), "Ogg", "ogg,oga,opus", "ogg", kStreamed, nullptr,
              kTags | kLanguages | kChapterTexts, kAnyTags, kNoFlags, nullptr, "vorbis,opus,flac,speex", kTagsInStream | kOneComment, {}, {kVorbis, kOpus, kFlac}},
};

constexpr std::array kFlashRates{44100, 22050, 11025, 0};
constexpr std::array kStandardMp3Rates{48000, 44100, 32000, 24000, 22050, 16000, 0};
constexpr std::array kCarriages{
    Carriage{FourCC("MOV "), kXvid, kXvid},
    Carriage{FourCC("AVI "), kXvid, kXvid, false, nullptr, 0, false, nullptr, true},
    Carriage{FourCC("TS  "), kXvid, 0, false, nullptr, 0, false, nullptr, true},
    // Players of one large vendor take HEVC only under this tag.
    Carriage{FourCC("MP4 "), kHevc, FourCC("hvc1")},
    Carriage{FourCC("MOV "), kHevc, FourCC("hvc1")},
    Carriage{FourCC("MP4 "), kAc3, 0, true},
    Carriage{FourCC("MOV "), kAc3, 0, true},
    Carriage{FourCC("M4A "), kAc3, 0, true},
    Carriage{FourCC("MP4 "), kEac3, 0, true},
    Carriage{FourCC("MOV "), kEac3, 0, true},
    Carriage{FourCC("FLV "), kMp3, 0, false, kFlashRates.data()},
    Carriage{FourCC("MP4 "), kMp3, 0, false, kStandardMp3Rates.data()},
    // A frame of more than 768 bytes a channel counts as two there, and encoders go above their rate.
    Carriage{FourCC("AVI "), kAac, 0, false, nullptr, 4.0},
    Carriage{FourCC("MPG "), kMpeg2, 0, false, nullptr, 0, true},
    Carriage{FourCC("OGG "), kFlac, 0, false, nullptr, 0, false, kFlacLayouts.data()},
    Carriage{FourCC("MKV "), kPcm, 0, false, nullptr, 0, false, kUsualLayouts.data()},
    Carriage{FourCC("MKA "), kPcm, 0, false, nullptr, 0, false, kUsualLayouts.data()},
};

/// Other names under which a codec is asked for, in capitals.
constexpr std::array kAliases{
    std::pair{FourCC("DIVX"), kXvid}, std::pair{FourCC("DX50"), kXvid},  std::pair{FourCC("FMP4"), kXvid},
    std::pair{FourCC("MP4V"), kXvid}, std::pair{FourCC("AVC1"), kH264},  std::pair{FourCC("X264"), kH264},
    std::pair{FourCC("H265"), kHevc}, std::pair{FourCC("HVC1"), kHevc},  std::pair{FourCC("HEV1"), kHevc},
    std::pair{FourCC("X265"), kHevc}, std::pair{FourCC("JPEG"), kMjpg},  std::pair{FourCC("VP8 "), kVp8},
    std::pair{FourCC("VP9 "), kVp9},  std::pair{FourCC("VP09"), kVp9},   std::pair{FourCC("MP2V"), kMpeg2},
    std::pair{FourCC("AV1 "), kAv1},
    std::pair{FourCC("MP4A"), kAac},  std::pair{FourCC(".MP3"), kMp3},   std::pair{FourCC("AC-3"), kAc3},
    std::pair{FourCC("LPCM"), kPcm},  std::pair{FourCC("SOWT"), kPcm},
};
// clang-format on

/// Whether `name` is one of those that stand in `list` between commas, in small letters.
bool IsListed(const char* list, const std::string& name) {
    std::string small(name);
    std::transform(small.begin(), small.end(), small.begin(),
                   [](unsigned char letter) { return static_cast<char>(std::tolower(letter)); });
    const std::string_view all(list);
    for (size_t at = all.find(small); at != std::string_view::npos; at = all.find(small, at + 1)) {
        const size_t end = at + small.size();
        if ((at == 0 || all[at - 1] == ',') && (end == all.size() || all[end] == ','))
            return true;
    }
    return false;
}

/// The code in capitals, other names replaced by the table's.
uint32_t Canonical(uint32_t code) {
    uint32_t upper = 0;
    for (int shift = 0; shift < 32; shift += 8) {
        const auto byte = static_cast<unsigned char>(code >> shift);
        upper |= static_cast<uint32_t>(std::toupper(byte) & 0xFF) << shift;
    }
    for (const auto& [other, code_in_table] : kAliases)
        if (other == upper)
            return code_in_table;
    return upper;
}

template <typename Table>
const typename Table::value_type* FindByCode(const Table& table, uint32_t code) {
    const auto found =
        std::find_if(table.begin(), table.end(), [code](const auto& row) { return row.code == code; });
    return found == table.end() ? nullptr : &*found;
}

template <typename Table>
const typename Table::value_type* FindFitting(const Table& table, const std::array<uint32_t, 12>& fitting,
                                              uint32_t code) {
    const uint32_t canonical = Canonical(code);
    const bool fits = canonical != 0 && std::find(fitting.begin(), fitting.end(), canonical) != fitting.end();
    return fits ? FindByCode(table, canonical) : nullptr;
}

template <typename Table>
bool CanEncode(const Table& table, uint32_t code) {
    const auto* codec = FindByCode(table, code);
    return codec != nullptr && avcodec_find_encoder_by_name(codec->encoder) != nullptr;
}

/// The codes from `fitting` that can be encoded here, into the zeroed list `codes`; true when there is one.
template <typename Table>
bool CopyEncodable(const Table& table, const std::array<uint32_t, 12>& fitting, uint32_t* codes) {
    const auto canEncode = [&](uint32_t code) { return code != 0 && CanEncode(table, code); };
    return std::copy_if(fitting.begin(), fitting.end(), codes, canEncode) != codes;
}

FileFormatInfo Describe(const Container& container) {
    FileFormatInfo info{};
    info.fccFormat = container.code;
    std::strncpy(info.szName, container.name, sizeof info.szName - 1);
    std::strncpy(info.szExtensions, container.extensions, sizeof info.szExtensions - 1);
    info.bHasVideo = CopyEncodable(kPictureCodecs, container.video, info.fccVideoCodecs) ? 1 : 0;
    info.bHasAudio = CopyEncodable(kSoundCodecs, container.audio, info.fccAudioCodecs) ? 1 : 0;
    return info;
}

} // namespace

const Container* FindContainer(uint32_t code) {
    return code == 0 ? nullptr : FindByCode(kContainers, Canonical(code));
}

const PictureCodec* FindPictureCodec(uint32_t code) {
    return FindByCode(kPictureCodecs, Canonical(code));
}

const PictureCodec* FindPictureCodec(const Container& container, uint32_t code) {
    return FindFitting(kPictureCodecs, container.video, code);
}

const SoundCodec* FindSoundCodec(const Container& container, uint32_t code) {
    return FindFitting(kSoundCodecs, container.audio, code);
}

bool TakesDeep(const PictureCodec& codec) {
    const AVCodec* encoder = codec.deep ? FindEncoder(codec) : nullptr;
    if (encoder == nullptr || encoder->pix_fmts == nullptr)
        return false;
    const AVPixelFormat* format = encoder->pix_fmts;
    while (*format != AV_PIX_FMT_NONE && *format != AV_PIX_FMT_YUV420P10)
        ++format;
    return *format != AV_PIX_FMT_NONE;
}

const AVCodec* FindEncoder(const PictureCodec& codec) {
    return avcodec_find_encoder_by_name(codec.encoder);
}

const AVCodec* FindEncoder(const SoundCodec& codec, int bitsPerSample) {
    if (codec.code != kPcm)
        return avcodec_find_encoder_by_name(codec.encoder);
    switch (bitsPerSample) {
    case 8:
        return avcodec_find_encoder(AV_CODEC_ID_PCM_U8);
    case 24:
        return avcodec_find_encoder(AV_CODEC_ID_PCM_S24LE);
    case 32:
        return avcodec_find_encoder(AV_CODEC_ID_PCM_S32LE);
    default:
        return avcodec_find_encoder(AV_CODEC_ID_PCM_S16LE);
    }
}

AVCodecID PacketForm(const Container& container, AVCodecID codec) {
    const AVCodecDescriptor* descriptor = avcodec_descriptor_get(codec);
    if (descriptor != nullptr && descriptor->type == AVMEDIA_TYPE_AUDIO && container.copiedSound != nullptr)
        return av_match_list(descriptor->name, container.copiedSound, ',') > 0 ? codec : AV_CODEC_ID_NONE;
    if (descriptor == nullptr || descriptor->type != AVMEDIA_TYPE_SUBTITLE || container.subtitles == nullptr)
        return AV_CODEC_ID_NONE;
    if (av_match_list(descriptor->name, container.subtitles, ',') > 0)
        return codec;
    const std::string list(container.subtitles);
    const AVCodecDescriptor* usual = avcodec_descriptor_get_by_name(list.substr(0, list.find(',')).c_str());
    const bool bothTexts =
        usual != nullptr && (usual->props & descriptor->props & AV_CODEC_PROP_TEXT_SUB) != 0;
    const bool convertible = bothTexts && codec != AV_CODEC_ID_EIA_608 &&
                             avcodec_find_decoder(codec) != nullptr &&
                             avcodec_find_encoder(usual->id) != nullptr;
    return convertible ? usual->id : AV_CODEC_ID_NONE;
}

bool CarriesTag(const Container& container, const std::string& key, const std::string& value) {
    const size_t most = (container.ways & kTinyTags) != 0    ? 255
                        : (container.ways & kShortTags) != 0 ? 65535
                                                             : std::numeric_limits<size_t>::max();
    return (container.carries & kTags) != 0 && (container.tags == nullptr || IsListed(container.tags, key)) &&
           value.size() <= most;
}

bool CarriesTrackTag(const Container& container, const std::string& key, const std::string& value) {
    if (key == "title")
        return (container.carries & kTitles) != 0;
    if (key == "language_tag")
        return (container.ways & kLanguageTags) != 0;
    if (key != "language")
        return (container.ways & kTrackTexts) != 0;
    if ((container.carries & kLanguages) == 0)
        return false;
    constexpr size_t kLetters = 3;
    return container.tags == nullptr ||
           (value.size() == kLetters && std::all_of(value.begin(), value.end(), [](char letter) {
                return letter >= 'a' && letter <= 'z';
            }));
}

const Carriage& FindCarriage(const Container& container, uint32_t codec) {
    static constexpr Carriage kUsual;
    const auto found = std::find_if(kCarriages.begin(), kCarriages.end(), [&](const Carriage& carriage) {
        return carriage.container == container.code && carriage.codec == codec;
    });
    return found == kCarriages.end() ? kUsual : *found;
}

const Carriage& FindCarriage(const Container& container, AVCodecID soundCodec) {
    const auto* codec = std::find_if(kSoundCodecs.begin(), kSoundCodecs.end(),
                                     [&](const SoundCodec& row) { return row.id == soundCodec; });
    const uint32_t code = codec != kSoundCodecs.end()      ? codec->code
                          : soundCodec == AV_CODEC_ID_EAC3 ? kEac3
                                                           : 0;
    return FindCarriage(container, code);
}

uint32_t FormatTraits(uint32_t code) {
    const Container* container = FindContainer(code);
    if (container == nullptr)
        return 0;
    return container->carries |
           (container->kind == ContainerKind::kSteadyRate ? uint32_t{kWriterFormatSteadyRate} : 0U);
}

const FileFormatInfo* FileFormatInfos() {
    static const auto table = [] {
        std::array<FileFormatInfo, kContainers.size() + 1> entries{}; // what is not filled ends the table
        auto* entry = entries.data();
        for (const Container& container : kContainers) {
            const FileFormatInfo info = Describe(container);
            if (av_guess_format(container.muxer, nullptr, nullptr) != nullptr &&
                (info.bHasVideo != 0 || info.bHasAudio != 0))
                *entry++ = info;
        }
        return entries;
    }();
    return table.data();
}

} // namespace writer
