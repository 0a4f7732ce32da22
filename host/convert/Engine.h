// The engine's converter, made and set up.
#ifndef MOVIECONV_HOST_CONVERT_ENGINE_H
#define MOVIECONV_HOST_CONVERT_ENGINE_H

#include "api/MovieConv.h"
#include "host/convert/Request.h"
#include "host/source/Source.h"
#include "writer/WriterStatus.h"

#include <memory>

namespace movieconv {

struct EngineDestroy {
    void operator()(void* converter) const { MCDestroy(converter); }
};
using Engine = std::unique_ptr<void, EngineDestroy>;

/// A converter for these decoders of the source, with its parameters set as the request asks, for files with
/// these options of the writer; with a split it makes one clip at a time. It posts no events. Throws Failure.
Engine MakeEngine(const Request& request, const SourceInfo& source, VideoDecoder* pictures,
                  AudioDecoder* sound, uint32_t writerSet = kWriterDefaultSet);

} // namespace movieconv

#endif
