// The texts of a track of subtitles as one script in the ASS format, which libass draws.
#ifndef MOVIECONV_HOST_SOURCE_TEXTSCRIPT_H
#define MOVIECONV_HOST_SOURCE_TEXTSCRIPT_H

#include "host/source/CueList.h"
#include "host/source/MediaTime.h"

#include <cstdint>
#include <set>
#include <string>
#include <vector>

namespace movieconv {

constexpr int64_t kHundredth = kTicksPerSecond / 100; ///< The unit of the times in a script, in ticks.

struct TextEvent {
    int64_t begin; ///< Hundredths.
    int64_t end;
    std::string line; ///< "Layer,Style,Name,MarginL,MarginR,MarginV,Effect,Text" with the times left out.
    bool moves;       ///< Is not the same at all times.
};

class TextScript {
public:
    /// Throws TrackError.
    explicit TextScript(const CueList& list);

    /// In the order of their begins.
    const std::vector<TextEvent>& Events() const { return events_; }

    /// When those of `seen` began and those on which their places depend (hundredths, rising): libass stacks
    /// a text upon what is seen as it appears, and leaves it there.
    std::set<int64_t> BeginsThatPlace(std::vector<const TextEvent*> seen) const;

    /// What stands in the script's file.
    std::string Text() const;

private:
    void Decode(AVCodecContext* decoder, const CueList::Cue& cue);
    void Add(const CueList::Cue& cue, const std::string& coded);
    void LastUpToNext();

    std::string header_;
    std::vector<TextEvent> events_;
};

} // namespace movieconv

#endif
