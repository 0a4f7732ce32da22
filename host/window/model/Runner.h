// What the window needs from whoever converts: looking at movies and running conversions. Everything in here
// may be called from, and calls back on, any thread; no function of a Run blocks.
#ifndef MOVIECONV_HOST_WINDOW_MODEL_RUNNER_H
#define MOVIECONV_HOST_WINDOW_MODEL_RUNNER_H

#include "host/window/model/Wishes.h"

#include <QImage>
#include <QString>
#include <QStringList>

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace movieconv::window {

/// A sound or subtitle track.
struct TrackFacts {
    int number = 0;   ///< As Wishes name it.
    QString language; ///< ISO code; empty when the source does not tell.
    QString title;
    QString details;     ///< "AAC, 5.1".
    int64_t bitRate = 0; ///< Bits a second; 0 when the source does not tell.
};

/// What a runner knows of a movie beyond the facts, for itself.
struct OwnKnowledge {
    OwnKnowledge() = default;
    OwnKnowledge(const OwnKnowledge&) = delete;
    OwnKnowledge& operator=(const OwnKnowledge&) = delete;
    virtual ~OwnKnowledge() = default;
};

/// What a movie is.
struct MovieFacts {
    double seconds = 0;
    bool lengthKnown = false;
    int width = 0; ///< As shown; 0 without pictures.
    int height = 0;
    double rate = 0;      ///< Pictures a second.
    QString pictureCodec; ///< "H.264".
    bool interlaced = false;
    bool hdr = false;
    int depth = 8; ///< Bits per sample.
    QString title; ///< As the movie tells it.
    std::vector<TrackFacts> sounds;
    std::vector<TrackFacts> subtitles;
    int chapters = 0;
    int64_t bytes = 0;
    std::shared_ptr<const OwnKnowledge> own; ///< May be null.
};

struct FormatFacts {
    QString extension; ///< "mp4".
    QString name;      ///< For people.
    bool pictures = true;
    QStringList furtherExtensions; ///< "m4v".
};

struct PresetFacts {
    QString name; ///< As Wishes name it.
    QString title;
    QString description; ///< One line.
    QString extension;   ///< Of the files it makes.
    int quality = 60;    ///< On Wishes' scale, or -1 when there is nothing to choose.
    bool copiesSound = false;
    QStringList complaints; ///< What its file asks for in vain. Sentences.
};

/// What the window need not offer where it is missing.
struct Abilities {
    bool tracks = false; ///< Choosing among sound tracks and subtitles.
    bool deinterlace = false;
    bool crop = false;
    bool presetFiles = false;
};

struct Order {
    std::string source; ///< Bytes as the system has them, like every path here.
    std::string target;
    Wishes wishes;
    bool replace = false; ///< An existing target.
    MovieFacts facts;     ///< Of the source.
};

/// What stands in the way of an order, or what it would lose.
struct Findings {
    bool targetExists = false;
    QStringList warnings;          ///< Sentences.
    QStringList notes;             ///< Of less weight.
    std::optional<int64_t> needed; ///< Bytes.
    std::optional<int64_t> free;   ///< Bytes where the target goes.
};

enum class Phase { kPreparing, kConverting, kPaused, kWaitingForRoom, kFinishing, kStopping };

struct Bounds {
    int64_t least;
    int64_t most;
};

struct Figures {
    Phase phase = Phase::kPreparing;
    double position = 0; ///< Seconds of the movie converted.
    double length = 0;
    double fraction = -1;        ///< 0 to 1; negative when the length is not known.
    std::optional<double> speed; ///< Seconds of movie a second.
    std::optional<double> left;  ///< Seconds.
    double worked = 0;           ///< Seconds, pauses left out.
    int64_t bytes = 0;
    std::optional<Bounds>
        expected; ///< Bytes in the end, where that is not known before but can be guessed by now.
};

enum class Ending { kDone, kStopped, kFailed };

struct Outcome {
    Ending ending = Ending::kFailed;
    QString sentence;               ///< What was done, or what went wrong and what to do.
    std::vector<std::string> files; ///< Complete ones.
    QStringList notCarried;         ///< What the source has and the target has not.
    int64_t bytes = 0;
    double position = 0; ///< Seconds of the movie converted.
    double worked = 0;   ///< Seconds.
};

/// Hears what becomes of a run, on threads of the run's.
class RunListener {
public:
    RunListener() = default;
    RunListener(const RunListener&) = delete;
    RunListener& operator=(const RunListener&) = delete;
    virtual ~RunListener() = default;

    virtual void OnFigures(const Figures& figures) = 0;
    virtual void OnPicture(const QImage& picture) = 0;
    virtual void OnNote(const QString& sentence) = 0;
    /// The last call, exactly once.
    virtual void OnEnd(const Outcome& outcome) = 0;
};

/// A conversion under way. Its destruction after OnEnd is immediate; before, it stops and waits.
class Run {
public:
    Run() = default;
    Run(const Run&) = delete;
    Run& operator=(const Run&) = delete;
    virtual ~Run() = default;

    virtual void Pause() = 0;
    virtual void Resume() = 0;
    /// Ends it; what was converted so far is finished as a file.
    virtual void Stop() = 0;
    /// Whether pictures are wanted, which cost a little.
    virtual void ShowPictures(bool wanted) = 0;
};

class Runner {
public:
    Runner() = default;
    Runner(const Runner&) = delete;
    Runner& operator=(const Runner&) = delete;
    virtual ~Runner() = default;

    virtual Abilities Can() = 0;
    virtual std::vector<PresetFacts> Presets() = 0;
    virtual std::vector<FormatFacts> Formats() = 0;

    /// These read or write a small file. What was loaded is among Presets() from then on. Throw
    /// std::runtime_error with a sentence for people.
    virtual PresetFacts LoadPreset(const std::string& path) = 0;
    /// Gives the names of those wishes for any movie that it cannot keep.
    virtual QStringList SavePreset(const std::string& path, const Wishes& wishes) = 0;
    /// Where the user's own are kept; what is there is among Presets(). May be empty.
    virtual std::string PresetFolder() = 0;

    /// Returns at once; whatever goes wrong is an outcome.
    virtual std::unique_ptr<Run> Start(const Order& order, std::shared_ptr<RunListener> listener) = 0;

    /// These read the disk and may take long; they are called on threads of their own. Throw
    /// std::runtime_error with a sentence for people.
    virtual MovieFacts Look(const std::string& path) = 0;
    /// A file that exists already and that the order would write; empty when there is none.
    virtual std::string FileInTheWay(const Order& order) = 0;
    virtual Findings Check(const Order& order) = 0;
    /// The picture nearest before `seconds`, at most `width` pixels wide; null when there is none.
    virtual QImage PictureAt(const std::string& path, double seconds, int width) = 0;
};

} // namespace movieconv::window

#endif
