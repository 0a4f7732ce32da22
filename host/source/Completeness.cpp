#include "host/source/Completeness.h"

#include "ffmpeg/Mp4Box.h"
#include "host/source/ContainerParts.h"
#include "host/source/MatroskaEnd.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <string_view>

extern "C" {
#include <libavutil/avstring.h>
#include <libavutil/intreadwrite.h>
}

namespace movieconv {
namespace {

constexpr double kToleratedSeconds = 1;
constexpr double kToleratedShare = 0.01;
constexpr int64_t kToleratedBytes = 8; // sizes are told with and without their own header

using Header = std::array<uint8_t, 24>;

bool Has(const Header& header, std::size_t at, std::string_view name) {
    return std::memcmp(header.data() + at, name.data(), name.size()) == 0;
}

/// MP4 and its like: boxes one behind another. Only those that hold a movie count, whatever follows them.
bool BoxesAreCutOff(const InputFile& file) {
    constexpr std::array kVital{av::BoxType("mdat"), av::BoxType("moof"), av::BoxType("moov")};
    for (int64_t at = 0;;) {
        const std::optional<PartHead> box = ReadBoxHead(file, at);
        if (!box || box->size == PartHead::kOpen)
            return false;
        if (box->size > file.Size() - at)
            return std::find(kVital.begin(), kVital.end(), box->name) != kVital.end();
        at += box->size;
    }
}

/// AVI and WAV: the first chunk tells its size, unless it was written where nobody could go back to enter it.
bool ChunkIsCutOff(const InputFile& file) {
    constexpr int64_t kUnknown = 0x7FFFF000; // and everything above
    Header header{};
    if (file.ReadAt(0, header.data(), header.size()) < 12 || !Has(header, 0, "RIFF"))
        return false;
    const int64_t size = AV_RL32(header.data() + 4);
    return size < kUnknown && size > file.Size() - 8 + kToleratedBytes;
}

/// ASF: objects one behind another, an identifier and a size each. A broadcast tells none.
bool ObjectsAreCutOff(const InputFile& file) {
    Header header{};
    for (int64_t at = 0; file.ReadAt(at, header.data(), header.size()) == static_cast<int>(header.size());) {
        const auto size = static_cast<int64_t>(AV_RL64(header.data() + 16));
        if (size > file.Size() - at)
            return true;
        if (size < static_cast<int64_t>(header.size()))
            return false;
        at += size;
    }
    return false;
}

/// Matroska and WebM: a head, and behind it one segment that holds all.
bool SegmentIsCutOff(const InputFile& file) {
    constexpr uint64_t kSegment = 0x18538067;
    constexpr int kElements = 3; // the head, and a filler perhaps
    int64_t at = 0;
    for (int i = 0; i < kElements; ++i) {
        const std::optional<PartHead> element = ReadElementHead(file, at);
        if (!element || element->size == PartHead::kOpen)
            return false;
        if (element->name == kSegment || element->size > file.Size() - at)
            return element->size > file.Size() - at;
        at += element->size;
    }
    return false;
}

bool IndexReachesBeyond(AVFormatContext& context, int64_t bytes) {
    for (unsigned i = 0; i < context.nb_streams; ++i) {
        AVStream* stream = context.streams[i];
        const int entries = avformat_index_get_entries_count(stream);
        for (int k = 0; stream->discard != AVDISCARD_ALL && k < entries; ++k) {
            const AVIndexEntry* entry = avformat_index_get_entry(stream, k);
            if (entry->pos + entry->size > bytes)
                return true;
        }
    }
    return false;
}

std::optional<Shortfall> Compare(std::optional<double> announced, std::optional<double> reached) {
    if (!announced || !reached)
        return std::nullopt;
    const double missing = *announced - *reached;
    if (missing <= kToleratedSeconds || missing <= kToleratedShare * *announced)
        return std::nullopt;
    return Shortfall{false, {}, *announced, *reached};
}

} // namespace

bool IsCutOff(const InputFile& file, AVFormatContext& context) {
    const char* format = context.iformat->name;
    if (file.Size() <= 0)
        return false;
    if (av_match_name("mov", format) != 0)
        return BoxesAreCutOff(file) || IndexReachesBeyond(context, file.Size());
    if (av_match_name("matroska", format) != 0)
        return SegmentIsCutOff(file);
    if (av_match_name("asf", format) != 0)
        return ObjectsAreCutOff(file);
    return (av_match_name("avi", format) != 0 || av_match_name("wav", format) != 0) && ChunkIsCutOff(file);
}

std::vector<std::optional<double>> LastPackets(const InputFile& file, const AVFormatContext& context) {
    std::vector<std::optional<double>> last;
    if (av_match_name("matroska", context.iformat->name) != 0)
        last = ReadMatroskaEnd(file);
    if (last.size() > context.nb_streams) // streams and tracks do not belong to each other
        last.clear();
    last.resize(context.nb_streams);
    return last;
}

std::optional<Shortfall> FindShortfall(const Promise& promise, const Reached& reached) {
    if (!reached.pictures && !reached.sound)
        return std::nullopt;
    std::optional<Shortfall> found = Compare(promise.pictures, reached.pictures);
    if (!found)
        found = Compare(promise.sound, reached.sound);
    if (!found)
        found = Compare(promise.all, std::max(reached.pictures, reached.sound));
    if (promise.cutOff)
        found.emplace(found.value_or(Shortfall{})).cutOff = true;
    return found;
}

} // namespace movieconv
