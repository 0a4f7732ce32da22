#include "host/source/LanguageTags.h"

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
int ReadNumber(const uint8_t* bytes, int most, bool keepMark, uint64_t& number) {
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
    const int nameLength = ReadNumber(head.data(), 4, true, part.name);
    const int sizeLength = nameLength > 0 ? ReadNumber(head.data() + nameLength, 8, false, size) : 0;
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

    /// What is in a part, but for `skip` bytes; empty when it is no tag.
    std::string Tag(const Part& part, int64_t skip) const {
        std::array<char, 36> text{}; // a tag has 35 characters at most
        const auto size = std::min<int64_t>(part.end - part.begin - skip, text.size() - 1);
        if (size <= 0 || file_.ReadAt(part.begin + skip, reinterpret_cast<uint8_t*>(text.data()),
                                      static_cast<std::size_t>(size)) != size)
            return {};
        std::string tag(text.data());
        const bool isTag = std::all_of(tag.begin(), tag.end(), [](unsigned char letter) {
            return letter == '-' || (letter < 0x80 && std::isalnum(letter) != 0);
        });
        return isTag && tag != "und" ? tag : std::string();
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

std::vector<std::string> OfMp4(const InputFile& file) {
    std::vector<std::string> tags;
    Parts boxes(file, ReadBox);
    boxes.ForEach(boxes.Find(boxes.Whole(), BoxName("moov")), [&](const Part& track) {
        if (track.name != BoxName("trak"))
            return true;
        constexpr int64_t kVersionAndFlags = 4;
        const Part media = boxes.Find(track, BoxName("mdia"));
        tags.push_back(boxes.Tag(boxes.Find(media, BoxName("elng")), kVersionAndFlags));
        return true;
    });
    return tags;
}

std::vector<std::string> OfMatroska(const InputFile& file) {
    constexpr uint64_t kSegment = 0x18538067;
    constexpr uint64_t kCluster = 0x1F43B675;
    constexpr uint64_t kTracks = 0x1654AE6B;
    constexpr uint64_t kTrack = 0xAE;
    constexpr uint64_t kType = 0x83;
    constexpr uint64_t kLanguage = 0x22B59D;
    constexpr std::array kTypes{1, 2, 0x11, 0x21}; // of those that become streams
    std::vector<std::string> tags;
    Parts elements(file, ReadElement);
    const Part segment = elements.Find(elements.Whole(), kSegment);
    elements.ForEach(elements.Find(segment, kTracks, kCluster), [&](const Part& track) {
        const int type = track.name == kTrack ? elements.Number(elements.Find(track, kType)) : 0;
        if (std::find(kTypes.begin(), kTypes.end(), type) != kTypes.end())
            tags.push_back(elements.Tag(elements.Find(track, kLanguage), 0));
        return true;
    });
    return tags;
}

} // namespace

std::vector<std::string> ReadLanguageTags(const InputFile& file, const AVFormatContext& context) {
    std::vector<std::string> tags;
    if (av_match_name("matroska", context.iformat->name) != 0)
        tags = OfMatroska(file);
    else if (av_match_name("mov", context.iformat->name) != 0)
        tags = OfMp4(file);
    if (tags.size() > context.nb_streams) // streams and tracks do not belong to each other
        tags.clear();
    tags.resize(context.nb_streams); // covers and attached files follow the tracks
    return tags;
}

} // namespace movieconv
