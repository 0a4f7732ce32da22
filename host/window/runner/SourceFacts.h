// What the window shows of a movie that the library has looked at.
#ifndef MOVIECONV_HOST_WINDOW_RUNNER_SOURCEFACTS_H
#define MOVIECONV_HOST_WINDOW_RUNNER_SOURCEFACTS_H

#include "host/source/SourceInfo.h"
#include "host/window/model/Runner.h"

namespace movieconv::window {

MovieFacts FactsOf(SourceInfo info);

/// What the facts were made of; null for facts of other origin.
const SourceInfo* InfoBehind(const MovieFacts& facts);

} // namespace movieconv::window

#endif
