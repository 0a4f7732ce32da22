#include "host/convert/SpeedMeter.h"

#include <algorithm>

namespace movieconv {
namespace {

constexpr double kWindow = 10;
constexpr double kLeastWork = 0.5;
constexpr double kSpacing = 0.1; // points closer together than this say nothing new

} // namespace

void SpeedMeter::Add(double worked, double position) {
    if (points_.size() > 1 && worked - points_[points_.size() - 2].worked < kSpacing)
        points_.back() = {worked, position};
    else
        points_.push_back({worked, position});
    while (points_.size() > 2 && worked - points_[1].worked >= kWindow)
        points_.pop_front();
}

std::optional<double> SpeedMeter::Speed() const {
    if (points_.empty() || points_.back().worked - points_.front().worked < kLeastWork)
        return std::nullopt;
    const Point& first = points_.front();
    const Point& last = points_.back();
    return (last.position - first.position) / (last.worked - first.worked);
}

std::optional<double> SpeedMeter::Left(double length) const {
    const std::optional<double> speed = Speed();
    if (!speed || *speed <= 0)
        return std::nullopt;
    return std::max(length - points_.back().position, 0.0) / *speed;
}

} // namespace movieconv
