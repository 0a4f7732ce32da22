#include "host/source/PacketClock.h"

#include "host/source/MediaTime.h"
#include "host/source/StreamChoice.h"

#include <algorithm>
#include <cstddef>

namespace movieconv {
namespace {

/// Whether the clock of such a source may start anew.
bool MayJump(const AVFormatContext& context) {
    return (context.iformat->flags & AVFMT_TS_DISCONT) != 0;
}

std::vector<int> WitnessesIn(const SourceInfo& info, const AVFormatContext& context) {
    std::vector<int> witnesses;
    const int converted = info.pictures ? info.pictures->index : info.sound->index;
    const std::vector<int>& programs = info.streams[static_cast<std::size_t>(converted)].programs;
    for (const StreamInfo& stream : info.streams)
        if (MayJump(context) && BelongsTo(programs, stream) &&
            (stream.kind == StreamKind::kPictures || stream.kind == StreamKind::kSound))
            witnesses.push_back(stream.index);
    return witnesses;
}

} // namespace

PacketClock::PacketClock(const SourceInfo& info, const AVFormatContext& context)
    : witnesses_(WitnessesIn(info, context)) {}

void PacketClock::Repair(const MovieReader& reader, AVPacket& packet) {
    if (!MayJump(*reader.Context()) || packet.dts == AV_NOPTS_VALUE)
        return;
    const AVStream* stream = reader.Context()->streams[packet.stream_index];
    const AVRational mediaBase{1, kTicksPerSecond};
    constexpr int64_t kLongest = 3600 * kTicksPerSecond; // damaged data can tell anything
    const int64_t length =
        std::clamp<int64_t>(av_rescale_q(packet.duration, stream->time_base, mediaBase), 0, kLongest);
    const int64_t stamp = reader.MediaTime(packet.dts, stream->time_base);
    const int64_t shift = stream->codecpar->codec_type == AVMEDIA_TYPE_SUBTITLE
                              ? repair_.Shift()
                              : repair_.ShiftFor(packet.stream_index, stamp, length);
    jumps_ = repair_.Jumps();
    const int64_t ticks = av_rescale_q(shift, mediaBase, stream->time_base);
    packet.dts += ticks;
    if (packet.pts != AV_NOPTS_VALUE)
        packet.pts += ticks;
}

} // namespace movieconv
