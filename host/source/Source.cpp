#include "host/source/Source.h"

#include "host/source/MediaTime.h"

#include <algorithm>
#include <cmath>
#include <new>
#include <vector>

extern "C" {
#include <libavutil/avstring.h>
#include <libavutil/display.h>
#include <libavutil/parseutils.h>
#include <libavutil/pixdesc.h>
}

namespace movieconv {
namespace {

constexpr double kShortestStream = 0.001;  // the engine takes a shorter one for absent
constexpr double kGuessedDuration = 3600;  // for sources that tell nothing at all, such as pipes
constexpr int64_t kStretchBytes = 2 << 20; // read at the end, and at the beginning, to find the duration
constexpr double kClockStart = 8;       // a stamp below, far into the file, may count on from what was probed
constexpr double kUsualFrameRate = 200; // a higher one may be an artefact of the container's clock
constexpr double kHighestPeakRate = 240;  // likewise where pictures follow each other closest
constexpr int kCountedPictures = 250;     // to find out how many there are in a second
constexpr double kFallbackFrameRate = 25; // pictures keep their own times whatever rate is told

bool IsTold(AVRational rate) {
    return rate.num > 0 && rate.den > 0;
}

bool IsUsual(AVRational rate) {
    return IsTold(rate) && av_q2d(rate) <= kUsualFrameRate;
}

/// Whether `rate` is about the other one: a container rounds times, and a short movie its average.
bool IsAbout(AVRational rate, double other, double tolerance) {
    return IsTold(rate) && std::abs(av_q2d(rate) / other - 1) < tolerance;
}

/// Pictures per second by the container's word: the average rate, or its nominal one where they agree. 0 when
/// neither is usual.
double ToldFrameRate(const AVStream* stream) {
    const AVRational average = stream->avg_frame_rate;
    const AVRational nominal = stream->r_frame_rate;
    if (IsUsual(average))
        return av_q2d(IsUsual(nominal) && IsAbout(nominal, av_q2d(average), 0.01) ? nominal : average);
    return IsUsual(nominal) ? av_q2d(nominal) : 0;
}

/// Matroska and NUT announce where the movie ends on its clock, all others how long it is.
bool AnnouncesItsEnd(const AVInputFormat& format) {
    return av_match_name("matroska", format.name) != 0 || av_match_name("nut", format.name) != 0;
}

/// Where a stream of Matroska ends by the tag that its writer left, in seconds from the start of the source;
/// 0 without one.
double TaggedEnd(const AVStream* stream, double start) {
    const AVDictionaryEntry* tag = av_dict_get(stream->metadata, "DURATION", nullptr, 0);
    int64_t microseconds = 0;
    return tag != nullptr && av_parse_time(&microseconds, tag->value, 1) >= 0
               ? static_cast<double>(microseconds) / AV_TIME_BASE - start
               : 0;
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

AVRational PixelAspect(AVFormatContext* context, AVStream* stream, bool turned) {
    AVRational aspect = av_guess_sample_aspect_ratio(context, stream, nullptr);
    if (aspect.num <= 0 || aspect.den <= 0)
        return {1, 1};
    return turned ? av_inv_q(aspect) : aspect;
}

void CopyParameters(const AVCodecParameters& from, AVCodecParameters* to) {
    if (to == nullptr)
        throw std::bad_alloc();
    av::CheckMemory(avcodec_parameters_copy(to, &from));
}

std::string LayoutName(const AVChannelLayout& layout) {
    char text[64] = "";
    av_channel_layout_describe(&layout, text, sizeof text);
    return text;
}

} // namespace

Source::Source(const std::string& path, SourceChoice choice) : choice_(choice) {
    info_.path = path;
    Open();
    if (info_.pictures)
        FindFrameRate();
    FindDuration();
}

/// Opens the file, again if it is open, and chooses its streams.
void Source::Open() {
    file_.reset();
    file_ = std::make_unique<MovieFile>(info_.path, choice_.playlists);
    info_.bytes = file_->Bytes();
    const AVFormatContext* context = Context();
    if (context->start_time != AV_NOPTS_VALUE)
        start_ = av_rescale_q(context->start_time, {1, AV_TIME_BASE}, {1, kTicksPerSecond});
    info_.container =
        context->iformat->long_name != nullptr ? context->iformat->long_name : context->iformat->name;
    ChooseStreams();
}

void Source::ChooseStreams() {
    for (unsigned i = 0; i < Context()->nb_streams; ++i)
        Context()->streams[i]->discard = AVDISCARD_ALL;
    if (choice_.pictures) {
        const int index = av_find_best_stream(Context(), AVMEDIA_TYPE_VIDEO, -1, -1, nullptr, 0);
        const bool isCover =
            index >= 0 && (Context()->streams[index]->disposition & AV_DISPOSITION_ATTACHED_PIC) != 0;
        if (index >= 0 && !isCover &&
            avcodec_find_decoder(Context()->streams[index]->codecpar->codec_id) != nullptr)
            DescribePictures(index);
    }
    if (choice_.sound) {
        const int index = av_find_best_stream(Context(), AVMEDIA_TYPE_AUDIO, -1,
                                              info_.pictures ? info_.pictures->index : -1, nullptr, 0);
        if (index >= 0 && avcodec_find_decoder(Context()->streams[index]->codecpar->codec_id) != nullptr &&
            Context()->streams[index]->codecpar->sample_rate > 0 &&
            Context()->streams[index]->codecpar->ch_layout.nb_channels > 0)
            DescribeSound(index);
    }
    if (!info_.pictures && !info_.sound) {
        throw SourceError("\"" + info_.path + "\" holds no " +
                          (choice_.pictures && choice_.sound ? "pictures and no sound"
                           : choice_.pictures                ? "pictures"
                                                             : "sound") +
                          " that can be decoded");
    }
}

void Source::DescribePictures(int index) {
    AVStream* stream = Context()->streams[index];
    const AVCodecParameters* parameters = stream->codecpar;
    if (parameters->width <= 0 || parameters->height <= 0)
        return;
    stream->discard = AVDISCARD_DEFAULT;
    PictureStreamInfo info;
    info.index = index;
    info.codec = avcodec_get_name(parameters->codec_id);
    const char* format = av_get_pix_fmt_name(static_cast<AVPixelFormat>(parameters->format));
    info.pixelFormat = format != nullptr ? format : "unknown";
    ReadOrientation(stream, info);
    const bool turned = info.quarterTurns % 2 != 0;
    info.width = turned ? parameters->height : parameters->width;
    info.height = turned ? parameters->width : parameters->height;
    info.pixelAspect = PixelAspect(Context(), stream, turned);
    info.frameRate = ToldFrameRate(stream);
    info.duration = EndOf(stream);
    info.interlaced = parameters->field_order > AV_FIELD_PROGRESSIVE;
    info.colorPrimaries = parameters->color_primaries;
    info.colorTransfer = parameters->color_trc;
    info.colorMatrix = parameters->color_space;
    info_.pictures = info;
}

void Source::DescribeSound(int index) {
    AVStream* stream = Context()->streams[index];
    const AVCodecParameters* parameters = stream->codecpar;
    stream->discard = AVDISCARD_DEFAULT;
    SoundStreamInfo info;
    info.index = index;
    info.codec = avcodec_get_name(parameters->codec_id);
    info.layout = LayoutName(parameters->ch_layout);
    info.sampleRate = parameters->sample_rate;
    info.channels = parameters->ch_layout.nb_channels;
    const int storedBits =
        std::max(parameters->bits_per_raw_sample, av_get_exact_bits_per_sample(parameters->codec_id));
    info.bitsPerSample = storedBits > 16 ? 32 : 16;
    info.duration = EndOf(stream);
    info_.sound = info;
}

/// When a stream begins, from the start of the source.
double Source::BeginOf(const AVStream* stream) const {
    return stream->start_time != AV_NOPTS_VALUE ? ToSeconds(MediaTime(stream->start_time, stream)) : 0;
}

/// When a stream ends, from the start of the source; 0 when it does not tell. It may begin later than others.
double Source::EndOf(const AVStream* stream) const {
    return stream->duration > 0
               ? BeginOf(stream) + static_cast<double>(stream->duration) * av_q2d(stream->time_base)
               : 0;
}

/// Pictures per second by the container's index, or by the stamps of the first ones; 0 when neither can be
/// read.
double Source::CountFrameRate() {
    AVStream* stream = Context()->streams[info_.pictures->index];
    if (av_match_name("mov", Context()->iformat->name) != 0 && stream->nb_frames > 1 &&
        stream->duration > 0) {
        const double indexed = static_cast<double>(stream->nb_frames) /
                               (static_cast<double>(stream->duration) * av_q2d(stream->time_base));
        if (IsAbout(stream->avg_frame_rate, indexed, 0.05))
            return indexed;
    }
    if (!IsSeekable())
        return 0;
    AVStream* sound = info_.sound ? Context()->streams[info_.sound->index] : nullptr;
    if (sound != nullptr)
        sound->discard = AVDISCARD_ALL;
    const Stretch begin = ReadStretch(8 * kStretchBytes, kCountedPictures);
    if (sound != nullptr)
        sound->discard = AVDISCARD_DEFAULT;
    ReturnToBegin();
    return begin.packets > 1 && begin.last > begin.first ? (begin.packets - 1) / (begin.last - begin.first)
                                                         : 0;
}

/// Counts the first pictures where the container tells no usual rate, and settles the highest one.
void Source::FindFrameRate() {
    PictureStreamInfo& info = *info_.pictures;
    const AVStream* stream = PictureStream();
    if (info.frameRate <= 0) {
        const double counted = CountFrameRate();
        info.frameRate = counted > 0 ? counted : kFallbackFrameRate;
        for (const AVRational told : {stream->avg_frame_rate, stream->r_frame_rate})
            if (counted > 0 && IsAbout(told, counted, 0.05))
                info.frameRate = av_q2d(told);
    }
    info.peakRate = info.frameRate;
    if (IsTold(stream->r_frame_rate) && !info.interlaced) { // where it may count fields
        if (const double peak = av_q2d(stream->r_frame_rate); peak <= kHighestPeakRate)
            info.peakRate = std::max(info.peakRate, peak);
    }
}

void Source::FindDuration() {
    const bool guessedByRate = Context()->duration_estimation_method == AVFMT_DURATION_FROM_BITRATE;
    info_.duration = Context()->duration > 0 ? static_cast<double>(Context()->duration) / AV_TIME_BASE : 0;
    if (info_.duration > 0 && AnnouncesItsEnd(*Context()->iformat))
        info_.duration -= ToSeconds(start_);
    // ASF has its length from whoever wrote it, who may have taken the last stamp for it.
    const bool doubtful = av_match_name("asf", Context()->iformat->name) != 0 && start_ > kTicksPerSecond;
    const bool measured = info_.duration <= 0 || guessedByRate || doubtful;
    if (measured)
        MeasureDuration();
    const double whole = info_.duration;
    const auto complete = [&](double& duration) {
        if (duration <= 0 || measured)
            duration = whole;
        info_.duration = std::max(info_.duration, duration);
    };
    FindPromise(measured);
    info_.duration = 0;
    if (info_.pictures)
        complete(info_.pictures->duration);
    if (info_.sound) {
        complete(info_.sound->duration);
        if (info_.sound->duration < kShortestStream && info_.pictures)
            info_.sound.reset();
    }
}

/// Takes down what the container announces about the streams that are converted.
void Source::FindPromise(bool measured) {
    Promise& promise = info_.promise;
    promise.cutOff = file_->IsCutOff();
    // Where the last stamps were looked up, or the clock may start anew, nothing was announced.
    const bool announced = !measured && (Context()->iformat->flags & AVFMT_TS_DISCONT) == 0 &&
                           Context()->duration_estimation_method == AVFMT_DURATION_FROM_STREAM;
    if (!announced)
        return;
    const auto announcedEnd = [&](const AVStream* stream) {
        const double own = EndOf(stream) > 0 ? EndOf(stream) : TaggedEnd(stream, ToSeconds(start_));
        return own > 0 && own < info_.duration + 1 ? std::optional(own) : std::nullopt;
    };
    bool othersMayBeLonger = false;
    for (unsigned i = 0; i < Context()->nb_streams; ++i) {
        const AVStream* stream = Context()->streams[i];
        const bool timed = stream->codecpar->codec_type != AVMEDIA_TYPE_ATTACHMENT &&
                           (stream->disposition & AV_DISPOSITION_ATTACHED_PIC) == 0;
        othersMayBeLonger =
            othersMayBeLonger || (timed && stream != PictureStream() && stream != SoundStream());
    }
    if (info_.pictures)
        promise.pictures = announcedEnd(PictureStream());
    if (info_.sound)
        promise.sound = announcedEnd(SoundStream());
    if (!othersMayBeLonger && !promise.pictures && !promise.sound)
        promise.all = info_.duration;
}

/// Finds out by reading the end of the file how long it is, and its beginning too where the stamps are
/// counted from wherever reading starts.
void Source::MeasureDuration() {
    Stretch tail;
    bool countsOn = true;
    if (IsSeekable()) {
        const int64_t target = std::max<int64_t>(info_.bytes - kStretchBytes, 0);
        const bool byBytes = (Context()->iformat->flags & AVFMT_NO_BYTE_SEEK) == 0;
        const int sought =
            byBytes ? avformat_seek_file(Context(), -1, INT64_MIN, target, INT64_MAX, AVSEEK_FLAG_BYTE)
                    : avformat_seek_file(Context(), -1, INT64_MIN, INT64_MAX / 2, INT64_MAX, 0);
        if (sought >= 0)
            tail = ReadStretch(INT64_MAX);
        countsOn = !byBytes || target == 0 || tail.first > kClockStart;
        if (countsOn)
            ReturnToBegin();
        else
            Open(); // or seeking would take the end's wrong stamps for places
    }
    if (tail.end > 0 && countsOn) {
        info_.duration = tail.end;
        return;
    }
    if (tail.length > 0) {
        const Stretch head = ReadStretch(kStretchBytes);
        ReturnToBegin();
        info_.duration = static_cast<double>(info_.bytes) * (head.length + tail.length) /
                         static_cast<double>(head.bytes + tail.bytes);
    }
    info_.certainty = info_.duration > 0 ? Certainty::kEstimated : Certainty::kGuessed;
    if (info_.duration <= 0)
        info_.duration = kGuessedDuration;
}

/// Reads to the end, or until it has so many bytes or packets of the stream that is counted. That may
/// describe the streams anew, as they are there; for the decoders they are as at the beginning.
Source::Stretch Source::ReadStretch(int64_t mostBytes, int mostPackets) {
    std::vector<av::CodecParameters> beginnings;
    for (unsigned i = 0; i < Context()->nb_streams; ++i) {
        beginnings.emplace_back(avcodec_parameters_alloc());
        CopyParameters(*Context()->streams[i]->codecpar, beginnings[i].get());
    }
    const int counted = info_.pictures ? info_.pictures->index : info_.sound->index;
    Stretch stretch;
    const av::Packet packet = av::NewPacket();
    while (stretch.bytes < mostBytes && stretch.packets < mostPackets &&
           av_read_frame(Context(), packet.get()) >= 0) {
        const AVStream* stream = Context()->streams[packet->stream_index];
        stretch.bytes += packet->size;
        if (packet->stream_index == counted) {
            ++stretch.packets;
            stretch.length += static_cast<double>(packet->duration) * av_q2d(stream->time_base);
        }
        const int64_t stamp = packet->pts != AV_NOPTS_VALUE ? packet->pts : packet->dts;
        if (stamp != AV_NOPTS_VALUE) {
            stretch.first = std::min(stretch.first, ToSeconds(MediaTime(stamp, stream)));
            stretch.last = std::max(stretch.last, ToSeconds(MediaTime(stamp, stream)));
            stretch.end = std::max(stretch.end, ToSeconds(MediaTime(stamp + packet->duration, stream)));
        }
        av_packet_unref(packet.get());
    }
    for (std::size_t i = 0; i < beginnings.size(); ++i)
        CopyParameters(*beginnings[i], Context()->streams[i]->codecpar);
    return stretch;
}

void Source::ReturnToBegin() {
    if (!Rewind())
        throw SourceError("cannot read \"" + info_.path + "\" from its start again");
}

bool Source::IsSeekable() const {
    return Context()->pb != nullptr && (Context()->pb->seekable & AVIO_SEEKABLE_NORMAL) != 0;
}

bool Source::Rewind() {
    const int flags = Context()->iformat->flags;
    const auto toFirstByte = [&] {
        return (flags & AVFMT_NO_BYTE_SEEK) == 0 &&
               avformat_seek_file(Context(), -1, 0, 0, 0, AVSEEK_FLAG_BYTE) >= 0;
    };
    // In streams for broadcast the first time lies behind the first key picture, which is decoded earlier.
    if ((flags & AVFMT_TS_DISCONT) != 0 && toFirstByte())
        return true;
    // By the stream that begins first, lest the others be skipped up to where the usual one begins.
    const AVStream* first = PictureStream();
    if (const AVStream* sound = SoundStream();
        sound != nullptr && (first == nullptr || BeginOf(sound) < BeginOf(first)))
        first = sound;
    const int64_t start = first->start_time != AV_NOPTS_VALUE ? first->start_time : 0;
    const int64_t earlier = start - av_rescale_q(1, {1, 1}, first->time_base);
    return avformat_seek_file(Context(), first->index, INT64_MIN, earlier, start, 0) >= 0 || toFirstByte();
}

const AVStream* Source::PictureStream() const {
    return info_.pictures ? Context()->streams[info_.pictures->index] : nullptr;
}

const AVStream* Source::SoundStream() const {
    return info_.sound ? Context()->streams[info_.sound->index] : nullptr;
}

int64_t Source::MediaTime(int64_t stamp, const AVStream* stream) const {
    constexpr int64_t kFarthest = int64_t{1} << 60; // room for sums with what damaged stamps tell
    return std::clamp(av_rescale_q(stamp, stream->time_base, {1, kTicksPerSecond}), -kFarthest, kFarthest) -
           start_;
}

} // namespace movieconv
