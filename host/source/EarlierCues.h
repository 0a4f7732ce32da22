// Subtitles that begin before the part of a movie that is converted, and may be shown into it.
#ifndef MOVIECONV_HOST_SOURCE_EARLIERCUES_H
#define MOVIECONV_HOST_SOURCE_EARLIERCUES_H

#include "host/sentence/Sentence.h"
#include "host/source/PacketReader.h"

#include <cstdint>
#include <map>
#include <vector>

namespace movieconv {

/// Since when they have to have begun to be found (media time): all, as far as reading them takes seconds,
/// those of the last minute in any case.
int64_t EarliestCueFor(const PacketReader& file, int64_t begin);

/// Tells what was not looked for; empty where `earliest` is the source's start.
Sentence TellEarliestCue(int64_t earliest, int64_t begin);

/// Goes to where all that begins at `earliest` or later is still to be read; stays where it is for the
/// source's start. False when the source cannot be sought there: where it is then is not known.
bool SeekToCues(PacketReader& file, int64_t earliest);

struct EarlierCues {
    std::map<int, std::vector<av::Packet>> packets; ///< By stream.
    int64_t earliest = 0;                           ///< See EarliestCueFor.
};

/// Where pictures can be decoded from, containers give none of them. `main` is the stream that tells how far
/// reading is, `file` has just been opened. None when it cannot be sought.
EarlierCues ReadEarlierCues(PacketReader& file, int main, std::vector<int> streams, int64_t begin);

} // namespace movieconv

#endif
