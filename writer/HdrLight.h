// The light that HDR pictures were made for, as streams and containers tell it.
#ifndef MOVIECONV_WRITER_HDRLIGHT_H
#define MOVIECONV_WRITER_HDRLIGHT_H

#include "ffmpeg/AvHandles.h"
#include "writer/WriterStatus.h"

#include <optional>
#include <string>

namespace writer {

struct HdrLight {
    std::optional<WriterMasteringDisplay> display;
    int brightestPixel = 0; ///< cd/m2; 0: not known.
    int brightestPicture = 0;
};

/// What the options say of it; nothing when that is nothing.
std::optional<HdrLight> LightOf(const WriterOptions& options);

/// The display as x265 takes it, in units of 0.00002 and 0.0001 cd/m2.
std::string MasteringText(const WriterMasteringDisplay& display);

/// Makes the container tell it. Throws std::bad_alloc.
void AddLight(AVStream& stream, const HdrLight& light);

} // namespace writer

#endif
