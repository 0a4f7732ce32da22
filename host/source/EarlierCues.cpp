#include "host/source/EarlierCues.h"

#include "host/sentence/Say.h"
#include "host/source/MediaTime.h"
#include "host/source/PacketTime.h"

#include <algorithm>
#include <utility>

extern "C" {
#include <libavutil/avstring.h>
}

namespace movieconv {
namespace {

/// Whether an index leads to each packet, so that those of one stream can be read without the others.
bool HasWholeIndex(const PacketReader& file) {
    return av_match_name("mov", file.Context()->iformat->name) != 0;
}

} // namespace

int64_t EarliestCueFor(const PacketReader& file, int64_t begin) {
    constexpr double kMostBytes = 1 << 30;
    constexpr int64_t kLeast = 60 * kTicksPerSecond;
    const int64_t near = std::max<int64_t>(begin - kLeast, 0);
    if (HasWholeIndex(file) || near == 0)
        return 0;
    const int64_t length = file.Context()->duration; // in microseconds
    if (file.File().IsPlaylist() || file.File().Bytes() <= 0 || length <= 0)
        return near;
    const double rate = static_cast<double>(file.File().Bytes()) / static_cast<double>(length);
    const auto reach =
        static_cast<int64_t>(std::min(kMostBytes / rate, 1e15)) * (kTicksPerSecond / 1'000'000);
    return std::min(near, std::max<int64_t>(begin - reach, 0));
}

Sentence TellEarliestCue(int64_t earliest, int64_t begin) {
    if (earliest <= 0)
        return {};
    return Say(
        "subtitles that appeared more than {:.0f} s before the begin and may still be shown there were "
        "not looked for",
        ToSeconds(begin - earliest));
}

bool SeekToCues(PacketReader& file, int64_t earliest) {
    if (earliest <= 0)
        return true;
    const int64_t from = file.Start() + earliest;
    const int64_t target = av_rescale_q(from, {1, kTicksPerSecond}, av_get_time_base_q());
    return avformat_seek_file(file.Context(), -1, INT64_MIN, target, target, 0) >= 0;
}

EarlierCues ReadEarlierCues(PacketReader& file, int main, std::vector<int> streams, int64_t begin) {
    EarlierCues found;
    if (!file.IsSeekable())
        return found;
    std::map<int, bool> behind; // by the streams that tell how far reading is: whether it is beyond the begin
    if (HasWholeIndex(file)) {
        for (const int stream : streams)
            behind[stream] = false;
        file.Select(std::move(streams));
    } else {
        behind[main] = false;
        file.Select({main});
        file.SelectBeside(std::move(streams));
    }
    AVFormatContext* context = file.Context();
    found.earliest = EarliestCueFor(file, begin);
    if (!SeekToCues(file, found.earliest))
        return found;
    while (std::any_of(behind.begin(), behind.end(), [](const auto& stream) { return !stream.second; })) {
        av::Packet packet = av::NewPacket();
        const int result = av_read_frame(context, packet.get());
        av::CheckMemory(result);
        if (result < 0)
            break;
        const int64_t stamp = StampOf(*packet);
        if (stamp == AV_NOPTS_VALUE)
            continue;
        const int stream = packet->stream_index;
        const bool isEarlier = file.MediaTime(stamp, context->streams[stream]->time_base) < begin;
        if (const auto told = behind.find(stream); told != behind.end() && !isEarlier)
            told->second = true;
        if (stream != main && isEarlier)
            found.packets[stream].push_back(std::move(packet));
    }
    return found;
}

} // namespace movieconv
