// Tracks of subtitles: as they are, or those of text in the container's form.
#ifndef MOVIECONV_WRITER_CUETRACKS_H
#define MOVIECONV_WRITER_CUETRACKS_H

#include "writer/TrackStage.h"

#include <memory>

namespace writer {

/// A track whose packets are subtitles that the container carries in some form; both outlive it. Throws
/// WriterFailure (kWriterErrorCodec) when they cannot be converted.
std::unique_ptr<TrackStage> MakeCueTrack(const Track& track, const Container& container);

} // namespace writer

#endif
