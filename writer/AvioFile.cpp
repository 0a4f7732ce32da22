#include "writer/AvioFile.h"

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <utility>

namespace writer {
namespace {

constexpr int kBufferSize = 128 * 1024;

} // namespace

AvioFile::AvioFile(std::shared_ptr<ByteFile> file, Mode mode, Tap tap)
    : file_(std::move(file)), tap_(std::move(tap)) {
    io_ = av::NewIo(
        kBufferSize, mode == Mode::kWrite, this,
        [](void* self, uint8_t* data, int size) { return static_cast<AvioFile*>(self)->Read(data, size); },
        [](void* self, uint8_t* data, int size) { return static_cast<AvioFile*>(self)->Write(data, size); },
        [](void* self, int64_t offset, int whence) {
            return static_cast<AvioFile*>(self)->Seek(offset, whence);
        });
    size_ = std::max<int64_t>(0, file_->Seek(0, SEEK_END));
    file_->Seek(0, SEEK_SET);
    // Multiplexers mark a point at which one may flush after every packet; a system call for each would be
    // too many.
    io_->min_packet_size = kBufferSize / 2;
}

int AvioFile::Flush() {
    avio_flush(io_.get());
    return error_;
}

int AvioFile::Write(const uint8_t* data, int size) {
    int done = 0;
    while (error_ == 0 && done < size) {
        const int64_t written = file_->Write(data + done, size - done);
        if (written > 0) {
            if (tap_)
                error_ = tap_(position_, data + done, written);
            done += static_cast<int>(written);
            position_ += written;
            size_.store(std::max(size_.load(std::memory_order_relaxed), position_),
                        std::memory_order_relaxed);
        } else {
            error_ = written < 0 ? static_cast<int>(-written) : EIO;
        }
    }
    return error_ == 0 ? size : AVERROR(error_);
}

int AvioFile::Read(uint8_t* data, int size) {
    const int64_t count = file_->Read(data, size);
    if (count == 0)
        return AVERROR_EOF;
    if (count < 0) {
        error_ = static_cast<int>(-count);
        return AVERROR(error_);
    }
    position_ += count;
    return static_cast<int>(count);
}

int64_t AvioFile::Seek(int64_t offset, int whence) {
    if (whence == AVSEEK_SIZE)
        return Size();
    const int64_t position = file_->Seek(offset, whence & ~AVSEEK_FORCE);
    if (position >= 0)
        position_ = position;
    else
        error_ = static_cast<int>(-position);
    return position < 0 ? AVERROR(static_cast<int>(-position)) : position;
}

} // namespace writer
