// The functions of the media writer's second header. A writer needs the five of media/MediaWriter.h and may
// lack any of these, so they are looked up, once, instead of being linked.
#ifndef MOVIECONV_ENGINE_WRITERCALLS_H
#define MOVIECONV_ENGINE_WRITERCALLS_H

#include "writer/WriterStatus.h"

/// Null for a function that the writer does not have.
struct WriterCalls {
    decltype(&MWGetVersion) getVersion = nullptr;
    decltype(&MWForwardLog) forwardLog = nullptr;
    decltype(&MWGetThreadFileStatus) getThreadFileStatus = nullptr;
};

/// Those of the writer that the process runs with.
const WriterCalls& Writer();

#endif
