#include "host/source/PictureStamps.h"

#include "host/source/MediaTime.h"

namespace movieconv {
namespace {

/// Pictures that a codec may decode before one that is shown earlier; twice what the standards allow.
constexpr std::size_t kMostReordered = 32;

} // namespace

PictureStamps::PictureStamps(const Source& source, Demuxer& demuxer, SubtitleBurner* burner)
    : reader_(source.Reader()),
      demuxer_(demuxer),
      stream_(source.PictureStream()->index),
      timeBase_(source.PictureStream()->time_base),
      codec_(source.PictureStream()->codecpar->codec_id),
      repair_(ToMediaTime(1 / source.Info().pictures->frameRate)),
      burner_(burner) {
    const PictureStreamInfo& pictures = *source.Info().pictures;
    info_.format = {pictures.width, pictures.height, CredibleRate(pictures), pictures.duration};
}

double PictureStamps::Seek(double seconds, int /*mode*/) {
    range_.BeginAt(ToMediaTime(seconds));
    demuxer_.Seek(seconds);
    return seconds;
}

void PictureStamps::EndAt(double seconds) {
    range_.EndAt(ToMediaTime(seconds));
}

VideoImage* PictureStamps::GetCurrentImage() {
    if (!started_) {
        started_ = true;
        ended_ = !Advance();
    }
    return ended_ ? nullptr : &image_;
}

int PictureStamps::DecodeNext(int /*mode*/) {
    ended_ = ended_ || !Advance();
    return ended_ ? 0 : 1;
}

bool PictureStamps::Advance() {
    while (stay_.IsOver()) {
        const std::optional<StampRepair::Stamp> stamp = NextSettled();
        ranDry_ = !stamp;
        if (!stamp)
            return false;
        StampRepair::Stamp fitted = *stamp;
        const PictureRange::Place place = range_.Fit(fitted, settledAll_);
        if (place == PictureRange::Place::kWithin)
            stay_ = {*stamp, fitted};
        if (place == PictureRange::Place::kBehind)
            return false;
    }
    range_.Gave();
    image_ = {};
    image_.nType = kMediaTypePicture;
    image_.nWidth = info_.format.nWidth;
    image_.nHeight = info_.format.nHeight;
    TellTimes(image_, TakePart(stay_, burner_));
    return true;
}

std::optional<StampRepair::Stamp> PictureStamps::NextSettled() {
    while (!settledAll_) {
        const std::optional<int64_t> shown = NextShown();
        settledAll_ = !shown;
        const int before = repair_.Repaired();
        if (const auto settled =
                shown ? repair_.Push(shown) : repair_.Finish(lastStay_.Told(reader_, timeBase_))) {
            repaired_ = repair_.Repaired() != before;
            return settled;
        }
    }
    return std::nullopt;
}

/// The next stamp in the order in which pictures are shown.
std::optional<int64_t> PictureStamps::NextShown() {
    while (!readAll_ && decoded_.size() <= kMostReordered) {
        const av::Packet packet = demuxer_.Take(stream_);
        readAll_ = !packet;
        if (packet)
            lastStay_.Add(*packet);
        if (packet && IsShown(*packet))
            decoded_.push(reader_.MediaTime(packet->pts, timeBase_));
    }
    if (decoded_.empty())
        return std::nullopt;
    const int64_t next = decoded_.top();
    decoded_.pop();
    return next;
}

/// Whether a packet becomes a picture that is shown, at a time that it tells.
bool PictureStamps::IsShown(const AVPacket& packet) {
    constexpr int kVp8ShowFrame = 0x10;
    const bool isStamped = packet.pts != AV_NOPTS_VALUE;
    if (!firstKey_ && isStamped && (packet.flags & AV_PKT_FLAG_KEY) != 0) // though it may not be shown
        firstKey_ = packet.pts;
    if ((packet.flags & AV_PKT_FLAG_DISCARD) != 0 || packet.size <= 0)
        return false;
    if (codec_ == AV_CODEC_ID_VP8 && (packet.data[0] & kVp8ShowFrame) == 0)
        return false;
    if (!isStamped) {
        ++unstamped_;
        return false;
    }
    return firstKey_ &&
           packet.pts >= *firstKey_; // what is shown earlier builds on pictures that are not there
}

} // namespace movieconv
