#include "host/source/DecodingThreads.h"

#include <algorithm>
#include <thread>
#include <utility>

namespace movieconv {
namespace {

constexpr int kWarmUpPictures = 4;
constexpr int kFewestJudged = 8;
constexpr int kMostJudged = 24;
constexpr std::size_t kTrialPackets = 400;
constexpr unsigned kMostThreads = 16;
constexpr double kHeavy = 0.5; // bits in a pixel from which decoding is sure to be slower than encoding
constexpr double kBusy = 0.85; // share of the processors from which more threads bring nothing

} // namespace

DecodingThreads::DecodingThreads(double bitsPerPixel) {
    if (bitsPerPixel <= kHeavy)
        trial_.emplace();
}

int DecodingThreads::Many() {
    const unsigned processors = std::thread::hardware_concurrency();
    return processors > 1 ? static_cast<int>(std::min(processors + 2, kMostThreads)) : 1;
}

void DecodingThreads::OnPicture(bool queueIsEmpty) {
    if (++pictures_ == kWarmUpPictures)
        use_ = {};
    else if (pictures_ > kWarmUpPictures && queueIsEmpty)
        ++starved_;
}

std::optional<std::vector<av::Packet>> DecodingThreads::Consider(const AVPacket& packet) {
    av::Packet copy(av_packet_clone(&packet));
    if (!copy) { // no memory for it: the count stays as it is
        trial_.reset();
        return std::nullopt;
    }
    trial_->push_back(std::move(copy));
    const int judged = pictures_ - kWarmUpPictures;
    const bool known = judged >= kFewestJudged || trial_->size() >= kTrialPackets;
    const bool runsEmpty = judged <= 0 || starved_ * 2 > judged;
    if (known && runsEmpty && use_.Processors() < kBusy * std::thread::hardware_concurrency())
        return std::exchange(trial_, std::nullopt);
    if (judged >= kMostJudged || trial_->size() >= kTrialPackets)
        trial_.reset();
    return std::nullopt;
}

} // namespace movieconv
