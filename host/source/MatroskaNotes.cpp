#include "host/source/ContainerNotes.h"

#include "host/source/Languages.h"
#include "host/source/MatroskaSegment.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <map>
#include <utility>

namespace movieconv {
namespace {

constexpr uint64_t kTitle = 0x7BA9;
constexpr uint64_t kTrackLanguage = 0x22B59D;
constexpr uint64_t kTrackCodec = 0x86;
constexpr uint64_t kChapters = 0x1043A770;
constexpr uint64_t kEdition = 0x45B9;
constexpr uint64_t kEditionDefault = 0x45DB;
constexpr uint64_t kEditionOrdered = 0x45DD;
constexpr uint64_t kChapter = 0xB6;
constexpr uint64_t kChapterNumber = 0x73C4;
constexpr uint64_t kChapterFile = 0x6E67;
constexpr uint64_t kChapterBegin = 0x91;
constexpr uint64_t kChapterDisplay = 0x80;
constexpr uint64_t kChapterTitle = 0x85;
constexpr uint64_t kAttachments = 0x1941A469;
constexpr uint64_t kFile = 0x61A7;
constexpr uint64_t kFileName = 0x466E;
constexpr uint64_t kFileDescription = 0x467E;
constexpr uint64_t kTags = 0x1254C367;
constexpr uint64_t kTag = 0x7373;
constexpr uint64_t kTargets = 0x63C0;
constexpr uint64_t kTargetType = 0x63CA;
constexpr std::array<uint64_t, 4> kTargetsWithin{0x63C5, 0x63C9, 0x63C4, 0x63C6}; // of the movie
constexpr uint64_t kSimpleTag = 0x67C8;
constexpr uint64_t kTagName = 0x45A3;
constexpr uint64_t kTagText = 0x4487;
constexpr uint64_t kTagLanguage = 0x447A;

constexpr int64_t kLongestLanguage = 36; // with its end
constexpr int64_t kLongestName = 4096;   // also of titles
constexpr int64_t kLongestText = 1 << 20;

/// The codecs whose names FFmpeg does not read.
AVCodecID CodecNamed(const std::string& name) {
    return name == "S_TEXT/WEBVTT" ? AV_CODEC_ID_WEBVTT : AV_CODEC_ID_NONE;
}

/// What one file tells.
class MatroskaReader {
public:
    explicit MatroskaReader(const InputFile& file) : segment_(file), elements_(segment_.Elements()) {}

    ContainerNotes Read() {
        notes_.title = Text(segment_.Locate(kMatroskaInfo), kTitle, kLongestName);
        ReadTracks();
        ReadEditions();
        segment_.ForEach(segment_.Locate(kAttachments), kFile, [this](const Part& file) {
            if (std::string description = Text(file, kFileDescription, kLongestText); !description.empty())
                notes_.files.push_back({Text(file, kFileName, kLongestName), std::move(description)});
        });
        ReadTags();
        return std::move(notes_);
    }

private:
    std::string Text(const Part& whole, uint64_t name, int64_t most) {
        return elements_.Text(elements_.Find(whole, name), 0, most);
    }

    void ReadTracks() {
        segment_.ForEachTrack([this](const Part& track) {
            notes_.streams.push_back({LanguageTagFrom(Text(track, kTrackLanguage, kLongestLanguage)),
                                      {},
                                      CodecNamed(Text(track, kTrackCodec, kLongestName))});
        });
    }

    /// Players follow the one that is marked, or else the first.
    void ReadEditions() {
        bool isMarked = false;
        segment_.ForEach(segment_.Locate(kChapters), kEdition, [&](const Part& edition) {
            const bool isFirst = notes_.chapters == 0;
            const bool marks = elements_.Number(elements_.Find(edition, kEditionDefault)) != 0;
            if (isFirst)
                CountDisordered(edition);
            if (isFirst || (marks && !isMarked))
                notes_.ordersParts = elements_.Number(elements_.Find(edition, kEditionOrdered)) != 0;
            isMarked = isMarked || marks;
            ReadChapters(edition, 0);
        });
    }

    /// Those in `whole`, an edition or a chapter.
    void ReadChapters(const Part& whole, int depth) {
        constexpr int kDeepest = 8;
        if (depth == kDeepest)
            return;
        segment_.ForEach(whole, kChapter, [&](const Part& chapter) {
            ++notes_.chapters;
            if (depth == 0)
                ReadTitles(chapter);
            if (elements_.Find(chapter, kChapterFile).name == kChapterFile)
                notes_.foreign.push_back(elements_.Number(elements_.Find(chapter, kChapterNumber)));
            ReadChapters(chapter, depth + 1);
        });
    }

    /// FFmpeg leaves out what does not begin behind all it has read.
    void CountDisordered(const Part& edition) {
        uint64_t latest = 0;
        segment_.ForEach(edition, kChapter, [&](const Part& chapter) {
            const uint64_t begin = elements_.Number(elements_.Find(chapter, kChapterBegin));
            notes_.disordered += latest != 0 && begin <= latest ? 1 : 0;
            latest = std::max(latest, begin);
        });
    }

    void ReadTitles(const Part& chapter) {
        std::vector<std::string> titles;
        segment_.ForEach(chapter, kChapterDisplay, [&](const Part& display) {
            std::string title = Text(display, kChapterTitle, kLongestName);
            if (!title.empty() && std::find(titles.begin(), titles.end(), title) == titles.end())
                titles.push_back(std::move(title));
        });
        if (titles.size() > 1)
            notes_.titles.push_back({titles.front(), titles.back()});
    }

    /// Of the texts about the movie, those that come again under a key that FFmpeg has for one of them.
    void ReadTags() {
        std::map<std::string, std::vector<std::string>> texts;
        segment_.ForEach(segment_.Locate(kTags), kTag, [&](const Part& tag) {
            const Part targets = elements_.Find(tag, kTargets);
            const bool isOfAPart =
                std::any_of(kTargetsWithin.begin(), kTargetsWithin.end(), [&](uint64_t target) {
                    return elements_.Number(elements_.Find(targets, target)) != 0;
                });
            const std::string type = Text(targets, kTargetType, kLongestName);
            if (!isOfAPart)
                segment_.ForEach(tag, kSimpleTag, [&](const Part& simple) {
                    std::vector<std::string>& known = texts[KeyOf(simple, type)];
                    std::string text = Text(simple, kTagText, kLongestText);
                    if (!text.empty() && std::find(known.begin(), known.end(), text) == known.end())
                        known.push_back(std::move(text));
                });
        });
        for (const auto& [key, all] : texts) {
            if (all.size() < 2)
                continue;
            Tag tag{key, all.front()};
            for (std::size_t i = 1; i < all.size(); ++i)
                tag.value += ";" + all[i]; // as FFmpeg joins Vorbis comments
            notes_.repeated.push_back(std::move(tag));
        }
    }

    /// "ARTIST", "ALBUM/ARTIST" where the tag tells what it is about, "ARTIST-fre" where it has a language.
    std::string KeyOf(const Part& simple, const std::string& type) {
        const std::string name = Text(simple, kTagName, kLongestName);
        const std::string language = Text(simple, kTagLanguage, kLongestLanguage);
        return (type.empty() ? name : type + "/" + name) +
               (language.empty() || language == "und" ? "" : "-" + language);
    }

    MatroskaSegment segment_;
    Parts& elements_;
    ContainerNotes notes_;
};

} // namespace

ContainerNotes ReadMatroskaNotes(const InputFile& file) {
    return MatroskaReader(file).Read();
}

} // namespace movieconv
