// How long a movie is.
#ifndef MOVIECONV_HOST_SOURCE_LENGTH_H
#define MOVIECONV_HOST_SOURCE_LENGTH_H

#include "host/source/PacketReader.h"
#include "host/source/SourceInfo.h"

namespace movieconv {

struct Length {
    double seconds = 0; ///< From the start of the source.
    Certainty certainty = Certainty::kKnown;
    bool announced = false;     ///< By the container, which was believed.
    bool clockRestarts = false; ///< Its clock starts anew within it, or is likely to.
};

/// Reads parts of the source where the container tells no length, or one to doubt. `info` describes the
/// chosen streams. The source is at its begin before and after. Throws SourceError.
Length FindLength(PacketReader& reader, const SourceInfo& info);

} // namespace movieconv

#endif
