// Finds out what a container does not tell reliably: how many pictures there are in a second, how long the
// movie is, the light of HDR. What it has to read for that, it reads again later: the reader is at its start
// afterwards.
#ifndef MOVIECONV_HOST_SOURCE_PROBE_H
#define MOVIECONV_HOST_SOURCE_PROBE_H

#include "host/source/PacketReader.h"
#include "host/source/SourceInfo.h"

namespace movieconv {

/// Fills in the chosen pictures' rates. Throws SourceError when the source cannot be read from its start
/// again.
void ProbeFrameRate(PacketReader& reader, SourceInfo& info);

/// Looks for the light that HDR pictures were made for in the first of them, where the container does not
/// tell. Throws SourceError likewise.
void ProbeLight(PacketReader& reader, SourceInfo& info);

/// Fills in the lengths of the movie and of the chosen streams, how certain they are, and what the container
/// promises. Throws SourceError likewise.
void ProbeLength(PacketReader& reader, SourceInfo& info);

} // namespace movieconv

#endif
