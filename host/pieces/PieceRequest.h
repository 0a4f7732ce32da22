// The conversions that a plan stands for.
#ifndef MOVIECONV_HOST_PIECES_PIECEREQUEST_H
#define MOVIECONV_HOST_PIECES_PIECEREQUEST_H

#include "host/pieces/Plan.h"

#include <string>

namespace movieconv {

/// What names the files that the plan's conversion reads, and its output.
Request WholeRequest(const Plan& plan);

/// The conversion that makes a piece, 0 to Pieces() - 1, into the file `output`.
Request RequestFor(const Plan& plan, int number, const std::string& output);

} // namespace movieconv

#endif
