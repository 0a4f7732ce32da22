// Bit rates and a picture size by which an output keeps below a size.
#ifndef MOVIECONV_HOST_CONVERT_SIZEPLAN_H
#define MOVIECONV_HOST_CONVERT_SIZEPLAN_H

#include "host/convert/Request.h"
#include "host/source/Source.h"
#include "media/EncodeParam.h"

#include <cstdint>
#include <optional>
#include <string>

namespace movieconv {

/// The request with rates, and where those are low a picture size and channels, that follow from its greatest
/// size and the source's length; without one as it is. Throws Failure when no such rates are possible.
Request FitIntoSize(Request request, const SourceInfo& source);

/// Bytes that an output of that length is going to take, about, coded as `param` says; nothing where what is
/// seen or heard decides it.
std::optional<int64_t> NeededBytes(EncodeParam param, const Request& request, const SourceInfo& source,
                                   double length);

/// What was chosen, a sentence for people.
Sentence TellSize(const Request& fitted);

} // namespace movieconv

#endif
