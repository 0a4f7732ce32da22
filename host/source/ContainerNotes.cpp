#include "host/source/ContainerNotes.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <cstdint>
#include <functional>
#include <string_view>
#include <utility>

extern "C" {
#include <libavutil/avstring.h>
#include <libavutil/intreadwrite.h>
}

namespace movieconv {
namespace {

/// A box of MP4 or an element of Matroska: what is between `begin` and `end` of the file.
struct Part {
    uint64_t name = 0;
    int64_t begin = 0;
    int64_t end = 0;
};

/// Reads the head of the part at `at`, which ends at `end` at the latest. False when there is none.
using ReadPart = bool (*)(const InputFile& file, int64_t at, int64_t end, Part& part);

/// Boxes and elements that are looked at in a file. No real one has more before its tracks end.
constexpr int kMostParts = 100'000;

bool ReadBox(const InputFile& file, int64_t at, int64_t end, Part& part) {
    std::array<uint8_t, 16> head{};
    const int count = file.ReadAt(at, head.data(), head.size());
    if (count < 8)
        return false;
    const bool isLong = AV_RB32(head.data()) == 1 && count == 16;
    const int64_t headSize = isLong ? 16 : 8;
    const int64_t size = isLong ? static_cast<int64_t>(AV_RB64(head.data() + 8)) : AV_RB32(head.data());
    if (size < headSize || size > end - at)
        return false;
    part = {AV_RB32(head.data() + 4), at + headSize, at + size};
    return true;
}

/// A number of 1 to 8 bytes, of which the zeros in front tell how many. Its bytes; 0 when it makes no sense.
int ReadMarked(const uint8_t* bytes, int most, bool keepMark, uint64_t& number) {
    int length = 1;
    while (length <= most && (bytes[0] & (0x80 >> (length - 1))) == 0)
        ++length;
    if (length > most)
        return 0;
    number = keepMark ? bytes[0] : static_cast<uint64_t>(bytes[0] & (0x7F >> (length - 1)));
    for (int i = 1; i < length; ++i)
        number = number << 8 | bytes[i];
    return length;
}

bool ReadElement(const InputFile& file, int64_t at, int64_t end, Part& part) {
    std::array<uint8_t, 12> head{}; // what is not read stays 0
    if (file.ReadAt(at, head.data(), head.size()) < 2)
        return false;
    uint64_t size = 0;
    const int nameLength = ReadMarked(head.data(), 4, true, part.name);
    const int sizeLength = nameLength > 0 ? ReadMarked(head.data() + nameLength, 8, false, size) : 0;
    if (sizeLength == 0)
        return false;
    part.begin = at + nameLength + sizeLength;
    const bool isOpen = size == (uint64_t{1} << (7 * sizeLength)) - 1;
    if (part.begin > end || (!isOpen && size > static_cast<uint64_t>(end - part.begin)))
        return false;
    part.end = isOpen ? end : part.begin + static_cast<int64_t>(size);
    return true;
}

class Parts {
public:
    Parts(const InputFile& file, ReadPart read) : file_(file), read_(read) {}

    Part Whole() const { return {0, 0, file_.Size()}; }

    /// Calls `take` with each part of `whole`, until it returns false.
    void ForEach(const Part& whole, const std::function<bool(const Part&)>& take) {
        Part part;
        for (int64_t at = whole.begin; at < whole.end && left_-- > 0 && read_(file_, at, whole.end, part);
             at = part.end)
            if (!take(part))
                return;
    }

    /// The first one of that name that comes before one of the name `last`; an empty one without it.
    Part Find(const Part& whole, uint64_t name, uint64_t last = 0) {
        Part found;
        ForEach(whole, [&](const Part& part) {
            if (part.name == name)
                found = part;
            return part.name != name && part.name != last;
        });
        return found;
    }

    /// What is in a part, but for `skip` bytes; empty when there is more than `most`.
    std::string Text(const Part& part, int64_t skip, int64_t most) const {
        const int64_t size = part.end - part.begin - skip;
        if (size <= 0 || size > most)
            return {};
        std::string text(static_cast<std::size_t>(size), '\0');
        if (file_.ReadAt(part.begin + skip, reinterpret_cast<uint8_t*>(text.data()), text.size()) != size)
            return {};
        return text.substr(0, text.find('\0'));
    }

