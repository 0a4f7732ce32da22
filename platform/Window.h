/// \file
/// A window, for interfaces that only hand it on.
#ifndef MOVIECONV_PLATFORM_WINDOW_H
#define MOVIECONV_PLATFORM_WINDOW_H

/// A window of the host. The engine hands references to it on and never looks inside.
typedef struct OpaqueWindowPtr OpaqueWindowPtr;

#endif
