// One movie in the queue.
#ifndef MOVIECONV_HOST_WINDOW_MODEL_ENTRY_H
#define MOVIECONV_HOST_WINDOW_MODEL_ENTRY_H

#include "host/window/model/Runner.h"

#include <QJsonObject>

namespace movieconv::window {

/// `kInterrupted`: the program ended while it was being converted.
enum class State { kWaiting, kActive, kDone, kStopped, kFailed, kInterrupted };

struct Entry {
    quint64 id = 0;
    std::string source;
    std::string target;       ///< Where it goes; follows the naming rules until the user names it.
    bool targetNamed = false; ///< By the user.
    bool replace = false;     ///< An existing target.
    Wishes wishes;
    State state = State::kWaiting;

    std::optional<MovieFacts> facts; ///< Nothing until the movie was looked at.
    QString unusable;                ///< Why it cannot be converted; empty when it can, as far as is known.
    Findings findings;
    bool examined = false;     ///< Whether the three above tell of the entry as it is.
    bool targetShared = false; ///< Another entry in the queue goes there as well.

    Figures figures;
    Outcome outcome;
    QStringList notes; ///< The log of the last run.

    /// Whether it is ready to be converted.
    bool IsStartable() const { return state == State::kWaiting && examined && unusable.isEmpty(); }
    bool IsBeingExamined() const { return state == State::kWaiting && !examined; }
    bool IsOver() const { return state != State::kWaiting && state != State::kActive; }

    /// Seconds that will be converted; nothing when that is not known.
    std::optional<double> SecondsWanted() const;
};

/// A path as text; bytes that are none are replaced.
QString Readable(const std::string& path);
/// Likewise, for people: signs that end a line, or turn the direction in which the rest is read, are
/// replaced.
QString Shown(const std::string& text);
/// The file's name, for people.
QString NameOf(const std::string& path);

/// What of an entry survives the program.
QJsonObject ToJson(const Entry& entry);
/// Nothing when `json` is no entry. What was being converted comes back as interrupted.
std::optional<Entry> EntryFromJson(const QJsonObject& json);

} // namespace movieconv::window

#endif
