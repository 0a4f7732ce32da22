// What the conversion library tells, in the window's language.
#ifndef MOVIECONV_HOST_WINDOW_RUNNER_LIBRARYWORDS_H
#define MOVIECONV_HOST_WINDOW_RUNNER_LIBRARYWORDS_H

#include "host/convert/Observer.h"

#include <QString>

namespace movieconv::window {

/// "subtitles 3 (hdmv_pgs_subtitle, German): MP4 cannot hold them". What the library tells in words that are
/// not known here stays as it is.
QString LineOf(const NotCarried& what);

} // namespace movieconv::window

#endif
