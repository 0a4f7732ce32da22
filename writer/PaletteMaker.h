// Gives a picture the 256 colours that suit it best.
#ifndef MOVIECONV_WRITER_PALETTEMAKER_H
#define MOVIECONV_WRITER_PALETTEMAKER_H

#include "ffmpeg/AvHandles.h"

namespace writer {

/// The format of the pictures that a palette is made for.
constexpr AVPixelFormat kPaletteSource = AV_PIX_FMT_BGRA;

/// Every picture has a palette of its own, so that none waits for the rest of the movie. Not thread-safe.
class PaletteMaker {
public:
    /// The picture with a palette, ordered dither between its colours. Throws WriterFailure
    /// (kWriterErrorEncode) or std::bad_alloc.
    av::Frame Convert(av::Frame picture);

private:
    av::Frame last_; ///< The picture that came last,
    av::Frame made_; ///< and what it became: stills are common.
};

} // namespace writer

#endif
