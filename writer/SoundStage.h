// The thread that encodes sound: converted, cut into the codec's frames, encoded, handed on.
#ifndef MOVIECONV_WRITER_SOUNDSTAGE_H
#define MOVIECONV_WRITER_SOUNDSTAGE_H

#include "thread/BoundedQueue.h"
#include "writer/Encoders.h"
#include "writer/FilePlan.h"
#include "writer/PictureStage.h"
#include "writer/SoundConverter.h"

#include <atomic>
#include <cstdint>
#include <functional>
#include <thread>
#include <vector>

namespace writer {

/// A stretch of sound of one format.
struct SoundBlock {
    PcmFormat format;
    std::vector<uint8_t> data;
};

class SoundStage {
public:
    /// Opens the encoder; throws WriterFailure. `fillsStart`: sound that begins late is preceded by silence,
    /// for containers in which every stream begins at 0. `neverEmpty`: where there is no sound at all, one
    /// silent sample takes its place.
    SoundStage(const AudioPlan& plan, EncoderFlags flags, bool fillsStart, bool neverEmpty);
    SoundStage(const SoundStage&) = delete;
    SoundStage& operator=(const SoundStage&) = delete;
    ~SoundStage();

    const AVCodecContext& Encoder() const { return encoder_.Context(); }

    /// Sample frames given to the encoder in one go.
    using Encoded = std::function<void(int samples)>;

    /// Starts the thread. The first sample is heard at `start` (100 ns units). Packets are in sample frames.
    void Start(int64_t start, PacketTaker take, Encoded encoded, StageFailure failed);

    /// Waits while the stage is full. False when the stage has ended.
    bool Push(SoundBlock block);

    /// No more sound will come.
    void Finish() { queue_.Finish(); }

    /// Ends the stage at once; what it holds is dropped.
    void Cancel() {
        cancelled_ = true;
        queue_.Close();
    }

    /// Waits for the thread.
    void Join();

private:
    void Run(int64_t start);
    void Encode(const SoundBlock& block, const PacketTaker& take);
    void EncodeAvailable(int least, const PacketTaker& take);

    const bool fillsStart_;
    const bool neverEmpty_;
    bool empty_ = true;
    AudioEncoder encoder_;
    SoundConverter converter_;
    BoundedQueue<SoundBlock> queue_;
    std::atomic<bool> cancelled_{false};
    PacketTaker take_;
    Encoded encoded_;
    std::thread thread_;
};

} // namespace writer

#endif
