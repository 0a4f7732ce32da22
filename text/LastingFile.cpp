#include "text/LastingFile.h"

#include "text/Descriptor.h"
#include "text/Path.h"
#include "text/WriteAll.h"

#include <cerrno>
#include <cstdio>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace text {

namespace {

/// Some file systems cannot; the name is there all the same.
void SyncFolderOf(const std::string& path) {
    const Descriptor folder(open(FolderOf(path).c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    if (folder.Number() >= 0)
        fsync(folder.Number());
}

bool AddNameLastingly(const std::string& from, const std::string& to) {
    errno = RenameToMissing(from, to);
    if (errno != 0)
        return false;
    SyncFolderOf(to);
    return true;
}

bool WriteLastingly(const std::string& path, const std::string& making, std::string_view bytes, mode_t mode,
                    bool (*giveName)(const std::string&, const std::string&)) {
    unlink(making.c_str()); // of a process that was killed, or a link that somebody laid there
    Descriptor file(open(making.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, mode));
    if (file.Number() < 0)
        return false;
    if (WriteAll(file.Number(), bytes) && fsync(file.Number()) == 0 && file.Close() && giveName(making, path))
        return true;
    const int error = errno;
    unlink(making.c_str());
    errno = error;
    return false;
}

} // namespace

bool ReplaceLastingly(const std::string& path, const std::string& making, std::string_view bytes,
                      mode_t mode) {
    return WriteLastingly(path, making, bytes, mode, RenameLastingly);
}

bool AddLastingly(const std::string& path, const std::string& making, std::string_view bytes, mode_t mode) {
    return WriteLastingly(path, making, bytes, mode, AddNameLastingly);
}

int RenameToMissing(const std::string& from, const std::string& to) {
    if (renameat2(AT_FDCWD, from.c_str(), AT_FDCWD, to.c_str(), RENAME_NOREPLACE) == 0)
        return 0;
    if (errno != EINVAL && errno != ENOSYS)
        return errno;
    // File systems without that operation have hard links; where there are none either, looking must do.
    if (link(from.c_str(), to.c_str()) == 0) {
        unlink(from.c_str()); // it has its name, whether the first one goes or not
        return 0;
    }
    if (errno != EPERM && errno != ENOSYS && errno != EOPNOTSUPP)
        return errno;
    struct stat found {};
    if (lstat(to.c_str(), &found) == 0)
        return EEXIST;
    return std::rename(from.c_str(), to.c_str()) == 0 ? 0 : errno;
}

bool RenameLastingly(const std::string& from, const std::string& to) {
    if (std::rename(from.c_str(), to.c_str()) != 0)
        return false;
    SyncFolderOf(to);
    return true;
}

} // namespace text
