// Bit rates and a picture size by which an output keeps below a size.
#ifndef MOVIECONV_HOST_CONVERT_SIZEPLAN_H
#define MOVIECONV_HOST_CONVERT_SIZEPLAN_H

#include "host/convert/Request.h"
#include "host/source/Source.h"

#include <string>

namespace movieconv {

/// The request with rates, and where those are low a picture size and channels, that follow from its greatest
/// size and the source's length; without one as it is. Throws Failure when no such rates are possible.
Request FitIntoSize(Request request, const SourceInfo& source);

/// What was chosen, a sentence for people.
std::string TellSize(const Request& fitted);

} // namespace movieconv

#endif
