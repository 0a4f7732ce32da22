// Draws subtitles as they are to be seen at a time.
#ifndef MOVIECONV_HOST_SOURCE_CUEDRAWER_H
#define MOVIECONV_HOST_SOURCE_CUEDRAWER_H

#include "host/source/CueList.h"
#include "host/source/Overlay.h"
#include "host/source/SourceInfo.h"

#include <cstdint>
#include <limits>
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

    /// From when on something else may be to be seen than at `time`; `time` itself where something moves,
    /// kNever where nothing changes any more. What it gives depends on the time alone.
    virtual int64_t NextChange(int64_t time) = 0;

    static constexpr int64_t kNever = std::numeric_limits<int64_t>::max();
};

/// For pictures such as `pictures` tells, upright and cropped; positions are those in them. Fonts are for
/// texts. Throw SourceError; ScratchError without a folder for temporary files.
std::unique_ptr<CueDrawer> MakeTextDrawer(CueList list, const PictureStreamInfo& pictures,
                                          const std::vector<FontFile>& fonts);
std::unique_ptr<CueDrawer> MakeBitmapDrawer(CueList list, const PictureStreamInfo& pictures);

} // namespace movieconv

#endif
