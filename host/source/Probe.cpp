#include "host/source/Probe.h"

#include "host/source/MediaTime.h"
#include "host/source/PacketTime.h"
#include "host/source/SourceError.h"
#include "host/source/StreamDecoder.h"
#include "host/source/StreamDescription.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <limits>
#include <optional>
#include <utility>
#include <vector>

extern "C" {
#include <libavutil/avstring.h>
#include <libavutil/parseutils.h>
}

namespace movieconv {
namespace {

constexpr double kGuessedDuration = 3600;  // for sources that tell nothing at all, such as pipes
constexpr int64_t kStretchBytes = 2 << 20; // read at the end, and at the beginning, to find the duration
constexpr double kMostVariation =
    4; // of the bit rate; more by which stamps exceed what the size tells are a jump
constexpr double kClockStart = 8; // a stamp below, far into the file, may count on from what was probed
constexpr double kHighestPeakRate = 240;  // likewise where pictures follow each other closest
constexpr int kCountedPictures = 250;     // to find out how many there are in a second
constexpr double kFallbackFrameRate = 25; // pictures keep their own times whatever rate is told

/// What the packets of a part of the source tell, in seconds from its start.
struct Stretch {
    int64_t bytes = 0;  // of packets
    int64_t begin = -1; // in the file
    int64_t reached = 0;
    double first = std::numeric_limits<double>::infinity(); // stamp
    double last = 0;
    double end = 0;    // of what lasts longest
    int packets = 0;   // of one stream, pictures if there are any
    double length = 0; // of these packets
};

bool IsTold(AVRational rate) {
    return rate.num > 0 && rate.den > 0;
}

/// Whether `rate` is about the other one: a container rounds times, and a short movie its average.
bool IsAbout(AVRational rate, double other, double tolerance) {
    return IsTold(rate) && std::abs(av_q2d(rate) / other - 1) < tolerance;
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

void ReturnToBegin(MovieReader& reader, const SourceInfo& info) {
    if (!reader.Rewind())
        throw SourceError("cannot read \"" + info.path + "\" from its start again");
}

/// Reads to the end, or until it has so many bytes or packets of the stream that is counted. That may
/// describe the streams anew, as they are there; for the decoders they are as at the beginning.
Stretch ReadStretch(MovieReader& reader, int counted, int64_t mostBytes,
                    int mostPackets = std::numeric_limits<int>::max()) {
    AVFormatContext* context = reader.Context();
    std::vector<av::CodecParameters> beginnings;
    for (unsigned i = 0; i < context->nb_streams; ++i)
        beginnings.push_back(CopyOf(*context->streams[i]->codecpar));
    Stretch stretch;
    const av::Packet packet = av::NewPacket();
    while (stretch.bytes < mostBytes && stretch.packets < mostPackets &&
           av_read_frame(context, packet.get()) >= 0) {
        const AVStream* stream = context->streams[packet->stream_index];
        stretch.bytes += packet->size;
        if (packet->pos >= 0) {
            stretch.begin = stretch.begin < 0 ? packet->pos : std::min(stretch.begin, packet->pos);
            stretch.reached = std::max(stretch.reached, packet->pos + packet->size);
        }
        if (packet->stream_index == counted) {
            ++stretch.packets;
            stretch.length += static_cast<double>(packet->duration) * av_q2d(stream->time_base);
        }
        const int64_t stamp = StampOf(*packet);
        if (stamp != AV_NOPTS_VALUE) {
            stretch.first = std::min(stretch.first, ToSeconds(reader.MediaTime(stamp, stream->time_base)));
            stretch.last = std::max(stretch.last, ToSeconds(reader.MediaTime(stamp, stream->time_base)));
            stretch.end =
                std::max(stretch.end, ToSeconds(reader.MediaTime(EndStampOf(*packet), stream->time_base)));
        }
        av_packet_unref(packet.get());
    }
    for (std::size_t i = 0; i < beginnings.size(); ++i)
        av::CheckMemory(avcodec_parameters_copy(context->streams[i]->codecpar, beginnings[i].get()));
    return stretch;
}

/// Pictures per second by the container's index, or by the stamps of the first ones; 0 when neither can be
/// read.
double CountFrameRate(MovieReader& reader, const SourceInfo& info) {
    AVStream* stream = reader.Context()->streams[info.pictures->index];
    if (av_match_name("mov", reader.Context()->iformat->name) != 0 && stream->nb_frames > 1 &&
        stream->duration > 0) {
        const double indexed = static_cast<double>(stream->nb_frames) /
                               (static_cast<double>(stream->duration) * av_q2d(stream->time_base));
        if (IsAbout(stream->avg_frame_rate, indexed, 0.05))
            return indexed;
    }
    if (!reader.IsSeekable())
        return 0;
    AVStream* sound = info.sound ? reader.Context()->streams[info.sound->index] : nullptr;
    if (sound != nullptr)
        sound->discard = AVDISCARD_ALL;
    const Stretch begin = ReadStretch(reader, info.pictures->index, 8 * kStretchBytes, kCountedPictures);
    if (sound != nullptr)
        sound->discard = AVDISCARD_DEFAULT;
    ReturnToBegin(reader, info);
    return begin.packets > 1 && begin.last > begin.first ? (begin.packets - 1) / (begin.last - begin.first)
                                                         : 0;
}

int Counted(const SourceInfo& info) {
    return info.pictures ? info.pictures->index : info.sound->index;
}

/// The last part of the file; an empty one where it cannot be sought.
Stretch ReadTail(MovieReader& reader, const SourceInfo& info) {
    const int64_t target = std::max<int64_t>(info.bytes - kStretchBytes, 0);
    const bool byBytes = (reader.Context()->iformat->flags & AVFMT_NO_BYTE_SEEK) == 0;
    const int sought =
        byBytes ? avformat_seek_file(reader.Context(), -1, INT64_MIN, target, INT64_MAX, AVSEEK_FLAG_BYTE)
                : avformat_seek_file(reader.Context(), -1, INT64_MIN, INT64_MAX / 2, INT64_MAX, 0);
    return sought >= 0 ? ReadStretch(reader, Counted(info), INT64_MAX) : Stretch{};
}

/// Seconds, by the file's size and by how long its first and last packets last; 0 when these do not tell.
double EstimateDuration(MovieReader& reader, const SourceInfo& info, const Stretch& tail) {
    const Stretch head = ReadStretch(reader, Counted(info), kStretchBytes);
    ReturnToBegin(reader, info);
    const auto span = [](const Stretch& part) {
        return part.begin < 0 ? part.bytes : part.reached - part.begin;
    };
    const int64_t bytes = span(head) + span(tail);
    return bytes > 0
               ? static_cast<double>(info.bytes) * (head.length + tail.length) / static_cast<double>(bytes)
               : 0;
}

/// Finds out by reading the end of the file how long it is, and its beginning too where the stamps are
/// counted from wherever reading starts.
void MeasureDuration(MovieReader& reader, SourceInfo& info) {
    Stretch tail;
    bool countsOn = true;
    if (reader.IsSeekable()) {
        tail = ReadTail(reader, info);
        const bool byBytes = (reader.Context()->iformat->flags & AVFMT_NO_BYTE_SEEK) == 0;
        countsOn = !byBytes || info.bytes <= kStretchBytes || tail.first > kClockStart;
        if (countsOn)
            ReturnToBegin(reader, info);
        else
            reader.Reopen(); // or seeking would take the end's wrong stamps for places
    }
    if (tail.end > 0 && countsOn) {
        info.duration = tail.end;
        return;
    }
    if (tail.length > 0)
        info.duration = EstimateDuration(reader, info, tail);
    info.certainty = info.duration > 0 ? Certainty::kEstimated : Certainty::kGuessed;
    if (info.duration <= 0)
        info.duration = kGuessedDuration;
}

/// Whether stamps fall from one of some places in the file to the next.
bool FallsSomewhere(MovieReader& reader, const SourceInfo& info, double last) {
    constexpr int64_t kPlaces = 16;
    constexpr int64_t kSampleBytes = 256 << 10;
    constexpr double kMostFall = 0.5; // pictures that build on later ones
    const bool byPlace = (reader.Context()->iformat->flags & AVFMT_NO_BYTE_SEEK) == 0 &&
                         av_match_name("ogg", reader.Context()->iformat->name) == 0; // see SeeksAstray
    double before = 0;
    for (int64_t place = 1; byPlace && place < kPlaces; ++place) {
        const int64_t target = info.bytes / kPlaces * place;
        if (avformat_seek_file(reader.Context(), -1, INT64_MIN, target, INT64_MAX, AVSEEK_FLAG_BYTE) < 0)
            return false;
        const Stretch sample = ReadStretch(reader, Counted(info), kSampleBytes, 1);
        if (sample.packets == 0)
            continue;
        if (sample.first < before - kMostFall)
            return true;
        before = std::max(before, sample.first);
    }
    return last < before - kMostFall;
}

/// Where the clock may start anew, the last stamp says little: files that were joined seem to last for hours,
/// or as long as one of them. True when the duration is by the size instead.
bool DoubtStamps(MovieReader& reader, SourceInfo& info) {
    if ((reader.Context()->iformat->flags & AVFMT_TS_DISCONT) == 0 || !reader.IsSeekable() ||
        reader.File().IsPlaylist())
        return false;
    const Stretch tail = ReadTail(reader, info);
    const bool falls = FallsSomewhere(reader, info, tail.last);
    ReturnToBegin(reader, info);
    const double estimate = tail.length > 0 ? EstimateDuration(reader, info, tail) : 0;
    info.clockRestarts = falls || (estimate > 0 && info.duration > estimate * kMostVariation);
    if (estimate <= 0 || !info.clockRestarts)
        return false;
    info.duration = estimate;
    info.certainty = Certainty::kEstimated;
    return true;
}

/// Whether a stream that is not converted may be what makes the movie as long as the container tells.
bool OthersMayBeLonger(const SourceInfo& info) {
    return std::any_of(info.streams.begin(), info.streams.end(), [&](const StreamInfo& stream) {
        const bool converted = (info.pictures && info.pictures->index == stream.index) ||
                               (info.sound && info.sound->index == stream.index);
        return !converted && stream.kind != StreamKind::kCover && stream.kind != StreamKind::kAttachment;
    });
}

/// Takes down what the container announces about the streams that are converted.
void FindPromise(const MovieReader& reader, SourceInfo& info, bool measured) {
    const AVFormatContext& context = *reader.Context();
    Promise& promise = info.promise;
    promise.cutOff = reader.File().IsCutOff();
    // Where the last stamps were looked up, or the clock may start anew, nothing was announced.
    if (measured || (context.iformat->flags & AVFMT_TS_DISCONT) != 0 ||
        context.duration_estimation_method != AVFMT_DURATION_FROM_STREAM)
        return;
    // There each stream is given the length of the whole file.
    const bool oneLength = std::strcmp(context.iformat->name, "asf") == 0;
    const auto announced = [&](const auto& stream) -> std::optional<double> {
        if (!stream || oneLength)
            return std::nullopt;
        const double end = stream->duration > 0
                               ? stream->duration
                               : TaggedEnd(context.streams[stream->index], ToSeconds(reader.Start()));
        return end > 0 && end < info.duration + 1 ? std::optional(end) : std::nullopt;
    };
    promise.pictures = announced(info.pictures);
    promise.sound = announced(info.sound);
    if (!OthersMayBeLonger(info) && !promise.pictures && !promise.sound)
        promise.all = info.duration;
}

} // namespace

/// Counts the first pictures where the container tells no usual rate, and settles the highest one.
void ProbeFrameRate(MovieReader& reader, SourceInfo& info) {
    PictureStreamInfo& pictures = *info.pictures;
    const double counted = pictures.frameRate <= 0 ? CountFrameRate(reader, info) : 0;
    const AVStream* stream = reader.Context()->streams[pictures.index];
    if (pictures.frameRate <= 0) {
        pictures.frameRate = counted > 0 ? counted : kFallbackFrameRate;
        for (const AVRational told : {stream->avg_frame_rate, stream->r_frame_rate})
            if (counted > 0 && IsAbout(told, counted, 0.05))
                pictures.frameRate = av_q2d(told);
    }
    pictures.peakRate = pictures.frameRate;
    if (IsTold(stream->r_frame_rate) && !pictures.interlaced) { // where it may count fields
        if (const double peak = av_q2d(stream->r_frame_rate); peak <= kHighestPeakRate)
            pictures.peakRate = std::max(pictures.peakRate, peak);
    }
}

void ProbeLight(MovieReader& reader, SourceInfo& info) {
    constexpr int kMostPackets = 100; // until the first picture comes out
    PictureStreamInfo& pictures = *info.pictures;
    if (!IsHdr(pictures) || (pictures.masteringDisplay && pictures.lightLevel) || !reader.IsSeekable())
        return;
    const AVStream* stream = reader.Context()->streams[pictures.index];
    const av::CodecParameters parameters = CopyOf(*stream->codecpar);
    StreamDecoder decoder(*parameters, stream->time_base, 1);
    const auto look = [&](const AVFrame& frame) {
        const auto sideData = [&](AVFrameSideDataType type) -> const void* {
            const AVFrameSideData* data = av_frame_get_side_data(&frame, type);
            return data != nullptr ? data->data : nullptr;
        };
        TakeLight(static_cast<const AVMasteringDisplayMetadata*>(
                      sideData(AV_FRAME_DATA_MASTERING_DISPLAY_METADATA)),
                  static_cast<const AVContentLightMetadata*>(sideData(AV_FRAME_DATA_CONTENT_LIGHT_LEVEL)),
                  pictures);
        return false;
    };
    const av::Packet packet = av::NewPacket();
    bool goesOn = true;
    for (int count = 0;
         goesOn && count < kMostPackets && av_read_frame(reader.Context(), packet.get()) >= 0;) {
        if (packet->stream_index == pictures.index) {
            goesOn = decoder.Decode(packet.get(), look);
            ++count;
        }
        av_packet_unref(packet.get());
    }
    ReturnToBegin(reader, info);
}

void ProbeLength(MovieReader& reader, SourceInfo& info) {
    const AVFormatContext& context = *reader.Context();
    const AVInputFormat& format = *context.iformat;
    info.duration = context.duration > 0 ? static_cast<double>(context.duration) / AV_TIME_BASE : 0;
    if (info.duration > 0 && AnnouncesItsEnd(format))
        info.duration -= ToSeconds(reader.Start());
    // ASF has its length from whoever wrote it, who may have taken the last stamp for it.
    const bool doubtful = av_match_name("asf", format.name) != 0 && reader.Start() > kTicksPerSecond;
    bool measured =
        info.duration <= 0 || doubtful || context.duration_estimation_method == AVFMT_DURATION_FROM_BITRATE;
    if (measured)
        MeasureDuration(reader, info);
    else
        measured = DoubtStamps(reader, info);
    FindPromise(reader, info, measured);
    const double whole = std::exchange(info.duration, 0);
    const auto complete = [&](double& duration, std::optional<double> promised) {
        if (duration <= 0 || measured)
            duration = promised.value_or(whole);
        info.duration = std::max(info.duration, duration);
    };
    if (info.pictures)
        complete(info.pictures->duration, info.promise.pictures);
    if (info.sound)
        complete(info.sound->duration, info.promise.sound);
}

} // namespace movieconv
