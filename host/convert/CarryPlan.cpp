#include "host/convert/CarryPlan.h"

#include "host/convert/CarryTexts.h"
#include "host/convert/Formats.h"
#include "host/convert/Timecode.h"
#include "host/sentence/Say.h"
#include "host/source/Languages.h"
#include "host/source/StreamChoice.h"
#include "media/FourCC.h"
#include "media/MediaRecords.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <utility>

namespace movieconv {
namespace {

constexpr int64_t kLargestCoverInFlac = 16'000'000; // with its description below 2^24

const StreamInfo& StreamAt(const SourceInfo& source, int index) {
    return source.streams[static_cast<std::size_t>(index)];
}

bool IsAmong(const std::vector<int>& list, int number) {
    return std::count(list.begin(), list.end(), number) > 0;
}

bool CanBeHeard(const StreamInfo& stream) {
    return stream.decodable && stream.sound && stream.sound->sampleRate > 0 && stream.sound->channels > 0;
}

Sentence CannotHoldIt(const FileFormatInfo& format) {
    return Say("{} cannot hold it", ShortName(format));
}

Sentence WhyCoverStays(const StreamInfo& cover, const FileFormatInfo& format) {
    if (!Has(format, kWriterFormatCover))
        return CannotHoldIt(format);
    return format.fccFormat == FourCC("FLAC") && cover.bytes > kLargestCoverInFlac
               ? Say("{} cannot hold one of {} bytes", ShortName(format), cover.bytes)
               : Sentence();
}

/// Without what is drawn into the pictures, unless it is asked for by name.
std::vector<int> WantedSubtitles(const SourceInfo& source, const Request& request) {
    std::vector<int> wanted = WantedTracks(source.streams, StreamKind::kSubtitles, request.subtitles);
    if (!request.subtitles)
        wanted.erase(
            std::remove_if(wanted.begin(), wanted.end(),
                           [&](int stream) { return std::to_string(stream) == request.burnSubtitles; }),
            wanted.end());
    return wanted;
}

/// What the name of a file of subtitles says of its codec.
std::string UsualTextCodec(const std::string& path) {
    const std::size_t dot = path.rfind('.');
    const std::string extension = dot == std::string::npos ? "" : path.substr(dot + 1);
    return SameIgnoringCase(extension, "ass") || SameIgnoringCase(extension, "ssa") ? "ass"
           : SameIgnoringCase(extension, "vtt")                                     ? "webvtt"
                                                                                    : "subrip";
}

NotCarried LostOfChapters(Sentence reason) {
    return {"chapters", std::nullopt, {}, {}, std::move(reason)};
}

} // namespace

CarryPlan::CarryPlan(const SourceInfo& source, const Request& request, const FileFormatInfo& format)
    : source_(source),
      request_(request),
      format_(format),
      sounds_(WantedTracks(source.streams, StreamKind::kSound, request.audioTracks)),
      subtitles_(WantedSubtitles(source, request)) {
    if (request.copySound && source.sound && format.bHasAudio != 0)
        further_.push_back(source.sound->index);
    for (const int stream : FurtherSound())
        further_.push_back(stream);
    for (const int stream : subtitles_)
        if (WhySubtitlesStay(StreamAt(source, stream), format).IsEmpty())
            further_.push_back(stream);
}

std::vector<int> CarryPlan::FurtherSound() const {
    std::vector<int> further;
    for (const int number : sounds_)
        if (source_.sound && number != source_.sound->index &&
            WhySoundStays(StreamAt(source_, number)).IsEmpty())
            further.push_back(number);
    return further;
}

bool CarryPlan::Wants(const StreamInfo& stream) const {
    return stream.kind == StreamKind::kPictures    ? !request_.noVideo
           : stream.kind == StreamKind::kSound     ? !request_.noAudio && IsAmong(sounds_, stream.index)
           : stream.kind == StreamKind::kSubtitles ? IsAmong(subtitles_, stream.index)
                                                   : true;
}

Sentence CarryPlan::WhyItStays(const StreamInfo& stream) const {
    switch (stream.kind) {
    case StreamKind::kPictures:
        if (format_.bHasVideo == 0 || (source_.pictures && source_.pictures->index == stream.index))
            return {};
        return source_.pictures ? Say("one stream of pictures is converted") : Say("it cannot be decoded");
    case StreamKind::kSound: {
        const bool isConverted = source_.sound ? source_.sound->index == stream.index : CanBeHeard(stream);
        return format_.bHasAudio != 0 && isConverted ? Sentence() : WhySoundStays(stream);
    }
    case StreamKind::kSubtitles:
        return WhySubtitlesStay(stream, format_);
    case StreamKind::kData:
        return stream.holdsChapters || HoldsTheTimecode(source_, stream)
                   ? Sentence()
                   : Say("data streams are not converted");
    case StreamKind::kCover:
        return WhyCoverStays(stream, format_);
    case StreamKind::kAttachment:
        return Has(format_, kWriterFormatAttachments) ? Sentence() : CannotHoldIt(format_);
    }
    return {};
}

/// Why a stream of sound beside the engine's stays behind; empty when it does not.
Sentence CarryPlan::WhySoundStays(const StreamInfo& stream) const {
    if (format_.bHasAudio == 0)
        return CannotHoldIt(format_);
    if (!Has(format_, kWriterFormatTracks))
        return Say("{} holds one track of sound, MKV and MP4 hold several", ShortName(format_));
    if (!CanBeHeard(stream))
        return Say("it cannot be decoded");
    if (request_.copySound && MWCarriesPackets(format_.fccFormat, stream.codec.c_str()) == 0)
        return Say("{} cannot hold it as it is", ShortName(format_));
    if (source_.pictures && !BelongsTo(StreamAt(source_, source_.pictures->index).programs, stream))
        return Say("it belongs to another programme");
    return {};
}

/// What chapters do to the movie itself, which no output shows, whether they are carried or not.
void CarryPlan::AddUnfollowedChapters(std::vector<NotCarried>& left) const {
    if (source_.chaptersOrder)
        left.push_back(
            LostOfChapters(Say("the order in which they play parts of the movie is not followed")));
    if (const int count = source_.foreignChapters; count > 0)
        left.push_back(
            LostOfChapters(Say("{} of them stand for parts of other files, which are not played", count)));
}

/// What no output holds of chapters: what FFmpeg does not read, and what has no place in the movie.
void CarryPlan::AddLostChapters(std::vector<NotCarried>& left) const {
    if (request_.noChapters)
        return;
    const auto tell = [&](Sentence reason) { left.push_back(LostOfChapters(std::move(reason))); };
    if (const int count = source_.unreadChapters; count > 0)
        tell(Say("{} of them are in other editions or within others", count));
    if (const int count = source_.disorderedChapters; count > 0)
        tell(Say("{} of them are out of their order in time", count));
    if (const int count = ChaptersOutside(source_); count > 0)
        tell(Say("{} of them lie outside the movie", count));
    if (const int count = source_.furtherTitles; count > 0)
        tell(Say("{} of them have titles in further languages", count));
    if (const Sentence names = FurtherChapterTexts(source_); !names.IsEmpty() && !request_.noMetadata)
        tell(Say("of their texts only the titles are carried, not {}", names));
}

/// Of the one cover that is carried.
std::optional<NotCarried> CarryPlan::LostCoverTitle() const {
    const auto cover =
        std::find_if(source_.streams.begin(), source_.streams.end(),
                     [](const StreamInfo& stream) { return stream.kind == StreamKind::kCover; });
    if (cover == source_.streams.end() || cover->title.empty() || request_.noMetadata ||
        !Has(format_, kWriterFormatCover) || Has(format_, kWriterFormatCoverText))
        return std::nullopt;
    return NotCarried{"label",
                      cover->index,
                      cover->codec,
                      {},
                      Say("{} cannot hold its {}", ShortName(format_), Say("title"))};
}

std::vector<NotCarried> CarryPlan::LostByFormat() const {
    std::vector<NotCarried> left = LostTexts(source_, request_, format_);
    AddUnfollowedChapters(left);
    if (std::optional<NotCarried> chapters = WhyChaptersStay(source_, request_, format_))
        left.push_back(*std::move(chapters));
    else
        AddLostChapters(left);
    if (std::optional<NotCarried> timecode = WhyTimecodeStays(source_, request_, format_))
        left.push_back(*std::move(timecode));
    for (const int stream : further_)
        if (std::optional<NotCarried> lost = LostLabel(StreamAt(source_, stream), request_, format_))
            left.push_back(std::move(*lost));
    if (std::optional<NotCarried> title = LostCoverTitle())
        left.push_back(*std::move(title));
    return left;
}

std::optional<NotCarried> LostOfFile(const StreamInfo& stream, const Request& request,
                                     const FileFormatInfo& format) {
    if (Sentence reason = WhySubtitlesStay(stream, format); !reason.IsEmpty())
        return NotCarried{"subtitles", std::nullopt, stream.codec, stream.language, std::move(reason)};
    return LostLabel(stream, request, format);
}

Sentence WhySubtitlesStay(const StreamInfo& stream, const FileFormatInfo& format) {
    constexpr uint32_t kMatroska = FourCC("MKV ");
    if (MWCarriesPackets(format.fccFormat, stream.codec.c_str()) != 0)
        return {};
    const bool matroskaCan = MWCarriesPackets(kMatroska, stream.codec.c_str()) != 0;
    return matroskaCan ? Say("{} cannot hold them, MKV can", ShortName(format))
                       : Say("{} cannot hold them", ShortName(format));
}

NotCarried LeftOf(const StreamInfo& stream, Sentence reason) {
    const std::string& what = stream.codec == "none" ? stream.fileName : stream.codec;
    const auto number = stream.index >= 0 ? std::optional(stream.index) : std::nullopt; // none: a file's own
    return {std::string(KindName(stream.kind)), number, what, stream.language, std::move(reason)};
}

std::vector<NotCarried> ForetellLeftBehind(const SourceInfo& source, const Request& request,
                                           const FileFormatInfo& format) {
    const CarryPlan plan(source, request, format);
    std::vector<NotCarried> left = plan.LostByFormat();
    for (const SubtitleFileWish& wish : request.subtitleFiles) {
        StreamInfo stream;
        stream.kind = StreamKind::kSubtitles;
        stream.codec = UsualTextCodec(wish.path);
        stream.language = ThreeLetters(wish.language);
        if (std::optional<NotCarried> lost = LostOfFile(stream, request, format))
            left.push_back(std::move(*lost));
    }
    for (const StreamInfo& stream : source.streams)
        if (plan.Wants(stream))
            if (Sentence reason = plan.WhyItStays(stream); !reason.IsEmpty())
                left.push_back(LeftOf(stream, std::move(reason)));
    return left;
}

} // namespace movieconv
