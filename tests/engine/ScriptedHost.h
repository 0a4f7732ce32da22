// A host whose decoders play lists, whose clock stands still unless a decoder moves it, and whose every part
// writes into the recorder's trace: decoder calls, callbacks, events posted to the main queue. The engine is
// the product's own, behind its exported functions.
#ifndef MOVIECONV_TESTS_ENGINE_SCRIPTEDHOST_H
#define MOVIECONV_TESTS_ENGINE_SCRIPTEDHOST_H

#include "api/MovieConv.h"
#include "platform/Platform.h"
#include "tests/recorder/RecordingWriter.h"

#include <climits>
#include <functional>
#include <string>
#include <vector>

/// Seconds and milliseconds in the 100 ns of time stamps.
constexpr int64_t kSecond = 10000000;
constexpr int64_t kMs = 10000;

/// Moves the clock that the engine reads, for decoders of one's own; steps of 10 ms count.
void AdvanceClock(uint32_t ms);

/// Plays pictures with the given stamps. Notes
///     seek video SECONDS MODE
///     image STAMP, or image none
///     next -> RESULT
/// and "reserved" for an operation that must never be called, as ScriptedAudio does.
class ScriptedVideo : public VideoDecoder {
public:
    VideoSourceInfo* GetVideoInfo() override { return descriptions-- > 0 ? &info : nullptr; }
    double Seek(double seconds, int mode) override;
    VideoImage* GetCurrentImage() override;
    int DecodeNext(int mode) override;

    void Reserved0() override { recorder::Note("reserved"); }
    void Reserved1() override { recorder::Note("reserved"); }
    void Reserved2() override { recorder::Note("reserved"); }
    void Reserved3() override { recorder::Note("reserved"); }
    void Reserved4() override { recorder::Note("reserved"); }
    void Reserved7() override { recorder::Note("reserved"); }

    VideoFormat& Format() { return info.format; }

    /// Picture `index` as it is handed out.
    VideoImage Image(size_t index) const;

    std::vector<int64_t> stamps;
    int descriptions = INT_MAX; // so many calls find one, later ones none
    bool staysAtLast = false;   // goes on handing out the last picture after the end
    bool announcesEnd = true;   // DecodeNext tells the end; otherwise the picture is missing
    bool overwrites = false;    // one record for all pictures; otherwise each has its own
    uint32_t stepMs = 0;        // what the clock advances at each DecodeNext

private:
    /// Fills the record of the current picture.
    VideoImage* Load();

    VideoSourceInfo info{{}, {320, 240, 10.0, 1.0}};
    std::vector<VideoImage> images;
    size_t position = 0;
};

/// Plays blocks of `blockLength` bytes, 1000 a second, with the given stamps. Notes
///     seek audio SECONDS
///     block STAMP, or block none
class ScriptedAudio : public AudioDecoder {
public:
    AudioSourceInfo* GetAudioInfo() override { return descriptions-- > 0 ? &info : nullptr; }
    double Seek(double seconds) override;
    AudioFrame* GetNextFrame() override;

    void Reserved0() override { recorder::Note("reserved"); }
    void Reserved1() override { recorder::Note("reserved"); }
    void Reserved2() override { recorder::Note("reserved"); }
    void Reserved3() override { recorder::Note("reserved"); }
    void Reserved6() override { recorder::Note("reserved"); }

    AudioFormat& Format() { return info.format; }

    /// Block `index` as it is handed out.
    AudioFrame Block(size_t index) const;

    std::vector<int64_t> stamps;
    int32_t blockLength = 50;
    int descriptions = INT_MAX;
    bool endsEmpty = false; // the end is an empty block, not null
    uint32_t stepMs = 0;    // what the clock advances at each block

private:
    AudioSourceInfo info{{}, {1000, 1, 8, 1000, 1.0}};
    AudioFrame block{};
    size_t position = 0;
};

/// A converter over scripted decoders. Notes the callbacks:
///     progress VALUE at POSITION [done LENGTH] [speed SPEED] [preview STAMP]
///     finished OUTCOME at POSITION [done LENGTH] [speed SPEED], or finished OUTCOME without record
/// with "done" where it is not the position, "speed" where it is not 0 and "unusual" behind a value that is
/// not the record's. Notes the events:
///     event progress VALUE, event finished OUTCOME
class ScriptedHost {
public:
    ScriptedHost();
    ~ScriptedHost() { MCDestroy(handle); }
    ScriptedHost(const ScriptedHost&) = delete;
    ScriptedHost& operator=(const ScriptedHost&) = delete;

    /// As many pictures and blocks, 10 and 20 a second, each stream as long as that makes it.
    void SetMovie(size_t pictures, size_t blocks);

    /// Makes the converter unless it exists, as all of the following do, over the decoders that are wanted,
    /// with the output "out.mp4".
    void Create();

    /// Changes the parameters.
    void Change(const std::function<void(EncodeParam&)>& change);

    /// Splits the output into clips of that length.
    void Split(unsigned long milliseconds);

    /// Starts with the callback.
    int Start(double begin = 0.0, double length = 0.0);

    /// Starts, waits for the end and returns the trace without log lines. Notes a failure to start:
    ///     start -> RESULT
    std::string Convert(double begin = 0.0, double length = 0.0);

    static unsigned Callback(void* context, unsigned kind, unsigned value, uintptr_t info);

    ScriptedVideo video;
    ScriptedAudio audio;
    bool hasVideo = true;
    bool hasAudio = true;
    bool hasCallback = true;
    unsigned cancelAt = 0; // number of the progress call, from 1, that returns 0
    unsigned abortAt = 0;  // number of the one that asks for a stop
    std::function<void(unsigned kind, const ProgressInfo*)> onCallback;
    OpaqueWindowPtr* window = nullptr;
    MCHandle handle = nullptr;

    std::vector<ProgressInfo> records; // of the progress calls
};

/// What has been noted, a line each.
enum class Part { kLog, kWithoutLog, kWhole };
std::string Trace(Part part);

#endif
