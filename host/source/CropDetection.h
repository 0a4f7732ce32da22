// Finds the black borders of a movie's pictures.
#ifndef MOVIECONV_HOST_SOURCE_CROPDETECTION_H
#define MOVIECONV_HOST_SOURCE_CROPDETECTION_H

#include "host/source/Crop.h"
#include "host/source/Source.h"

#include <optional>
#include <string>

namespace movieconv {

/// Whether a movie can be looked at before it is converted: a pipe would lose what was read for that.
bool CanBeLookedAtBefore(const std::string& path);

/// What is black in every one of some key pictures all over the movie; nothing when it cannot be looked at
/// there, or all of it is black. `source` is a movie of its own for this: where its reader
/// stands afterwards is not told. Throws SourceError.
std::optional<Crop> FindBorders(Source& source);

} // namespace movieconv

#endif
