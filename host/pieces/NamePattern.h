// What outputs of many movies are called.
#ifndef MOVIECONV_HOST_PIECES_NAMEPATTERN_H
#define MOVIECONV_HOST_PIECES_NAMEPATTERN_H

#include <string>

namespace movieconv {

/// The file name that `pattern` makes for a movie, with words in braces replaced: {name} by the input's name
/// without its extension, {from} by that extension, {folder} by the name of the folder that the input lies
/// in, {ext} by `extension`. Throws Failure (kRequest) for any other word in braces.
std::string NameAfter(const std::string& pattern, const std::string& input, const std::string& extension);

} // namespace movieconv

#endif
