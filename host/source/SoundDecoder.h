// The engine's source of sound: decoded ahead on a thread of its own, as interleaved PCM without gaps.
//
// The engine calls from its worker; a block stays valid until the next one is asked for.
#ifndef MOVIECONV_HOST_SOURCE_SOUNDDECODER_H
#define MOVIECONV_HOST_SOURCE_SOUNDDECODER_H

#include "host/source/Demuxer.h"
#include "host/source/Failures.h"
#include "host/source/MediaTime.h"
#include "host/source/PcmDecoder.h"
#include "host/source/Source.h"
#include "media/Decoders.h"
#include "thread/BoundedQueue.h"

#include <atomic>
#include <optional>
#include <thread>
#include <vector>

namespace movieconv {

class SoundDecoder final : public AudioDecoder {
public:
    /// The first sample handed out lies exactly at the time that Seek asked for, without Seek at the source's
    /// start: sound that begins later is preceded by silence. Throws SourceError.
    SoundDecoder(const Source& source, Demuxer& demuxer, Failures& failures);
    ~SoundDecoder();

    AudioSourceInfo* GetAudioInfo() override { return &info_; }
    double Seek(double seconds) override;
    AudioFrame* GetNextFrame() override;

    /// The last sample is the one before that time. Before the first block is asked for.
    void EndAt(double seconds) { end_ = ToMediaTime(seconds); }

    /// Makes the sound end now. Any thread.
    void Stop() { queue_.Close(); }

    /// Figures for progress and the closing report. Any thread.
    int64_t Damaged() const { return damaged_; }
    int Corrections() const { return corrections_; }
    int Channels() const { return channels_; } ///< Of the source where it had most.
    double SecondsDelivered() const;

    /// Whether the source's last sound has been decoded and handed on. Any thread.
    bool RanDry() const { return ranDry_; }

    /// Where the last sound that could be decoded ends, in media time; 0 without any. Any thread.
    int64_t DecodedTo() const { return decodedTo_; }

private:
    int64_t MostBytes() const;
    void Run();
    void DecodeAll();
    bool PushSilence(int64_t samples);
    bool PushSound(PcmDecoder::Chunk chunk);
    bool Push(PcmDecoder::Chunk chunk);

    Demuxer& demuxer_;
    Failures& failures_;
    const int stream_;
    const bool besidePictures_;
    AudioSourceInfo info_{};
    int64_t frameBytes_ = 0; // of one sample of all channels
    int64_t blockBytes_ = 0;
    int64_t begin_ = 0;
    std::optional<int64_t> end_;

    // The decoding thread's.
    PcmDecoder decoder_;
    int64_t samplesPushed_ = 0; // silence included
    bool refused_ = false;      // nobody takes sound any more

    // Between the threads.
    BoundedQueue<PcmDecoder::Chunk> queue_;
    std::atomic<int64_t> damaged_{0};
    std::atomic<int> corrections_{0};
    std::atomic<int> channels_{0};
    std::atomic<bool> ranDry_{false};
    std::atomic<int64_t> decodedTo_{0};
    std::atomic<int64_t> samplesDelivered_{0};
    std::thread thread_;

    // The engine worker's.
    PcmDecoder::Chunk current_;
    int64_t used_ = 0; // bytes of it
    AudioFrame block_{};
};

} // namespace movieconv

#endif
