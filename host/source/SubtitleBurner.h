// Draws subtitles into pictures.
#ifndef MOVIECONV_HOST_SOURCE_SUBTITLEBURNER_H
#define MOVIECONV_HOST_SOURCE_SUBTITLEBURNER_H

#include "host/sentence/Sentence.h"
#include "host/source/BurnWish.h"
#include "host/source/CueDrawer.h"
#include "host/source/CueList.h"
#include "host/source/Overlay.h"
#include "host/source/PictureRange.h"
#include "host/source/Source.h"
#include "host/source/StampRepair.h"

#include <cstdint>
#include <memory>
#include <vector>

namespace movieconv {

class SubtitleBurner {
public:
    /// Reads the subtitles that `choice` wants in the pictures. Throws TrackError when there are none such.
    SubtitleBurner(const Source& source, const SourceChoice& choice);

    /// Draws what is to be seen at `time` (media time) into a picture as PictureConverter gives it. Times
    /// rise. Throws SourceError.
    void Draw(AVFrame& picture, int64_t time);

    /// As CueDrawer's.
    int64_t NextChange(int64_t time) { return drawer_->NextChange(time); }

    /// When the first of those began that are still shown at `time`; `time` where there is none.
    int64_t ShownSince(int64_t time) const;

    /// What was not looked for; empty where all was.
    const Sentence& Unread() const { return unread_; }

private:
    const OverlayColours colours_;
    std::vector<CueList::Span> spans_;
    Sentence unread_;
    std::unique_ptr<CueDrawer> drawer_;
    Overlay overlay_;
};

/// The next part of a picture's stay, into all of which `burner`, if there is one, draws the same.
inline StampRepair::Stamp TakePart(PictureStay& stay, SubtitleBurner* burner) {
    return stay.Take(burner != nullptr ? burner->NextChange(stay.Time()) : CueDrawer::kNever);
}

} // namespace movieconv

#endif
