// Room in front of a growing file of the MP4 family, in which its index comes when it is finished. F is the
// end of the first box, R the size of the room:
//
//     growing     [ftyp][free R                       ][moov][moof mdat]...
//     finished    [ftyp][free 16][index][free, the rest][mdat to the end: texts, moov, moof mdat...]
//     too small   [ftyp][free 16][mdat: rest of the room, moov, moof mdat..., free box, texts][index]
//
// Everything is written where a reader of the growing file skips it, and reaches the disk, before the size of
// the room becomes 16. R is chosen so that this changes one byte: a file is either the one or the other,
// whenever writing ends.
#ifndef MOVIECONV_WRITER_MP4ROOM_H
#define MOVIECONV_WRITER_MP4ROOM_H

#include "writer/Extras.h"
#include "writer/FilePlan.h"
#include "writer/FileSystem.h"
#include "writer/Mp4Index.h"
#include "writer/WriterFailure.h"

#include <atomic>
#include <cstdint>
#include <functional>

namespace writer {

/// The data did not reach the disk. The system tells that once: a later attempt succeeds with it missing.
class SyncFailure final : public WriterFailure {
public:
    explicit SyncFailure(int error)
        : WriterFailure(SystemFailure(kWriterErrorFinish, error, "Syncing the data failed")) {}
};

/// The size of the room for the index of a file that becomes as long as planned, and for its texts.
int64_t RoomFor(const FilePlan& plan, const Extras& extras);

class Mp4Room {
public:
    /// `size` as RoomFor gives it.
    explicit Mp4Room(int64_t size) : size_(size) {}

    /// Closes the room off once `file` has its first box, before the room or, where the multiplexer began
    /// behind it, there. Does nothing before that, and when it is done. Leaves the file's position as it was.
    /// 0, or an errno value.
    int Close(ByteFile& file) noexcept;

    /// May be asked on any thread.
    bool Closed() const { return begin_ > 0; }
    int64_t Size() const { return size_; }

    /// Makes the plain file. `index` gives the index with its texts at a position, `textSize` or fewer bytes
    /// of them; `check` is shown the file as it will be, and throws when something is missing there. Where
    /// something fails, the file stays the growing one, and WriterFailure is thrown: SyncFailure when nothing
    /// that was written is certain to be on the disk.
    void Finish(ByteFile& file, const std::function<Mp4Index::Result(int64_t place)>& index, int64_t textSize,
                const std::function<void(ByteFile&)>& check) const;

private:
    bool FinishInFront(ByteFile& file, const Mp4Index::Result& index, int64_t texts, int64_t end) const;
    void FinishBehind(ByteFile& file, const Mp4Index::Result& index, int64_t end) const;
    void Switch(ByteFile& file, const std::function<void(ByteFile&)>& check) const;

    const int64_t size_;
    std::atomic<int64_t> begin_{0};
};

} // namespace writer

#endif
