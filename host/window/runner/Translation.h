// From the window's terms to the conversion library's.
#ifndef MOVIECONV_HOST_WINDOW_RUNNER_TRANSLATION_H
#define MOVIECONV_HOST_WINDOW_RUNNER_TRANSLATION_H

#include "host/convert/Request.h"
#include "host/window/model/Runner.h"

namespace movieconv::window {

/// The presets there are. Their texts are in the user's language.
std::vector<PresetFacts> BuiltInPresets();

/// What is wanted of a movie, in the library's terms.
Request ToRequest(const Order& order);

} // namespace movieconv::window

#endif
