// The source of a request, opened.
#ifndef MOVIECONV_HOST_CONVERT_SOURCES_H
#define MOVIECONV_HOST_CONVERT_SOURCES_H

#include "host/convert/Request.h"
#include "host/source/Movie.h"

#include <memory>

namespace movieconv {

/// With the decoders of what the request wants of it. `interruption` ends this, too. Throws Failure.
Movie OpenMovie(const Request& request,
                std::shared_ptr<Interruption> interruption = std::make_shared<Interruption>());

/// What it holds. Throws Failure.
SourceInfo LookAtSource(const Request& request);

} // namespace movieconv

#endif
