#include "host/source/InputFile.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <fcntl.h>
#include <new>
#include <poll.h>
#include <sys/stat.h>
#include <system_error>
#include <unistd.h>
#include <utility>

namespace movieconv {
namespace {

constexpr int kBufferBytes = 64 * 1024;

} // namespace

InputFile::InputFile(const std::string& path, Growth growth, std::shared_ptr<const Interruption> interruption)
    : file_(open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK)), interruption_(std::move(interruption)) {
    if (file_.Number() < 0)
        throw std::system_error(errno, std::generic_category());
    struct stat status {};
    const bool regular = fstat(file_.Number(), &status) == 0 && S_ISREG(status.st_mode);
    size_ = regular ? status.st_size : 0;
    if (regular && growth == Growth::kLeftOut)
        end_ = size_;
    const auto read = [](void* self, uint8_t* data, int size) {
        return static_cast<InputFile*>(self)->Read(data, size);
    };
    const auto seek = [](void* self, int64_t offset, int whence) {
        return static_cast<InputFile*>(self)->Seek(offset, whence);
    };
    io_ = av::NewIo(kBufferBytes, false, this, read, nullptr, regular ? +seek : nullptr);
}

int InputFile::Read(uint8_t* data, int size) {
    const auto most = static_cast<std::size_t>(std::clamp<int64_t>(end_ - place_, 0, size));
    for (;;) {
        std::array<pollfd, 2> sources{pollfd{file_.Number(), POLLIN, 0},
                                      pollfd{interruption_->Descriptor(), POLLIN, 0}};
        const bool waited = poll(sources.data(), sources.size(), -1) >= 0;
        if (interruption_->Interrupted())
            return AVERROR_EXIT;
        const ssize_t count = waited ? read(file_.Number(), data, most) : -1;
        place_ += std::max<ssize_t>(count, 0);
        if (count >= 0)
            return count == 0 ? AVERROR_EOF : static_cast<int>(count);
        if (errno != EINTR && errno != EAGAIN)
            return AVERROR(errno);
    }
}

int InputFile::ReadAt(int64_t offset, uint8_t* data, std::size_t size) const {
    return static_cast<int>(pread(file_.Number(), data, size, offset));
}

int64_t InputFile::Seek(int64_t offset, int whence) {
    if (whence == AVSEEK_SIZE)
        return size_;
    const off_t place = lseek(file_.Number(), offset, whence & ~AVSEEK_FORCE);
    if (place >= 0)
        place_ = place;
    return place < 0 ? AVERROR(errno) : place;
}

} // namespace movieconv
