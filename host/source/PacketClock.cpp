#include "host/source/PacketClock.h"

#include "host/source/MediaTime.h"
#include "host/source/StreamChoice.h"

#include <algorithm>
#include <cstddef>
#include <utility>

namespace movieconv {
namespace {

constexpr AVRational kMediaBase{1, kTicksPerSecond};

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

PacketClock::PacketClock(const SourceInfo& info, const PacketReader& reader)
    : reader_(reader), witnesses_(WitnessesIn(info, *reader.Context())) {}

void PacketClock::Push(av::Packet packet) {
    std::optional<ClockRepair::Packet> told;
    const AVStream* stream = reader_.Context()->streams[packet->stream_index];
    const AVMediaType kind = stream->codecpar->codec_type;
    if (MayJump(*reader_.Context()) && packet->dts != AV_NOPTS_VALUE && kind != AVMEDIA_TYPE_SUBTITLE) {
        constexpr int64_t kLongest = 3600 * kTicksPerSecond; // damaged data can tell anything
        const int64_t length = av_rescale_q(packet->duration, stream->time_base, kMediaBase);
        told = {packet->stream_index, kind == AVMEDIA_TYPE_AUDIO,
                reader_.MediaTime(packet->dts, stream->time_base), std::clamp<int64_t>(length, 0, kLongest)};
    }
    repair_.Push(told);
    waiting_.push_back(std::move(packet));
}

av::Packet PacketClock::Pop(bool all) {
    const std::optional<int64_t> shift = repair_.Pop(all);
    jumps_ = repair_.Jumps();
    if (!shift)
        return nullptr;
    av::Packet packet = std::move(waiting_.front());
    waiting_.pop_front();
    const int64_t ticks =
        av_rescale_q(*shift, kMediaBase, reader_.Context()->streams[packet->stream_index]->time_base);
    for (int64_t* stamp : {&packet->dts, &packet->pts})
        if (*stamp != AV_NOPTS_VALUE)
            *stamp += ticks;
    return packet;
}

} // namespace movieconv
