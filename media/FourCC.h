/// \file
/// Four-character codes: 32-bit values whose bytes, in memory order, are the four characters.
#ifndef MOVIECONV_MEDIA_FOURCC_H
#define MOVIECONV_MEDIA_FOURCC_H

#include <stdint.h>

/// The code whose first character is `a`: MC_FOURCC('H', '2', '6', '4').
#define MC_FOURCC(a, b, c, d)                                                                                \
    ((uint32_t)(unsigned char)(a) | (uint32_t)(unsigned char)(b) << 8 | (uint32_t)(unsigned char)(c) << 16 | \
     (uint32_t)(unsigned char)(d) << 24)

#ifdef __cplusplus
/// The code whose first character is `a`; it stands in the lowest byte ("MP4 " is 0x2034504D).
constexpr uint32_t FourCC(char a, char b, char c, char d) {
    return static_cast<uint32_t>(static_cast<unsigned char>(a)) |
           static_cast<uint32_t>(static_cast<unsigned char>(b)) << 8 |
           static_cast<uint32_t>(static_cast<unsigned char>(c)) << 16 |
           static_cast<uint32_t>(static_cast<unsigned char>(d)) << 24;
}

/// The same from a literal of exactly four characters: FourCC("XVID").
constexpr uint32_t FourCC(const char (&code)[5]) {
    return FourCC(code[0], code[1], code[2], code[3]);
}
#endif

#endif
