// File names and messages between wide strings and UTF-8, whatever the locale.
#ifndef MOVIECONV_TEXT_UTF8_H
#define MOVIECONV_TEXT_UTF8_H

#include <string>
#include <string_view>

namespace text {

/// Bytes to wide characters (UTF-32). A byte that is not part of valid UTF-8 becomes U+DC00 plus the byte
/// (U+DC80..U+DCFF), so that any file name survives the way there and back.
std::wstring FromUtf8(std::string_view bytes);

/// Wide characters to bytes: the inverse of FromUtf8. Values that are no characters become U+FFFD.
std::string ToUtf8(std::wstring_view wide);

} // namespace text

#endif
