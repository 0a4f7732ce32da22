#include "writer/TextRows.h"

#include <algorithm>

namespace writer {
namespace {

constexpr int64_t kEmptySize = 2;                 // the length of a text
constexpr int64_t kLongestSample = INT32_MAX / 2; // multiplexers take no longer ones

bool IsEmpty(const PlacedPacket& sample) {
    return sample.size <= kEmptySize;
}

bool IsEarlier(const PlacedPacket& one, const PlacedPacket& other) {
    return one.dts < other.dts;
}

void AddPieces(PlacedPacket sample, int64_t end, std::vector<PlacedPacket>& row) {
    while (sample.dts < end) {
        sample.pts = sample.dts;
        sample.duration = std::min(end - sample.dts, kLongestSample);
        row.push_back(sample);
        sample.dts += sample.duration;
    }
}

} // namespace

bool IsEmptyText(const AVPacket& packet, AVCodecID codec) {
    return codec == AV_CODEC_ID_MOV_TEXT && packet.size <= kEmptySize;
}

void TextRows::Add(const PlacedPacket& sample) {
    rows_[sample.stream].push_back(sample);
}

int64_t TextRows::Texts(int stream) const {
    const auto row = rows_.find(stream);
    return row == rows_.end() ? 0
                              : std::count_if(row->second.begin(), row->second.end(),
                                              [](const PlacedPacket& each) { return !IsEmpty(each); });
}

std::vector<PlacedPacket> TextRows::Make(int64_t begin, int64_t end) const {
    std::vector<PlacedPacket> all;
    for (const auto& [stream, samples] : rows_) {
        std::vector<PlacedPacket> row = samples;
        for (PlacedPacket& sample : row)
            sample.dts = std::max(sample.dts, begin);
        std::stable_sort(row.begin(), row.end(), IsEarlier);
        for (size_t i = 0; i < row.size(); ++i) {
            const bool isLast = i + 1 == row.size();
            AddPieces(row[i], isLast ? std::max(end, row[i].dts + 1) : row[i + 1].dts, all);
        }
    }
    std::stable_sort(all.begin(), all.end(), IsEarlier);
    return all;
}

} // namespace writer
