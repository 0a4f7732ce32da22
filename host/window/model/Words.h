// Figures and states in words.
#ifndef MOVIECONV_HOST_WINDOW_MODEL_WORDS_H
#define MOVIECONV_HOST_WINDOW_MODEL_WORDS_H

#include "host/window/model/Entry.h"

#include <QString>

#include <optional>

namespace movieconv::window {

/// "0:42", "1:02:03".
QString ClockText(double seconds);
/// "0:42.5": to the millisecond, where it is no whole second.
QString ExactClockText(double seconds);
/// Seconds from "90", "1:30", "1:02:03.5"; nothing when it is no time.
std::optional<double> ParseClock(const QString& text);
/// "less than a minute", "about 12 minutes", "about 2 h 10 min".
QString LeftText(double seconds);
QString BytesText(int64_t bytes);
/// "8.4×".
QString SpeedText(double speed);
/// "1920 × 1080 · 25 pictures a second · H.264 · 42:10".
QString FactsLine(const MovieFacts& facts);
/// A track for people: "English, Director's comments (AAC, stereo)".
QString TrackLine(const TrackFacts& track);
/// Text that may hold signs of a markup language, for a tool tip, which would follow them.
QString ForToolTip(const QString& text);
QString PhaseText(Phase phase);
/// What the list says about an entry below its name. `preset`: its title.
QString StateLine(const Entry& entry, const QString& preset);

} // namespace movieconv::window

#endif
