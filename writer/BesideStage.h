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

#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <vector>

namespace writer {

/// What becomes of one track. Start to Finish are called on one thread.
class BesideTrack {
public:
    BesideTrack() = default;
    BesideTrack(const BesideTrack&) = delete;
    BesideTrack& operator=(const BesideTrack&) = delete;
    virtual ~BesideTrack() = default;

    /// As the multiplexer gets it; valid as long as the track.
    virtual MuxedStream Stream() const = 0;

    /// `take` gets the packets, on any thread.
    virtual void Start(PacketTaker take, StageFailure failed) = 0;

    /// An item, to be shown at `time` of the file (100 ns units), which can lie before its begin. False when
    /// the track has ended.
    virtual bool Take(const WriterTrackItem& item, int64_t time) = 0;

    /// No item begins before `time` any more.
    virtual void Reach(int64_t /*time*/) {}

    /// Of sound that is handed on as it comes, from what is heard first to the end.
    virtual double Seconds() const { return 0; }

    /// Nothing more will come.
    virtual void Finish() = 0;
    virtual void Cancel() = 0;
    virtual void Join() = 0;
};

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
    double Seconds() const { return tracks_.empty() ? 0 : tracks_.front().writer->Seconds(); }

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
    struct Track {
        const TrackPlan* plan;
        int stream;
        std::unique_ptr<BesideTrack> writer;
    };

    void Run();
    void Read(Track& track, const Step& step);

    std::vector<Track> tracks_;
    std::optional<int64_t> begin_;
    int64_t reached_ = INT64_MIN;
    StageThread<Step> thread_;
};

} // namespace writer

#endif
