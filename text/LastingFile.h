// Files that are there whole or not at all, also after a power cut.
#ifndef MOVIECONV_TEXT_LASTINGFILE_H
#define MOVIECONV_TEXT_LASTINGFILE_H

#include <string>
#include <string_view>

#include <sys/types.h>

namespace text {

/// Writes it as `making`, a name in the same folder that nobody else uses, and gives it its name; what stood
/// under either is replaced. `mode`: of the file, but for the mask of the process. False with errno set when
/// that fails; then nothing is left of it.
bool ReplaceLastingly(const std::string& path, const std::string& making, std::string_view bytes,
                      mode_t mode);

/// Likewise, but with errno EEXIST where the name is taken.
bool AddLastingly(const std::string& path, const std::string& making, std::string_view bytes, mode_t mode);

/// Gives a file another name, in one step where the file system can; EEXIST where that is taken. 0 or an
/// errno value. Allocates nothing.
int RenameToMissing(const std::string& from, const std::string& to);

/// Gives a synced file its name. False, with errno set, when that fails.
bool RenameLastingly(const std::string& from, const std::string& to);

} // namespace text

#endif
