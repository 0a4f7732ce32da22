// The thread that encodes sound: converted, cut into the codec's frames, encoded, handed on.
#ifndef MOVIECONV_WRITER_SOUNDSTAGE_H
#define MOVIECONV_WRITER_SOUNDSTAGE_H

#include "writer/FilePlan.h"
#include "writer/SoundConverter.h"
#include "writer/SoundEncoder.h"
#include "writer/StageThread.h"

#include <cstdint>
#include <functional>
#include <vector>

namespace writer {

/// A stretch of sound of one format.
struct SoundBlock {
    PcmFormat format;
    std::vector<uint8_t> data;
};

class SoundStage {
public:
    /// Opens the encoder; throws WriterFailure. `plan` is read during the life of the stage.
    SoundStage(const SoundPlan& plan, EncoderFlags flags);
    SoundStage(const SoundStage&) = delete;
    SoundStage& operator=(const SoundStage&) = delete;
    ~SoundStage() = default;

    const AVCodecContext& Encoder() const { return encoder_.Context(); }

    /// Sample frames given to the encoder in one go.
    using Encoded = std::function<void(int samples)>;

    /// Starts the thread. The first sample is heard at `start` (100 ns units). Packets are in sample frames.
    void Start(int64_t start, PacketTaker take, Encoded encoded, StageFailure failed);

    /// Waits while the stage is full. False when the stage has ended.
    bool Push(SoundBlock block);

    void Finish() { thread_.Finish(); }
    void Cancel() { thread_.Cancel(); }
    void Join() { thread_.Join(); }

private:
    void Run(int64_t start);
    void Encode(const SoundBlock& block, const PacketTaker& take);
    void EncodeAvailable(int least, const PacketTaker& take);

    const SoundPlan& plan_;
    bool empty_ = true;
    SoundEncoder encoder_;
    SoundConverter converter_;
    PacketTaker take_;
    Encoded encoded_;
    StageThread<SoundBlock> thread_;
};

} // namespace writer

#endif
