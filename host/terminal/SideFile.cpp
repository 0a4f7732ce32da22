#include "host/terminal/SideFile.h"

#include "host/convert/Failure.h"
#include "text/Descriptor.h"
#include "text/LastingFile.h"

#include <cerrno>
#include <cstdio>
#include <fcntl.h>
#include <fmt/format.h>
#include <sys/stat.h>
#include <system_error>
#include <unistd.h>

namespace movieconv {
namespace {

std::optional<FileId> IdOf(const std::string& path) {
    struct stat status {};
    if (lstat(path.c_str(), &status) != 0)
        return std::nullopt;
    return FileId{status.st_dev, status.st_ino};
}

/// For file systems that know no conditional renaming: looking must do.
int RenameExpected(const std::string& temporary, const std::string& path, const FileId& expected) {
    const std::optional<FileId> found = IdOf(path);
    if (found && found != expected)
        return EEXIST;
    return std::rename(temporary.c_str(), path.c_str()) == 0 ? 0 : errno;
}

int Exchange(const std::string& a, const std::string& b) {
    return renameat2(AT_FDCWD, a.c_str(), AT_FDCWD, b.c_str(), RENAME_EXCHANGE) == 0 ? 0 : errno;
}

} // namespace

SideFile LookAtSideFile(int descriptor, std::string_view mark, off_t offset) {
    struct stat status {};
    if (fstat(descriptor, &status) != 0)
        throw std::system_error(errno, std::generic_category());
    if (!S_ISREG(status.st_mode))
        return {SideFile::Kind::kNoFile, {}};
    std::string found(mark.size(), '\0');
    const bool ours = status.st_size == 0 || (pread(descriptor, found.data(), found.size(), offset) ==
                                                  static_cast<ssize_t>(found.size()) &&
                                              found == mark);
    return {ours ? SideFile::Kind::kOurs : SideFile::Kind::kForeign, {status.st_dev, status.st_ino}};
}

SideFile LookAtSideFile(const std::string& path, std::string_view mark, off_t offset) {
    struct stat status {};
    if (lstat(path.c_str(), &status) != 0)
        return {SideFile::Kind::kMissing, {}};
    if (S_ISLNK(status.st_mode))
        return {SideFile::Kind::kLink, {}};
    if (!S_ISREG(status.st_mode)) // opening a device may already do something to it
        return {SideFile::Kind::kNoFile, {}};
    const text::Descriptor file(
        open(path.c_str(), O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_NOCTTY | O_CLOEXEC));
    if (file.Number() < 0)
        throw std::system_error(errno, std::generic_category());
    return LookAtSideFile(file.Number(), mark, offset);
}

void RequireWritable(const SideFile& file, const char* option, const std::string& path, const char* what,
                     bool overwrite) {
    const auto refuse = [&](const std::string& reason) {
        throw Failure(Category::kOutput, fmt::format("{} \"{}\" is {}", option, path, reason));
    };
    switch (file.kind) {
    case SideFile::Kind::kLink:
        refuse("a symbolic link; name the file itself");
        break;
    case SideFile::Kind::kNoFile:
        refuse("a folder, a device or a pipe; name a file");
        break;
    case SideFile::Kind::kForeign:
        if (!overwrite)
            refuse(fmt::format("a file but not {}; use another name or --overwrite", what));
        break;
    case SideFile::Kind::kMissing:
    case SideFile::Kind::kOurs:
        break;
    }
}

int ReplaceExpected(const std::string& temporary, const std::string& path,
                    const std::optional<FileId>& expected) {
    if (!expected)
        return text::RenameToMissing(temporary, path);
    const int error = Exchange(temporary, path);
    if (error == ENOENT)
        return text::RenameToMissing(temporary, path);
    if (error == EINVAL || error == ENOSYS)
        return RenameExpected(temporary, path, *expected);
    if (error != 0)
        return error;
    if (IdOf(temporary) == expected)
        return unlink(temporary.c_str()) == 0 ? 0 : errno;
    const int undone = Exchange(temporary, path);
    return undone == 0 ? EEXIST : undone;
}

} // namespace movieconv
