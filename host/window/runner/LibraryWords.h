// What the conversion library tells, in the window's language.
#ifndef MOVIECONV_HOST_WINDOW_RUNNER_LIBRARYWORDS_H
#define MOVIECONV_HOST_WINDOW_RUNNER_LIBRARYWORDS_H

#include "host/convert/Observer.h"

#include <QString>

namespace movieconv::window {

/// A clause or a sentence of the library's; what is not known here stays as it is.
QString InWindowsLanguage(const std::string& text);

/// Likewise, with a capital letter and a full stop.
QString SentenceOf(const std::string& text);

/// "subtitles 3 (Blu-ray (PGS), German): MP4 cannot hold them".
QString LineOf(const NotCarried& what);

} // namespace movieconv::window

#endif
