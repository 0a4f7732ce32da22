// How much room an output needs, and how much there is.
#ifndef MOVIECONV_HOST_CONVERT_ROOM_H
#define MOVIECONV_HOST_CONVERT_ROOM_H

#include "host/convert/Observer.h"
#include "host/convert/Request.h"

#include <cstdint>
#include <string>

namespace movieconv {

/// Bytes that an ordinary user can still write to the file system of `folder`; -1 when it cannot be told.
int64_t FreeBytes(const std::string& folder);

struct Room {
    double length;      ///< Seconds to convert.
    int64_t needed;     ///< Bytes that they are going to take, about; -1 when quality decides it.
    std::string folder; ///< The output's.
    int64_t free;       ///< Bytes free there; -1 when it cannot be told.
};

/// What is told when the disk is full and the conversion waits for so many bytes of room.
Warning WaitsForRoom(const std::string& output, int64_t bytes);

/// Opens the source and reckons; the output need not be possible. Throws Failure.
Room EstimateRoom(const Request& request);

} // namespace movieconv

#endif
