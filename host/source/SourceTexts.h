// Brings the texts of a movie to one form, whatever its container's way is.
#ifndef MOVIECONV_HOST_SOURCE_SOURCETEXTS_H
#define MOVIECONV_HOST_SOURCE_SOURCETEXTS_H

#include "host/source/SourceInfo.h"

#include <string_view>

namespace movieconv {

/// `container` is FFmpeg's short name.
void PutTextsRight(std::string_view container, SourceInfo& info);

} // namespace movieconv

#endif
