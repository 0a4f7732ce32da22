// The thread that encodes pictures: paced, scaled, encoded, handed on.
#ifndef MOVIECONV_WRITER_PICTURESTAGE_H
#define MOVIECONV_WRITER_PICTURESTAGE_H

#include "media/MediaRecords.h"
#include "writer/FilePlan.h"
#include "writer/PaletteMaker.h"
#include "writer/PictureEncoder.h"
#include "writer/PicturePacer.h"
#include "writer/PictureScaler.h"
#include "writer/StageThread.h"

#include <cstdint>
#include <functional>

namespace writer {

class PictureStage {
public:
    /// Opens the encoder; throws WriterFailure. `plan` is read during the life of the stage.
    PictureStage(const PicturePlan& plan, EncoderFlags flags);
    PictureStage(const PictureStage&) = delete;
    PictureStage& operator=(const PictureStage&) = delete;
    ~PictureStage() = default;

    const AVCodecContext& Encoder() const { return encoder_.Context(); }

    /// How many showings came into the file, and how many of these repeat a picture; called on the stage's
    /// thread. A picture that was left out makes none.
    using Shown = std::function<void(int64_t count, int64_t repeats)>;

    /// Starts the thread. Packets are in ticks of the plan's clock.
    void Start(PacketTaker take, Shown shown, StageFailure failed);

    /// Takes a copy of the picture, to be shown at `time` (100 ns units), for as long as `stay` if none
    /// follows. Waits while the stage is full. False when the stage has ended.
    bool Push(const VideoImage& image, int64_t time, int64_t stay);

    void Finish() { thread_.Finish(); }
    void Cancel() { thread_.Cancel(); }
    void Join() { thread_.Join(); }

private:
    struct Picture {
        av::Frame frame;
        int64_t time;
        int64_t stay;
    };

    void Run();
    void Cut();
    void Show(av::Frame picture, const PicturePacer::Showing& showing, int64_t stay);
    int64_t StayInTicks(const PicturePacer::Showing& showing, int64_t time, int64_t end) const;
    int64_t RepeatUntil(int64_t tick);
    bool StaysLong(int64_t stay) const;
    void RepeatAtEnd();

    const PicturePlan& plan_;
    PictureEncoder encoder_;
    PicturePacer pacer_;
    PictureScaler scaler_;
    PaletteMaker palette_; ///< Where the plan wants one.
    FramePool pool_;       ///< Used by Push only.
    PacketTaker take_;
    Shown shown_;
    av::Frame last_; ///< The picture shown last, where it may have to be shown again, and its last tick.
    int64_t lastTick_ = 0;
    int64_t lastStay_ = 0;
    bool isCut_ = false; ///< What comes now is behind the piece.
    StageThread<Picture> thread_;
};

} // namespace writer

#endif
