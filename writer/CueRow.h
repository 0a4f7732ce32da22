// Puts cues that may overlap into a row in which one follows the other, for forms that show one text at a
// time.
#ifndef MOVIECONV_WRITER_CUEROW_H
#define MOVIECONV_WRITER_CUEROW_H

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

namespace writer {

/// Times are in any unit.
class CueRow {
public:
    /// Takes the next stretch with the texts that are shown in it, in the order in which they began.
    using Taker = std::function<void(int64_t begin, int64_t end, const std::vector<std::string>& texts)>;

    explicit CueRow(Taker take) : take_(std::move(take)) {}

    /// Cues come by their begins. One that begins before what was handed out already begins there; one
    /// without a length is left out.
    void Add(int64_t begin, int64_t end, std::string text);

    /// No cue begins before `time` any more.
    void Reach(int64_t time);

    /// No cue comes any more.
    void Finish();

private:
    struct Cue {
        int64_t end;
        std::string text;
    };

    void HandOut(int64_t end);

    const Taker take_;
    int64_t position_ = 0; // up to which all has been handed out
    std::vector<Cue> shown_;
};

} // namespace writer

#endif
