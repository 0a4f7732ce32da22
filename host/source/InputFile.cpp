#include "host/source/InputFile.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <fcntl.h>
#include <new>
#include <poll.h>
#include <sys/eventfd.h>
#include <sys/stat.h>
#include <system_error>
#include <unistd.h>

namespace movieconv {
namespace {

constexpr int kBufferBytes = 64 * 1024;

} // namespace

InputFile::InputFile(const std::string& path)
    : file_(open(path.c_str(), O_RDONLY | O_CLOEXEC)), wake_(eventfd(0, EFD_CLOEXEC)) {
    struct stat status {};
    const bool regular = fstat(file_.Number(), &status) == 0 && S_ISREG(status.st_mode);
    size_ = regular ? status.st_size : 0;
    const auto read = [](void* self, uint8_t* data, int size) {
        return static_cast<const InputFile*>(self)->Read(data, size);
    };
    const auto seek = [](void* self, int64_t offset, int whence) {
        return static_cast<const InputFile*>(self)->Seek(offset, whence);
    };
    io_ = av::NewIo(kBufferBytes, false, this, read, nullptr, regular ? +seek : nullptr);
}

InputFile::Descriptor::Descriptor(int number) : number_(number) {
    if (number_ < 0)
        throw std::system_error(errno, std::generic_category());
}

InputFile::Descriptor::~Descriptor() {
    close(number_);
}

void InputFile::Interrupt() {
    interrupted_ = true;
    eventfd_write(wake_.Number(), 1); // never read again: it ends every later wait too
}

int InputFile::Read(uint8_t* data, int size) const {
    for (;;) {
        std::array<pollfd, 2> sources{pollfd{file_.Number(), POLLIN, 0}, pollfd{wake_.Number(), POLLIN, 0}};
        const bool waited = poll(sources.data(), sources.size(), -1) >= 0;
        if (interrupted_)
            return AVERROR_EXIT;
        const ssize_t count = waited ? read(file_.Number(), data, static_cast<std::size_t>(size)) : -1;
        if (count >= 0)
            return count == 0 ? AVERROR_EOF : static_cast<int>(count);
        if (errno != EINTR)
            return AVERROR(errno);
    }
}

int InputFile::ReadAt(int64_t offset, uint8_t* data, std::size_t size) const {
    return static_cast<int>(pread(file_.Number(), data, size, offset));
}

int64_t InputFile::Seek(int64_t offset, int whence) const {
    if (whence == AVSEEK_SIZE)
        return size_;
    const off_t position = lseek(file_.Number(), offset, whence & ~AVSEEK_FORCE);
    return position < 0 ? AVERROR(errno) : position;
}

} // namespace movieconv
