// What the media writer is told of a conversion beside the engine's parameters.
#ifndef MOVIECONV_HOST_CONVERT_WRITERPLAN_H
#define MOVIECONV_HOST_CONVERT_WRITERPLAN_H

#include "host/convert/Request.h"
#include "host/source/SourceInfo.h"
#include "writer/WriterStatus.h"

namespace movieconv {

/// Without the functions that it calls. Throws Failure as PlanPictures does.
WriterOptions OptionsFor(const Request& request, const SourceInfo& source);

} // namespace movieconv

#endif
