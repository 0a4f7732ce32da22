#include "host/convert/CarryTexts.h"

#include "host/convert/Formats.h"
#include "host/convert/Timecode.h"
#include "host/sentence/Say.h"
#include "host/source/Languages.h"
#include "host/source/MediaTime.h"
#include "media/MediaRecords.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstddef>
#include <fmt/format.h>
#include <iterator>
#include <string>
#include <string_view>
#include <utility>

namespace movieconv {
namespace {

int64_t Ticks(double seconds) {
    return std::llround(seconds * kTicksPerSecond);
}

int Dispositions(const StreamFlags& flags) {
    return (flags.isDefault ? AV_DISPOSITION_DEFAULT : 0) | (flags.forced ? AV_DISPOSITION_FORCED : 0) |
           (flags.original ? AV_DISPOSITION_ORIGINAL : 0) | (flags.dub ? AV_DISPOSITION_DUB : 0) |
           (flags.commentary ? AV_DISPOSITION_COMMENT : 0) |
           (flags.hearingImpaired ? AV_DISPOSITION_HEARING_IMPAIRED : 0) |
           (flags.visualImpaired ? AV_DISPOSITION_VISUAL_IMPAIRED : 0);
}

/// The texts of the output: the source's, where the request has no others. A timecode is none of them.
std::vector<Tag> TextsFor(const SourceInfo& source, const Request& request) {
    std::vector<Tag> texts;
    for (const Tag& tag : source.tags) {
        const bool replaced =
            std::any_of(request.metadata.begin(), request.metadata.end(),
                        [&](const Tag& wish) { return SameIgnoringCase(wish.key, tag.key); });
        if (!request.noMetadata && !replaced)
            texts.push_back(tag);
    }
    texts.insert(texts.end(), request.metadata.begin(), request.metadata.end());
    texts.erase(
        std::remove_if(texts.begin(), texts.end(), [](const Tag& tag) { return IsTimecode(tag.key); }),
        texts.end());
    return texts;
}

/// What the engine converts, with the writer's numbers for it.
std::vector<std::pair<const StreamInfo*, int>> EnginesTracks(const SourceInfo& source, const Request& request,
                                                             const FileFormatInfo& format) {
    std::vector<std::pair<const StreamInfo*, int>> tracks;
    const auto add = [&](int stream, int track) {
        tracks.emplace_back(&source.streams[static_cast<std::size_t>(stream)], track);
    };
    if (source.pictures && !request.noVideo && format.bHasVideo != 0)
        add(source.pictures->index, kWriterTrackPictures);
    if (source.sound && !request.noAudio && !request.copySound && format.bHasAudio != 0)
        add(source.sound->index, kWriterTrackSound);
    return tracks;
}

/// What people wrote about a track beside its title: not what describes its pictures, or when a file was
/// made.
std::vector<Tag> TextsOf(const StreamInfo& stream, const Request& request) {
    constexpr std::array<std::string_view, 4> kOthers{"creation_time", "alpha_mode", "stereo_mode",
                                                      "language_tag"};
    std::vector<Tag> texts;
    if (!request.noMetadata)
        std::copy_if(stream.tags.begin(), stream.tags.end(), std::back_inserter(texts), [&](const Tag& tag) {
            return !tag.value.empty() && !IsTimecode(tag.key) &&
                   std::none_of(kOthers.begin(), kOthers.end(),
                                [&](std::string_view other) { return SameIgnoringCase(tag.key, other); });
        });
    return texts;
}

/// The stream's language by a code that the format can hold; empty when there is none.
std::string LanguageIn(const FileFormatInfo& format, const StreamInfo& stream) {
    const bool hasNone = stream.kind == StreamKind::kPictures && Has(format, kWriterFormatNoPictureLanguage);
    if (stream.language.empty() || hasNone)
        return {};
    for (const std::string& code : CodesFor(stream.language))
        if (MWCarriesTrackTag(format.fccFormat, "language", code.c_str()) != 0)
            return code;
    return {};
}

bool HasLength(const Chapter& chapter) {
    return Ticks(chapter.end) - Ticks(chapter.begin) >= kWriterShortestChapter;
}

/// How many chapters the writer did not take.
int AddChapters(const std::vector<Chapter>& chapters, uint32_t set) {
    int left = 0;
    for (const Chapter& chapter : chapters)
        if (HasLength(chapter) &&
            MWAddChapter(set, Ticks(chapter.begin), Ticks(chapter.end), chapter.title.c_str()) == 0)
            ++left;
    return left;
}

/// Seconds of the source, as far as that is known.
double EndOf(const SourceInfo& source) {
    return source.certainty == Certainty::kKnown ? source.duration : HUGE_VAL;
}

/// Those that lie in the one file that the request asks for, on its timeline.
std::vector<Chapter> ChaptersWithin(const SourceInfo& source, const Request& request) {
    const double end = std::min(request.length.value_or(HUGE_VAL), EndOf(source) - request.begin);
    std::vector<Chapter> within;
    for (Chapter chapter : source.chapters) {
        chapter.begin = std::max(chapter.begin - request.begin, 0.0);
        chapter.end = std::min(chapter.end - request.begin, end);
        if (chapter.begin < chapter.end)
            within.push_back(std::move(chapter));
    }
    return within;
}

/// AddChapters as texts.
int AddChapterTexts(const std::vector<Chapter>& chapters, uint32_t set) {
    constexpr int kMost = 999;
    int number = 0;
    int left = 0;
    for (const Chapter& chapter : chapters) {
        if (!HasLength(chapter))
            continue;
        if (number == kMost) {
            ++left;
            continue;
        }
        const auto milliseconds = std::llround(chapter.begin * 1000);
        const std::string key = fmt::format("CHAPTER{:03}", ++number);
        MWSetTag(set, key.c_str(),
                 fmt::format("{:02}:{:02}:{:02}.{:03}", milliseconds / 3'600'000, milliseconds / 60'000 % 60,
                             milliseconds / 1000 % 60, milliseconds % 1000)
                     .c_str());
        MWSetTag(set, (key + "NAME").c_str(), chapter.title.c_str());
    }
    return left;
}

} // namespace

void LabelTrack(const StreamInfo& stream, const Request& request, const FileFormatInfo& format, uint32_t set,
                int track) {
    if (const std::string code = LanguageIn(format, stream); !code.empty())
        MWSetTrackTag(set, track, "language", code.c_str());
    if (!stream.languageTag.empty())
        MWSetTrackTag(set, track, "language_tag", stream.languageTag.c_str());
    if (!request.noMetadata && !stream.title.empty())
        MWSetTrackTag(set, track, "title", stream.title.c_str());
    for (const Tag& tag : TextsOf(stream, request))
        if (MWCarriesTrackTag(format.fccFormat, tag.key.c_str(), tag.value.c_str()) != 0)
            MWSetTrackTag(set, track, tag.key.c_str(), tag.value.c_str());
    MWSetTrackFlags(set, track, Dispositions(stream.flags));
}

std::optional<NotCarried> LostLabel(const StreamInfo& stream, const Request& request,
                                    const FileFormatInfo& format) {
    std::vector<Sentence> missing;
    if (!stream.language.empty() && LanguageIn(format, stream).empty())
        missing.push_back(Say("language"));
    else if (!stream.languageTag.empty() &&
             MWCarriesTrackTag(format.fccFormat, "language_tag", stream.languageTag.c_str()) == 0)
        missing.push_back(Say("language as {}", stream.languageTag));
    if (!request.noMetadata && !stream.title.empty() &&
        MWCarriesTrackTag(format.fccFormat, "title", stream.title.c_str()) == 0)
        missing.push_back(Say("title"));
    const int carried = MWCarriedTrackFlags(format.fccFormat) | AV_DISPOSITION_DEFAULT;
    if ((Dispositions(stream.flags) & ~carried) != 0)
        missing.push_back(Say("flags"));
    for (const Tag& tag : TextsOf(stream, request))
        if (MWCarriesTrackTag(format.fccFormat, tag.key.c_str(), tag.value.c_str()) == 0)
            missing.emplace_back(tag.key);
    if (missing.empty())
        return std::nullopt;
    return NotCarried{"label", stream.index >= 0 ? std::optional(stream.index) : std::nullopt, stream.codec,
                      stream.language,
                      Say("{} cannot hold its {}", ShortName(format), SayList(std::move(missing)))};
}

void CarryTexts(const SourceInfo& source, const Request& request, const FileFormatInfo& format,
                uint32_t set) {
    for (const Tag& tag : TextsFor(source, request))
        MWSetTag(set, tag.key.c_str(), tag.value.c_str());
    for (const auto& [stream, track] : EnginesTracks(source, request, format))
        LabelTrack(*stream, request, format, set, track);
}

std::vector<NotCarried> LostTexts(const SourceInfo& source, const Request& request,
                                  const FileFormatInfo& format) {
    std::vector<NotCarried> left;
    std::vector<Sentence> missing;
    for (const Tag& tag : TextsFor(source, request))
        if (!tag.value.empty() && MWCarriesTag(format.fccFormat, tag.key.c_str(), tag.value.c_str()) == 0)
            missing.emplace_back(tag.key);
    if (!missing.empty())
        left.push_back({"tags",
                        std::nullopt,
                        {},
                        {},
                        Say("{} cannot hold {}", ShortName(format), SayList(std::move(missing)))});
    for (const auto& [stream, track] : EnginesTracks(source, request, format))
        if (std::optional<NotCarried> lost = LostLabel(*stream, request, format))
            left.push_back(std::move(*lost));
    return left;
}

int CarryChapters(const SourceInfo& source, const Request& request, const FileFormatInfo& format,
                  uint32_t set) {
    const std::vector<Chapter>& all = source.chapters;
    const auto wrong =
        std::count_if(all.begin(), all.end(), [](const Chapter& each) { return !HasLength(each); });
    const auto left = static_cast<int>(wrong);
    if (Has(format, kWriterFormatChapters))
        return left + AddChapters(all, set);
    const std::vector<Chapter> within = ChaptersWithin(source, request);
    return left +
           (Has(format, kWriterFormatChapterTexts) ? AddChapterTexts(within, set) : AddChapters(within, set));
}

int ChaptersOutside(const SourceInfo& source) {
    const double end = EndOf(source);
    return static_cast<int>(
        std::count_if(source.chapters.begin(), source.chapters.end(), [&](const Chapter& chapter) {
            return HasLength(chapter) && (chapter.end <= 0 || chapter.begin >= end);
        }));
}

Sentence FurtherChapterTexts(const SourceInfo& source) {
    std::vector<Sentence> names;
    for (const Chapter& chapter : source.chapters)
        for (const Tag& tag : chapter.tags)
            if (std::find(names.begin(), names.end(), Sentence(tag.key)) == names.end())
                names.emplace_back(tag.key);
    return SayList(std::move(names));
}

std::optional<NotCarried> WhyChaptersStay(const SourceInfo& source, const Request& request,
                                          const FileFormatInfo& format) {
    constexpr uint32_t kAny = kWriterFormatChapters | kWriterFormatChapterTexts | kWriterFormatEarlyChapters;
    if (Has(format, kAny) || source.chapters.empty() || request.noChapters)
        return std::nullopt;
    return NotCarried{"chapters", std::nullopt, {}, {}, Say("{} cannot hold them", ShortName(format))};
}

} // namespace movieconv
