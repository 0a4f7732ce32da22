// A track of sound that goes into the file as it is coded.
#ifndef MOVIECONV_WRITER_SOUNDPACKETS_H
#define MOVIECONV_WRITER_SOUNDPACKETS_H

#include "writer/TrackStage.h"

#include <memory>

namespace writer {

/// A track whose packets are sound that the container carries; both outlive it. `isFirst`: the file is the
/// first one of the track. Throws WriterFailure (kWriterErrorCodec) when the container does not carry its
/// rate.
std::unique_ptr<TrackStage> MakeSoundPackets(const Track& track, const Container& container, bool isFirst);

} // namespace writer

#endif
