// Divides a conversion into pieces.
#ifndef MOVIECONV_HOST_PIECES_PLANNER_H
#define MOVIECONV_HOST_PIECES_PLANNER_H

#include "host/pieces/Plan.h"

#include <functional>
#include <optional>
#include <string>

namespace movieconv {

/// The plan of a request, a conversion of one file with pictures, as far as the source's stamps are not
/// needed. Throws Failure when that is impossible.
Plan BeginPlan(const Request& request, const Division& division);

/// Completes it: reads the source's stamps and divides it. `stopped` is asked now and then. Throws Failure
/// when that is impossible; nothing when it was stopped.
std::optional<Plan> MakePlan(Plan plan, const std::function<bool()>& stopped);

/// What pieces cost where the pictures have a bit rate, a sentence; empty where they do not.
std::string TellBitRate(const Plan& plan);

} // namespace movieconv

#endif
