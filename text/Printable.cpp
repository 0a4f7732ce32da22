#include "text/Printable.h"

#include "text/Utf8.h"

#include <cstdio>

namespace text {
namespace {

constexpr wchar_t kEscapedByte = 0xDC00; // plus the byte, see FromUtf8

bool IsAmong(wchar_t character, wchar_t first, wchar_t last) {
    return character >= first && character <= last;
}

} // namespace

bool IsCommand(wchar_t character) {
    return (character < 0x20 && character != '\t') || IsAmong(character, 0x7F, 0x9F) ||
           IsAmong(character, 0x2028, 0x202E) || // ends of lines and paragraphs, changes of direction
           IsAmong(character, 0x2066, 0x2069);   // further such changes
}

std::string Printable(std::string_view bytes) {
    std::string shown;
    for (const wchar_t character : FromUtf8(bytes)) {
        char number[12] = "";
        if (IsAmong(character, kEscapedByte + 0x80, kEscapedByte + 0xFF))
            std::snprintf(number, sizeof number, "\\x%02x", static_cast<unsigned>(character - kEscapedByte));
        else if (IsCommand(character))
            std::snprintf(number, sizeof number, character < 0x80 ? "\\x%02x" : "\\u%04x",
                          static_cast<unsigned>(character));
        shown += number[0] != '\0' ? number : ToUtf8({&character, 1});
    }
    return shown;
}

} // namespace text
