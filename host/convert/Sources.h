// The source of a request, opened.
#ifndef MOVIECONV_HOST_CONVERT_SOURCES_H
#define MOVIECONV_HOST_CONVERT_SOURCES_H

#include "host/convert/Request.h"
#include "host/source/Movie.h"

namespace movieconv {

/// With the decoders of what the request wants of it. Throws Failure.
Movie OpenMovie(const Request& request);

/// What it holds. Throws Failure.
SourceInfo LookAtSource(const Request& request);

} // namespace movieconv

#endif
