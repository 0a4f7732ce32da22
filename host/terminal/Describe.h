// What --info, --estimate and --plan print.
#ifndef MOVIECONV_HOST_TERMINAL_DESCRIBE_H
#define MOVIECONV_HOST_TERMINAL_DESCRIBE_H

#include "host/convert/Room.h"
#include "host/source/Source.h"

#include <string>

namespace movieconv {

/// The source in a few lines for people.
std::string Describe(const SourceInfo& source);

/// The same as one JSON object in one line, as docs/progress-json.md describes it.
std::string DescribeAsJson(const SourceInfo& source);

/// Likewise how much room an output needs, and that a plan of so many pieces is made.
std::string EstimateAsJson(const Room& room);
std::string PlanAsJson(const std::string& path, int pieces);

} // namespace movieconv

#endif
