// What a path says without a look at the disk.
#ifndef MOVIECONV_TEXT_PATH_H
#define MOVIECONV_TEXT_PATH_H

#include <string>

namespace text {

/// The folder of a path, "." for a plain name.
inline std::string FolderOf(const std::string& path) {
    const std::size_t slash = path.rfind('/');
    if (slash == std::string::npos)
        return ".";
    return slash == 0 ? "/" : path.substr(0, slash);
}

/// The name in a path, without its folder.
inline std::string NameOf(const std::string& path) {
    return path.substr(path.rfind('/') + 1);
}

} // namespace text

#endif
