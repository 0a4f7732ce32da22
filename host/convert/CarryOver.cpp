#include "host/convert/CarryOver.h"

#include "host/convert/CarryPlan.h"
#include "host/convert/CarryTexts.h"
#include "host/convert/Formats.h"
#include "host/sentence/Say.h"
#include "writer/WriterStatus.h"

#include <fmt/format.h>
#include <optional>
#include <string>
#include <utility>

namespace movieconv {
namespace {

/// Hands a cover or an attachment that the format can hold to the writer; a cover after the first one, or of
/// another kind, is a file among others. Empty when it was taken.
Sentence CarryStored(const Movie& movie, const StreamInfo& stream, const Request& request,
                     const FileFormatInfo& format, uint32_t set, bool& hasCover) {
    if (stream.kind != StreamKind::kCover && stream.kind != StreamKind::kAttachment)
        return {};
    const bool holdsFiles = Has(format, kWriterFormatAttachments);
    if (stream.kind == StreamKind::kCover && hasCover && !holdsFiles)
        return Say("only one cover is carried");
    const std::vector<uint8_t> data = movie.StoredFile(stream.index);
    const auto size = static_cast<int64_t>(data.size());
    const char* title = request.noMetadata ? "" : stream.title.c_str();
    if (stream.kind == StreamKind::kCover && !hasCover) {
        hasCover = MWSetCover(set, data.data(), size) != 0;
        if (hasCover)
            MWDescribeCover(set, stream.fileName.c_str(), title);
        if (hasCover || !holdsFiles)
            return hasCover ? Sentence() : Say("it is neither JPEG nor PNG");
    }
    const bool unnamed = stream.kind == StreamKind::kCover && stream.fileName.empty();
    const std::string type = stream.codec == "mjpeg" ? "jpeg" : stream.codec;
    const std::string name = unnamed ? fmt::format("cover-{}.{}", stream.index, type) : stream.fileName;
    const std::string mimeType = unnamed ? fmt::format("image/{}", type) : stream.mimeType;
    const bool taken = MWAddAttachment(set, name.c_str(), mimeType.c_str(), data.data(), size) != 0 &&
                       MWDescribeAttachment(set, title) != 0;
    return taken ? Sentence() : Say("it has no name or no content");
}

} // namespace

Carried CarryOver(Movie& movie, const Request& request, const FileFormatInfo& format, uint32_t writerSet) {
    const SourceInfo& source = movie.Info();
    const CarryPlan plan(source, request, format);
    CarryTexts(source, request, format, writerSet);
    Carried carried{{}, plan.LostByFormat()};
    std::vector<NotCarried>& left = carried.left;
    if (!request.noChapters && !WhyChaptersStay(source, request, format))
        if (const int wrong = CarryChapters(source, request, format, writerSet); wrong != 0)
            left.push_back({"chapters", std::nullopt, {}, {}, Say("{} of them have no length", wrong)});
    FurtherTracks tracks(movie, request, format, writerSet);
    for (const int number : plan.FurtherTracks())
        tracks.Add(source.streams[static_cast<std::size_t>(number)]);
    for (const SubtitleFileWish& wish : request.subtitleFiles)
        if (std::optional<NotCarried> lost = tracks.AddFile(wish, request.subtitleCharset))
            left.push_back(std::move(*lost));
    carried.subtitles = tracks.Finish();
    bool hasCover = false;
    for (const StreamInfo& stream : source.streams) {
        if (!plan.Wants(stream))
            continue;
        Sentence reason = plan.WhyItStays(stream);
        if (reason.IsEmpty())
            reason = CarryStored(movie, stream, request, format, writerSet, hasCover);
        if (!reason.IsEmpty())
            left.push_back(LeftOf(stream, std::move(reason)));
    }
    return carried;
}

std::vector<NotCarried> LostCues(const std::vector<SubtitleTrack>& subtitles, uint32_t writerSet) {
    std::vector<NotCarried> lost;
    for (const auto& [track, stream] : subtitles)
        if (const int64_t count = MWGetLostCues(writerSet, track); count > 0)
            lost.push_back(
                LeftOf(stream, SayCounted(count, Say("one of their texts could not be converted"),
                                          Say("{} of their texts could not be converted", count))));
    return lost;
}

} // namespace movieconv
