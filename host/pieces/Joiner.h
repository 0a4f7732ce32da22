// Makes the output of a plan's pieces.
#ifndef MOVIECONV_HOST_PIECES_JOINER_H
#define MOVIECONV_HOST_PIECES_JOINER_H

#include "host/convert/Observer.h"
#include "host/pieces/Plan.h"

#include <functional>
#include <string>

namespace movieconv {

/// Checks every piece and joins them. `goesOn` is told the share done and may end it; the output's name is
/// not touched then. Throws Failure; the text names the pieces that do not belong there.
Verdict JoinPieces(const Plan& plan, const std::string& planPath, bool replace, Observer& observer,
                   const std::function<bool(double)>& goesOn);

} // namespace movieconv

#endif
