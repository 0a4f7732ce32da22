// The tracks of a file beside the engine's pictures and sound: read from the host as far as the file has
// come, placed by their time in the source, handed to the multiplexer.
//
//     engine's worker                 thread of the stage            threads of the tracks
//     WriteVideo ─ how far it is ──> asks the host for each track ─┬─> sound: SoundStage ─┐
//                                                                  └─> packets ───────────┴─> Muxer
//
// The way from the worker holds a few steps only, so that a track that cannot keep up holds up the engine.
#ifndef MOVIECONV_WRITER_BESIDESTAGE_H
#define MOVIECONV_WRITER_BESIDESTAGE_H

#include "writer/FilePlan.h"
#include "writer/PacketWriter.h"
#include "writer/StageThread.h"
#include "writer/TrackStage.h"

#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <vector>

namespace writer {

/// All functions but Cancel are called on one thread.
class BesideStage {
public:
    BesideStage();
    BesideStage(const BesideStage&) = delete;
    BesideStage& operator=(const BesideStage&) = delete;
    ~BesideStage();

    /// `plan` outlives it. `isFirst`: the file is the first one of the track. Throws WriterFailure.
    void Add(const TrackPlan& plan, const Container& container, EncoderFlags flags, bool isFirst,
             PacketWriter& file);

    bool Empty() const { return tracks_.empty(); }

    /// The first track's, once it is joined.
    double Seconds() const { return tracks_.empty() ? 0 : tracks_.front().stage->Seconds(); }

    /// Starts the threads. Time 0 of the file is `begin` in the source, in 100 ns units as all times.
    void Start(int64_t begin, const std::function<void(AVPacket& packet, int stream)>& write,
               const StageFailure& failed);
    bool Started() const { return begin_.has_value(); }

    /// The file has come to this time of the source. Waits while the tracks are behind.
    void Reach(int64_t sourceTime);

    /// The file ends there. Does not wait for the tracks; Join does.
    void Finish(int64_t sourceTime);
    void Cancel();
    void Join();

private:
    struct Step {
        int64_t time; ///< Of the source.
        bool closing;
    };
    struct Entry {
        const TrackPlan* plan;
        int stream; ///< Number in the file.
        std::unique_ptr<TrackStage> stage;
    };

    void Run();
    void Read(Entry& track, const Step& step);

    std::vector<Entry> tracks_;
    std::optional<int64_t> begin_;
    int64_t reached_ = INT64_MIN;
    StageThread<Step> thread_;
};

} // namespace writer

#endif