    int Number(const Part& part) const {
        uint8_t byte = 0;
        return part.end - part.begin == 1 && file_.ReadAt(part.begin, &byte, 1) == 1 ? byte : 0;
    }

private:
    const InputFile& file_;
    const ReadPart read_;
    int left_ = kMostParts;
};

constexpr uint64_t BoxName(std::string_view name) {
    uint64_t number = 0;
    for (const char letter : name)
        number = number << 8 | static_cast<unsigned char>(letter);
    return number;
}

constexpr int64_t kLongestTag = 36; // with its end
constexpr int64_t kLongestTitle = 4096;

/// Empty for what is no language.
std::string TagFrom(const std::string& text) {
    const bool isTag = std::all_of(text.begin(), text.end(), [](unsigned char letter) {
        return letter == '-' || (letter < 0x80 && std::isalnum(letter) != 0);
    });
    return isTag && text != "und" ? text : std::string();
}

ContainerNotes OfMp4(const InputFile& file) {
    constexpr int64_t kVersionAndFlags = 4;
    ContainerNotes notes;
    Parts boxes(file, ReadBox);
    boxes.ForEach(boxes.Find(boxes.Whole(), BoxName("moov")), [&](const Part& track) {
        if (track.name != BoxName("trak"))
            return true;
        const Part language = boxes.Find(boxes.Find(track, BoxName("mdia")), BoxName("elng"));
        const Part title = boxes.Find(boxes.Find(track, BoxName("udta")), BoxName("name"));
        notes.streams.push_back(
            {TagFrom(boxes.Text(language, kVersionAndFlags, kLongestTag + kVersionAndFlags)),
             boxes.Text(title, 0, kLongestTitle)});
        return true;
    });
    return notes;
}

/// Those in `whole`, an edition or a chapter.
int CountChapters(Parts& elements, const Part& whole, int depth) {
    constexpr uint64_t kChapter = 0xB6;
    constexpr int kDeepest = 8;
    int count = 0;
    if (depth < kDeepest)
        elements.ForEach(whole, [&](const Part& part) {
            count += part.name == kChapter ? 1 + CountChapters(elements, part, depth + 1) : 0;
            return true;
        });
    return count;
}

/// What stands in front of the packets.
ContainerNotes OfMatroska(const InputFile& file) {
    constexpr uint64_t kSegment = 0x18538067;
    constexpr uint64_t kCluster = 0x1F43B675;
    constexpr uint64_t kInfo = 0x1549A966;
    constexpr uint64_t kTitle = 0x7BA9;
    constexpr uint64_t kTracks = 0x1654AE6B;
    constexpr uint64_t kTrack = 0xAE;
    constexpr uint64_t kType = 0x83;
    constexpr uint64_t kLanguage = 0x22B59D;
    constexpr uint64_t kChapters = 0x1043A770;
    constexpr uint64_t kEdition = 0x45B9;
    constexpr std::array kTypes{1, 2, 0x11, 0x21}; // of those that become streams
    ContainerNotes notes;
    Parts elements(file, ReadElement);
    const Part segment = elements.Find(elements.Whole(), kSegment);
    notes.title =
        elements.Text(elements.Find(elements.Find(segment, kInfo, kCluster), kTitle), 0, kLongestTitle);
    elements.ForEach(elements.Find(segment, kTracks, kCluster), [&](const Part& track) {
        const int type = track.name == kTrack ? elements.Number(elements.Find(track, kType)) : 0;
        if (std::find(kTypes.begin(), kTypes.end(), type) != kTypes.end())
            notes.streams.push_back(
                {TagFrom(elements.Text(elements.Find(track, kLanguage), 0, kLongestTag)), {}});
        return true;
    });
    elements.ForEach(elements.Find(segment, kChapters, kCluster), [&](const Part& edition) {
        notes.chapters += edition.name == kEdition ? CountChapters(elements, edition, 0) : 0;
        return true;
    });
    return notes;
}

} // namespace

ContainerNotes ReadContainerNotes(const InputFile& file, const AVFormatContext& context) {
    ContainerNotes notes;
    if (av_match_name("matroska", context.iformat->name) != 0)
        notes = OfMatroska(file);
    else if (av_match_name("mov", context.iformat->name) != 0)
        notes = OfMp4(file);
    if (notes.streams.size() > context.nb_streams) // streams and tracks do not belong to each other
        notes.streams.clear();
    notes.streams.resize(context.nb_streams); // covers and attached files follow the tracks
    return notes;
}

} // namespace movieconv
