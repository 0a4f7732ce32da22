#include "writer/PatientFile.h"

#include <cerrno>
#include <utility>

namespace writer {

PatientFile::PatientFile(std::unique_ptr<ByteFile> file, FullDiskHandler onFull)
    : file_(std::move(file)), onFull_(std::move(onFull)) {}

int64_t PatientFile::Write(const uint8_t* data, int64_t size) {
    int64_t result;
    do {
        result = file_->Write(data, size);
    } while ((result == -ENOSPC || result == -EDQUOT) && onFull_(size));
    return result;
}

} // namespace writer
