// Texts in whatever character set they come.
#ifndef MOVIECONV_HOST_SOURCE_CHARSET_H
#define MOVIECONV_HOST_SOURCE_CHARSET_H

#include <string>

extern "C" {
#include <libavcodec/avcodec.h>
}

namespace movieconv {

/// A text in UTF-8, from one in `charset`; by default UTF-8 or UTF-16 if it can be that, else Windows-1252.
/// One that begins with a byte order mark stays as it is. Throws SourceError when there is no such character
/// set, or the text is none in it.
std::string Decoded(std::string text, const std::string& charset = {});

/// Whether packets of the codec are nothing but text.
bool IsPlainText(AVCodecID codec);

/// A packet of subtitles made of plain text, in UTF-8 whatever it is in. Whether it had to be changed.
bool MakeUtf8(AVPacket& packet);

} // namespace movieconv

#endif
