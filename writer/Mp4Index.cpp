#include "writer/Mp4Index.h"

#include "media/MediaRecords.h"
#include "writer/BigEndian.h"
#include "writer/WriterFailure.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <new>
#include <numeric>
#include <utility>

namespace writer {
namespace {

/// Where the index begins in what was kept: behind the texts, which are packets and no boxes.
size_t FindMoov(const std::vector<uint8_t>& kept) {
    // The index ends what was kept, and its first four bytes say how long it is.
    constexpr std::array<uint8_t, 4> kName{'m', 'o', 'o', 'v'};
    for (auto at = kept.begin(); (at = std::search(at, kept.end(), kName.begin(), kName.end())) != kept.end();
         ++at) {
        const auto name = static_cast<size_t>(at - kept.begin());
        if (name < 4)
            continue;
        const size_t begin = name - 4;
        if (begin + BigEndian(&kept[begin], 4) == kept.size())
            return begin;
    }
    throw WriterFailure(kWriterErrorEncode, "The container has no index.");
}

/// The multiplexer's own.
uint32_t InMovieUnits(int64_t ticks) {
    constexpr int kUnitsPerSecond = 1000;
    return static_cast<uint32_t>(av_rescale(ticks, kUnitsPerSecond, kTicksPerSecond));
}

bool HasTimecode(const Extras& extras) {
    return extras.pictures.tags.count("timecode") != 0;
}

} // namespace

bool NeedsIndex(const Extras& extras) {
    return !extras.chapters.empty() || extras.cover.data || HasTimecode(extras);
}

/// Drops what is written to it, but for the end.
class Mp4Index::Sink final : public ByteFile {
public:
    /// What is written from `place` on is kept.
    void KeepFrom(int64_t place) { place_ = place; }
    std::vector<uint8_t>& Kept() { return kept_; }

