#include "host/source/StreamDescription.h"

#include "ffmpeg/Loudspeakers.h"
#include "host/source/Charset.h"
#include "host/source/ColourMatrix.h"
#include "host/source/MediaTime.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstring>
#include <string_view>
#include <utility>

extern "C" {
#include <libavutil/avstring.h>
#include <libavutil/display.h>
#include <libavutil/dovi_meta.h>
#include <libavutil/pixdesc.h>
#include <libavutil/stereo3d.h>
}

namespace movieconv {
namespace {

// A multiplexer's notes about its own file, and what is described in fields of its own.
constexpr std::array<std::string_view, 13> kNotes{
    "encoder",  "major_brand", "minor_version", "compatible_brands", "handler_name", "vendor_id", "duration",
    "language", "filename",    "mimetype",      "variant_bitrate",   "id3v2_priv",   "rotate"};
constexpr std::array<std::string_view, 7> kStatistics{
    "BPS",       "NUMBER_OF_FRAMES", "NUMBER_OF_BYTES",  "_STATISTICS_",
    "DURATION-", "SOURCE_ID",        "file_package_umid"};

bool IsNote(const std::string& key) {
    const auto same = [&](std::string_view note) { return av_strcasecmp(key.c_str(), note.data()) == 0; };
    const auto begins = [&](std::string_view note) { return key.compare(0, note.size(), note) == 0; };
    return std::any_of(kNotes.begin(), kNotes.end(), same) ||
           std::any_of(kStatistics.begin(), kStatistics.end(), begins);
}

/// Old files have texts in the character set of their time; no container of today takes these.
std::string TagOf(const AVDictionary* metadata, const char* key) {
    const AVDictionaryEntry* entry = av_dict_get(metadata, key, nullptr, 0);
    return entry != nullptr ? Decoded(entry->value) : "";
}

std::vector<Tag> TagsWithout(const AVDictionary* metadata, std::string_view left) {
    std::vector<Tag> tags = DescribeTags(metadata);
    tags.erase(
        std::remove_if(tags.begin(), tags.end(),
                       [&](const Tag& tag) { return av_strcasecmp(tag.key.c_str(), left.data()) == 0; }),
        tags.end());
    return tags;
}

/// "location" for QuickTime's long name of it, where nothing else has that name.
std::string UsualKey(const AVDictionary& metadata, const std::string& key) {
    constexpr std::string_view kQuickTime = "com.apple.quicktime.";
    constexpr std::string_view kPlaceForm = ".ISO6709";
    constexpr std::array<std::string_view, 11> kUsual{"title",     "artist",      "author", "album",
                                                      "comment",   "description", "genre",  "keywords",
                                                      "copyright", "make",        "model"};
    if (key.compare(0, kQuickTime.size(), kQuickTime) != 0)
        return key;
    std::string rest = key.substr(kQuickTime.size());
    const bool isPlace = rest == "location" + std::string(kPlaceForm);
    if (isPlace)
        rest = "location";
    const bool isUsual = isPlace || std::find(kUsual.begin(), kUsual.end(), rest) != kUsual.end();
    return isUsual && av_dict_get(&metadata, rest.c_str(), nullptr, 0) == nullptr ? rest : key;
}

bool IsUsual(AVRational rate) {
    constexpr double kUsualFrameRate = 200; // a higher one may be an artefact of the container's clock
    return rate.num > 0 && rate.den > 0 && av_q2d(rate) <= kUsualFrameRate;
}

/// Pictures per second by the container's word: the average rate, or its nominal one where they agree or no
/// average is told. 0 when that is not usual.
double ToldFrameRate(const AVStream* stream) {
    const AVRational average = stream->avg_frame_rate;
    const AVRational nominal = stream->r_frame_rate;
    if (IsUsual(average))
        return av_q2d(IsUsual(nominal) && std::abs(av_q2d(nominal) / av_q2d(average) - 1) < 0.01 ? nominal
                                                                                                 : average);
    const bool isAverageTold = average.num > 0 && average.den > 0;
    return IsUsual(nominal) && !isAverageTold ? av_q2d(nominal) : 0;
}

/// Reads the turn that brings the stored picture upright from the container's display matrix.
void ReadOrientation(const AVStream* stream, PictureStreamInfo& info) {
    const uint8_t* data = av_stream_get_side_data(stream, AV_PKT_DATA_DISPLAYMATRIX, nullptr);
    if (data == nullptr)
        return;
    int32_t matrix[9];
    std::copy_n(data, sizeof matrix, reinterpret_cast<uint8_t*>(matrix));
    const int64_t determinant =
        static_cast<int64_t>(matrix[0]) * matrix[4] - static_cast<int64_t>(matrix[1]) * matrix[3];
    info.mirrored = determinant < 0;
    if (info.mirrored)
        av_display_matrix_flip(matrix, 1, 0);
    const double counterClockwise = av_display_rotation_get(matrix);
    if (!std::isnan(counterClockwise)) {
        const int turns = static_cast<int>((std::lround(-counterClockwise / 90) % 4 + 4) % 4);
        // The matrix mirrors last, the converter first: the turn changes its direction.
        info.quarterTurns = info.mirrored ? (4 - turns) % 4 : turns;
    }
}

AVRational PixelAspect(AVFormatContext& context, AVStream* stream, bool turned) {
    AVRational aspect = av_guess_sample_aspect_ratio(&context, stream, nullptr);
    if (aspect.num <= 0 || aspect.den <= 0)
        return {1, 1};
    return turned ? av_inv_q(aspect) : aspect;
}

void ReadSideData(const AVStream* stream, PictureStreamInfo& info) {
    const auto sideData = [&](AVPacketSideDataType type) {
        return av_stream_get_side_data(stream, type, nullptr);
    };
    TakeLight(
        reinterpret_cast<const AVMasteringDisplayMetadata*>(sideData(AV_PKT_DATA_MASTERING_DISPLAY_METADATA)),
        reinterpret_cast<const AVContentLightMetadata*>(sideData(AV_PKT_DATA_CONTENT_LIGHT_LEVEL)), info);
    const auto* dolby =
        reinterpret_cast<const AVDOVIDecoderConfigurationRecord*>(sideData(AV_PKT_DATA_DOVI_CONF));
    info.dolbyVision = dolby != nullptr;
    info.dolbyVisionAlone = dolby != nullptr && dolby->dv_bl_signal_compatibility_id == 0;
    const auto* stereo = reinterpret_cast<const AVStereo3D*>(sideData(AV_PKT_DATA_STEREO3D));
    info.stereoscopic = stereo != nullptr && stereo->type != AV_STEREO3D_2D;
    info.spherical = sideData(AV_PKT_DATA_SPHERICAL) != nullptr;
}

/// Opacity beside VP9's pictures is told by a tag only. A GIF's pixels always have room for it, and hardly
/// ever use it.
bool HasOpacity(const AVStream* stream, const AVPixFmtDescriptor& format) {
    const AVDictionaryEntry* tag = av_dict_get(stream->metadata, "alpha_mode", nullptr, 0);
    const bool isTagged = tag != nullptr && std::strcmp(tag->value, "1") == 0;
    const bool isInPixels = (format.flags & AV_PIX_FMT_FLAG_ALPHA) != 0 &&
                            (format.flags & AV_PIX_FMT_FLAG_PAL) == 0 &&
                            stream->codecpar->codec_id != AV_CODEC_ID_GIF;
    return isTagged || isInPixels;
}

/// Empty where half the resolution in both directions, or none, is all there is.
std::string FinerThanHalf(const AVPixFmtDescriptor& format) {
    if (IsRgb(av_pix_fmt_desc_get_id(&format)))
        return "RGB";
    if (format.nb_components < 3 || (format.log2_chroma_w > 0 && format.log2_chroma_h > 0))
        return "";
    if (format.log2_chroma_w == 0)
        return format.log2_chroma_h == 0 ? "4:4:4" : "4:4:0";
    return format.log2_chroma_w == 1 ? "4:2:2" : "4:1:1";
}

/// The pixels tell RGB: not every container does, and a label of RGB on others is a mistake.
int MatrixOf(const AVCodecParameters& parameters) {
    if (IsRgb(static_cast<AVPixelFormat>(parameters.format)))
        return kMatrixRgb;
    return parameters.color_space == AVCOL_SPC_RGB ? kMatrixUnstated : parameters.color_space;
}

PictureStreamInfo DescribePictures(AVFormatContext& context, AVStream* stream) {
    const AVCodecParameters& parameters = *stream->codecpar;
    PictureStreamInfo info;
    info.index = stream->index;
    info.codec = avcodec_get_name(parameters.codec_id);
    if (const AVPixFmtDescriptor* format =
            av_pix_fmt_desc_get(static_cast<AVPixelFormat>(parameters.format))) {
        info.pixelFormat = format->name;
        info.depth = format->comp[0].depth;
        info.fineColours = FinerThanHalf(*format);
        info.transparent = HasOpacity(stream, *format);
    } else {
        info.pixelFormat = "unknown";
    }
    ReadOrientation(stream, info);
    const bool turned = info.quarterTurns % 2 != 0;
    info.width = turned ? parameters.height : parameters.width;
    info.height = turned ? parameters.width : parameters.height;
    info.pixelAspect = PixelAspect(context, stream, turned);
    info.codedAspect =
        parameters.sample_aspect_ratio.num > 0 ? parameters.sample_aspect_ratio : stream->sample_aspect_ratio;
    info.frameRate = ToldFrameRate(stream);
    info.interlaced = parameters.field_order > AV_FIELD_PROGRESSIVE;
    info.topFieldFirst = parameters.field_order == AV_FIELD_TT || parameters.field_order == AV_FIELD_BT;
    info.fullRange = parameters.color_range == AVCOL_RANGE_JPEG;
    info.colorPrimaries = parameters.color_primaries;
    info.colorTransfer = parameters.color_trc;
    info.colorMatrix = MatrixOf(parameters);
    info.matrixByPicture = (context.iformat->flags & AVFMT_TS_DISCONT) != 0;
    ReadSideData(stream, info);
    return info;
}

/// Of a layout that tells only how many channels there are, the usual one's.
std::string LayoutName(const AVChannelLayout& layout) {
    const av::ChannelLayout usual(layout.nb_channels);
    char text[64] = "";
    av_channel_layout_describe(layout.order == AV_CHANNEL_ORDER_UNSPEC ? usual.Get() : &layout, text,
                               sizeof text);
    return text;
}

SoundStreamInfo DescribeSound(const AVStream* stream) {
    const AVCodecParameters& parameters = *stream->codecpar;
    SoundStreamInfo info;
    info.index = stream->index;
    info.codec = avcodec_get_name(parameters.codec_id);
    info.layout = LayoutName(parameters.ch_layout);
    info.sampleRate = parameters.sample_rate;
    info.channels = parameters.ch_layout.nb_channels;
    info.speakers = av::SpeakersOf(parameters.ch_layout);
    const int storedBits =
        std::max(parameters.bits_per_raw_sample, av_get_exact_bits_per_sample(parameters.codec_id));
    info.bitsPerSample = storedBits > 16 ? 32 : 16;
    return info;
}

StreamKind KindOf(const AVStream* stream) {
    const AVMediaType type = stream->codecpar->codec_type;
    if (type == AVMEDIA_TYPE_VIDEO)
        return (stream->disposition & AV_DISPOSITION_ATTACHED_PIC) != 0 ? StreamKind::kCover
                                                                        : StreamKind::kPictures;
    return type == AVMEDIA_TYPE_AUDIO        ? StreamKind::kSound
           : type == AVMEDIA_TYPE_SUBTITLE   ? StreamKind::kSubtitles
           : type == AVMEDIA_TYPE_ATTACHMENT ? StreamKind::kAttachment
                                             : StreamKind::kData;
}

StreamFlags FlagsOf(const AVStream* stream) {
    const auto has = [&](int flag) { return (stream->disposition & flag) != 0; };
    return {has(AV_DISPOSITION_DEFAULT),        has(AV_DISPOSITION_FORCED),
            has(AV_DISPOSITION_ORIGINAL),       has(AV_DISPOSITION_DUB),
            has(AV_DISPOSITION_COMMENT),        has(AV_DISPOSITION_HEARING_IMPAIRED),
            has(AV_DISPOSITION_VISUAL_IMPAIRED)};
}

/// Texts become data when FFmpeg has read the chapters in them; other data of MP4 have tags of their own.
bool IsChapterTrack(const AVCodecParameters& parameters) {
    return parameters.codec_id == AV_CODEC_ID_BIN_DATA &&
           (parameters.codec_tag == MKTAG('t', 'e', 'x', 't') ||
            parameters.codec_tag == MKTAG('t', 'x', '3', 'g'));
}

/// A stamp in seconds from `start`.
double SecondsFrom(int64_t start, int64_t stamp, AVRational timeBase) {
    return ToSeconds(av_sat_sub64(av_rescale_q(stamp, timeBase, {1, kTicksPerSecond}), start));
}

StreamInfo DescribeStream(AVFormatContext& context, AVStream* stream, int64_t start) {
    const AVCodecParameters& parameters = *stream->codecpar;
    StreamInfo info;
    info.index = stream->index;
    info.kind = KindOf(stream);
    SetCodec(info, parameters.codec_id);
    if (const char* profile = avcodec_profile_name(parameters.codec_id, parameters.profile))
        info.profile = profile;
    info.language = TagOf(stream->metadata, "language");
    if (info.language == "und")
        info.language.clear();
    info.title = TagOf(stream->metadata, "title");
    info.flags = FlagsOf(stream);
    if (stream->start_time != AV_NOPTS_VALUE)
        info.begin = SecondsFrom(start, stream->start_time, stream->time_base);
    if (stream->duration > 0)
        info.duration =
            info.begin.value_or(0) + static_cast<double>(stream->duration) * av_q2d(stream->time_base);
    info.bitRate = parameters.bit_rate;
    info.tags = TagsWithout(stream->metadata, "title");
    info.fileName = TagOf(stream->metadata, "filename");
    info.mimeType = TagOf(stream->metadata, "mimetype");
    info.bytes = info.kind == StreamKind::kCover        ? stream->attached_pic.size
                 : info.kind == StreamKind::kAttachment ? parameters.extradata_size
                                                        : 0;
    info.holdsChapters = IsChapterTrack(parameters);
    if (parameters.codec_type == AVMEDIA_TYPE_VIDEO) {
        info.pictures = DescribePictures(context, stream);
        info.pictures->duration = info.duration;
    } else if (parameters.codec_type == AVMEDIA_TYPE_AUDIO) {
        info.sound = DescribeSound(stream);
        info.sound->duration = info.duration;
    }
    return info;
}

} // namespace

std::string_view KindName(StreamKind kind) {
    switch (kind) {
    case StreamKind::kPictures:
        return "pictures";
    case StreamKind::kSound:
        return "sound";
    case StreamKind::kSubtitles:
        return "subtitles";
    case StreamKind::kCover:
        return "cover";
    case StreamKind::kAttachment:
        return "attachment";
    case StreamKind::kData:
        break;
    }
    return "data";
}

void SetCodec(StreamInfo& info, AVCodecID codec) {
    const AVCodecDescriptor* descriptor = avcodec_descriptor_get(codec);
    info.codec = avcodec_get_name(codec);
    info.decodable = avcodec_find_decoder(codec) != nullptr;
    info.textual = descriptor != nullptr && (descriptor->props & AV_CODEC_PROP_TEXT_SUB) != 0;
}

void TakeLight(const AVMasteringDisplayMetadata* display, const AVContentLightMetadata* light,
               PictureStreamInfo& info) {
    if (display != nullptr && display->has_primaries != 0 && display->has_luminance != 0) {
        MasteringDisplay& told = info.masteringDisplay.emplace();
        for (int axis = 0; axis < 2; ++axis) {
            told.red[axis] = av_q2d(display->display_primaries[0][axis]);
            told.green[axis] = av_q2d(display->display_primaries[1][axis]);
            told.blue[axis] = av_q2d(display->display_primaries[2][axis]);
            told.white[axis] = av_q2d(display->white_point[axis]);
        }
        told.darkest = av_q2d(display->min_luminance);
        told.brightest = av_q2d(display->max_luminance);
    }
    if (light != nullptr)
        info.lightLevel = {static_cast<int>(light->MaxCLL), static_cast<int>(light->MaxFALL)};
}

std::vector<StreamInfo> DescribeStreams(AVFormatContext& context, int64_t start) {
    std::vector<StreamInfo> streams;
    for (unsigned i = 0; i < context.nb_streams; ++i)
        streams.push_back(DescribeStream(context, context.streams[i], start));
    for (unsigned i = 0; i < context.nb_programs; ++i) {
        const AVProgram& program = *context.programs[i];
        for (unsigned k = 0; k < program.nb_stream_indexes; ++k)
            streams[program.stream_index[k]].programs.push_back(program.id);
    }
    return streams;
}

std::vector<Chapter> DescribeChapters(const AVFormatContext& context, int64_t start) {
    std::vector<Chapter> chapters;
    for (unsigned i = 0; i < context.nb_chapters; ++i) {
        const AVChapter& chapter = *context.chapters[i];
        chapters.push_back({SecondsFrom(start, chapter.start, chapter.time_base),
                            SecondsFrom(start, chapter.end, chapter.time_base),
                            TagOf(chapter.metadata, "title"), TagsWithout(chapter.metadata, "title"),
                            chapter.id});
    }
    return chapters;
}

bool IsImage(const AVFormatContext& context, const SourceInfo& info) {
    if (!info.pictures || info.sound)
        return false;
    const std::string_view format = context.iformat->name;
    constexpr std::string_view kPipe = "_pipe"; // FFmpeg's formats of one kind of image each end so
    if (format == "image2" ||
        (format.size() > kPipe.size() && format.substr(format.size() - kPipe.size()) == kPipe))
        return true;
    const std::string brand = TagOf(context.metadata, "major_brand");
    const bool mayBe = format == "gif" || format == "apng" || brand == "avif" || brand == "heic";
    constexpr double kLessThanTwo = 1.5; // pictures
    return mayBe && info.pictures->duration * info.pictures->frameRate < kLessThanTwo;
}

std::vector<Tag> DescribeTags(const AVDictionary* metadata) {
    std::vector<Tag> tags;
    const AVDictionaryEntry* entry = nullptr;
    while ((entry = av_dict_get(metadata, "", entry, AV_DICT_IGNORE_SUFFIX)) != nullptr)
        if (!IsNote(entry->key))
            tags.push_back({UsualKey(*metadata, Decoded(entry->key)), Decoded(entry->value)});
    return tags;
}

std::vector<Tag> DescribeService(AVFormatContext& context, int stream) {
    // What FFmpeg's multiplexer writes of services that have no name.
    constexpr std::string_view kNoName = "Service01";
    constexpr std::string_view kNoProvider = "FFmpeg";
    std::vector<Tag> tags;
    const AVProgram* program = av_find_program_from_stream(&context, nullptr, stream);
    if (program == nullptr)
        return tags;
    if (std::string name = TagOf(program->metadata, "service_name"); !name.empty() && name != kNoName)
        tags.push_back({"title", std::move(name)});
    if (std::string provider = TagOf(program->metadata, "service_provider");
        !provider.empty() && provider != kNoProvider)
        tags.push_back({"service_provider", std::move(provider)});
    return tags;
}

} // namespace movieconv
