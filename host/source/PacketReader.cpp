#include "host/source/PacketReader.h"

#include "host/sentence/Say.h"
#include "host/source/MediaTime.h"
#include "host/source/SourceError.h"

#include <algorithm>
#include <utility>

namespace movieconv {
namespace {

/// In media time. Damaged stamps can be anything; those beyond leave room for sums with them.
constexpr int64_t kFarthestTime = int64_t{1} << 60;

int64_t WithinReason(int64_t mediaTime) {
    return std::clamp(mediaTime, -kFarthestTime, kFarthestTime);
}

} // namespace

PacketReader::PacketReader(const std::string& path, bool playlists, Growth growth,
                           std::shared_ptr<Interruption> interruption)
    : path_(path),
      playlists_(playlists),
      growth_(growth),
      interruption_(std::move(interruption)),
      file_(std::make_unique<MovieFile>(path, playlists, growth, interruption_)) {
    if (const int64_t start = Context()->start_time; start != AV_NOPTS_VALUE)
        start_ = WithinReason(av_rescale_q(start, {1, AV_TIME_BASE}, {1, kTicksPerSecond}));
}

void PacketReader::Select(std::vector<int> streams) {
    selected_ = std::move(streams);
    DiscardOthers();
}

void PacketReader::SelectBeside(std::vector<int> streams) {
    beside_ = std::move(streams);
    DiscardOthers();
}

void PacketReader::DiscardOthers() {
    for (unsigned i = 0; i < Context()->nb_streams; ++i) {
        const bool wanted = std::count(selected_.begin(), selected_.end(), static_cast<int>(i)) > 0 ||
                            std::count(beside_.begin(), beside_.end(), static_cast<int>(i)) > 0;
        Context()->streams[i]->discard = wanted ? AVDISCARD_DEFAULT : AVDISCARD_ALL;
    }
}

int64_t PacketReader::MediaTime(int64_t stamp, AVRational timeBase) const {
    return WithinReason(av_rescale_q(stamp, timeBase, {1, kTicksPerSecond})) - start_;
}

bool PacketReader::IsSeekable() const {
    return Context()->pb != nullptr && (Context()->pb->seekable & AVIO_SEEKABLE_NORMAL) != 0;
}

bool PacketReader::Rewind() {
    if (file_->IsPlaylist()) { // whose demultiplexer may find nothing more after a seek, and tells success
        try {
            Reopen();
            return true;
        } catch (const SourceError&) {
            return false;
        }
    }
    const int flags = Context()->iformat->flags;
    const auto toFirstByte = [&] {
        return (flags & AVFMT_NO_BYTE_SEEK) == 0 &&
               avformat_seek_file(Context(), -1, 0, 0, 0, AVSEEK_FLAG_BYTE) >= 0;
    };
    // In streams for broadcast the first time lies behind the first key picture, which is decoded earlier.
    if ((flags & AVFMT_TS_DISCONT) != 0 && toFirstByte())
        return true;
    // By the stream that begins first, lest the others be skipped up to where the usual one begins. What
    // decoders leave out at the begin of sound lies before the time that the stream tells.
    const AVStream* first = nullptr;
    const auto stampOf = [](AVStream* stream) {
        const AVIndexEntry* entry = avformat_index_get_entry(stream, 0);
        const int64_t start = stream->start_time != AV_NOPTS_VALUE ? stream->start_time : 0;
        return entry != nullptr && entry->timestamp != AV_NOPTS_VALUE ? std::min(start, entry->timestamp)
                                                                      : start;
    };
    int64_t start = 0;
    for (const int index : selected_) {
        AVStream* stream = Context()->streams[index];
        const int64_t stamp = stampOf(stream);
        if (first == nullptr || av_compare_ts(stamp, stream->time_base, start, first->time_base) < 0) {
            first = stream;
            start = stamp;
        }
    }
    if (first == nullptr)
        return toFirstByte();
    const int64_t earlier = start - av_rescale_q(1, {1, 1}, first->time_base);
    return avformat_seek_file(Context(), first->index, INT64_MIN, earlier, start, 0) >= 0 || toFirstByte();
}

void PacketReader::Reopen() {
    auto again = std::make_unique<MovieFile>(path_, playlists_, growth_, interruption_);
    int last = -1;
    for (const std::vector<int>* streams : {&selected_, &beside_})
        for (const int stream : *streams)
            last = std::max(last, stream);
    if (last >= static_cast<int>(again->Context()->nb_streams))
        throw SourceError(Say("\"{}\" has changed meanwhile", path_));
    file_ = std::move(again);
    DiscardOthers();
}

} // namespace movieconv
