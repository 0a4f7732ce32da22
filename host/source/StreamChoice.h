// Which of a movie's streams are converted.
#ifndef MOVIECONV_HOST_SOURCE_STREAMCHOICE_H
#define MOVIECONV_HOST_SOURCE_STREAMCHOICE_H

#include "host/source/SourceInfo.h"

#include <vector>

namespace movieconv {

/// Stream numbers, -1 for none.
struct ChosenStreams {
    int pictures = -1;
    int sound = -1;
};

/// The numbers of the streams of that kind that are wanted. Throws TrackError when one that is asked for is
/// not there.
std::vector<int> WantedTracks(const std::vector<StreamInfo>& streams, StreamKind kind,
                              const TrackList& wanted);

/// Whether the stream belongs to one of these programmes of a broadcast, or there are none.
bool BelongsTo(const std::vector<int>& programs, const StreamInfo& stream);

/// The pictures are those marked as default, of several the largest, of several the first. The sound belongs
/// to the same broadcast programme, is no commentary and not made for people who see or hear little, if there
/// is another; then as for pictures, with channels for size. Only what can be decoded.
ChosenStreams ChooseStreams(const std::vector<StreamInfo>& streams, const SourceChoice& choice);

} // namespace movieconv

#endif
