// The media writer's file formats and how people name them.
#ifndef MOVIECONV_HOST_CONVERT_FORMATS_H
#define MOVIECONV_HOST_CONVERT_FORMATS_H

#include "media/EncodeParam.h"

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace movieconv {

/// The format named by `name`, a four-character code or an extension, in any case. Null when there is none.
const FileFormatInfo* FindFormat(std::string_view name);

/// The format that the extension of a file name stands for. Null when it has none or an unknown one.
const FileFormatInfo* FindFormatOfFile(std::string_view path);

/// "MP4" of "MP4 (MPEG-4 Part 14)".
std::string ShortName(const FileFormatInfo& format);

/// Whether the format has one of the media writer's kWriterFormat...
bool Has(const FileFormatInfo& format, uint32_t trait);

/// Compares by bytes, ASCII letters in any case.
bool SameIgnoringCase(std::string_view one, std::string_view other);

/// "H264" from "h264", "AAC " from "aac". Nothing for more than four characters or none.
std::optional<uint32_t> ParseCode(std::string_view text);

/// The range of a codec's constant quality, where lower is better.
struct QualityRange {
    double best;
    double worst;
};

/// Nothing for codecs that have none, such as those that lose nothing.
std::optional<QualityRange> QualityRangeOf(uint32_t videoCodec);

/// The characters of a code, without the spaces at its end.
std::string CodeName(uint32_t code);

} // namespace movieconv

#endif
