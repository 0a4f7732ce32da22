// A file whose writes wait for room on a full disk.
#ifndef MOVIECONV_WRITER_PATIENTFILE_H
#define MOVIECONV_WRITER_PATIENTFILE_H

#include "writer/FileSystem.h"

#include <cstdint>
#include <functional>
#include <memory>

namespace writer {

class PatientFile final : public ByteFile {
public:
    /// Asked when the disk is full, with the bytes that it has not taken; true: try again.
    using FullDiskHandler = std::function<bool(int64_t)>;

    PatientFile(std::unique_ptr<ByteFile> file, FullDiskHandler onFull);

    int64_t Write(const uint8_t* data, int64_t size) override;
    int64_t Read(uint8_t* data, int64_t size) override { return file_->Read(data, size); }
    int64_t Seek(int64_t offset, int whence) override { return file_->Seek(offset, whence); }
    int64_t Truncate(int64_t size) override { return file_->Truncate(size); }
    int64_t Sync() override { return file_->Sync(); }

private:
    const std::unique_ptr<ByteFile> file_;
    const FullDiskHandler onFull_;
};

} // namespace writer

#endif
