// What the conversion library tells, in the window's language.
#ifndef MOVIECONV_HOST_WINDOW_RUNNER_LIBRARYWORDS_H
#define MOVIECONV_HOST_WINDOW_RUNNER_LIBRARYWORDS_H

#include "host/convert/Observer.h"
#include "host/sentence/Sentence.h"

#include <QString>

namespace movieconv::window {

/// By its pattern and its parts, and those in their turn; what the translations do not know stays English.
QString InWindowsLanguage(const Sentence& sentence);

/// Likewise, with a capital letter and a full stop.
QString SentenceOf(const Sentence& sentence);

/// "subtitles 3 (Blu-ray (PGS), German): MP4 cannot hold them".
QString LineOf(const NotCarried& what);

} // namespace movieconv::window

#endif
