#include "writer/Mp4Tracks.h"

#include "writer/BigEndian.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstring>

namespace writer {
namespace {

constexpr size_t kHeadSize = 8;

/// Calls `take` with the type of each box from `begin` to `end`, and where its content begins and ends.
template <class Take>
void ForEachBox(uint8_t* begin, uint8_t* end, Take take) {
    while (static_cast<size_t>(end - begin) >= kHeadSize) {
        const auto size = static_cast<size_t>(BigEndian(begin, 4));
        if (size < kHeadSize || size > static_cast<size_t>(end - begin))
            return;
        take(reinterpret_cast<const char*>(begin + 4), begin + kHeadSize, begin + size);
        begin += size;
    }
}

bool Is(const char* type, const char* name) {
    return std::memcmp(type, name, 4) == 0;
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
    ForEachBox(begin, end, [&](const char* type, uint8_t* content, uint8_t* contentEnd) {
        if (Is(type, "tkhd") && contentEnd - content >= 4 && track.hides)
            content[3] = static_cast<uint8_t>(content[3] & ~kEnabled);
        if (!Is(type, "mdia"))
            return;
        media = content - kHeadSize;
        ForEachBox(content, contentEnd, [&](const char* inner, uint8_t* head, uint8_t* headEnd) {
            if (!Is(inner, "mdhd"))
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
    if (moov.size() < kHeadSize)
        return;
    size_t at = kHeadSize;
    for (size_t next = 0; next < tracks.size() && at + kHeadSize <= moov.size();) {
        const auto size = static_cast<size_t>(BigEndian(&moov[at], 4));
        if (size < kHeadSize || size > moov.size() - at)
            return;
        size_t added = 0;
        if (Is(reinterpret_cast<const char*>(&moov[at + 4]), "trak"))
            added = CorrectTrack(moov, at, size, tracks[next++]);
        at += size + added;
    }
}

} // namespace writer
