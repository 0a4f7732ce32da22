#include "host/pieces/FileBirth.h"

#include <fcntl.h>
#include <fmt/format.h>
#include <sys/stat.h>

namespace movieconv {

std::string BirthOf(const std::string& path) {
    struct statx status {};
    if (statx(AT_FDCWD, path.c_str(), 0, STATX_INO | STATX_BTIME, &status) != 0)
        return {};
    return (status.stx_mask & STATX_BTIME) != 0
               ? fmt::format("{}.{}.{}", status.stx_ino, status.stx_btime.tv_sec, status.stx_btime.tv_nsec)
               : fmt::format("{}", status.stx_ino);
}

std::string BirthOf(const std::string& temporary, const std::string& path) {
    std::string birth = BirthOf(temporary);
    return birth.empty() ? BirthOf(path) : birth;
}

} // namespace movieconv
