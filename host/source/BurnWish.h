// Subtitles that are to be drawn into the pictures.
#ifndef MOVIECONV_HOST_SOURCE_BURNWISH_H
#define MOVIECONV_HOST_SOURCE_BURNWISH_H

#include <cstdint>
#include <limits>
#include <optional>
#include <string>

namespace movieconv {

struct BurnWish {
    std::string what;    ///< The number of a stream as SourceInfo has it, or else a file's path.
    std::string charset; ///< Of a file; empty: it is looked at.
    int64_t begin = 0;   ///< Media time between which pictures are converted.
    int64_t end = std::numeric_limits<int64_t>::max();
    std::optional<int64_t> earliest{}; ///< Where the first one begins that is shown at the begin, if known.
};

/// Whether it names a stream of the source.
bool NamesStream(const BurnWish& wish);

} // namespace movieconv

#endif
