// Tracks of packets beside the engine's: copied as they are, and subtitles of text in the container's form.
#ifndef MOVIECONV_WRITER_PACKETTRACKS_H
#define MOVIECONV_WRITER_PACKETTRACKS_H

#include "writer/BesideStage.h"

#include <memory>

namespace writer {

/// A track of packets for the container, which carries them. Throws WriterFailure (kWriterErrorCodec) when
/// what they hold cannot be converted.
std::unique_ptr<BesideTrack> MakePacketTrack(const Track& track, const Container& container);

} // namespace writer

#endif
