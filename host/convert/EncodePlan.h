// From the request and the source to the engine's encoding parameters.
#ifndef MOVIECONV_HOST_CONVERT_ENCODEPLAN_H
#define MOVIECONV_HOST_CONVERT_ENCODEPLAN_H

#include "host/convert/Request.h"
#include "host/source/Source.h"
#include "media/EncodeParam.h"

#include <string>

namespace movieconv {

/// The file format to write. Throws Failure when there is none.
const FileFormatInfo& ChooseFormat(const Request& request);

/// `defaults` changed as the request says, for a file of `format`. Throws Failure.
EncodeParam PlanEncoding(const EncodeParam& defaults, const FileFormatInfo& format, const Request& request,
                         const SourceInfo& source);

/// What becomes of a source with more pictures a second than the engine gives a format that needs a steady
/// rate, a sentence; empty where every picture has its own time, or another rate was asked for.
Sentence TellRateLoss(const Request& request, const SourceInfo& source);

/// Seconds of the source that the request asks for. Throws Failure when they begin behind its end.
double LengthToConvert(const Request& request, const SourceInfo& source);

} // namespace movieconv

#endif
