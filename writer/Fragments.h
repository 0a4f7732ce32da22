// Files of the MP4 family while they grow: a row of fragments, each complete in itself.
#ifndef MOVIECONV_WRITER_FRAGMENTS_H
#define MOVIECONV_WRITER_FRAGMENTS_H

#include "writer/FragmentLog.h"
#include "writer/Mp4Room.h"
#include "writer/PacketWriter.h"

#include <functional>
#include <memory>

namespace writer {

/// Gives the fragmented file `part`, written by `written`, one index in `room`, over data that stays where it
/// is. `log` has seen all of it. The chapters of `extras` are on the file's timeline. Times are then those
/// that went into `written`. The file has to be synced afterwards. `progress` is told the share done, 0 to 1.
/// Throws WriterFailure, with kWriterErrorFinish when `part` cannot be read or does not hold all that was
/// written; it is the fragmented file then, as it was.
void FinishFragments(const std::shared_ptr<ByteFile>& part, const PacketWriter& written,
                     const Container& container, const FragmentLog& log, const Mp4Room& room, bool bitExact,
                     const Extras& extras, const std::function<void(double)>& progress);

/// How far `part`, which has `size` bytes, consists of whole fragments, whose data is exactly what their
/// heads name; 0 where there is none. The multiplexer does not know: of data that it had no memory for it
/// does not tell, and when it fails in the midst of a packet, the data of those that follow is not where the
/// head has it.
int64_t WholeFragments(ByteFile& part, int64_t size);

} // namespace writer

#endif
