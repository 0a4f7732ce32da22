// When a movie's pictures are shown, without decoding them: the engine's source of pictures where only their
// stamps matter.
#ifndef MOVIECONV_HOST_SOURCE_PICTURESTAMPS_H
#define MOVIECONV_HOST_SOURCE_PICTURESTAMPS_H

#include "host/source/Demuxer.h"
#include "host/source/LastStay.h"
#include "host/source/PictureRange.h"
#include "host/source/Source.h"
#include "host/source/StampRepair.h"
#include "host/source/SubtitleBurner.h"
#include "media/Decoders.h"

#include <atomic>
#include <cstdint>
#include <functional>
#include <optional>
#include <queue>
#include <vector>

namespace movieconv {

/// Hands out the pictures that PictureDecoder would, with the same stamps and without planes.
class PictureStamps final : public VideoDecoder {
public:
    /// `burner` draws into those pictures, if there is one, and has to last as long.
    PictureStamps(const Source& source, Demuxer& demuxer, SubtitleBurner* burner = nullptr);

    VideoSourceInfo* GetVideoInfo() override { return &info_; }
    double Seek(double seconds, int mode) override;
    VideoImage* GetCurrentImage() override;
    int DecodeNext(int mode) override;

    /// Leaves out the pictures from that time on, where the one before ends, too. Only before the first is
    /// taken.
    void EndAt(double seconds);

    /// Whether the source's last picture was handed out. Any thread.
    bool RanDry() const { return ranDry_; }

    /// Pictures of which the source does not tell when they are shown.
    int64_t Unstamped() const { return unstamped_; }

    /// Whether the current picture's stamp is not its own, but was put right.
    bool IsRepaired() const { return repaired_; }

private:
    bool Advance();
    std::optional<StampRepair::Stamp> NextSettled();
    std::optional<int64_t> NextShown();
    bool IsShown(const AVPacket& packet);

    const PacketReader& reader_;
    Demuxer& demuxer_;
    const int stream_;
    const AVRational timeBase_;
    const AVCodecID codec_;
    VideoSourceInfo info_{};
    StampRepair repair_;
    LastStay lastStay_;
    std::priority_queue<int64_t, std::vector<int64_t>, std::greater<>> decoded_; // of packets, in media time
    std::optional<int64_t> firstKey_; // when the first picture that can be decoded is shown
    PictureRange range_;
    SubtitleBurner* const burner_;
    PictureStay stay_; // the current picture's
    bool readAll_ = false;
    bool settledAll_ = false;
    bool repaired_ = false;
    bool started_ = false;
    bool ended_ = false;
    VideoImage image_{};
    int64_t unstamped_ = 0;
    std::atomic<bool> ranDry_{false};
};

} // namespace movieconv

#endif
