// From the window's terms to the conversion library's.
#ifndef MOVIECONV_HOST_WINDOW_RUNNER_TRANSLATION_H
#define MOVIECONV_HOST_WINDOW_RUNNER_TRANSLATION_H

#include "host/convert/Request.h"
#include "host/window/model/Runner.h"

namespace movieconv::window {

/// What is wanted of a movie, in the library's terms. Throws PresetError when there is no such preset.
Request ToRequest(const Order& order);

/// Bits a second that the order's target takes, about: where a constant quality decides, by experience.
double EstimatedRate(const Order& order, const Request& request);

} // namespace movieconv::window

#endif
