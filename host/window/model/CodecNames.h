// Codecs and arrangements of channels, by the names that people know.
#ifndef MOVIECONV_HOST_WINDOW_MODEL_CODECNAMES_H
#define MOVIECONV_HOST_WINDOW_MODEL_CODECNAMES_H

#include <QString>

namespace movieconv::window {

/// "H.264" of "h264". A code that is not known stays as it is.
QString CodecName(const QString& code);

/// "5.1" of "5.1(side)"; "stereo" in the window's language.
QString ChannelsName(const QString& layout);

} // namespace movieconv::window

#endif
