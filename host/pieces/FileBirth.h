// Files that are known again.
#ifndef MOVIECONV_HOST_PIECES_FILEBIRTH_H
#define MOVIECONV_HOST_PIECES_FILEBIRTH_H

#include <string>

namespace movieconv {

/// By which a file is known again in its file system after it was renamed or written to: its number, and when
/// it was made where that is told. Empty when there is none.
std::string BirthOf(const std::string& path);

/// Likewise, of an output that is called `temporary` until it is complete, and `path` from then on.
std::string BirthOf(const std::string& temporary, const std::string& path);

} // namespace movieconv

#endif
