// The timecode of a movie: the number of its first picture, counted from the start of a day.
#ifndef MOVIECONV_HOST_CONVERT_TIMECODE_H
#define MOVIECONV_HOST_CONVERT_TIMECODE_H

#include "host/convert/Observer.h"
#include "host/convert/Request.h"
#include "host/source/SourceInfo.h"
#include "media/EncodeParam.h"

#include <cstdint>
#include <optional>
#include <string>

namespace movieconv {

/// Whether a text of that name is a timecode, which is not copied but moved with the range.
bool IsTimecode(const std::string& key);

/// Whether the stream does nothing but say what the movie's timecode is.
bool HoldsTheTimecode(const SourceInfo& source, const StreamInfo& stream);

/// Why the output has no timecode although there is one. Nothing when it has, or none is wanted.
std::optional<NotCarried> WhyTimecodeStays(const SourceInfo& source, const Request& request,
                                           const FileFormatInfo& format);

/// Tells the writer's set the timecode of the next file, which begins with the first picture at or after
/// `time`, in seconds from the start of the source. Does nothing when it stays.
void CarryTimecode(const SourceInfo& source, const Request& request, const FileFormatInfo& format,
                   uint32_t set, double time);

} // namespace movieconv

#endif
