// The news of a conversion.
#ifndef MOVIECONV_HOST_CONVERT_OBSERVER_H
#define MOVIECONV_HOST_CONVERT_OBSERVER_H

#include "host/convert/Failure.h"

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace movieconv {

enum class Phase {
    kConverting,
    kPaused,
    kFinishing, ///< The rest is encoded, the index written, the file synced.
    kWaitingForRoom
};

struct Start {
    std::string input;
    std::string output;
    double length;      ///< Seconds to convert.
    bool lengthIsKnown; ///< False when it is a guess.
};

struct ByteRange {
    int64_t least;
    int64_t most;
};

struct Progress {
    Phase phase = Phase::kConverting;
    bool phaseChanged = false; ///< Since the last report.
    double position = 0;       ///< Seconds of the source converted.
    double length = 0;
    std::optional<double> percent; ///< Below 100; nothing when the length is a guess.
    std::optional<double> speed;   ///< Seconds of source a second of work.
    std::optional<double> left;    ///< Seconds of work for the rest.
    int64_t bytes = 0;             ///< In the output so far, all clips.
    /// Bytes that the whole output is going to have, about: where no rate tells it before, from ten seconds
    /// on.
    std::optional<ByteRange> expected;
    double worked = 0;   ///< Seconds, pauses left out.
    double finished = 0; ///< Of the finishing phase, 0 to 1.
    int clip = 0;        ///< Number of the open clip from 1; 0 without splitting.
};

struct OpenedFile {
    int number; ///< From 1.
    std::string path;
    std::string temporaryPath; ///< Where the data is until the file is complete.
    int64_t begin = 0;      ///< Stamp of its first picture in the source where it is a clip, in media time.
    std::string input = {}; ///< Of which of many movies; empty where there is but one.
};

struct ClosedFile {
    int number;
    std::string path;
    double videoSeconds; ///< In the file; 0 without such a stream.
    double audioSeconds;
    int64_t bytes;
    int64_t pictures;       ///< Taken from the source.
    std::string input = {}; ///< As of OpenedFile.
};

struct Warning {
    enum class Kind {
        kSmallRoom,    ///< The output will probably not find enough room.
        kWaitsForRoom, ///< The disk is full; the conversion goes on when there is room, or ends by Stop.
        kChosen,       ///< What was chosen for Request::maxSize or Request::detectCrop.
        kFailed,       ///< One of many movies failed; the others go on.
        kLeftover,     ///< Something of a run that broke off stays, for another one to go on with.
        kOlderClips,   ///< Clips of an earlier conversion stay beside the new ones.
        kSource,       ///< Something was wrong with the source and has been put right or skipped.
        kLoss,         ///< The output has less of something than the source.
    };
    Kind kind;
    Sentence text;
    std::string input = {}; ///< As of OpenedFile.
};

/// Something of the source that its output does not hold, although the conversion goes well.
struct NotCarried {
    /// "pictures", "sound", "subtitles", "chapters", "cover", "attachment", "timecode", "data", "tags" or,
    /// of a track that is carried, "label".
    std::string kind;
    std::optional<int> number; ///< Of the stream in the source; nothing for chapters, tags and timecode.
    std::string codec;         ///< Of an attached file of no codec its name. Empty when it is not known.
    std::string language;      ///< Empty when it is not known.
    Sentence reason;           ///< A clause.
    std::string input = {};    ///< As of OpenedFile.
};

/// A picture for display: blue, green, red and 255 for each pixel, without gaps, top row first.
struct ShownPicture {
    int width = 0;
    int height = 0;
    std::vector<uint8_t> bgra;
};

enum class Outcome {
    kDone,    ///< All was converted and stands in files under their names.
    kStopped, ///< By Job::Stop: what was converted until then stands in files under their names.
    kFailed,
};

struct Verdict {
    Outcome outcome = Outcome::kFailed;
    std::optional<Failure> failure; ///< Of a failed one.
    double position = 0;            ///< Seconds of the source converted.
    double earlier = 0;             ///< How much of that an earlier run had done.
    double worked = 0;              ///< Seconds, pauses left out.
    int64_t bytes = 0;              ///< Of the complete files.
    int files = 0;                  ///< Complete ones.
    int64_t damaged = 0;            ///< Pieces of the source's picture data that were skipped.
};

/// Hears what happens in a conversion, always on the thread that it chose; see Job. Started comes once at
/// most, first; Ended once, last. A request that is refused only ends. The defaults ignore the news.
class Observer {
public:
    Observer() = default;
    Observer(const Observer&) = delete;
    Observer& operator=(const Observer&) = delete;
    virtual ~Observer() = default;

    virtual void Started(const Start&) {}
    /// At least twice a second, but in a pause, and whenever the phase changes.
    virtual void Progressed(const Progress&) {}
    /// Also for an output that is not split. A file into which nothing is converted is removed without news.
    virtual void Opened(const OpenedFile&) {}
    /// The file is complete, on the disk, under its name.
    virtual void Closed(const ClosedFile&) {}
    virtual void Warned(const Warning&) {}
    /// Once for each, after Started.
    virtual void LeftBehind(const NotCarried&) {}
    virtual void Showed(const std::shared_ptr<const ShownPicture>&) {}
    virtual void Ended(const Verdict&) = 0;
};

} // namespace movieconv

#endif
