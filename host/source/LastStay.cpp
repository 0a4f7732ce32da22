#include "host/source/LastStay.h"

#include "media/MediaRecords.h"

extern "C" {
#include <libavutil/common.h>
#include <libavutil/mathematics.h>
}

namespace movieconv {
namespace {

constexpr int64_t kLongestStay = int64_t{24} * 3600 * kTicksPerSecond; // what is told longer is meant as open

} // namespace

void LastStay::Add(const AVPacket& packet) {
    if ((packet.flags & AV_PKT_FLAG_DISCARD) != 0)
        return;
    const Times times{packet.pts, packet.dts, packet.duration};
    if (!last_ || times.shown > last_->shown) { // one without a stamp is never that
        last_ = times;
        behind_.reset();
    } else if (!behind_) {
        behind_ = times;
    }
    latest_ = times;
}

std::optional<StampRepair::Stamp> LastStay::Told(const PacketReader& reader, AVRational timeBase) const {
    if (!last_ || last_->shown == AV_NOPTS_VALUE || latest_.shown == AV_NOPTS_VALUE)
        return std::nullopt;
    // Some containers know only how long it is until the next picture is decoded. There the one decoded last
    // tells what comes after all.
    const bool isStep = behind_ && last_->duration == av_sat_sub64(behind_->decoded, last_->decoded);
    const int64_t duration =
        av_rescale_q(isStep ? latest_.duration : last_->duration, timeBase, {1, kTicksPerSecond});
    if (duration <= 0 || duration > kLongestStay)
        return std::nullopt;
    return StampRepair::Stamp{reader.MediaTime(last_->shown, timeBase), duration};
}

} // namespace movieconv
