// Files of the MP4 family while they grow: a row of fragments, each complete in itself.
#ifndef MOVIECONV_WRITER_FRAGMENTS_H
#define MOVIECONV_WRITER_FRAGMENTS_H

#include "writer/AvioFile.h"
#include "writer/Muxer.h"

#include <functional>
#include <memory>

namespace writer {

/// Writes the movie in the fragmented file `part`, written by `written`, into `out` once more with a single
/// index, with `extras`, whose chapters are on the file's timeline. Times are
/// those that went into `written`. `progress` is told the share done, 0 to 1. Throws
/// WriterFailure, with kWriterErrorFinish when `part` cannot be read or does not hold all that was written.
void JoinFragments(const std::shared_ptr<ByteFile>& part, const Muxer& written, const Container& container,
                   AvioFile& out, bool bitExact, const Extras& extras,
                   const std::function<void(double)>& progress);

/// Throws WriterFailure when the index of `file` does not name all that `written` took: the multiplexer
/// leaves out without a word what it has no memory for.
void CheckIndex(const std::shared_ptr<ByteFile>& file, const Muxer& written);

/// How far `part`, which has `size` bytes, consists of whole fragments. The multiplexer does not know: of
/// data that it had no memory for it does not tell.
int64_t WholeFragments(ByteFile& part, int64_t size);

} // namespace writer

#endif
