// What stands in the way of a conversion, and what it is going to lose, before it begins.
#ifndef MOVIECONV_HOST_WINDOW_RUNNER_FORESIGHT_H
#define MOVIECONV_HOST_WINDOW_RUNNER_FORESIGHT_H

#include "host/window/model/Runner.h"

namespace movieconv::window {

/// Reads the disk. Of facts that do not come from FactsOf, less can be told.
Findings Foresee(const Order& order);

/// Of the files that the order writes, the first that exists; empty when none does.
std::string ExistingFileOf(const Order& order);

} // namespace movieconv::window

#endif
