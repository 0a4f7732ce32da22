// What files are known by.
#ifndef MOVIECONV_HOST_PIECES_SOURCEMARK_H
#define MOVIECONV_HOST_PIECES_SOURCEMARK_H

#include "host/convert/Request.h"

#include <cstdint>
#include <string>
#include <vector>

namespace movieconv {

/// What tells whether a file is still the one that was looked at.
struct SourceMark {
    std::string path; ///< Absolute.
    int64_t bytes = 0;
    int64_t modified = 0; ///< Nanoseconds since 1970.
    std::string head;     ///< SHA-256 of its first 64 KiB,
    std::string tail;     ///< and of its last.
    bool operator==(const SourceMark&) const = default;
};

/// An absolute path without detours to the same file, wherever the program runs.
std::string AbsolutePath(const std::string& path);

/// Looks at a file. Throws Failure when it cannot be read, or not twice.
SourceMark MarkOf(const std::string& path);

/// Looks at the files of subtitles that a request names, and lets it name them from anywhere. Throws Failure.
std::vector<SourceMark> MarkTexts(Request& request);

} // namespace movieconv

#endif
