// The files that pieces are kept in: their names, and the seal at their end by which they are recognised.
//
// The seal stands in the same file, so that a piece and what vouches for it get their name in one step:
//
//     MCSEAL1 / hash of the plan / number of the piece / bytes before the seal / SHA-256 of all that
#ifndef MOVIECONV_HOST_PIECES_PIECEFILE_H
#define MOVIECONV_HOST_PIECES_PIECEFILE_H

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

/// Throws Failure when something that is no piece, or that `request` reads, has the place of a piece of a
/// plan of that name: of this one, or of any.
void RequirePlaces(const std::string& planPath, const Request& request, std::optional<int> only);

/// How many pieces stand beside a plan's name, whosever they are.
int CountPieces(const std::string& planPath);

/// Removes all pieces beside the plan, and what was in the making; nothing else whatever it is called, and
/// nothing that `request` reads.
void RemovePieces(const std::string& planPath, const Request& request);

} // namespace movieconv

#endif
