// Tracks of packets beside the engine's: sound and subtitles as they are, and subtitles of text in the
// container's form.
#ifndef MOVIECONV_WRITER_PACKETTRACKS_H
#define MOVIECONV_WRITER_PACKETTRACKS_H

#include "writer/BesideStage.h"

#include <memory>

namespace writer {

/// A track of packets for the container, which carries them. `isFirst`: the file is the first one of the
/// track. Throws WriterFailure (kWriterErrorCodec) when what they hold cannot be converted or carried.
std::unique_ptr<BesideTrack> MakePacketTrack(const Track& track, const Container& container, bool isFirst);

} // namespace writer

#endif
