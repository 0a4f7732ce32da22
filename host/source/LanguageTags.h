// Languages of tracks with their region or script, which FFmpeg does not read.
#ifndef MOVIECONV_HOST_SOURCE_LANGUAGETAGS_H
#define MOVIECONV_HOST_SOURCE_LANGUAGETAGS_H

#include "ffmpeg/AvHandles.h"
#include "host/source/InputFile.h"

#include <string>
#include <vector>

namespace movieconv {

/// For each stream of `context` its language as the container has it by BCP 47, such as "pt-BR"; empty where
/// it tells none. Matroska and the family of MP4 do.
std::vector<std::string> ReadLanguageTags(const InputFile& file, const AVFormatContext& context);

} // namespace movieconv

#endif
