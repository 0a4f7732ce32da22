// Lets FFmpeg's multiplexers and demultiplexers work on a ByteFile.
#ifndef MOVIECONV_WRITER_AVIOFILE_H
#define MOVIECONV_WRITER_AVIOFILE_H

#include "ffmpeg/AvHandles.h"
#include "writer/FileSystem.h"

#include <atomic>
#include <cstdint>
#include <functional>
#include <memory>

namespace writer {

/// Works from the start of the file on. The first failure stays: nothing is written after it.
class AvioFile {
public:
    /// Told what was written, and where; 0, or an errno value.
    using Tap = std::function<int(int64_t position, const uint8_t* data, int64_t size)>;

    enum class Mode { kRead, kWrite };

    /// Throws std::bad_alloc.
    AvioFile(std::shared_ptr<ByteFile> file, Mode mode, Tap tap = {});
    AvioFile(const AvioFile&) = delete;
    AvioFile& operator=(const AvioFile&) = delete;
    ~AvioFile() = default;

    AVIOContext* Io() const { return io_.get(); }
    const std::shared_ptr<ByteFile>& File() const { return file_; }

    /// Writes out what is buffered. 0, or the errno value of the first failure.
    int Flush();

    /// The errno value of the first failed operation; 0 while there is none.
    int Error() const { return error_; }

    /// How far the file reaches; may be asked on any thread.
    int64_t Size() const { return size_.load(std::memory_order_relaxed); }

private:
    int Write(const uint8_t* data, int size);
    int Read(uint8_t* data, int size);
    int64_t Seek(int64_t offset, int whence);

    const std::shared_ptr<ByteFile> file_;
    const Tap tap_;
    av::Io io_;
    std::atomic<int> error_{0}; // may be asked on any thread
    int64_t position_ = 0;
    std::atomic<int64_t> size_{0};
};

} // namespace writer

#endif