    int64_t Write(const uint8_t* data, int64_t size) override {
        const int64_t begin = position_;
        position_ += size;
        end_ = std::max(end_, position_);
        if (place_ < 0 || begin < place_)
            return size;
        const auto at = static_cast<size_t>(begin - place_);
        try {
            kept_.resize(std::max(kept_.size(), at + static_cast<size_t>(size)));
        } catch (...) {
            return -ENOMEM;
        }
        std::memcpy(&kept_[at], data, static_cast<size_t>(size));
        return size;
    }
    int64_t Read(uint8_t* /*data*/, int64_t /*size*/) override { return 0; }
    int64_t Seek(int64_t offset, int whence) override {
        position_ = offset + (whence == SEEK_SET ? 0 : whence == SEEK_CUR ? position_ : end_);
        return position_;
    }
    int64_t Truncate(int64_t /*size*/) override { return -EBADF; }
    int64_t Sync() override { return 0; }

private:
    int64_t position_ = 0;
    int64_t end_ = 0;
    int64_t place_ = -1;
    std::vector<uint8_t> kept_;
};

Mp4Index::Mp4Index(const Container& container, bool bitExact, const Extras& extras, int64_t place)
    : extras_(extras),
      place_(place),
      sink_(std::make_shared<Sink>()),
      file_(sink_, AvioFile::Mode::kWrite),
      muxer_(container, file_, {.fragmented = false, .bitExact = bitExact}, extras),
      packet_(av::NewPacket()) {
    file_.Io()->direct = 1; // what stands in for the data need not be copied
}

Mp4Index::~Mp4Index() = default;

int64_t Mp4Index::MostTexts(const Extras& extras) {
    constexpr int64_t kPerText = 64;
    constexpr int64_t kHead = 256;
    // The multiplexer ends the texts of each track with an empty one.
    const auto ends =
        static_cast<int64_t>(extras.tracks.size()) * kPerText + (HasTimecode(extras) ? kHead : 0);
    return std::accumulate(extras.chapters.begin(), extras.chapters.end(), ends,
                           [](int64_t sum, const OutputChapter& chapter) {
                               return sum + kPerText + static_cast<int64_t>(chapter.title.size());
                           });
}

int64_t Mp4Index::MostOf(const Extras& extras) {
    constexpr int64_t kPerTag = 64;
    constexpr int64_t kChapterTrack = 2048;
    constexpr int64_t kTimecodeTrack = 1024;
    // In the texts, in the list, and in the tables of their track.
    int64_t size = 3 * MostTexts(extras) + (extras.chapters.empty() ? 0 : kChapterTrack) +
                   (HasTimecode(extras) ? kTimecodeTrack : 0);
    std::vector<const Tags*> all{&extras.tags, &extras.pictures.tags, &extras.sound.tags};
    for (const Track& track : extras.tracks)
        all.push_back(&track.label.tags);
    for (const Tags* tags : all)
        for (const auto& [key, value] : *tags)
            size += kPerTag + static_cast<int64_t>(key.size() + value.size());
    return size + (extras.cover.data ? kPerTag + static_cast<int64_t>(extras.cover.data->size()) : 0);
}

void Mp4Index::AddStream(const MuxedStream& stream, int64_t delay) {
    muxer_.AddStream(stream);
    tracks_.push_back({stream.label->Text("language"), stream.label->Text("language_tag"),
                       stream.parameters->codec_type == AVMEDIA_TYPE_SUBTITLE &&
                           (stream.label->flags & AV_DISPOSITION_DEFAULT) == 0});
    streams_.push_back(
        {stream.unit, delay, stream.parameters->codec_id, stream.carriage->describedByPacket, {}});
}

void Mp4Index::Begin() {
    if (std::exchange(begun_, true))
        return;
    // The timecode is a packet of the multiplexer's own, behind its head.
    if (HasTimecode(extras_)) {
        avio_seek(file_.Io(), place_, SEEK_SET);
        sink_->KeepFrom(place_);
    }
    muxer_.WriteHeader(0);
    if (HasTimecode(extras_)) {
        if (file_.Flush() != 0)
            throw std::bad_alloc();
        head_ = std::exchange(sink_->Kept(), {});
        sink_->KeepFrom(-1);
    }
    for (size_t stream = 0; stream < streams_.size(); ++stream)
        streams_[stream].muxedUnit = muxer_.Stream(static_cast<int>(stream)).description.unit;
}

bool Mp4Index::WantsContent(const PlacedPacket& packet) const {
    const auto stream = static_cast<size_t>(packet.stream);
    // The first packet of some codecs describes all of them; pictures of this one are told apart in the
    // index.
    return stream < streams_.size() && (streams_[stream].packets == 0 ||
                                        (packet.key && streams_[stream].codec == AV_CODEC_ID_MPEG2VIDEO));
}

void Mp4Index::Add(const PlacedPacket& placed, const std::vector<uint8_t>& content) {
    Begin();
    if (placed.stream < 0 || static_cast<size_t>(placed.stream) >= streams_.size())
        throw WriterFailure(kWriterErrorFinish, "The temporary file holds a stream that was not written.");
    Stream& stream = streams_[static_cast<size_t>(placed.stream)];
    const auto size = static_cast<size_t>(placed.size);
    if (content_.size() < size + AV_INPUT_BUFFER_PADDING_SIZE)
        content_.resize(size + AV_INPUT_BUFFER_PADDING_SIZE);
    if (stream.packets == 0 && stream.describedByPacket)
        stream.start = content;
    const std::vector<uint8_t>& shown = content.empty() ? stream.start : content;
    std::copy_n(shown.begin(), std::min(shown.size(), size), content_.begin());
    packet_->data = content_.data();
    packet_->size = static_cast<int>(placed.size);
    packet_->stream_index = placed.stream;
    packet_->dts = placed.dts - stream.delay;
    packet_->pts = placed.pts - stream.delay;
    packet_->duration = placed.duration;
    packet_->flags = placed.key ? AV_PKT_FLAG_KEY : 0;
    av_packet_rescale_ts(packet_.get(), stream.unit, stream.muxedUnit);
    muxer_.WriteAt(*packet_, placed.position);
    std::fill_n(content_.begin(), std::min(shown.size(), size), uint8_t{0});
    ++stream.packets;
}

Mp4Index::Result Mp4Index::Finish() {
    Begin();
    file_.Flush();
    const int64_t place = place_ + static_cast<int64_t>(head_.size());
    avio_seek(file_.Io(), place, SEEK_SET);
    sink_->KeepFrom(place);
    // Only now, so that their texts come here.
    muxer_.SetChapters(extras_.chapters);
    muxer_.WriteTrailer();
    if (file_.Flush() != 0)
        throw std::bad_alloc();
    std::vector<uint8_t>& kept = sink_->Kept();
    const size_t moov = FindMoov(kept);
    Result result{{}, std::vector<uint8_t>(kept.begin() + static_cast<std::ptrdiff_t>(moov), kept.end())};
    CorrectTracks(result.moov, tracks_);
    if (!extras_.chapters.empty() && extras_.chapters.front().begin > 0)
        DelayChapters(result.moov, tracks_.size(), InMovieUnits(extras_.chapters.front().begin));
    kept.resize(moov);
    result.texts = std::move(head_);
    result.texts.insert(result.texts.end(), kept.begin(), kept.end());
    return result;
}

} // namespace writer
