// A track of packets beside the engine's.
#ifndef MOVIECONV_WRITER_PACKETTRACK_H
#define MOVIECONV_WRITER_PACKETTRACK_H

#include "media/MediaRecords.h"
#include "writer/TrackStage.h"

#include <utility>

namespace writer {

/// Unit of the times in WriterTrackItem.
constexpr AVRational kItemUnit{1, kTicksPerSecond};

/// What all of them have in common: they do their work on the thread of the stage that asks the host.
class PacketTrack : public TrackStage {
public:
    /// `track` outlives it. `unit`: of the times in the packets that are handed on.
    PacketTrack(const Track& track, AVRational unit)
        : track_(track), unit_(unit), parameters_(av::NewParameters()) {}

    void Start(PacketTaker take, StageFailure /*failed*/) override { take_ = std::move(take); }
    void Finish() override {}
    void Cancel() override {}
    void Join() override {}

protected:
    void HandOn(AVPacket& packet) { take_(packet); }

    const Track& track_;
    const AVRational unit_;
    av::CodecParameters parameters_;

private:
    PacketTaker take_;
};

} // namespace writer

#endif
