// The seal at the end of a piece's file, by which it is recognised: in the same file, so that a piece and
// what vouches for it get their name in one step.
//
//     MCSEAL1 / hash of the plan / number of the piece / bytes before the seal / SHA-256 of all that
#ifndef MOVIECONV_HOST_PIECES_PIECESEAL_H
#define MOVIECONV_HOST_PIECES_PIECESEAL_H

#include "host/pieces/Plan.h"

#include <cstdint>
#include <functional>
#include <optional>
#include <string>

namespace movieconv {

/// Seals a written file as a piece of the plan and gives it the piece's name, lastingly. The bytes in it.
/// Throws Failure, and the file is gone then.
int64_t SealPiece(const std::string& file, const Plan& plan, const std::string& planPath, int number);

/// What keeps a file from being that piece of the plan, a clause that begins with its name; empty when it is.
/// Reads all of it, and asks `goesOn` again and again meanwhile, which may have it wait; nothing once that is
/// false.
std::optional<std::string> FaultOf(const Plan& plan, const std::string& planPath, int number,
                                   const std::function<bool()>& goesOn);

} // namespace movieconv

#endif
