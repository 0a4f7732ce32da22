// What is wanted of a movie's tracks and texts.
#ifndef MOVIECONV_HOST_SOURCE_TRACKWISHES_H
#define MOVIECONV_HOST_SOURCE_TRACKWISHES_H

#include <optional>
#include <string>
#include <vector>

namespace movieconv {

struct Tag {
    std::string key; ///< As FFmpeg calls it, "title"; others as the container has them.
    std::string value;
};

/// Which streams of a kind are wanted: by their numbers, or by their languages; nothing: all of them.
using TrackList = std::optional<std::vector<std::string>>;

} // namespace movieconv

#endif
