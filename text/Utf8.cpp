#include "text/Utf8.h"

#include <cstddef>
#include <cstdint>

namespace text {
namespace {

constexpr char32_t kEscapeBase = 0xDC00;
constexpr char32_t kReplacement = 0xFFFD;

bool IsEscape(char32_t value) {
    return value >= kEscapeBase + 0x80 && value <= kEscapeBase + 0xFF;
}

bool IsCharacter(char32_t value) {
    return value <= 0x10FFFF && (value < 0xD800 || value > 0xDFFF);
}

struct Decoded {
    char32_t value;
    std::size_t length;
};

/// The character at the front of `bytes`, or the escape of its first byte.
Decoded DecodeFront(std::string_view bytes) {
    const auto lead = static_cast<unsigned char>(bytes.front());
    if (lead < 0x80)
        return {lead, 1};
    const Decoded escape{kEscapeBase + lead, 1};
    std::size_t length = 0;
    char32_t lowest = 0;
    if (lead >= 0xC2 && lead <= 0xDF) {
        length = 2;
        lowest = 0x80;
    } else if (lead >= 0xE0 && lead <= 0xEF) {
        length = 3;
        lowest = 0x800;
    } else if (lead >= 0xF0 && lead <= 0xF4) {
        length = 4;
        lowest = 0x10000;
    }
    if (length == 0 || bytes.size() < length)
        return escape;
    char32_t value = lead & (0x7FU >> length);
    for (std::size_t i = 1; i < length; ++i) {
        const auto byte = static_cast<unsigned char>(bytes[i]);
        if ((byte & 0xC0) != 0x80)
            return escape;
        value = value << 6 | (byte & 0x3FU);
    }
    return value >= lowest && IsCharacter(value) ? Decoded{value, length} : escape;
}

void AppendEncoded(std::string& out, char32_t value) {
    const auto tail = [value](int shift) { return static_cast<char>(0x80U | (value >> shift & 0x3FU)); };
    if (value < 0x80)
        out += static_cast<char>(value);
    else if (value < 0x800)
        out += {static_cast<char>(0xC0U | value >> 6), tail(0)};
    else if (value < 0x10000)
        out += {static_cast<char>(0xE0U | value >> 12), tail(6), tail(0)};
    else
        out += {static_cast<char>(0xF0U | value >> 18), tail(12), tail(6), tail(0)};
}

} // namespace

std::wstring FromUtf8(std::string_view bytes) {
    std::wstring wide;
    wide.reserve(bytes.size());
    while (!bytes.empty()) {
        const Decoded front = DecodeFront(bytes);
        wide += static_cast<wchar_t>(front.value);
        bytes.remove_prefix(front.length);
    }
    return wide;
}

std::string ToUtf8(std::wstring_view wide) {
    std::string bytes;
    bytes.reserve(wide.size());
    for (const wchar_t character : wide) {
        const auto value = static_cast<char32_t>(character);
        if (IsEscape(value))
            bytes += static_cast<char>(value - kEscapeBase);
        else
            AppendEncoded(bytes, IsCharacter(value) ? value : kReplacement);
    }
    return bytes;
}

} // namespace text
