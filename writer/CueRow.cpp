#include "writer/CueRow.h"

#include <algorithm>
#include <limits>
#include <utility>

namespace writer {

void CueRow::Add(int64_t begin, int64_t end, std::string text) {
    begin = std::max(begin, position_);
    if (end <= begin)
        return;
    Reach(begin);
    if (!shown_.empty() && begin > position_)
        HandOut(begin);
    position_ = begin;
    shown_.push_back({end, std::move(text)});
}

void CueRow::Reach(int64_t time) {
    while (!shown_.empty()) {
        const int64_t end =
            std::min_element(shown_.begin(), shown_.end(), [](const Cue& one, const Cue& other) {
                return one.end < other.end;
            })->end;
        if (end > time)
            return;
        HandOut(end);
    }
}

void CueRow::Finish() {
    Reach(std::numeric_limits<int64_t>::max());
}

/// What is shown up to `end`; what ends there is shown no longer.
void CueRow::HandOut(int64_t end) {
    std::vector<std::string> texts;
    for (const Cue& cue : shown_)
        texts.push_back(cue.text);
    take_(position_, end, texts);
    position_ = end;
    shown_.erase(
        std::remove_if(shown_.begin(), shown_.end(), [end](const Cue& cue) { return cue.end <= end; }),
        shown_.end());
}

} // namespace writer
