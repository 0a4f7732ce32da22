#include "host/source/Stretch.h"

#include "host/sentence/Say.h"
#include "host/source/MediaTime.h"
#include "host/source/PacketTime.h"
#include "host/source/SourceError.h"

#include <algorithm>
#include <cstddef>
#include <vector>

namespace movieconv {

int Counted(const SourceInfo& info) {
    return info.pictures ? info.pictures->index : info.sound->index;
}

Stretch ReadStretch(PacketReader& reader, int counted, int64_t mostBytes, int mostPackets) {
    AVFormatContext* context = reader.Context();
    std::vector<av::CodecParameters> beginnings;
    for (unsigned i = 0; i < context->nb_streams; ++i)
        beginnings.push_back(av::CopyOf(*context->streams[i]->codecpar));
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
            const double time = ToSeconds(reader.MediaTime(stamp, stream->time_base));
            if (packet->stream_index == counted)
                stretch.stamps.push_back(time);
            stretch.first = std::min(stretch.first, time);
            stretch.last = std::max(stretch.last, time);
            stretch.end =
                std::max(stretch.end, ToSeconds(reader.MediaTime(EndStampOf(*packet), stream->time_base)));
        }
        av_packet_unref(packet.get());
    }
    for (std::size_t i = 0; i < beginnings.size(); ++i)
        av::CheckMemory(avcodec_parameters_copy(context->streams[i]->codecpar, beginnings[i].get()));
    return stretch;
}

void ReturnToBegin(PacketReader& reader, const SourceInfo& info) {
    if (!reader.Rewind())
        throw SourceError(Say("cannot read \"{}\" from its start again", info.path));
}

} // namespace movieconv
