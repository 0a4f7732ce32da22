#include "host/convert/CarryOver.h"

#include "media/MediaRecords.h"
#include "writer/WriterStatus.h"

#include <cmath>
#include <fmt/format.h>
#include <string>
#include <string_view>
#include <utility>

namespace movieconv {
namespace {

constexpr std::string_view kChapterTrack = "bin_data"; // MP4 holds the chapters once more, as texts

int64_t Ticks(double seconds) {
    return std::llround(seconds * kTicksPerSecond);
}

void CarryTexts(const SourceInfo& source, uint32_t set) {
    for (const Tag& tag : source.tags)
        MWSetTag(set, tag.key.c_str(), tag.value.c_str());
    for (const StreamInfo& stream : source.streams) {
        const bool isSound = source.sound && stream.index == source.sound->index;
        if (!isSound && (!source.pictures || stream.index != source.pictures->index))
            continue;
        MWSetTrackTag(set, isSound ? 1 : 0, "language", stream.language.c_str());
        MWSetTrackTag(set, isSound ? 1 : 0, "title", stream.title.c_str());
    }
}

/// How many chapters were left out, because they make no sense.
int CarryChapters(const SourceInfo& source, uint32_t set) {
    int left = 0;
    for (const Chapter& chapter : source.chapters)
        left +=
            MWAddChapter(set, Ticks(chapter.begin), Ticks(chapter.end), chapter.title.c_str()) != 0 ? 0 : 1;
    return left;
}

bool CarryFile(const Movie& movie, const StreamInfo& stream, uint32_t set) {
    const std::vector<uint8_t> data = movie.StoredFile(stream.index);
    const auto size = static_cast<int64_t>(data.size());
    if (stream.kind == StreamKind::kCover)
        return MWSetCover(set, data.data(), size) != 0;
    return MWAddAttachment(set, stream.fileName.c_str(), stream.mimeType.c_str(), data.data(), size) != 0;
}

std::string_view KindName(StreamKind kind) {
    switch (kind) {
    case StreamKind::kSubtitles:
        return "subtitles";
    case StreamKind::kCover:
        return "cover";
    case StreamKind::kAttachment:
        return "attachment";
    default:
        return "data";
    }
}

/// Empty when the stream was carried, or is of a kind of which the source itself tells.
std::string ReasonFor(const Movie& movie, const StreamInfo& stream, const FileFormatInfo& format,
                      uint32_t set, bool& hasCover) {
    const uint32_t traits = MWGetFormatTraits(format.fccFormat);
    switch (stream.kind) {
    case StreamKind::kPictures:
    case StreamKind::kSound:
        return {};
    case StreamKind::kSubtitles:
        return "subtitles are not converted";
    case StreamKind::kData:
        if (stream.codec == kChapterTrack && !movie.Info().chapters.empty())
            return {};
        return "data streams are not converted";
    case StreamKind::kCover:
        if ((traits & kWriterFormatCover) == 0)
            return fmt::format("{} cannot hold it", format.szName);
        if (hasCover)
            return "only one cover is carried";
        hasCover = CarryFile(movie, stream, set);
        return hasCover ? "" : "it is neither JPEG nor PNG";
    case StreamKind::kAttachment:
        if ((traits & kWriterFormatAttachments) == 0)
            return fmt::format("{} cannot hold it", format.szName);
        return CarryFile(movie, stream, set) ? "" : "it has no name or no content";
    }
    return {};
}

} // namespace

std::vector<NotCarried> CarryOver(const Movie& movie, const FileFormatInfo& format, uint32_t writerSet) {
    const SourceInfo& source = movie.Info();
    std::vector<NotCarried> left;
    CarryTexts(source, writerSet);
    if (!source.chapters.empty()) {
        const bool can = (MWGetFormatTraits(format.fccFormat) & kWriterFormatChapters) != 0;
        const int wrong = CarryChapters(source, writerSet);
        if (!can)
            left.push_back(
                {"chapters", std::nullopt, {}, {}, fmt::format("{} cannot hold them", format.szName)});
        else if (wrong != 0)
            left.push_back(
                {"chapters", std::nullopt, {}, {}, fmt::format("{} of them have no length", wrong)});
    }
    bool hasCover = false;
    for (const StreamInfo& stream : source.streams) {
        std::string reason = ReasonFor(movie, stream, format, writerSet, hasCover);
        if (!reason.empty())
            left.push_back({std::string(KindName(stream.kind)), stream.index, stream.codec, stream.language,
                            std::move(reason)});
    }
    return left;
}

} // namespace movieconv
