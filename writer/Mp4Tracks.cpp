#include "writer/Mp4Tracks.h"

#include "ffmpeg/Mp4Box.h"
#include "writer/BigEndian.h"

#include <algorithm>
#include <array>
#include <cstddef>
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

} // namespace

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
