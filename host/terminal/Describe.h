// What --info prints.
#ifndef MOVIECONV_HOST_TERMINAL_DESCRIBE_H
#define MOVIECONV_HOST_TERMINAL_DESCRIBE_H

#include "host/source/Source.h"

#include <string>

namespace movieconv {

/// The source in a few lines for people.
std::string Describe(const SourceInfo& source);

/// The same as one JSON object in one line, as docs/progress-json.md describes it.
std::string DescribeAsJson(const SourceInfo& source);

} // namespace movieconv

#endif
