// Draws subtitles as they are to be seen at a time.
#ifndef MOVIECONV_HOST_SOURCE_CUEDRAWER_H
#define MOVIECONV_HOST_SOURCE_CUEDRAWER_H

#include "host/source/CueList.h"
#include "host/source/Overlay.h"
#include "host/source/SourceInfo.h"

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

namespace movieconv {

/// A typeface's file, as it is attached to a movie.
using FontFile = std::vector<uint8_t>;

/// For one thread; times rise.
class CueDrawer {
public:
    CueDrawer() = default;
    CueDrawer(const CueDrawer&) = delete;
    CueDrawer& operator=(const CueDrawer&) = delete;
    virtual ~CueDrawer() = default;

    /// Whether what is to be seen at `time` (media time) differs from what was drawn last; at first: from
    /// nothing.
    virtual bool Changes(int64_t time) = 0;

    /// That. Throws SourceError.
    virtual Canvas Draw(int64_t time) = 0;
};

/// For pictures such as `pictures` tells, upright and cropped; positions are those in them. Fonts are for
/// texts. Throw SourceError; ScratchError without a folder for temporary files.
std::unique_ptr<CueDrawer> MakeTextDrawer(CueList list, const PictureStreamInfo& pictures,
                                          const std::vector<FontFile>& fonts);
std::unique_ptr<CueDrawer> MakeBitmapDrawer(CueList list, const PictureStreamInfo& pictures);

} // namespace movieconv

#endif
