// Plans as files.
#ifndef MOVIECONV_HOST_PIECES_PLANTEXT_H
#define MOVIECONV_HOST_PIECES_PLANTEXT_H

#include "host/pieces/Plan.h"

#include <filesystem>
#include <string>

namespace movieconv {

/// Reads a plan. Throws Failure when there is none of that name, or it is not as it was written.
Plan ReadPlan(const std::string& path);

/// Writes it in one step, and to the disk; sets its hash. False when something stands there that it may not
/// replace. Throws Failure.
bool WritePlan(const std::string& path, Plan& plan, bool replace);

/// Whether a file is what WritePlan left of a plan of that name when it was killed.
bool IsPlanInTheMaking(const std::filesystem::path& file, const std::string& path);

/// What differs, in words; empty when nothing does. `now` need not be divided yet.
std::string Difference(const Plan& before, const Plan& now);

} // namespace movieconv

#endif
