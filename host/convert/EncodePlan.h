// From the command line and the source to the engine's encoding parameters.
#ifndef MOVIECONV_HOST_CONVERT_ENCODEPLAN_H
#define MOVIECONV_HOST_CONVERT_ENCODEPLAN_H

#include "host/source/Source.h"
#include "host/terminal/Options.h"
#include "media/EncodeParam.h"

namespace movieconv {

/// Checks that the options fit together with the formats there are. Throws Failure.
const FileFormatInfo& ChooseFormat(const Options& options);

/// `defaults` changed as the options say, for a file of `format`. Throws Failure.
EncodeParam PlanEncoding(const EncodeParam& defaults, const FileFormatInfo& format, const Options& options,
                         const SourceInfo& source);

/// Seconds of the source that the options ask for. Throws Failure when they begin behind its end.
double LengthToConvert(const Options& options, const SourceInfo& source);

} // namespace movieconv

#endif
