// What becomes of one track beside the engine's pictures and sound.
#ifndef MOVIECONV_WRITER_TRACKSTAGE_H
#define MOVIECONV_WRITER_TRACKSTAGE_H

#include "writer/Encoder.h"
#include "writer/PacketWriter.h"
#include "writer/StageThread.h"
#include "writer/WriterStatus.h"

#include <cstdint>

namespace writer {

/// Start to Finish are called on one thread.
class TrackStage {
public:
    TrackStage() = default;
    TrackStage(const TrackStage&) = delete;
    TrackStage& operator=(const TrackStage&) = delete;
    virtual ~TrackStage() = default;

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

} // namespace writer

#endif
