#include "writer/ContainerRows.h"

#include "writer/CodecRows.h"
#include "writer/WriterStatus.h"

extern "C" {
#include <libavformat/avformat.h>
}

namespace writer {
namespace {

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
constexpr uint32_t kEarlyChapters = kWriterFormatEarlyChapters;
constexpr uint32_t kNoPictureLanguage = kWriterFormatNoPictureLanguage;
constexpr uint32_t kSmallPackets = kWriterFormatSmallPackets;
constexpr uint32_t kJoinsFrames = kWriterFormatJoinsFrames;

// What the multiplexers write of all that can be said about a movie.
constexpr const char* kMp4Tags =
    "title,artist,album,album_artist,composer,genre,date,track,disc,comment,description,synopsis,copyright,"
    "creation_time,location,lyrics,grouping,show,season_number,episode_id,episode_sort,network,keywords,"
    "media_type,compilation,gapless_playback,hd_video";
constexpr const char* kMovTags =
    "title,artist,author,album,genre,date,comment,copyright,creation_time,location,make,model";
constexpr const char* kRiffTags = "title,artist,album,comment,copyright,date,genre,encoded_by,language,track";
constexpr const char* kServiceTags = "title,service_name,service_provider";
constexpr const char* kNoTags = "";

constexpr int kSenses = AV_DISPOSITION_HEARING_IMPAIRED | AV_DISPOSITION_VISUAL_IMPAIRED;
constexpr int kMp4Flags = AV_DISPOSITION_FORCED | AV_DISPOSITION_COMMENT | AV_DISPOSITION_DUB | kSenses;
constexpr int kMatroskaFlags = kMp4Flags | AV_DISPOSITION_ORIGINAL;

constexpr const char* kMp4Subtitles = "mov_text";
constexpr const char* kMatroskaSubtitles =
    "subrip,ass,ssa,text,webvtt,hdmv_pgs_subtitle,hdmv_text_subtitle,dvd_subtitle,dvb_subtitle";
constexpr const char* kMovSound =
    "aac,mp3,ac3,eac3,alac,pcm_s16le,pcm_s16be,pcm_s24le,pcm_s24be,pcm_s32le,pcm_s32be,pcm_f32le,pcm_f32be,"
    "pcm_u8,pcm_s8,pcm_alaw,pcm_mulaw";
constexpr const char* kMatroskaSound =
    "aac,mp3,mp2,ac3,eac3,dts,truehd,mlp,flac,alac,opus,vorbis,tta,wavpack,pcm_s16le,pcm_s24le,pcm_s32le,"
    "pcm_s16be,pcm_s24be,pcm_s32be,pcm_f32le,pcm_f64le,pcm_u8";

constexpr const char* kClusters = "cluster_time_limit=1000"; // what is lost at most when a file is cut off

constexpr std::array kContainerRows{
    Container{
        .code = FourCC("MP4 "),
        .name = "MP4 (MPEG-4 Part 14)",
        .extensions = "mp4,m4v",
        .muxer = "mp4",
        .kind = ContainerKind::kFragmented,
        .carries = kTags | kChapters | kCover | kTracks | kLanguages | kTitles | kTimecode | kJoinsFrames,
        .tags = kMp4Tags,
        .trackFlags = kMp4Flags,
        .subtitles = kMp4Subtitles,
        .copiedSound = "aac,mp3,mp2,ac3,eac3,opus,vorbis,alac,dts",
        .ways = kLanguageTags,
        .video = {kXvid, kH264, kHevc, kMjpg, kVp9, kMpeg2, kAv1},
        .audio = {kAac, kMp3, kAc3, kOpus, kVorbis},
    },
    Container{
        .code = FourCC("MOV "),
        .name = "QuickTime",
        .extensions = "mov,qt",
        .muxer = "mov",
        .kind = ContainerKind::kFragmented,
        .carries = kTags | kChapters | kTracks | kLanguages | kTitles | kTimecode | kJoinsFrames,
        .tags = kMovTags,
        .subtitles = kMp4Subtitles,
        .copiedSound = kMovSound,
        .ways = kLanguageTags | kShortTags,
        .video = {kXvid, kH264, kHevc, kMjpg, kMpeg2},
        .audio = {kAac, kMp3, kAc3, kAlac, kPcm},
    },
    Container{
        .code = FourCC("MKV "),
        .name = "Matroska",
        .extensions = "mkv",
        .muxer = "matroska",
        .options = kClusters,
        .carries =
            kTags | kChapters | kCover | kCoverText | kFiles | kTracks | kLanguages | kTitles | kTimecode,
        .trackFlags = kMatroskaFlags,
        .subtitles = kMatroskaSubtitles,
        .copiedSound = kMatroskaSound,
        .ways = kLanguageTags | kTrackTexts,
        .video = {kXvid, kH264, kHevc, kMjpg, kVp8, kVp9, kMpeg2, kFlv1, kAv1, kFfv1},
        .audio = {kAac, kMp3, kAc3, kFlac, kOpus, kVorbis, kAlac, kMp2, kPcm},
    },
    Container{
        .code = FourCC("MKA "),
        .name = "Matroska audio",
        .extensions = "mka",
        .muxer = "matroska",
        .options = kClusters,
        .carries = kTags | kChapters | kCover | kCoverText | kFiles | kTracks | kLanguages | kTitles,
        .trackFlags = kMatroskaFlags,
        .subtitles = kMatroskaSubtitles,
        .copiedSound = kMatroskaSound,
        .ways = kLanguageTags | kTrackTexts,
        .audio = {kAac, kMp3, kAc3, kFlac, kOpus, kVorbis, kAlac, kMp2, kPcm},
    },
    Container{
        .code = FourCC("AVI "),
        .name = "AVI (Audio Video Interleaved)",
        .extensions = "avi,divx",
        .muxer = "avi",
        .kind = ContainerKind::kSteadyRate,
        .carries = kTags | kTracks | kTitles,
        .tags = kRiffTags,
        // Not DTS: FFmpeg writes a rate of its packets that readers take for four times as fast.
        .copiedSound = "mp3,mp2,ac3,aac,pcm_s16le,pcm_s24le,pcm_s32le,pcm_u8,pcm_alaw,pcm_mulaw",
        .ways = kCountsSamples,
        .video = {kXvid, kH264, kMjpg, kVp8, kMpeg2, kFlv1},
        .audio = {kMp3, kAac, kAc3, kPcm},
    },
    Container{
        .code = FourCC("WEBM"),
        .name = "WebM",
        .extensions = "webm",
        .muxer = "webm",
        .options = kClusters,
        .carries = kTags | kChapters | kTracks | kLanguages | kTitles | kTimecode,
        .trackFlags = AV_DISPOSITION_FORCED,
        .subtitles = "webvtt",
        .copiedSound = "vorbis,opus",
        .ways = kLanguageTags | kTrackTexts,
        .video = {kVp8, kVp9, kAv1},
        .audio = {kVorbis, kOpus},
    },
    Container{
        .code = FourCC("FLV "),
        .name = "Flash Video",
        .extensions = "flv",
        .muxer = "flv",
        .carries = kTags,
        .copiedSound = "aac,mp3",
        .ways = kShortTags,
        .video = {kH264, kFlv1},
        .audio = {kAac, kMp3},
    },
    Container{
        .code = FourCC("TS  "),
        .name = "MPEG transport stream",
        .extensions = "ts",
        .muxer = "mpegts",
        .carries = kTags | kTracks | kLanguages | kNoPictureLanguage | kSmallPackets,
        .tags = kServiceTags,
        .trackFlags = kSenses,
        .subtitles = "dvb_subtitle",
        .copiedSound = "aac,aac_latm,mp3,mp2,ac3,eac3,dts,truehd,opus",
        .ways = kTinyTags,
        .video = {kH264, kHevc, kXvid, kMpeg2},
        .audio = {kAac, kMp3, kAc3, kOpus, kMp2},
    },
    Container{
        .code = FourCC("M2TS"),
        .name = "MPEG transport stream of discs and camcorders",
        .extensions = "m2ts,mts",
        .muxer = "mpegts",
        .options = "mpegts_m2ts_mode=1",
        .carries = kTags | kTracks | kLanguages | kNoPictureLanguage | kSmallPackets,
        .tags = kServiceTags,
        .trackFlags = kSenses,
        .subtitles = "hdmv_pgs_subtitle",
        .copiedSound = "ac3,eac3,dts,truehd",
        .ways = kTinyTags,
        .video = {kH264, kHevc, kMpeg2},
        .audio = {kAc3},
    },
    Container{
        .code = FourCC("MPG "),
        .name = "MPEG program stream",
        .extensions = "mpg,mpeg,vob",
        .muxer = "vob",
        .carries = kSmallPackets,
        .tags = kNoTags,
        .copiedSound = "mp2,mp3,ac3,dts",
        .video = {kMpeg2},
        .audio = {kMp2, kAc3},
    },
    Container{
        .code = kGif,
        .name = "GIF (animated)",
        .extensions = "gif",
        .muxer = "gif",
        .tags = kNoTags,
        .video = {kGif},
    },
    Container{
        .code = FourCC("M4A "),
        .name = "MPEG-4 audio",
        .extensions = "m4a,m4b",
        .muxer = "ipod",
        .kind = ContainerKind::kFragmented,
        .carries = kTags | kChapters | kCover | kTracks | kLanguages,
        .tags = kMp4Tags,
        .subtitles = kMp4Subtitles,
        .copiedSound = "aac,alac,ac3",
        .ways = kLanguageTags,
        .audio = {kAac, kAc3, kAlac},
    },
    Container{
        .code = FourCC("MP3 "),
        .name = "MP3",
        .extensions = "mp3",
        .muxer = "mp3",
        .carries = kTags | kCover | kCoverText | kEarlyChapters,
        .copiedSound = "mp3",
        .ways = kCountsSamples,
        .audio = {kMp3},
    },
    Container{
        .code = FourCC("WAV "),
        .name = "WAV (RIFF wave)",
        .extensions = "wav",
        .muxer = "wav",
        .kind = ContainerKind::kSteadyRate,
        .options = "rf64=auto",
        .carries = kTags,
        .tags = kRiffTags,
        .copiedSound = "pcm_s16le,pcm_s24le,pcm_s32le,pcm_f32le,pcm_f64le,pcm_u8,pcm_alaw,pcm_mulaw,mp3,ac3",
        .ways = kCountsSamples,
        .audio = {kPcm, kMp3, kAc3},
    },
    Container{
        .code = FourCC("FLAC"),
        .name = "FLAC",
        .extensions = "flac",
        .muxer = "flac",
        .carries = kTags | kCover | kCoverText | kChapterTexts,
        .copiedSound = "flac",
        .ways = kOneComment | kCountsSamples,
        .audio = {kFlac},
    },
    Container{
        .code = FourCC("OGG "),
        .name = "Ogg",
        .extensions = "ogg,oga,opus",
        .muxer = "ogg",
        .carries = kTags | kLanguages | kChapterTexts,
        .copiedSound = "vorbis,opus,flac,speex",
        .ways = kTagsInStream | kOneComment,
        .audio = {kVorbis, kOpus, kFlac},
    },
};

constexpr std::array kFlashRates{44100, 22050, 11025, 0};
constexpr std::array kStandardMp3Rates{48000, 44100, 32000, 24000, 22050, 16000, 0};
constexpr std::array<uint64_t, 9> kUsualLayouts{
    // where only their number is told
    AV_CH_LAYOUT_MONO,    AV_CH_LAYOUT_STEREO,       AV_CH_LAYOUT_2POINT1,
    AV_CH_LAYOUT_4POINT0, AV_CH_LAYOUT_5POINT0_BACK, AV_CH_LAYOUT_5POINT1_BACK,
    AV_CH_LAYOUT_6POINT1, AV_CH_LAYOUT_7POINT1,      0};
constexpr std::array<uint64_t, 9> kFlacLayouts{
    AV_CH_LAYOUT_MONO,    AV_CH_LAYOUT_STEREO,  AV_CH_LAYOUT_SURROUND,
    AV_CH_LAYOUT_QUAD,    AV_CH_LAYOUT_5POINT0, AV_CH_LAYOUT_5POINT1,
    AV_CH_LAYOUT_6POINT1, AV_CH_LAYOUT_7POINT1, 0};

constexpr std::array kCarriageRows{
    Carriage{.container = FourCC("MOV "), .codec = kXvid, .tag = kXvid},
    Carriage{.container = FourCC("AVI "), .codec = kXvid, .tag = kXvid, .isBt601 = true},
    Carriage{.container = FourCC("TS  "), .codec = kXvid, .isBt601 = true},
    // Players of one large vendor take HEVC only under this tag.
    Carriage{.container = FourCC("MP4 "), .codec = kHevc, .tag = FourCC("hvc1")},
    Carriage{.container = FourCC("MOV "), .codec = kHevc, .tag = FourCC("hvc1")},
    Carriage{.container = FourCC("MP4 "), .codec = kAc3, .describedByPacket = true},
    Carriage{.container = FourCC("MOV "), .codec = kAc3, .describedByPacket = true},
    Carriage{.container = FourCC("M4A "), .codec = kAc3, .describedByPacket = true},
    Carriage{.container = FourCC("MP4 "), .codec = kEac3, .describedByPacket = true},
    Carriage{.container = FourCC("MOV "), .codec = kEac3, .describedByPacket = true},
    Carriage{.container = FourCC("FLV "), .codec = kMp3, .sampleRates = kFlashRates.data()},
    Carriage{.container = FourCC("MP4 "), .codec = kMp3, .sampleRates = kStandardMp3Rates.data()},
    // A frame of more than 768 bytes a channel counts as two there, and encoders go above their rate.
    Carriage{.container = FourCC("AVI "), .codec = kAac, .maxBits = 4.0},
    Carriage{.container = FourCC("MPG "), .codec = kMpeg2, .steadyPictures = true},
    Carriage{.container = FourCC("OGG "), .codec = kFlac, .layouts = kFlacLayouts.data()},
    Carriage{.container = FourCC("MKV "), .codec = kPcm, .layouts = kUsualLayouts.data()},
    Carriage{.container = FourCC("MKA "), .codec = kPcm, .layouts = kUsualLayouts.data()},
};

} // namespace

std::span<const Container> Containers() {
    return kContainerRows;
}

std::span<const Carriage> Carriages() {
    return kCarriageRows;
}

} // namespace writer
