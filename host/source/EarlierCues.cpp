#include "host/source/EarlierCues.h"

#include "host/source/MediaTime.h"
#include "host/source/PacketTime.h"

#include <algorithm>
#include <utility>

namespace movieconv {

std::map<int, std::vector<av::Packet>> ReadEarlierCues(MovieReader& file, int main, std::vector<int> streams,
                                                       int64_t begin) {
    constexpr int64_t kFarthest = 60 * kTicksPerSecond;
    std::map<int, std::vector<av::Packet>> found;
    if (!file.IsSeekable())
        return found;
    file.Select({main});
    file.SelectBeside(std::move(streams));
    AVFormatContext* context = file.Context();
    const int64_t from = file.Start() + std::max<int64_t>(begin - kFarthest, 0);
    const int64_t target = av_rescale_q(from, {1, kTicksPerSecond}, av_get_time_base_q());
    if (avformat_seek_file(context, -1, INT64_MIN, target, target, 0) < 0)
        return found;
    for (;;) {
        av::Packet packet = av::NewPacket();
        const int result = av_read_frame(context, packet.get());
        av::CheckMemory(result);
        if (result < 0)
            return found;
        const int64_t stamp = StampOf(*packet);
        if (stamp == AV_NOPTS_VALUE)
            continue;
        const bool isEarlier =
            file.MediaTime(stamp, context->streams[packet->stream_index]->time_base) < begin;
        if (packet->stream_index != main) {
            if (isEarlier)
                found[packet->stream_index].push_back(std::move(packet));
        } else if (!isEarlier) {
            return found;
        }
    }
}

} // namespace movieconv
