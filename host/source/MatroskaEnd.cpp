#include "host/source/MatroskaEnd.h"

#include "host/source/MatroskaSegment.h"

#include <algorithm>
#include <array>
#include <cstddef>

extern "C" {
#include <libavutil/intreadwrite.h>
}

namespace movieconv {
namespace {

constexpr uint64_t kTimeUnit = 0x2AD7B1;
constexpr uint64_t kTrackNumber = 0xD7;
constexpr uint64_t kCues = 0x1C53BB6B;
constexpr uint64_t kCuePoint = 0xBB;
constexpr uint64_t kCuePositions = 0xB7;
constexpr uint64_t kCueCluster = 0xF1;
constexpr uint64_t kClusterTime = 0xE7;
constexpr uint64_t kSimpleBlock = 0xA3;
constexpr uint64_t kBlockGroup = 0xA0;
constexpr uint64_t kBlock = 0xA1;

class EndReader {
public:
    explicit EndReader(const InputFile& file) : file_(file), segment_(file) {}

    std::vector<std::optional<double>> Read() {
        if (!TellsItsSize())
            return {};
        Parts& elements = segment_.Elements();
        const uint64_t unit = elements.Number(elements.Find(segment_.Locate(kMatroskaInfo), kTimeUnit));
        unit_ = (unit != 0 ? static_cast<double>(unit) : kUsualUnit) / 1e9;
        segment_.ForEachTrack([&](const Part& track) {
            tracks_.push_back(elements.Number(elements.Find(track, kTrackNumber)));
        });
        last_.resize(tracks_.size());
        const bool isWhole = EachWithin(LastIndexed(), segment_.Whole().end, [this](const Part& part) {
            return part.name != kMatroskaCluster || TakeCluster(part);
        });
        if (!isWhole)
            last_.clear();
        return std::move(last_);
    }

private:
    static constexpr double kUsualUnit = 1e6; // ns

    /// A segment without a size ends wherever the file does.
    bool TellsItsSize() const {
        const Part& whole = segment_.Whole();
        for (int64_t at = 0; at < whole.begin;) {
            const std::optional<PartHead> head = ReadElementHead(file_, at);
            if (!head || head->size == PartHead::kOpen)
                return false;
            at += at + head->headSize == whole.begin ? head->headSize : head->size;
        }
        return whole.end > whole.begin;
    }

    /// The cluster of the last entry of the index; without an index the first one.
    int64_t LastIndexed() {
        Parts& elements = segment_.Elements();
        const Part& whole = segment_.Whole();
        Part last;
        segment_.ForEach(segment_.Locate(kCues), kCuePoint, [&](const Part& point) { last = point; });
        uint64_t place = 0;
        segment_.ForEach(last, kCuePositions, [&](const Part& positions) {
            place = std::max(place, elements.Number(elements.Find(positions, kCueCluster)));
        });
        const bool isPlace = place > 0 && place < static_cast<uint64_t>(whole.end - whole.begin);
        return isPlace ? whole.begin + static_cast<int64_t>(place) : whole.begin;
    }

    /// Calls `take` with each part between these places. False when they do not fill them, or `take` tells
    /// false.
    template <class Take>
    bool EachWithin(int64_t begin, int64_t end, Take take) {
        for (int64_t at = begin; at < end;) {
            const std::optional<PartHead> head = ReadElementHead(file_, at);
            if (!head || head->size == PartHead::kOpen || head->size > end - at || left_-- <= 0 ||
                !take(Part{head->name, at + head->headSize, at + head->size}))
                return false;
            at += head->size;
        }
        return true;
    }

    bool TakeCluster(const Part& cluster) {
        uint64_t time = 0;
        return EachWithin(cluster.begin, cluster.end, [&](const Part& part) {
            if (part.name == kClusterTime)
                time = segment_.Elements().Number(part);
            if (part.name == kSimpleBlock)
                TakeBlock(part, time);
            return part.name != kBlockGroup || EachWithin(part.begin, part.end, [&](const Part& inner) {
                       if (inner.name == kBlock)
                           TakeBlock(inner, time);
                       return true;
                   });
        });
    }

    /// It begins with its track's number and its time in the cluster.
    void TakeBlock(const Part& block, uint64_t clusterTime) {
        std::array<uint8_t, 10> head{}; // what is not read stays 0
        file_.ReadAt(block.begin, head.data(), head.size());
        const MarkedNumber track = ReadMarkedNumber(head.data(), 8, false);
        const auto found = std::find(tracks_.begin(), tracks_.end(), track.value);
        if (track.length == 0 || found == tracks_.end())
            return;
        const auto offset = static_cast<int16_t>(AV_RB16(head.data() + track.length));
        const double time = (static_cast<double>(clusterTime) + offset) * unit_;
        std::optional<double>& last = last_[static_cast<std::size_t>(found - tracks_.begin())];
        last = std::max(last.value_or(time), time);
    }

    const InputFile& file_;
    MatroskaSegment segment_;
    double unit_ = 0; // seconds
    std::vector<uint64_t> tracks_;
    std::vector<std::optional<double>> last_;
    int left_ = 200'000; // parts that are looked at, more than there are in ten seconds
};

} // namespace

std::vector<std::optional<double>> ReadMatroskaEnd(const InputFile& file) {
    return EndReader(file).Read();
}

} // namespace movieconv
