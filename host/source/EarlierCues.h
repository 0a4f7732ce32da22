// Subtitles that begin before the part of a movie that is converted, and may be shown into it.
#ifndef MOVIECONV_HOST_SOURCE_EARLIERCUES_H
#define MOVIECONV_HOST_SOURCE_EARLIERCUES_H

#include "host/source/MovieReader.h"

#include <cstdint>
#include <map>
#include <vector>

namespace movieconv {

/// Their packets by stream, those that begin within a minute before `begin` (media time). Where pictures can
/// be decoded from, containers give none of them. `main` is the stream that tells how far reading is, `file`
/// has just been opened. Empty when it cannot be sought.
std::map<int, std::vector<av::Packet>> ReadEarlierCues(MovieReader& file, int main, std::vector<int> streams,
                                                       int64_t begin);

} // namespace movieconv

#endif
