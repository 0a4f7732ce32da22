// The files of pieces beside their plan, by their names.
#ifndef MOVIECONV_HOST_PIECES_PIECEPLACES_H
#define MOVIECONV_HOST_PIECES_PIECEPLACES_H

#include "host/convert/Request.h"

#include <optional>
#include <string>

namespace movieconv {

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
