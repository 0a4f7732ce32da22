// One picture of a movie, for display.
#ifndef MOVIECONV_HOST_CONVERT_STILLPICTURE_H
#define MOVIECONV_HOST_CONVERT_STILLPICTURE_H

#include "host/convert/Observer.h"

#include <memory>
#include <string>

namespace movieconv {

/// The picture that the movie `path` shows `seconds` after its start; null when it shows none there. Opens
/// the movie and decodes from the key picture before; what is wrong with it goes to no LogTap. Throws
/// Failure.
std::shared_ptr<const ShownPicture> PictureAt(const std::string& path, double seconds);

} // namespace movieconv

#endif
