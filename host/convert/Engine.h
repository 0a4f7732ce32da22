// The engine's converter, made and set up.
#ifndef MOVIECONV_HOST_CONVERT_ENGINE_H
#define MOVIECONV_HOST_CONVERT_ENGINE_H

#include "api/MovieConv.h"
#include "host/convert/Request.h"
#include "host/source/Movie.h"
#include "writer/WriterStatus.h"

#include <memory>

namespace movieconv {

struct EngineDestroy {
    void operator()(void* converter) const { MCDestroy(converter); }
};
using Engine = std::unique_ptr<void, EngineDestroy>;

/// A converter for the movie with its parameters set as the request asks, for files with these options of the
/// writer. Throws Failure.
Engine MakeEngine(const Request& request, Movie& movie, uint32_t writerSet = kWriterDefaultSet);

/// Marks this library's conversions in the engine's events: the window to be given to MCStart.
OpaqueWindowPtr* EngineWindow();

/// Takes those events out of the main queue: all that they tell comes by the callback, too.
void DiscardEngineEvents();

} // namespace movieconv

#endif
