// The source of a request, opened.
#ifndef MOVIECONV_HOST_CONVERT_SOURCES_H
#define MOVIECONV_HOST_CONVERT_SOURCES_H

#include "host/convert/Request.h"
#include "host/source/Movie.h"

#include <memory>
#include <string>

namespace movieconv {

/// With the decoders of what the request wants of it. `interruption` ends this, too. Throws Failure.
Movie OpenMovie(const Request& request,
                std::shared_ptr<Interruption> interruption = std::make_shared<Interruption>());

/// What it holds. Throws Failure.
SourceInfo LookAtSource(const Request& request);

/// How the pictures were cropped, where that was looked for.
Sentence TellCrop(const SourceInfo& source);

/// A source that was looked at, whatever was chosen then, with the pictures and the sound that the request
/// chooses. Of others than before there is only what the container tells. Throws Failure when a track that is
/// asked for is not there.
SourceInfo AsAskedFor(SourceInfo source, const Request& request);

} // namespace movieconv

#endif
