// Makes the output of a plan's pieces.
#ifndef MOVIECONV_HOST_PIECES_JOINER_H
#define MOVIECONV_HOST_PIECES_JOINER_H

#include "host/convert/Bell.h"
#include "host/convert/Observer.h"
#include "host/pieces/Plan.h"

#include <cstdint>
#include <functional>
#include <string>

namespace movieconv {

/// What the output may do to others.
struct JoinOrder {
    bool replace = false; ///< It may replace a file.
    OnFull onFull = OnFull::kStop;
};

/// How far it is.
struct Joining {
    double share = 0;     ///< Done, of checking and writing.
    int64_t waitsFor = 0; ///< Bytes of room that it waits for on a full disk.
};

enum class Going { kOn, kPaused, kEnds };

/// Checks every piece and joins them. `follow` is told of it on this thread, again and again and whenever
/// `bell` is rung, and may have it wait, until the bell is rung, or end it; the output's name is not touched
/// then. Throws Failure; the text names the pieces that do not belong there.
Verdict JoinPieces(const Plan& plan, const std::string& planPath, const JoinOrder& order, Observer& observer,
                   Bell& bell, const std::function<Going(const Joining&)>& follow);

} // namespace movieconv

#endif
