// Files beside the output, the preview and the log: what may be replaced, and that nothing else is.
#ifndef MOVIECONV_HOST_TERMINAL_SIDEFILE_H
#define MOVIECONV_HOST_TERMINAL_SIDEFILE_H

#include <optional>
#include <string>
#include <string_view>
#include <sys/types.h>

namespace movieconv {

/// A file, whatever its name.
struct FileId {
    dev_t device;
    ino_t inode;
    bool operator==(const FileId&) const = default;
};

/// What stands under a name.
struct SideFile {
    enum class Kind { kMissing, kOurs, kForeign, kLink, kNoFile };
    Kind kind;
    FileId id; ///< Of a regular file.
};

/// Looks at `path` without following a link and without opening anything but a regular file. Ours is what has
/// `mark` at `offset`, and what is empty. Throws std::system_error when it cannot be looked at.
SideFile LookAtSideFile(const std::string& path, std::string_view mark, off_t offset);

/// Likewise for a file that is open for reading.
SideFile LookAtSideFile(int descriptor, std::string_view mark, off_t offset);

/// Throws Failure when `file`, which `option` names, is not to be written to: a link, a device, or, without
/// `overwrite`, a file that is not ours. `what` says what ours would be.
void RequireWritable(const SideFile& file, const char* option, const std::string& path, const char* what,
                     bool overwrite);

/// Gives the file `temporary` the name `path`, where the file `expected` stands, or nothing. Whatever else
/// stands there by now stays. 0, EEXIST in that case, or another errno value.
int ReplaceExpected(const std::string& temporary, const std::string& path,
                    const std::optional<FileId>& expected);

} // namespace movieconv

#endif
