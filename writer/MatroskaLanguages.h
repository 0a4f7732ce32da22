// Languages with their region or script in Matroska, which the multiplexer does not write.
#ifndef MOVIECONV_WRITER_MATROSKALANGUAGES_H
#define MOVIECONV_WRITER_MATROSKALANGUAGES_H

#include "writer/Extras.h"
#include "writer/FileSystem.h"

#include <string>
#include <vector>

namespace writer {

/// What the multiplexer is told as the language of a track that has a language tag, too: a text that takes as
/// much room as both elements.
std::string LanguagePlace(const TrackLabel& label);

/// Puts language and tag where the multiplexer has put these texts in the head of a file. Leaves the file's
/// position as it was. 0, or an errno value.
int PutLanguageTags(ByteFile& file, const std::vector<const TrackLabel*>& labels);

} // namespace writer

#endif
