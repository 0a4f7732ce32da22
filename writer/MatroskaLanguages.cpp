#include "writer/MatroskaLanguages.h"

#include "writer/BigEndian.h"

extern "C" {
#include <libavutil/crc.h>
}

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdio>
#include <cstring>

namespace writer {
namespace {

constexpr std::array<uint8_t, 3> kLanguage{0x22, 0xB5, 0x9C};
constexpr std::array<uint8_t, 3> kLanguageTag{0x22, 0xB5, 0x9D};
constexpr size_t kFrame = 4; // bytes of an element that are not its text

std::string LanguageOf(const TrackLabel& label) {
    const std::string language = label.Text("language");
    return language.empty() ? "und" : language;
}

std::string Element(const std::array<uint8_t, 3>& name, const std::string& text) {
    return std::string(name.begin(), name.end()) + static_cast<char>(0x80 | text.size()) + text;
}

struct Range {
    size_t begin = 0;
    size_t end = 0;
};

/// The length of a number, of which the zeros in front tell; 0 when it is not whole.
size_t LengthAt(const std::string& head, size_t at) {
    size_t length = 1;
    while (length <= 8 && at < head.size() && (static_cast<uint8_t>(head[at]) & (0x80 >> (length - 1))) == 0)
        ++length;
    return length <= 8 && at + length <= head.size() ? length : 0;
}

/// The content of the tracks, which come before all packets. An empty range when they are not whole.
Range FindTracks(const std::string& head) {
    constexpr uint64_t kSegment = 0x18538067;
    constexpr uint64_t kTracks = 0x1654AE6B;
    const auto* bytes = reinterpret_cast<const uint8_t*>(head.data());
    for (size_t at = 0;;) {
        const size_t nameLength = LengthAt(head, at);
        const size_t length = nameLength > 0 ? LengthAt(head, at + nameLength) : 0;
        if (length == 0)
            return {};
        const uint64_t name = BigEndian(bytes + at, nameLength);
        const size_t begin = at + nameLength + length;
        const uint64_t mask = (uint64_t{1} << (7 * length)) - 1;
        const uint64_t size = BigEndian(bytes + at + nameLength, length) & mask;
        at = begin;
        if (name == kSegment)
            continue; // the tracks are in it
        if (size > head.size() - begin)
            return {};
        if (name == kTracks)
            return {begin, begin + static_cast<size_t>(size)};
        at += static_cast<size_t>(size);
    }
}

/// The check sum in front of the content is that of all that follows it.
void Renew(std::string& content) {
    constexpr size_t kSumSize = 6;
    if (content.size() < kSumSize || content[0] != static_cast<char>(0xBF) ||
        content[1] != static_cast<char>(0x84))
        return;
    const auto* bytes = reinterpret_cast<const uint8_t*>(content.data());
    const uint32_t sum =
        ~av_crc(av_crc_get_table(AV_CRC_32_IEEE_LE), UINT32_MAX, bytes + kSumSize, content.size() - kSumSize);
    for (size_t i = 0; i < 4; ++i)
        content[2 + i] = static_cast<char>(sum >> (8 * i) & 0xFF);
}

int64_t ReadHead(ByteFile& file, std::string& head) {
    int64_t got = file.Seek(0, SEEK_SET);
    size_t done = 0;
    while (got >= 0 && done < head.size()) {
        got = file.Read(reinterpret_cast<uint8_t*>(&head[done]), static_cast<int64_t>(head.size() - done));
        if (got <= 0)
            break;
        done += static_cast<size_t>(got);
    }
    head.resize(done);
    return got;
}

int64_t WriteBack(ByteFile& file, size_t at, const std::string& content) {
    int64_t result = file.Seek(static_cast<int64_t>(at), SEEK_SET);
    for (size_t done = 0; result >= 0 && done < content.size();) {
        result = file.Write(reinterpret_cast<const uint8_t*>(&content[done]),
                            static_cast<int64_t>(content.size() - done));
        if (result == 0)
            return -EIO;
        done += result > 0 ? static_cast<size_t>(result) : 0;
    }
    return result;
}

} // namespace

std::string LanguagePlace(const TrackLabel& label) {
    const std::string language = LanguageOf(label);
    const std::string tag = label.Text("language_tag");
    std::string place = language + "/" + tag;
    place.resize(language.size() + tag.size() + kFrame, '/');
    return place;
}

int PutLanguageTags(ByteFile& file, const std::vector<const TrackLabel*>& labels) {
    constexpr int64_t kMostHead = 8 << 20; // tracks bring headers of their codecs
    const int64_t position = file.Seek(0, SEEK_CUR);
    const int64_t size = file.Seek(0, SEEK_END);
    if (position < 0 || size < 0)
        return EIO;
    std::string head(static_cast<size_t>(std::min(kMostHead, size)), '\0');
    int64_t result = ReadHead(file, head);
    const Range tracks = FindTracks(head);
    if (result >= 0 && tracks.end > tracks.begin) {
        std::string content = head.substr(tracks.begin, tracks.end - tracks.begin);
        for (const TrackLabel* label : labels) {
            const std::string place = Element(kLanguage, LanguagePlace(*label));
            const std::string both =
                Element(kLanguage, LanguageOf(*label)) + Element(kLanguageTag, label->Text("language_tag"));
            if (const size_t at = content.find(place); at != std::string::npos)
                content.replace(at, place.size(), both);
        }
        Renew(content);
        result = WriteBack(file, tracks.begin, content);
    }
    const int64_t back = file.Seek(position, SEEK_SET);
    return result < 0 ? static_cast<int>(-result) : back < 0 ? static_cast<int>(-back) : 0;
}

} // namespace writer
