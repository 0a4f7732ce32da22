// The thread that encodes pictures: paced, scaled, encoded, handed on.
#ifndef MOVIECONV_WRITER_PICTURESTAGE_H
#define MOVIECONV_WRITER_PICTURESTAGE_H

#include "media/MediaRecords.h"
#include "thread/BoundedQueue.h"
#include "writer/Encoders.h"
#include "writer/FilePlan.h"
#include "writer/PicturePacer.h"
#include "writer/PictureScaler.h"

#include <cstdint>
#include <exception>
#include <functional>
#include <thread>

namespace writer {

/// Told of what ended a stage's thread early; called on that thread.
using StageFailure = std::function<void(std::exception_ptr)>;

class PictureStage {
public:
    /// Opens the encoder; throws WriterFailure. `plan` is read during the life of the stage.
    PictureStage(const VideoPlan& plan, EncoderFlags flags);
    PictureStage(const PictureStage&) = delete;
    PictureStage& operator=(const PictureStage&) = delete;
    ~PictureStage();

    const AVCodecContext& Encoder() const { return encoder_.Context(); }

    /// How often a picture was shown in the file; called on the stage's thread for every picture in turn.
    using Shown = std::function<void(int64_t count)>;

    /// Starts the thread. Packets are in ticks of the plan's clock.
    void Start(PacketTaker take, Shown shown, StageFailure failed);

    /// Takes a copy of the picture, to be shown at `time` (100 ns units). Waits while the stage is full.
    /// False when the stage has ended.
    bool Push(const VideoImage& image, int64_t time);

    /// No more pictures will come.
    void Finish() { queue_.Finish(); }

    /// Ends the stage at once; what it holds is dropped.
    void Cancel() { queue_.Close(); }

    /// Waits for the thread.
    void Join();

private:
    void Run();
    void Show(av::Frame picture, const PicturePacer::Showing& showing);

    const VideoPlan& plan_;
    VideoEncoder encoder_;
    PicturePacer pacer_;
    PictureScaler scaler_;
    FramePool pool_; ///< Used by Push only.
    BoundedQueue<av::Frame> queue_;
    PacketTaker take_;
    Shown shown_;
    std::thread thread_;
};

} // namespace writer

#endif
