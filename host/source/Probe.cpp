#include "host/source/Probe.h"

#include "host/source/Length.h"
#include "host/source/MediaTime.h"
#include "host/source/StreamDecoder.h"
#include "host/source/StreamDescription.h"
#include "host/source/Stretch.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <cstring>
#include <optional>
#include <vector>

extern "C" {
#include <libavutil/avstring.h>
#include <libavutil/parseutils.h>
}

namespace movieconv {
namespace {

constexpr double kHighestPeakRate = 240;  // a higher one may be an artefact of the container's clock
constexpr int kCountedPictures = 250;     // to find out how many there are in a second
constexpr double kFallbackFrameRate = 25; // pictures keep their own times whatever rate is told

bool IsTold(AVRational rate) {
    return rate.num > 0 && rate.den > 0;
}

/// Whether `rate` is about the other one: a container rounds times, and a short movie its average.
bool IsAbout(AVRational rate, double other, double tolerance) {
    return IsTold(rate) && std::abs(av_q2d(rate) / other - 1) < tolerance;
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

bool IsMov(const PacketReader& reader) {
    return av_match_name("mov", reader.Context()->iformat->name) != 0;
}

/// The first pictures; an empty stretch where they could not be read once more.
Stretch ReadPictures(PacketReader& reader, const SourceInfo& info) {
    if (!reader.IsSeekable())
        return {};
    AVStream* sound = info.sound ? reader.Context()->streams[info.sound->index] : nullptr;
    if (sound != nullptr)
        sound->discard = AVDISCARD_ALL;
    Stretch begin = ReadStretch(reader, info.pictures->index, 8 * kStretchBytes, kCountedPictures);
    if (sound != nullptr)
        sound->discard = AVDISCARD_DEFAULT;
    ReturnToBegin(reader, info);
    return begin;
}

/// Pictures per second by the container's index, or by the stamps of the first ones; 0 when neither can be
/// read.
double CountFrameRate(PacketReader& reader, const SourceInfo& info) {
    const AVStream* stream = reader.Context()->streams[info.pictures->index];
    if (IsMov(reader) && stream->nb_frames > 1 && stream->duration > 0) {
        const double indexed = static_cast<double>(stream->nb_frames) /
                               (static_cast<double>(stream->duration) * av_q2d(stream->time_base));
        if (IsAbout(stream->avg_frame_rate, indexed, 0.05))
            return indexed;
    }
    const Stretch begin = ReadPictures(reader, info);
    return begin.packets > 1 && begin.last > begin.first ? (begin.packets - 1) / (begin.last - begin.first)
                                                         : 0;
}

/// In seconds: of all pictures where the container has an index of them, else of the first ones.
std::vector<double> StampsOfPictures(PacketReader& reader, const SourceInfo& info) {
    AVStream* stream = reader.Context()->streams[info.pictures->index];
    const int indexed = IsMov(reader) ? avformat_index_get_entries_count(stream) : 0;
    if (indexed < 2)
        return ReadPictures(reader, info).stamps;
    std::vector<double> stamps;
    stamps.reserve(static_cast<std::size_t>(indexed));
    for (int i = 0; i < indexed; ++i)
        stamps.push_back(static_cast<double>(avformat_index_get_entry(stream, i)->timestamp) *
                         av_q2d(stream->time_base));
    return stamps;
}

/// Pictures per second where they follow each other closest; 0 when that cannot be read.
double MeasurePeakRate(PacketReader& reader, const SourceInfo& info) {
    std::vector<double> stamps = StampsOfPictures(reader, info);
    std::sort(stamps.begin(), stamps.end());
    double peak = 0;
    for (std::size_t i = 1; i < stamps.size(); ++i)
        if (const double rate = 1 / (stamps[i] - stamps[i - 1]); rate <= kHighestPeakRate)
            peak = std::max(peak, rate);
    return peak;
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
void FindPromise(const PacketReader& reader, const Length& length, SourceInfo& info) {
    const AVFormatContext& context = *reader.Context();
    Promise& promise = info.promise;
    promise.cutOff = reader.File().IsCutOff();
    // Where the last stamps were looked up, or the clock may start anew, nothing was announced.
    if (!length.announced || (context.iformat->flags & AVFMT_TS_DISCONT) != 0 ||
        context.duration_estimation_method != AVFMT_DURATION_FROM_STREAM)
        return;
    // Of one that is cut off FFmpeg lowers the length that its head tells by what there is of it.
    const bool lowered = promise.cutOff && av_match_name("avi", context.iformat->name) != 0;
    // There each stream is given the length of the whole file.
    const bool oneLength = std::strcmp(context.iformat->name, "asf") == 0;
    const auto announced = [&](const auto& stream) -> std::optional<double> {
        if (!stream || oneLength)
            return std::nullopt;
        const AVStream& told = *context.streams[stream->index];
        if (lowered && told.nb_frames > 0)
            return static_cast<double>(told.nb_frames) * av_q2d(told.time_base);
        // A stream that begins far behind the others is given the length of the file otherwise.
        const double tagged = TaggedEnd(context.streams[stream->index], ToSeconds(reader.Start()));
        const double end = tagged > 0 ? tagged : stream->duration;
        return end > 0 && end < length.seconds + 1 ? std::optional(end) : std::nullopt;
    };
    promise.pictures = announced(info.pictures);
    promise.sound = announced(info.sound);
    if (!OthersMayBeLonger(info) && !promise.pictures && !promise.sound)
        promise.all = length.seconds;
}

} // namespace

/// Counts the first pictures where the container tells no usual rate, and settles the highest one.
void ProbeFrameRate(PacketReader& reader, SourceInfo& info) {
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
        const double told = av_q2d(stream->r_frame_rate);
        pictures.peakRate =
            std::max(pictures.peakRate, told <= kHighestPeakRate ? told : MeasurePeakRate(reader, info));
    }
}

void ProbeLight(PacketReader& reader, SourceInfo& info) {
    constexpr int kMostPackets = 100; // until the first picture comes out
    PictureStreamInfo& pictures = *info.pictures;
    if (!IsHdr(pictures) || (pictures.masteringDisplay && pictures.lightLevel) || !reader.IsSeekable())
        return;
    const AVStream* stream = reader.Context()->streams[pictures.index];
    const av::CodecParameters parameters = av::CopyOf(*stream->codecpar);
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

void ProbeLength(PacketReader& reader, SourceInfo& info) {
    const Length length = FindLength(reader, info);
    info.certainty = length.certainty;
    info.clockRestarts = length.clockRestarts;
    FindPromise(reader, length, info);
    info.duration = 0;
    const auto complete = [&](double& duration, std::optional<double> promised) {
        if (duration <= 0 || !length.announced || promised.value_or(duration) < duration)
            duration = promised.value_or(length.seconds);
        info.duration = std::max(info.duration, duration);
    };
    if (info.pictures)
        complete(info.pictures->duration, info.promise.pictures);
    if (info.sound)
        complete(info.sound->duration, info.promise.sound);
}

} // namespace movieconv
