#include "writer/FilePlan.h"

#include "ffmpeg/ExactRate.h"
#include "media/CodeText.h"
#include "media/Limits.h"
#include "media/MediaRecords.h"
#include "writer/PaletteMaker.h"
#include "writer/WriterFailure.h"

extern "C" {
#include <libavutil/imgutils.h>
}

#include <algorithm>
#include <array>
#include <cmath>
#include <string>
#include <thread>

namespace writer {
namespace {

constexpr double kDefaultFrameRate = 25.0;
constexpr double kLeastFrameRate = 0.0001; // what is below is no rate, as in the engine
constexpr double kMostFrameRate = 1000.0;
constexpr long kMostThreads = 16;

/// The first value that is above 0, else `last`.
template <typename Number>
Number FirstPositive(Number first, Number second, Number last) {
    return first > 0 ? first : second > 0 ? second : last;
}

double UsableRate(double rate) {
    return std::isfinite(rate) && rate > kLeastFrameRate ? std::min(rate, kMostFrameRate) : 0.0;
}

bool SameRate(double one, double other) {
    return std::abs(one - other) <= 0.001 * other;
}

/// The rate itself where the codec takes any; else the nearest of its own that is not below, or the highest.
AVRational TakenRate(const PictureCodec& codec, double rate) {
    const AVRational* own = codec.rates;
    if (own == nullptr)
        return av::ExactRate(codec.maxRate > 0 ? std::min(rate, codec.maxRate) : rate);
    while (own[1].num != 0 && !SameRate(rate, av_q2d(*own)) && av_q2d(*own) < rate)
        ++own;
    return *own;
}

int ChooseThreads(const PictureCodec& codec, const WriterOptions& options) {
    if (options.nEncoderThreads > 0)
        return options.nEncoderThreads;
    const long wanted = std::lround(codec.threads * std::thread::hardware_concurrency());
    return static_cast<int>(std::clamp(wanted, 1L, kMostThreads));
}

/// An ISO/IEC 23091-2 code as FFmpeg's enumerations, which have the same values; 2 is "not stated" in all of
/// them.
template <typename Enumeration>
Enumeration ColorCode(int code, int end) {
    return static_cast<Enumeration>(code > 0 && code < end ? code : 2);
}

std::string FormatText(const EncodeParam& param) {
    return "\"" + CodeText(param.fccFileFormat) + "\"";
}

constexpr std::array kProfiles{"baseline", "main", "high"};

void SetCompression(PictureSettings& settings, const PictureCodec& codec, const WriterOptions& options) {
    const int speed = options.nSpeed != 0 ? options.nSpeed : kUsualSpeed;
    const QualityScale& scale = codec.quality;
    if (speed < 1 || speed > static_cast<int>(codec.speed.values.size()) || options.nProfile < 0 ||
        options.nProfile > static_cast<int>(kProfiles.size()))
        throw WriterFailure(kWriterErrorArgument, "There is no such speed or profile.");
    settings.speed = speed - 1;
    if (options.nProfile > 0 && codec.id == AV_CODEC_ID_H264)
        settings.profile = kProfiles.at(static_cast<std::size_t>(options.nProfile) - 1);
    if (options.bQuality == 0)
        return;
    if (scale.kind == QualityKind::kNone ||
        !(options.dQuality >= scale.best && options.dQuality <= scale.worst))
        throw WriterFailure(kWriterErrorArgument, "\"" + CodeText(codec.code) + "\" has no quality of " +
                                                      std::to_string(options.dQuality) + ".");
    settings.quality = options.dQuality;
}

/// The format of the pictures that the encoder gets, by the depth that is asked for.
AVPixelFormat ChooseDepth(const PictureCodec& codec, const WriterOptions& options) {
    constexpr int kDeep = 10;
    const bool deep = options.nDepth == kDeep;
    if ((options.nDepth != 0 && options.nDepth != 8 && !deep) || (deep && !TakesDeep(codec)))
        throw WriterFailure(kWriterErrorArgument, "\"" + CodeText(codec.code) + "\" has no pictures of " +
                                                      std::to_string(options.nDepth) + " bits.");
    return deep ? AV_PIX_FMT_YUV420P10 : codec.format;
}

PictureSettings MakePictureSettings(const EncodeParam& param, const VideoFormat& source,
                                    const PictureCodec& codec, const WriterOptions& options) {
    PictureSettings settings{};
    settings.width = param.nWidth != 0 ? param.nWidth : std::max(0, source.nWidth);
    settings.height = param.nHeight != 0 ? param.nHeight : std::max(0, source.nHeight);
    if (settings.width < 0 || settings.height < 0 ||
        av_image_check_size(static_cast<unsigned>(settings.width), static_cast<unsigned>(settings.height), 0,
                            nullptr) < 0)
        throw WriterFailure(kWriterErrorArgument, "Pictures of " + std::to_string(settings.width) + "x" +
                                                      std::to_string(settings.height) +
                                                      " cannot be written; choose another size.");
    const double rate =
        FirstPositive(UsableRate(param.dFrameRate), UsableRate(source.dFrameRate), kDefaultFrameRate);
    if (options.bSteadyRate != 0 && codec.maxRate > 0 && rate > codec.maxRate)
        throw WriterFailure(kWriterErrorArgument, "\"" + CodeText(codec.code) + "\" shows at most " +
                                                      std::to_string(std::lround(codec.maxRate)) +
                                                      " pictures a second.");
    settings.rate = options.bSteadyRate != 0 ? av::ExactRate(rate) : TakenRate(codec, rate);
    settings.bitrate = FirstPositive(param.nVideoBitrate, kUsualVideoBitrate, 0);
    settings.maxBitrate = param.nVideoRateMode != 0 ? std::max(0, param.nVideoMaxBitrate) : 0;
    settings.threads = ChooseThreads(codec, options);
    SetCompression(settings, codec, options);
    settings.primaries = ColorCode<AVColorPrimaries>(options.nColorPrimaries, AVCOL_PRI_NB);
    settings.transfer = ColorCode<AVColorTransferCharacteristic>(options.nColorTransfer, AVCOL_TRC_NB);
    settings.matrix = ColorCode<AVColorSpace>(options.nColorMatrix, AVCOL_SPC_NB);
    settings.format = ChooseDepth(codec, options);
    settings.light = LightOf(options);
    return settings;
}

/// What is not stated is taken for it, too.
bool IsBt601(AVColorSpace matrix) {
    return matrix == AVCOL_SPC_UNSPECIFIED || matrix == AVCOL_SPC_BT470BG || matrix == AVCOL_SPC_SMPTE170M;
}

/// How large the pictures are, of what shape, and in which form the encoder gets them.
void SetShape(PicturePlan& plan, const EncodeParam& param, const VideoFormat& source,
              const WriterOptions& options) {
    plan.scaling.sourceAspect = {options.nSampleAspectNum, options.nSampleAspectDen};
    if (plan.scaling.sourceAspect.num <= 0 || plan.scaling.sourceAspect.den <= 0)
        plan.scaling.sourceAspect = {1, 1};
    plan.scaling.stretch = param.bResize != 0;
    plan.toPalette = plan.codec->format == AV_PIX_FMT_PAL8;
    const int width = plan.settings.width;
    const int height = plan.settings.height;
    if (source.nWidth > 0 && source.nHeight > 0)
        plan.settings.sampleAspect = FitPicture(source.nWidth, source.nHeight, plan.scaling.sourceAspect,
                                                width, height, plan.scaling.stretch)
                                         .sampleAspect;
    plan.scaling.width = width;
    plan.scaling.height = height;
    plan.scaling.format = plan.toPalette ? kPaletteSource : plan.settings.format;
    if (plan.codec->evenSize) {
        plan.scaling.padWidth = width % 2;
        plan.scaling.padHeight = height % 2;
        plan.settings.width += plan.scaling.padWidth;
        plan.settings.height += plan.scaling.padHeight;
    }
}

void SetColours(PicturePlan& plan, const Carriage& carriage, const WriterOptions& options) {
    plan.scaling.sourceFullRange = options.bFullRange != 0;
    plan.scaling.fullRange = plan.scaling.sourceFullRange || plan.codec->format == AV_PIX_FMT_YUVJ420P;
    plan.settings.fullRange = plan.scaling.fullRange;
    plan.scaling.matrix = plan.scaling.sourceMatrix = plan.settings.matrix;
    if ((plan.codec->isBt601 || carriage.isBt601) && !IsBt601(plan.settings.matrix)) {
        plan.scaling.matrix = SWS_CS_ITU601;
        plan.settings.matrix = AVCOL_SPC_BT470BG;
    }
}

void SetTimes(PicturePlan& plan, const Container& container, const Carriage& carriage,
              const VideoFormat& source, const WriterOptions& options) {
    plan.settings.inOrder = container.kind == ContainerKind::kSteadyRate;
    plan.clock = MakePictureClock(plan.settings.rate, container.kind == ContainerKind::kSteadyRate);
    plan.mostRate = std::max(av_q2d(plan.clock.rate), double{source.dFrameRate});
    const double sourceRate = UsableRate(source.dFrameRate);
    const double rate = av_q2d(plan.settings.rate);
    plan.keepStamps = sourceRate > 0.0 && SameRate(rate, sourceRate) && options.bSteadyRate == 0 &&
                      !carriage.steadyPictures;
    if (options.nPiece == kWriterPiecePictures) {
        if (options.bPieceContinues != 0)
            plan.tickBefore = options.llPieceTick;
        if (options.llPieceEnd >= 0)
            plan.end = options.llPieceEnd;
    }
    plan.pictureLength =
        std::llround(static_cast<double>(kTicksPerSecond) / (sourceRate > 0.0 ? sourceRate : rate));
}

/// Whether pictures keep the source's times, of which the engine is told another rate than they have.
bool KeepsOtherRate(const EncodeParam& param, const VideoFormat& source, const Container& container,
                    const Carriage& carriage, const WriterOptions& options) {
    const double told = UsableRate(source.dFrameRate);
    const double asked = UsableRate(param.dFrameRate);
    return UsableRate(options.dSourceRate) > told && (asked <= 0 || SameRate(asked, told)) &&
           options.bSteadyRate == 0 && container.kind != ContainerKind::kSteadyRate &&
           !carriage.steadyPictures;
}

PicturePlan MakePicturePlan(EncodeParam param, VideoFormat source, const Container& container,
                            const WriterOptions& options) {
    PicturePlan plan{};
    plan.codec = FindPictureCodec(container, param.fccVideo);
    if (plan.codec == nullptr)
        throw WriterFailure(kWriterErrorCodec, "The format " + FormatText(param) + " cannot carry video \"" +
                                                   CodeText(param.fccVideo) + "\".");
    const Carriage& carriage = FindCarriage(container, plan.codec->code);
    if (KeepsOtherRate(param, source, container, carriage, options))
        param.dFrameRate = source.dFrameRate = options.dSourceRate;
    plan.settings = MakePictureSettings(param, source, *plan.codec, options);
    SetShape(plan, param, source, options);
    SetColours(plan, carriage, options);
    SetTimes(plan, container, carriage, source, options);
    return plan;
}

SoundPlan MakeSoundPlan(const EncodeParam& param, const AudioFormat& source, uint64_t speakers,
                        const Container& container) {
    SoundPlan plan{};
    plan.codec = FindSoundCodec(container, param.fccAudio);
    if (plan.codec == nullptr)
        throw WriterFailure(kWriterErrorCodec, "The format " + FormatText(param) + " cannot carry audio \"" +
                                                   CodeText(param.fccAudio) + "\".");
    plan.settings.sampleRate = FirstPositive(param.nSampleRate, source.nSampleRate, 0);
    plan.settings.channels = FirstPositive(param.nChannels, source.nChannels, 0);
    plan.settings.bitsPerSample = FirstPositive(param.nBitsPerSample, source.nBitsPerSample, 16);
    plan.settings.bitrate = FirstPositive(param.nAudioBitrate, kUsualAudioBitrate, 0);
    plan.settings.maxBitrate = param.nAudioRateMode != 0 ? std::max(0, param.nAudioMaxBitrate) : 0;
    const Carriage& carriage = FindCarriage(container, plan.codec->code);
    plan.settings.sampleRates = carriage.sampleRates;
    plan.settings.maxBits = carriage.maxBits;
    plan.settings.speakers = speakers;
    plan.settings.layouts = carriage.layouts != nullptr ? carriage.layouts : plan.codec->layouts;
    plan.fillsStart = container.kind == ContainerKind::kSteadyRate;
    plan.neverEmpty = carriage.describedByPacket;
    if (plan.settings.sampleRate <= 0 || plan.settings.channels <= 0)
        throw WriterFailure(kWriterErrorArgument, "Sound of " + std::to_string(plan.settings.sampleRate) +
                                                      " Hz with " + std::to_string(plan.settings.channels) +
                                                      " channels cannot be written.");
    return plan;
}

/// What the container carries of the tracks beside the engine's. Sound is encoded as the engine's is.
std::vector<TrackPlan> MakeTrackPlans(const EncodeParam& param, const FilePlan& file, const Extras& extras) {
    std::vector<TrackPlan> plans;
    const Container& container = *file.container;
    for (const Track& track : extras.tracks) {
        if (track.sampleRate > 0 && file.sound && (container.carries & kWriterFormatTracks) != 0) {
            EncodeParam own = param;
            own.nSampleRate = track.sampleRate;
            own.nChannels = track.channels;
            own.nBitsPerSample = track.bitsPerSample;
            if (track.bitrate > 0)
                own.nAudioBitrate = static_cast<int32_t>(track.bitrate);
            plans.push_back({&track, MakeSoundPlan(own, {}, track.speakers, container)});
        } else if (track.parameters &&
                   PacketForm(container, track.parameters->codec_id) != AV_CODEC_ID_NONE) {
            plans.push_back({&track, std::nullopt});
        }
    }
    return plans;
}

/// Seconds that the file will last, about; 0 when that is not known.
double ExpectedLength(const FilePlan& plan, const VideoFormat* video, const AudioFormat* audio,
                      double fileLength) {
    double length =
        plan.pictures && video != nullptr ? double{video->dDuration} : 0; // copies: the records are packed
    if (plan.sound || plan.soundBeside)
        length = std::max(length, double{audio->dDuration});
    return fileLength > 0 && (length <= 0 || fileLength < length) ? fileLength : length;
}

} // namespace

int64_t PicturePlan::StayOf(const VideoImage& image) const {
    const int64_t told = image.nDuration;
    if (!keepStamps && told > 0) { // on the grid a shorter one might not be seen at all
        const int64_t step = std::llround(static_cast<double>(kTicksPerSecond) / av_q2d(settings.rate));
        return std::max(told, std::min(step, pictureLength));
    }
    const bool countsPictures = clock.ticksPerPicture == 1; // and is made longer only where that pays
    return told <= 0 || (countsPictures && told - pictureLength <= kTicksPerSecond) ? pictureLength : told;
}

FilePlan MakeFilePlan(const EncodeParam& param, const VideoFormat* video, const AudioFormat* audio,
                      const WriterOptions& options, const Extras& extras) {
    FilePlan plan{};
    plan.container = FindContainer(param.fccFileFormat);
    if (plan.container == nullptr)
        throw WriterFailure(kWriterErrorFormat, "The file format " + FormatText(param) + " is not known.");
    if (video != nullptr && param.bNoVideo == 0 && plan.container->video.front() != 0)
        plan.pictures = MakePicturePlan(param, *video, *plan.container, options);
    const bool hasSound = audio != nullptr && param.bNoAudio == 0 && plan.container->audio.front() != 0;
    plan.soundBeside = hasSound && options.bSoundBeside != 0;
    if (hasSound && !plan.soundBeside)
        plan.sound = MakeSoundPlan(param, *audio, options.nChannelMask, *plan.container);
    if (!plan.pictures && !hasSound)
        throw WriterFailure(kWriterErrorArgument,
                            "There is nothing to write into a file of the format " + FormatText(param) + ".");
    plan.tracks = MakeTrackPlans(param, plan, extras);
    if (plan.soundBeside && (plan.tracks.empty() || !IsSound(*plan.tracks.front().track)))
        throw WriterFailure(kWriterErrorCodec,
                            "The format " + FormatText(param) + " cannot carry the sound as it is.");
    plan.bitExact = options.bBitExact != 0;
    plan.piece = options.nPiece;
    plan.length = ExpectedLength(plan, video, audio, options.dFileLength);
    return plan;
}

} // namespace writer
