// Files of the MP4 family while they grow: a row of fragments, each complete in itself.
#ifndef MOVIECONV_WRITER_FRAGMENTS_H
#define MOVIECONV_WRITER_FRAGMENTS_H

#include "writer/Extras.h"
#include "writer/FilePlan.h"
#include "writer/FileSystem.h"

#include <cstdint>
#include <functional>

namespace writer {

class PartFile;

/// Gives the fragmented file `part`, which is written to its end, one index in its room, over data that stays
/// where it is. The chapters of `extras` are on the file's timeline. Times are then those that went into its
/// streams. The file has to be synced afterwards. `progress` is told the share done, 0 to 1. Throws
/// WriterFailure, with kWriterErrorFinish when `part` cannot be read or does not hold all that was written;
/// it is the fragmented file then, as it was.
void FinishFragments(const PartFile& part, const FilePlan& plan, const Extras& extras,
                     const std::function<void(double)>& progress);

/// How far `part`, which has `size` bytes, consists of whole fragments, whose data is exactly what their
/// heads name; 0 where there is none. The multiplexer does not know: of data that it had no memory for it
/// does not tell, and when it fails in the midst of a packet, the data of those that follow is not where the
/// head has it.
int64_t WholeFragments(ByteFile& part, int64_t size);

} // namespace writer

#endif
