// Where the packets of a Matroska file end, by the file's own structure.
#ifndef MOVIECONV_HOST_SOURCE_MATROSKAEND_H
#define MOVIECONV_HOST_SOURCE_MATROSKAEND_H

#include "host/source/InputFile.h"

#include <optional>
#include <vector>

namespace movieconv {

/// When the last packet of each stream begins, in seconds on the container's clock; nothing for a stream that
/// has none behind the last place that the index names. Empty unless the segment tells its size, is all
/// there, and is whole from that place to its end.
std::vector<std::optional<double>> ReadMatroskaEnd(const InputFile& file);

} // namespace movieconv

#endif
