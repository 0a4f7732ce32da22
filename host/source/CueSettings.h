// What Matroska has beside the text of a WebVTT cue.
#ifndef MOVIECONV_HOST_SOURCE_CUESETTINGS_H
#define MOVIECONV_HOST_SOURCE_CUESETTINGS_H

extern "C" {
#include <libavcodec/avcodec.h>
}

namespace movieconv {

/// Gives a cue the place and the name that Matroska keeps in an addition to its block, in the form that
/// FFmpeg's multiplexers and decoders take: side data of its own for each. A packet without such an addition
/// stays as it is.
void TakeCueSettings(AVPacket& packet);

} // namespace movieconv

#endif
