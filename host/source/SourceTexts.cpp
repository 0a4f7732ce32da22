#include "host/source/SourceTexts.h"

#include "host/source/Charset.h"
#include "host/source/Languages.h"
#include "host/source/StreamDescription.h"

#include <algorithm>
#include <cctype>
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

extern "C" {
#include <libavutil/avstring.h>
}

namespace movieconv {
namespace {

constexpr std::string_view kNoCodec = "none"; // what FFmpeg calls it

/// The text of that name, in any case, in `tags`, which may be constant.
template <class Tags>
auto FindTag(Tags& tags, const std::string& key) {
    return std::find_if(tags.begin(), tags.end(),
                        [&](const Tag& tag) { return av_strcasecmp(tag.key.c_str(), key.c_str()) == 0; });
}

const Tag* TextAt(const std::vector<Tag>& tags, const std::string& key) {
    const auto found = FindTag(tags, key);
    return found != tags.end() ? &*found : nullptr;
}

template <class Test>
void RemoveIf(std::vector<Tag>& tags, Test test) {
    tags.erase(std::remove_if(tags.begin(), tags.end(), test), tags.end());
}

/// Whether it is one of the comments that tell a chapter, CHAPTER001 and the like.
bool TellsAChapter(const std::string& key) {
    constexpr std::string_view kName = "CHAPTER";
    constexpr std::size_t kDigits = 3;
    return key.size() >= kName.size() + kDigits &&
           av_strncasecmp(key.c_str(), kName.data(), kName.size()) == 0 &&
           std::all_of(key.begin() + kName.size(), key.begin() + kName.size() + kDigits,
                       [](unsigned char letter) { return std::isdigit(letter) != 0; });
}

/// Ogg keeps the movie's texts with its streams: what the first one says is the movie's, what another one
/// says otherwise stays its own.
void TakeTextsOfStreams(SourceInfo& info) {
    const auto takes = [&](const Tag& tag) {
        const Tag* const known = TextAt(info.tags, tag.key);
        const bool isNew = known == nullptr && !TellsAChapter(tag.key);
        if (isNew)
            info.tags.push_back(tag);
        return known == nullptr || known->value == tag.value;
    };
    for (StreamInfo& stream : info.streams) {
        if (stream.kind == StreamKind::kCover || stream.kind == StreamKind::kAttachment)
            continue;
        if (!stream.title.empty() && takes({"title", stream.title}))
            stream.title.clear();
        RemoveIf(stream.tags, takes);
    }
}

/// AVI and WAV have the album as a product, and beside what people wrote the program that wrote the file.
void UseUsualNames(std::vector<Tag>& tags) {
    RemoveIf(tags, [](const Tag& tag) { return tag.key == "software"; });
    for (Tag& tag : tags)
        if (tag.key == "product" && TextAt(tags, "album") == nullptr)
            tag.key = "album";
}

/// FFmpeg gives a text that has a language twice, as "KEY-eng" too.
void DropCopies(std::vector<Tag>& tags) {
    constexpr std::size_t kSuffix = 4;
    const auto isCopy = [all = tags](const Tag& tag) {
        if (tag.key.size() <= kSuffix || tag.key[tag.key.size() - kSuffix] != '-')
            return false;
        const Tag* const plain = TextAt(all, tag.key.substr(0, tag.key.size() - kSuffix));
        return plain != nullptr && plain->value == tag.value;
    };
    RemoveIf(tags, isCopy);
}

/// Puts the text in the place of that of the same name, where there is one.
void ReplaceTag(std::vector<Tag>& tags, const std::string& key, const std::string& text) {
    const auto known = FindTag(tags, key);
    if (known != tags.end() && !text.empty())
        known->value = Decoded(text);
}

/// Of a chapter's titles the first one is what people gave it first.
void PreferFirstTitles(const std::vector<ContainerNotes::Titles>& titles, std::vector<Chapter>& chapters) {
    auto next = chapters.begin();
    for (const ContainerNotes::Titles& each : titles) {
        const auto found = std::find_if(next, chapters.end(), [&](const Chapter& chapter) {
            return chapter.title == Decoded(each.last);
        });
        if (found != chapters.end()) {
            found->title = Decoded(each.first);
            next = found + 1;
        }
    }
}

/// Gives attached files what is said of them, each to the first one of its name that has nothing yet.
void DescribeFiles(const std::vector<ContainerNotes::File>& files, std::vector<StreamInfo>& streams) {
    for (const ContainerNotes::File& file : files) {
        const auto stream = std::find_if(streams.begin(), streams.end(), [&](const StreamInfo& each) {
            return each.kind == StreamKind::kAttachment && each.title.empty() &&
                   each.fileName == Decoded(file.name);
        });
        if (stream != streams.end())
            stream->title = Decoded(file.description);
    }
}

} // namespace

void TakeNotes(const ContainerNotes& notes, SourceInfo& info) {
    for (std::size_t i = 0; i < info.streams.size(); ++i) {
        StreamInfo& stream = info.streams[i];
        const std::string& tag = notes.streams[i].languageTag;
        const std::string language = ThreeLetters(tag.substr(0, tag.find('-')));
        if (LanguageName(language) != language) // it is a known one
            stream.language = language != ThreeLetters(stream.language) ? language : stream.language;
        if (tag.find('-') != std::string::npos || language != ThreeLetters(stream.language))
            stream.languageTag = tag;
        if (stream.title.empty())
            stream.title = Decoded(notes.streams[i].title);
        if (notes.streams[i].codec != AV_CODEC_ID_NONE && stream.codec == kNoCodec)
            SetCodec(stream, notes.streams[i].codec);
    }
    for (const Tag& tag : notes.repeated)
        ReplaceTag(info.tags, tag.key, tag.value);
    ReplaceTag(info.tags, "title", notes.title);
    DescribeFiles(notes.files, info.streams);
    PreferFirstTitles(notes.titles, info.chapters);
    info.furtherTitles = static_cast<int>(notes.titles.size());
    const int unread = std::max(notes.chapters - static_cast<int>(info.chapters.size()), 0);
    info.disorderedChapters = std::min(notes.disordered, unread);
    info.unreadChapters = unread - info.disorderedChapters;
    info.chaptersOrder = notes.ordersParts;
    const auto own = std::remove_if(info.chapters.begin(), info.chapters.end(), [&](const Chapter& chapter) {
        return std::count(notes.foreign.begin(), notes.foreign.end(), static_cast<uint64_t>(chapter.number)) >
               0;
    });
    info.foreignChapters = static_cast<int>(info.chapters.end() - own);
    info.chapters.erase(own, info.chapters.end());
}

void PutTextsRight(std::string_view container, SourceInfo& info) {
    if (container == "ogg")
        TakeTextsOfStreams(info);
    if (container == "avi" || container == "wav")
        UseUsualNames(info.tags);
    DropCopies(info.tags);
    for (StreamInfo& stream : info.streams)
        DropCopies(stream.tags);
    for (Chapter& chapter : info.chapters)
        DropCopies(chapter.tags);
}

} // namespace movieconv
