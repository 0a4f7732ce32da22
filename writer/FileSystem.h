// The files that the writer makes, and the few things it asks of a file system. Names are opened here, so
// that they are never taken for a protocol, and tests can put a failing disk behind the same interface.
#ifndef MOVIECONV_WRITER_FILESYSTEM_H
#define MOVIECONV_WRITER_FILESYSTEM_H

#include <cstdint>
#include <memory>
#include <string>

namespace writer {

/// One open file. Results below 0 are negated errno values.
class ByteFile {
public:
    ByteFile() = default;
    ByteFile(const ByteFile&) = delete;
    ByteFile& operator=(const ByteFile&) = delete;
    virtual ~ByteFile() = default;

    /// Bytes written, at least 1 and possibly fewer than `size`.
    virtual int64_t Write(const uint8_t* data, int64_t size) = 0;
    /// Bytes read, 0 at the end.
    virtual int64_t Read(uint8_t* data, int64_t size) = 0;
    /// The new position.
    virtual int64_t Seek(int64_t offset, int whence) = 0;
    virtual int64_t Truncate(int64_t size) = 0;
    /// Returns once the data has reached the disk.
    virtual int64_t Sync() = 0;
};

/// Results are 0 or errno values.
class FileSystem {
public:
    FileSystem() = default;
    FileSystem(const FileSystem&) = delete;
    FileSystem& operator=(const FileSystem&) = delete;
    virtual ~FileSystem() = default;

    /// Creates a file for writing and reading; EEXIST when there is one of that name. Null with `error` set
    /// on failure. It has the permissions of the file named `like`, where that exists, and its owner and
    /// group as far as that is permitted.
    virtual std::unique_ptr<ByteFile> Create(const std::string& path, const std::string& like,
                                             int& error) = 0;
    /// Gives `from` the name `to`, in one step; EEXIST when `to` exists and must not be replaced.
    virtual int Rename(const std::string& from, const std::string& to, bool replace) = 0;
    virtual int Remove(const std::string& path) = 0;
    /// Whether there is certainly no file of that name. Allocates nothing.
    virtual bool IsMissing(const std::string& path) = 0;
    /// Makes a rename in the folder of `path` last.
    virtual int SyncFolder(const std::string& path) = 0;
};

/// The machine's own.
FileSystem& SystemFiles();

/// What stands in the way of writing to `path`: 0, EEXIST for a regular file, EISDIR, or EINVAL for anything
/// else that is not a regular file. Links are followed.
int CheckTarget(const std::string& path);

/// Where the data of `path` really goes: links are followed, so that they stay links. Throws std::bad_alloc.
std::string ResolveTarget(const std::string& path);

/// Creates a file beside `target`, which it is to replace: its name is that of the target with PartialSuffix,
/// cut where a name would be longer than file systems allow. Null with `error` set on failure, which a target
/// is whose own name is too long.
std::unique_ptr<ByteFile> CreateBeside(FileSystem& files, const std::string& target, std::string& path,
                                       int& error);

} // namespace writer

#endif
