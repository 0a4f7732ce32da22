// File names and messages between wide strings and UTF-8, whatever the locale.
#ifndef MOVIECONV_TEXT_UTF8_H
#define MOVIECONV_TEXT_UTF8_H

#include <algorithm>
#include <cstddef>
#include <string>
#include <string_view>

namespace text {

/// Bytes to wide characters (UTF-32). A byte that is not part of valid UTF-8 becomes U+DC00 plus the byte
/// (U+DC80..U+DCFF), so that any file name survives the way there and back.
std::wstring FromUtf8(std::string_view bytes);

/// Wide characters to bytes: the inverse of FromUtf8. Values that are no characters become U+FFFD.
std::string ToUtf8(std::wstring_view wide);

/// The front of `text`: at most so many bytes, without half a character at their end. Allocates nothing.
inline std::string_view CutTo(std::size_t most, std::string_view text) noexcept {
    std::size_t size = std::min(most, text.size());
    while (size < text.size() && size > 0 && (static_cast<unsigned char>(text[size]) & 0xC0) == 0x80)
        --size;
    return text.substr(0, size);
}

/// Copies as much of `text` as fits, likewise, and a terminator. Allocates nothing.
template <std::size_t Size>
void CopyText(char (&to)[Size], std::string_view text) noexcept {
    const std::string_view front = CutTo(Size - 1, text);
    *std::copy(front.begin(), front.end(), to) = '\0';
}

} // namespace text

#endif
