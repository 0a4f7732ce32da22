// What --info prints.
#ifndef MOVIECONV_HOST_DESCRIBE_H
#define MOVIECONV_HOST_DESCRIBE_H

#include "host/Source.h"

#include <string>

namespace host {

/// The source in a few lines for people.
std::string Describe(const SourceInfo& source);

} // namespace host

#endif
