#include "writer/Mp4Tracks.h"

#include "ffmpeg/Mp4Box.h"
#include "writer/BigEndian.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <initializer_list>
#include <optional>

namespace writer {
namespace {

constexpr int kHeadSize = 8; // of boxes below 4 GB

/// The head of the box between `begin` and `end`, which holds it whole; nothing where there is none.
std::optional<av::BoxHead> BoxAt(const uint8_t* begin, const uint8_t* end) {
    const auto head = av::ReadBoxHead(begin, static_cast<size_t>(end - begin));
    return head && head->headSize == kHeadSize && head->size != av::BoxHead::kOpen &&
                   head->size <= end - begin
               ? head
               : std::nullopt;
}

/// Calls `take` with the type of each box from `begin` to `end`, and where its content begins and ends.
template <class Take>
void ForEachBox(uint8_t* begin, uint8_t* end, Take take) {
    while (const auto head = BoxAt(begin, end)) {
        take(head->type, begin + kHeadSize, begin + head->size);
        begin += head->size;
    }
}

void SetSize(uint8_t* box, size_t size) {
    for (int i = 0; i < 4; ++i)
        box[i] = static_cast<uint8_t>(size >> (24 - 8 * i));
}

void SetLanguage(uint8_t* begin, const uint8_t* end, const std::string& language) {
    const bool isCode =
        language.size() == 3 && std::all_of(language.begin(), language.end(),
                                            [](char letter) { return letter >= 'a' && letter <= 'z'; });
    const std::ptrdiff_t place = begin < end && begin[0] == 1 ? 32 : 20; // behind times of 8 or 4 bytes
    if (!isCode || end - begin < place + 2)
        return;
    unsigned packed = 0; // five bits a letter
    for (const char letter : language)
        packed = packed << 5 | static_cast<unsigned>(letter - 'a' + 1);
    begin[place] = static_cast<uint8_t>(packed >> 8);
    begin[place + 1] = static_cast<uint8_t>(packed & 0xFF);
}

/// The extended language, a box of its own.
std::vector<uint8_t> LanguageBox(const std::string& tag) {
    constexpr std::array<uint8_t, 8> kNameAndVersion{'e', 'l', 'n', 'g', 0, 0, 0, 0};
    std::vector<uint8_t> box(4);
    box.insert(box.end(), kNameAndVersion.begin(), kNameAndVersion.end());
    box.insert(box.end(), tag.begin(), tag.end());
    box.push_back(0);
    SetSize(box.data(), box.size());
    return box;
}

/// Corrects what is there. Returns where the extended language comes: behind the media header; null where
/// there is none.
uint8_t* Correct(uint8_t* begin, uint8_t* end, const Mp4Track& track, uint8_t*& media) {
    constexpr uint8_t kEnabled = 1; // in the last of the flags, which follow the version
    uint8_t* place = nullptr;
    ForEachBox(begin, end, [&](uint32_t type, uint8_t* content, uint8_t* contentEnd) {
        if (type == av::BoxType("tkhd") && contentEnd - content >= 4 && track.hides)
            content[3] = static_cast<uint8_t>(content[3] & ~kEnabled);
        if (type != av::BoxType("mdia"))
            return;
        media = content - kHeadSize;
        ForEachBox(content, contentEnd, [&](uint32_t inner, uint8_t* head, uint8_t* headEnd) {
            if (inner != av::BoxType("mdhd"))
                return;
            SetLanguage(head, headEnd, track.language);
            place = headEnd;
        });
    });
    return place;
}

/// The track that begins at `at`. Returns by how much it became longer.
size_t CorrectTrack(std::vector<uint8_t>& moov, size_t at, size_t size, const Mp4Track& track) {
    uint8_t* media = nullptr;
    uint8_t* const place = Correct(&moov[at + kHeadSize], moov.data() + at + size, track, media);
    if (place == nullptr || track.languageTag.empty())
        return 0;
    const std::vector<uint8_t> box = LanguageBox(track.languageTag);
    for (uint8_t* holder : {moov.data(), &moov[at], media})
        SetSize(holder, static_cast<size_t>(BigEndian(holder, 4)) + box.size());
    moov.insert(moov.begin() + (place - moov.data()), box.begin(), box.end());
    return box.size();
}

/// Where the boxes begin that hold each other: `moov`, the track at `at`, and in it those of these names.
/// Empty where one is missing.
std::vector<size_t> WayTo(std::vector<uint8_t>& moov, size_t at, std::initializer_list<uint32_t> names) {
    std::vector<size_t> way{0, at};
    for (const uint32_t name : names) {
        uint8_t* const holder = moov.data() + way.back();
        size_t place = 0;
        ForEachBox(holder + kHeadSize, holder + BigEndian(holder, 4),
                   [&](uint32_t type, const uint8_t* content, const uint8_t* /*end*/) {
                       if (type == name && place == 0)
                           place = static_cast<size_t>(content - moov.data()) - kHeadSize;
                   });
        if (place == 0)
            return {};
        way.push_back(place);
    }
    return way;
}

/// The numbers of 32 bits of which the last box of a way consists.
std::vector<uint32_t> WordsOf(const std::vector<uint8_t>& moov, const std::vector<size_t>& way) {
    std::vector<uint32_t> words;
    if (!way.empty())
        for (size_t at = kHeadSize; at + 4 <= BigEndian(&moov[way.back()], 4); at += 4)
            words.push_back(static_cast<uint32_t>(BigEndian(&moov[way.back() + at], 4)));
    return words;
}

/// Where the box is of the version that has its times in 32 bits.
void SetWord(std::vector<uint8_t>& moov, const std::vector<size_t>& way, size_t number, uint32_t word) {
    const size_t at = way.empty() ? 0 : kHeadSize + 4 * number;
    if (at != 0 && at + 4 <= BigEndian(&moov[way.back()], 4) && moov[way.back() + kHeadSize] == 0)
        SetSize(&moov[way.back() + at], word);
}

void SetWords(std::vector<uint8_t>& moov, const std::vector<size_t>& way,
              const std::vector<uint32_t>& words) {
    const size_t before = BigEndian(&moov[way.back()], 4);
    const size_t after = kHeadSize + 4 * words.size();
    const auto end = moov.begin() + static_cast<std::ptrdiff_t>(way.back() + before);
    if (after > before)
        moov.insert(end, after - before, 0);
    else
        moov.erase(end - static_cast<std::ptrdiff_t>(before - after), end);
    for (const size_t box : way)
        SetSize(&moov[box], BigEndian(&moov[box], 4) + after - before);
    for (size_t i = 0; i < words.size(); ++i)
        SetSize(&moov[way.back() + kHeadSize + 4 * i], words[i]);
}

constexpr size_t kRuns = 2; // of equal lengths, behind a version and their number

/// The first sample lasts from 0 on. The last one gets what that is too long, behind the end of what is
/// shown: some readers take the sum of all for the end of the last chapter.
std::vector<uint32_t> LengthsFrom(uint32_t begin, const std::vector<uint32_t>& words) {
    std::vector<uint32_t> lengths;
    for (size_t i = kRuns; i + 1 < words.size(); i += 2)
        lengths.insert(lengths.end(), words[i], words[i + 1]);
    if (lengths.empty() || lengths.front() < begin)
        return {};
    if (lengths.size() > 1) {
        lengths.front() -= begin;
        lengths.back() += begin;
    }
    std::vector<uint32_t> made{words[0], 0};
    for (const uint32_t length : lengths) {
        if (made[1] != 0 && made.back() == length) {
            ++made[made.size() - 2];
        } else {
            made.insert(made.end(), {1, length});
            ++made[1];
        }
    }
    return made;
}

bool IsOfTexts(std::vector<uint8_t>& moov, size_t track) {
    constexpr size_t kType = 2; // behind the version and a reserved number
    const std::vector<uint32_t> handler =
        WordsOf(moov, WayTo(moov, track, {av::BoxType("mdia"), av::BoxType("hdlr")}));
    return handler.size() > kType && handler[kType] == av::BoxType("text");
}

/// An edit list shows nothing first, and then the samples.
void DelayTrack(std::vector<uint8_t>& moov, size_t at, uint32_t begin) {
    constexpr uint32_t kNothing = 0xFFFFFFFF;
    constexpr uint32_t kNormalRate = 0x10000;
    const std::vector<size_t> list = WayTo(moov, at, {av::BoxType("edts"), av::BoxType("elst")});
    const std::vector<uint32_t> edit = WordsOf(moov, list);
    if (edit.size() != 5 || edit[0] != 0 || edit[1] != 1 || edit[3] != 0) // version, count, ..., begin
        return;
    const auto lengths = [&] {
        return WayTo(moov, at,
                     {av::BoxType("mdia"), av::BoxType("minf"), av::BoxType("stbl"), av::BoxType("stts")});
    };
    const std::vector<uint32_t> made = LengthsFrom(begin, WordsOf(moov, lengths()));
    uint32_t end = 0;
    for (size_t i = kRuns; i + 1 < made.size(); i += 2)
        end += made[i] * made[i + 1];
    if (end <= begin) // they make no sense
        return;
    SetWords(moov, list, {0, 2, begin, kNothing, kNormalRate, end - begin, 0, kNormalRate});
    SetWord(moov, WayTo(moov, at, {av::BoxType("tkhd")}), 5, end);
    SetWord(moov, WayTo(moov, at, {av::BoxType("mdia"), av::BoxType("mdhd")}), 4, end);
    SetWords(moov, lengths(), made);
}

} // namespace

void DelayChapters(std::vector<uint8_t>& moov, size_t tracks, uint32_t begin) {
    size_t number = 0;
    size_t found = 0;
    ForEachBox(moov.data() + kHeadSize, moov.data() + moov.size(),
               [&](uint32_t type, const uint8_t* content, const uint8_t* /*end*/) {
                   const size_t at = static_cast<size_t>(content - moov.data()) - kHeadSize;
                   if (type == av::BoxType("trak") && ++number > tracks && found == 0 && IsOfTexts(moov, at))
                       found = at;
               });
    if (found != 0)
        DelayTrack(moov, found, begin);
}

void CorrectTracks(std::vector<uint8_t>& moov, const std::vector<Mp4Track>& tracks) {
    size_t at = kHeadSize;
    for (size_t next = 0; next < tracks.size() && at < moov.size();) {
        const auto head = BoxAt(&moov[at], moov.data() + moov.size());
        if (!head)
            return;
        const auto size = static_cast<size_t>(head->size);
        const size_t added =
            head->type == av::BoxType("trak") ? CorrectTrack(moov, at, size, tracks[next++]) : 0;
        at += size + added;
    }
}

} // namespace writer
