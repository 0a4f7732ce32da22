/// \file
/// Events for the application's main thread.
#ifndef MOVIECONV_ENGINE_POSTMESSAGE_H
#define MOVIECONV_ENGINE_POSTMESSAGE_H

#include "platform/Window.h"

/// The class of the converter's events.
constexpr unsigned kProgressMessage = 5000;
/// wParam of a progress event; lParam is the progress in hundredths of a percent.
constexpr unsigned kMessageProgress = 0;
/// wParam of the finished event; lParam is the outcome.
constexpr unsigned kMessageFinished = 100;

#pragma GCC visibility push(default)

/// Posts an event of class `message` and kind 'kind' to the main event queue, with the 32-bit parameters
/// 'WPAM', 'LPAM' and 'HWND' (the low 32 bits of `window`, which addresses nothing and may be null). From any
/// thread. 1, or 0 when the event could not be made, addressed or posted.
int PostMessage(OpaqueWindowPtr* window, unsigned message, unsigned wParam, unsigned lParam);

#pragma GCC visibility pop

#endif
