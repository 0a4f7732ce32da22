// The bytes of a source. A wait for a pipe or a device that brings nothing can be ended from another thread.
#ifndef MOVIECONV_HOST_SOURCE_INPUTFILE_H
#define MOVIECONV_HOST_SOURCE_INPUTFILE_H

#include "ffmpeg/AvHandles.h"
#include "host/source/Interruption.h"
#include "text/Descriptor.h"

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>

namespace movieconv {

/// What becomes of what is written to a regular file after it was opened.
enum class Growth { kRead, kLeftOut };

/// One thread reads through Io().
class InputFile {
public:
    /// Opens `path`, bytes as the system has them: it is never taken for a protocol. A pipe that nobody
    /// writes into yet is waited for by the first read. Throws std::system_error with the reason.
    InputFile(const std::string& path, Growth growth, std::shared_ptr<const Interruption> interruption);
    InputFile(const InputFile&) = delete;
    InputFile& operator=(const InputFile&) = delete;

    /// For a demultiplexer, which must not outlive this object.
    AVIOContext* Io() const { return io_.get(); }

    /// Bytes in a regular file; 0 for anything else, which cannot be sought either.
    int64_t Size() const { return size_; }

    /// Reads at a place of a regular file without moving there, for who looks at its structure. The number of
    /// bytes, fewer than asked for at the file's end; negative when reading fails.
    int ReadAt(int64_t offset, uint8_t* data, std::size_t size) const;

    const Interruption& Interrupter() const { return *interruption_; }

private:
    int Read(uint8_t* data, int size);
    int64_t Seek(int64_t offset, int whence);

    const text::Descriptor file_;
    const std::shared_ptr<const Interruption> interruption_;
    int64_t size_ = 0;
    int64_t end_ = INT64_MAX; // where reading ends at the latest
    int64_t place_ = 0;       // of the next byte
    av::Io io_;
};

} // namespace movieconv

#endif
