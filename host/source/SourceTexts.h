// Completes the texts of a movie and brings them to one form, whatever its container's way is.
#ifndef MOVIECONV_HOST_SOURCE_SOURCETEXTS_H
#define MOVIECONV_HOST_SOURCE_SOURCETEXTS_H

#include "host/source/ContainerNotes.h"
#include "host/source/SourceInfo.h"

#include <string_view>

namespace movieconv {

/// Adds what the container tells and FFmpeg doesn't read: languages, titles, names of files, codecs.
void TakeNotes(const ContainerNotes& notes, SourceInfo& info);

/// `container` is FFmpeg's short name.
void PutTextsRight(std::string_view container, SourceInfo& info);

} // namespace movieconv

#endif
