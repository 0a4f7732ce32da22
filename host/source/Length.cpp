#include "host/source/Length.h"

#include "host/source/MediaTime.h"
#include "host/source/Stretch.h"

#include <algorithm>

extern "C" {
#include <libavutil/avstring.h>
}

namespace movieconv {
namespace {

constexpr double kGuessedLength = 3600; // for sources that tell nothing at all, such as pipes
constexpr double kMostVariation =
    4; // of the bit rate; more by which stamps exceed what the size tells are a jump
constexpr double kClockStart = 8; // a stamp below, far into the file, may count on from what was probed

/// Matroska and NUT announce where the movie ends on its clock, all others how long it is.
bool AnnouncesItsEnd(const AVInputFormat& format) {
    return av_match_name("matroska", format.name) != 0 || av_match_name("nut", format.name) != 0;
}

/// 0 when the container announces none.
double AnnouncedLength(const PacketReader& reader) {
    const AVFormatContext& context = *reader.Context();
    if (context.duration <= 0)
        return 0;
    const double told = static_cast<double>(context.duration) / AV_TIME_BASE;
    return AnnouncesItsEnd(*context.iformat) ? told - ToSeconds(reader.Start()) : told;
}

/// Whether places in the file can be sought by their bytes.
bool SeeksByBytes(const PacketReader& reader) {
    return (reader.Context()->iformat->flags & AVFMT_NO_BYTE_SEEK) == 0;
}

/// The last part of the file; an empty one where it cannot be sought.
Stretch ReadTail(PacketReader& reader, const SourceInfo& info) {
    const int64_t target = std::max<int64_t>(info.bytes - kStretchBytes, 0);
    const int sought =
        SeeksByBytes(reader)
            ? avformat_seek_file(reader.Context(), -1, INT64_MIN, target, INT64_MAX, AVSEEK_FLAG_BYTE)
            : avformat_seek_file(reader.Context(), -1, INT64_MIN, INT64_MAX / 2, INT64_MAX, 0);
    return sought >= 0 ? ReadStretch(reader, Counted(info), INT64_MAX) : Stretch{};
}

/// Seconds, by the file's size and by how long its first and last packets last; 0 when these do not tell.
double EstimateLength(PacketReader& reader, const SourceInfo& info, const Stretch& tail) {
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

/// By reading the end of the file, and its beginning too where the stamps are counted from wherever reading
/// starts.
Length MeasureLength(PacketReader& reader, const SourceInfo& info, double announced) {
    Stretch tail;
    bool countsOn = true;
    if (reader.IsSeekable()) {
        tail = ReadTail(reader, info);
        countsOn = !SeeksByBytes(reader) || info.bytes <= kStretchBytes || tail.first > kClockStart;
        if (countsOn)
            ReturnToBegin(reader, info);
        else
            reader.Reopen(); // or seeking would take the end's wrong stamps for places
    }
    if (tail.end > 0 && countsOn)
        return {tail.end, Certainty::kKnown};
    const double estimate = tail.length > 0 ? EstimateLength(reader, info, tail) : announced;
    return estimate > 0 ? Length{estimate, Certainty::kEstimated}
                        : Length{kGuessedLength, Certainty::kGuessed};
}

/// Whether stamps fall from one of some places in the file to the next.
bool FallsSomewhere(PacketReader& reader, const SourceInfo& info, double last) {
    constexpr int64_t kPlaces = 16;
    constexpr int64_t kSampleBytes = 256 << 10;
    constexpr double kMostFall = 0.5; // pictures that build on later ones
    const bool byPlace =
        SeeksByBytes(reader) && av_match_name("ogg", reader.Context()->iformat->name) == 0; // see SeeksAstray
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
/// or as long as one of them. There the length is by the size.
Length DoubtLength(PacketReader& reader, const SourceInfo& info, double announced) {
    Length length{announced, Certainty::kKnown, true};
    if ((reader.Context()->iformat->flags & AVFMT_TS_DISCONT) == 0 || !reader.IsSeekable() ||
        reader.File().IsPlaylist())
        return length;
    const Stretch tail = ReadTail(reader, info);
    const bool falls = FallsSomewhere(reader, info, tail.last);
    ReturnToBegin(reader, info);
    const double estimate = tail.length > 0 ? EstimateLength(reader, info, tail) : 0;
    length.clockRestarts = falls || (estimate > 0 && announced > estimate * kMostVariation);
    if (length.clockRestarts && estimate > 0)
        length = {estimate, Certainty::kEstimated, false, true};
    return length;
}

} // namespace

Length FindLength(PacketReader& reader, const SourceInfo& info) {
    const AVFormatContext& context = *reader.Context();
    const double announced = AnnouncedLength(reader);
    // ASF has its length from whoever wrote it, who may have taken the last stamp for it.
    const bool doubtful =
        av_match_name("asf", context.iformat->name) != 0 && reader.Start() > kTicksPerSecond;
    if (announced <= 0 || doubtful || context.duration_estimation_method == AVFMT_DURATION_FROM_BITRATE)
        return MeasureLength(reader, info, announced);
    return DoubtLength(reader, info, announced);
}

} // namespace movieconv
