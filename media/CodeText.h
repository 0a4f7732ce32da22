// Four-character codes in messages.
#ifndef MOVIECONV_MEDIA_CODETEXT_H
#define MOVIECONV_MEDIA_CODETEXT_H

#include <cstdint>
#include <string>

/// The four characters of a code; "?" for those that cannot be printed.
inline std::string CodeText(uint32_t code) {
    std::string text;
    for (int shift = 0; shift < 32; shift += 8) {
        const auto character = static_cast<char>(code >> shift & 0xFF);
        text += character >= ' ' && character <= '~' ? character : '?';
    }
    return text;
}

#endif
