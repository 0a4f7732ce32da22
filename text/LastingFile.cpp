#include "text/LastingFile.h"

#include "text/Descriptor.h"
#include "text/Path.h"
#include "text/WriteAll.h"

#include <cerrno>
#include <cstdio>

#include <fcntl.h>
#include <unistd.h>

namespace text {

bool ReplaceLastingly(const std::string& path, const std::string& making, std::string_view bytes,
                      mode_t mode) {
    unlink(making.c_str()); // of a process that was killed, or a link that somebody laid there
    Descriptor file(open(making.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, mode));
    if (file.Number() < 0)
        return false;
    if (WriteAll(file.Number(), bytes) && fsync(file.Number()) == 0 && file.Close() &&
        RenameLastingly(making, path))
        return true;
    const int error = errno;
    unlink(making.c_str());
    errno = error;
    return false;
}

bool RenameLastingly(const std::string& from, const std::string& to) {
    if (std::rename(from.c_str(), to.c_str()) != 0)
        return false;
    const Descriptor folder(open(FolderOf(to).c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    if (folder.Number() >= 0)
        fsync(folder.Number()); // some file systems cannot; the name is there all the same
    return true;
}

} // namespace text
