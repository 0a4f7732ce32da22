// Whether what a plan was made of and with is still the same.
#ifndef MOVIECONV_HOST_PIECES_PLANCHECKS_H
#define MOVIECONV_HOST_PIECES_PLANCHECKS_H

#include "host/pieces/Plan.h"

#include <map>
#include <string>

namespace movieconv {

/// Of the program and of the libraries that decide what is in a piece, by name.
std::map<std::string, std::string> CurrentVersions();

/// Throws Failure that says what differs when the source, a file of subtitles or this program is not the one
/// that was planned with.
void CheckAgainst(const Plan& plan);

} // namespace movieconv

#endif
