// Which pictures lose their comb.
#ifndef MOVIECONV_HOST_SOURCE_DEINTERLACE_H
#define MOVIECONV_HOST_SOURCE_DEINTERLACE_H

namespace movieconv {

/// Those that say they are interlaced, all, or none. Each stays one picture.
enum class Deinterlace { kFlagged, kAll, kNone };

} // namespace movieconv

#endif
