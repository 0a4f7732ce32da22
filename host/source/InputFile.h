// The bytes of a source. A wait for a pipe or a device that brings nothing can be ended from another thread.
#ifndef MOVIECONV_HOST_SOURCE_INPUTFILE_H
#define MOVIECONV_HOST_SOURCE_INPUTFILE_H

#include "ffmpeg/AvHandles.h"

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <string>

namespace movieconv {

/// One thread reads through Io(); Interrupt may be called from any.
class InputFile {
public:
    /// Opens `path`, bytes as the system has them: it is never taken for a protocol. Throws
    /// std::system_error with the reason.
    explicit InputFile(const std::string& path);
    InputFile(const InputFile&) = delete;
    InputFile& operator=(const InputFile&) = delete;

    /// For a demultiplexer, which must not outlive this object.
    AVIOContext* Io() const { return io_.get(); }

    /// Bytes in a regular file; 0 for anything else, which cannot be sought either.
    int64_t Size() const { return size_; }

    /// Reads at a place of a regular file without moving there, for who looks at its structure. The number of
    /// bytes, fewer than asked for at the file's end; negative when reading fails.
    int ReadAt(int64_t offset, uint8_t* data, std::size_t size) const;

    /// Makes every read fail from now on, also one that is under way.
    void Interrupt();
    bool Interrupted() const { return interrupted_; }

private:
    class Descriptor {
    public:
        /// Throws std::system_error when `number` is that of a failed call.
        explicit Descriptor(int number);
        ~Descriptor();
        Descriptor(const Descriptor&) = delete;
        Descriptor& operator=(const Descriptor&) = delete;
        int Number() const { return number_; }

    private:
        const int number_;
    };

    int Read(uint8_t* data, int size) const;
    int64_t Seek(int64_t offset, int whence) const;

    const Descriptor file_;
    const Descriptor wake_; // readable once interrupted
    int64_t size_ = 0;
    std::atomic<bool> interrupted_{false};
    av::Io io_;
};

} // namespace movieconv

#endif
