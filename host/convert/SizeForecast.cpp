#include "host/convert/SizeForecast.h"

#include <algorithm>
#include <cmath>

namespace movieconv {
namespace {

constexpr double kFilled = 2; // seconds of the source that encoders and queues may hold at first
constexpr double kPart = 2;   // seconds
constexpr int kLeastParts = 3;
constexpr double kLeastSeconds = 8;
constexpr double kUnderWay = 3; // seconds of the source that may be on their way into the file at any time
constexpr double kLeastSpread = 0.25;
constexpr double kMostSpread = 1;

} // namespace

/// A file grows in lumps of some seconds. Only where one has just come do bytes and position belong together.
void SizeForecast::Add(double position, int64_t bytes) {
    if (bytes == now_.bytes)
        return;
    now_ = {position, bytes};
    if (first_.position == 0) {
        if (position >= kFilled)
            first_ = last_ = now_;
        return;
    }
    const double seconds = position - last_.position;
    if (seconds < kPart)
        return;
    const double rate = static_cast<double>(bytes - last_.bytes) / seconds;
    last_ = now_;
    ++parts_;
    const double distance = rate - mean_;
    mean_ += distance / parts_;
    squares_ += distance * (rate - mean_);
}

std::optional<ByteRange> SizeForecast::Total(double length) const {
    if (parts_ < kLeastParts || now_.position - first_.position < kLeastSeconds)
        return std::nullopt;
    const double rate = static_cast<double>(now_.bytes - first_.bytes) / (now_.position - first_.position);
    const double deviation = std::sqrt(squares_ / (parts_ - 1));
    const double spread = 1 + std::clamp(2 * deviation / rate, kLeastSpread, kMostSpread);
    const double rest = std::max(length - now_.position, 0.0);
    return ByteRange{now_.bytes + std::llround(rest * rate / spread),
                     now_.bytes + std::llround((rest * spread + kUnderWay) * rate)};
}

} // namespace movieconv
