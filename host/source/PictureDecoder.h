// The engine's source of pictures: decoded ahead on a thread of its own.
//
// The engine calls from its worker; what it is given stays valid until its next DecodeNext. The record is one
// and the same for all pictures: after DecodeNext it carries the next picture's stamps, so that a clip begun
// there starts at 0.
#ifndef MOVIECONV_HOST_SOURCE_PICTUREDECODER_H
#define MOVIECONV_HOST_SOURCE_PICTUREDECODER_H

#include "host/source/DecodingThreads.h"
#include "host/source/Demuxer.h"
#include "host/source/Failures.h"
#include "host/source/LastStay.h"
#include "host/source/PictureConverter.h"
#include "host/source/PictureFilter.h"
#include "host/source/PictureNotes.h"
#include "host/source/PictureRange.h"
#include "host/source/StampRepair.h"
#include "host/source/StreamDecoder.h"
#include "host/source/SubtitleBurner.h"
#include "media/Decoders.h"
#include "thread/BoundedQueue.h"

#include <atomic>
#include <memory>
#include <optional>
#include <thread>
#include <vector>

namespace movieconv {

class PictureDecoder final : public VideoDecoder {
public:
    /// The first picture handed out is the one shown at the time that Seek asked for, stamped with that time;
    /// without Seek it is the movie's first, stamped with 0 if it comes later. Throws SourceError.
    /// `burner`, where there is one, draws into the pictures and has to last as long.
    PictureDecoder(const Source& source, Demuxer& demuxer, Failures& failures, const SourceChoice& choice,
                   SubtitleBurner* burner = nullptr);
    ~PictureDecoder();

    VideoSourceInfo* GetVideoInfo() override { return &info_; }
    double Seek(double seconds, int mode) override;
    VideoImage* GetCurrentImage() override;
    int DecodeNext(int mode) override;

    /// When the picture after the current one begins, in media time; nothing when there is none. Waits for
    /// it. Where GetCurrentImage may be called.
    std::optional<int64_t> TimeOfNext();

    /// Leaves out the pictures from that time on, where the one before ends, too. Only before the first is
    /// taken.
    void EndAt(double seconds);

    /// Makes the pictures end now. Any thread.
    void Stop() { queue_.Close(); }

    /// Figures for the closing report. Any thread.
    int64_t Damaged() const { return damaged_; }
    int64_t Repaired() const { return repaired_; }
    bool Deinterlaced() const { return deinterlaced_; }
    bool LeftInterlaced() const { return leftInterlaced_; }
    bool Narrowed() const { return narrowed_; } ///< As PictureConverter has it.
    const PictureNotes& Notes() const { return notes_; }

    /// Whether the source's last picture has been decoded and handed on. Any thread.
    bool RanDry() const { return ranDry_; }

    /// Where the last picture that could be decoded ends, in media time; 0 without one. Any thread.
    int64_t DecodedTo() const { return decodedTo_; }

    /// The picture handed out last, null without one. Once the conversion has ended.
    const VideoImage* Last() const { return current_.frame ? &image_ : nullptr; }

private:
    struct Picture {
        av::Frame frame;
        StampRepair::Stamp stamp;
    };

    void Run();
    void DecodeAll();
    bool Accept(AVFrame& frame);
    bool Hold(AVFrame& picture, std::optional<int64_t> stamp);
    bool Deliver(StampRepair::Stamp stamp, bool isLast);
    bool UseMoreThreads(const std::vector<av::Packet>& known);
    bool Advance();

    const PacketReader& reader_;
    Demuxer& demuxer_;
    Failures& failures_;
    const int stream_;
    const AVRational timeBase_;
    VideoSourceInfo info_{};

    // The decoding thread's.
    const av::CodecParameters parameters_;
    DecodingThreads threads_;
    std::unique_ptr<StreamDecoder> decoder_;
    PictureFilter filter_;
    PictureConverter converter_;
    SubtitleBurner* const burner_;
    StampRepair stamps_;
    LastStay lastStay_;
    av::Frame held_; // decoded, its stamp not settled yet
    PictureRange range_;
    int64_t decoded_ = 0;
    int64_t skip_ = 0;     // frames that a restarted decoder gives once more
    bool refused_ = false; // nobody takes pictures any more
    int64_t unconverted_ = 0;

    // Between the threads.
    BoundedQueue<Picture> queue_;
    std::atomic<int64_t> damaged_{0};
    std::atomic<int64_t> repaired_{0};
    std::atomic<bool> ranDry_{false};
    std::atomic<int64_t> decodedTo_{0};
    std::atomic<bool> deinterlaced_{false};
    std::atomic<bool> leftInterlaced_{false};
    std::atomic<bool> narrowed_{false};
    PictureNotes notes_;
    std::thread thread_;

    // The engine worker's.
    Picture current_;
    std::optional<Picture> next_; // taken from the queue already
    VideoImage image_{};
    bool ended_ = false;
};

} // namespace movieconv

#endif
