#include "host/source/ContainerParts.h"

#include "ffmpeg/Mp4Box.h"

#include <algorithm>
#include <array>
#include <cstddef>

namespace movieconv {
MarkedNumber ReadMarkedNumber(const uint8_t* bytes, int mostBytes, bool keepMark) {
    int length = 1;
    while (length <= mostBytes && (bytes[0] & (0x80 >> (length - 1))) == 0)
        ++length;
    if (length > mostBytes)
        return {};
    uint64_t value = keepMark ? bytes[0] : static_cast<uint64_t>(bytes[0] & (0x7F >> (length - 1)));
    for (int i = 1; i < length; ++i)
        value = value << 8 | bytes[i];
    return {value, length};
}

std::optional<PartHead> ReadBoxHead(const InputFile& file, int64_t at) {
    std::array<uint8_t, av::BoxHead::kMostSize> bytes{};
    const int count = file.ReadAt(at, bytes.data(), bytes.size());
    const auto head = av::ReadBoxHead(bytes.data(), static_cast<std::size_t>(std::max(count, 0)));
    if (!head)
        return std::nullopt;
    return PartHead{head->type, head->headSize,
                    head->size != av::BoxHead::kOpen ? head->size : PartHead::kOpen};
}

std::optional<PartHead> ReadElementHead(const InputFile& file, int64_t at) {
    std::array<uint8_t, 12> head{}; // what is not read stays 0
    if (file.ReadAt(at, head.data(), head.size()) < 2)
        return std::nullopt;
    const MarkedNumber name = ReadMarkedNumber(head.data(), 4, true);
    const MarkedNumber size =
        name.length > 0 ? ReadMarkedNumber(head.data() + name.length, 8, false) : MarkedNumber{};
    if (size.length == 0)
        return std::nullopt;
    const int64_t headSize = name.length + size.length;
    const bool isOpen = size.value == (uint64_t{1} << (7 * size.length)) - 1;
    return PartHead{name.value, headSize,
                    isOpen ? PartHead::kOpen : headSize + static_cast<int64_t>(size.value)};
}

Part Parts::At(int64_t at, int64_t end) const {
    const std::optional<PartHead> head = read_(file_, at);
    if (!head)
        return {};
    const int64_t size = head->size != PartHead::kOpen ? head->size : end - at;
    if (head->headSize > end - at || size > end - at)
        return {};
    return {head->name, at + head->headSize, at + size};
}

void Parts::ForEach(const Part& whole, const std::function<bool(const Part&)>& take) {
    for (int64_t at = whole.begin; at < whole.end && left_-- > 0;) {
        const Part part = At(at, whole.end);
        if (part.end <= at || !take(part))
            return;
        at = part.end;
    }
}

Part Parts::Find(const Part& whole, uint64_t name, uint64_t last) {
    Part found;
    ForEach(whole, [&](const Part& part) {
        if (part.name == name)
            found = part;
        return part.name != name && part.name != last;
    });
    return found;
}

std::string Parts::Text(const Part& part, int64_t skip, int64_t most) const {
    const int64_t size = part.end - part.begin - skip;
    if (size <= 0 || size > most)
        return {};
    std::string text(static_cast<std::size_t>(size), '\0');
    if (file_.ReadAt(part.begin + skip, reinterpret_cast<uint8_t*>(text.data()), text.size()) != size)
        return {};
    return text.substr(0, text.find('\0'));
}

uint64_t Parts::Number(const Part& part) const {
    std::array<uint8_t, 8> bytes{};
    const int64_t size = part.end - part.begin;
    if (size < 1 || size > 8 ||
        file_.ReadAt(part.begin, bytes.data(), static_cast<std::size_t>(size)) != size)
        return 0;
    uint64_t number = 0;
    for (int64_t i = 0; i < size; ++i)
        number = number << 8 | bytes[static_cast<std::size_t>(i)];
    return number;
}

} // namespace movieconv
