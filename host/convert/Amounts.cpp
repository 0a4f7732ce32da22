#include "host/convert/Amounts.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <fmt/format.h>

namespace movieconv {

std::string FormatTime(double seconds, bool milliseconds) {
    constexpr double kMostSeconds = 1e9;
    const double bounded = std::isfinite(seconds) ? std::clamp(seconds, 0.0, kMostSeconds) : 0;
    const auto ms =
        static_cast<int64_t>(milliseconds ? std::llround(bounded * 1000) : std::floor(bounded) * 1000);
    const std::string text = fmt::format("{}:{:02}:{:02}", ms / 3'600'000, ms / 60'000 % 60, ms / 1000 % 60);
    return milliseconds ? fmt::format("{}.{:03}", text, ms % 1000) : text;
}

std::string FormatBytes(int64_t bytes) {
    constexpr std::array kUnits{"kB", "MB", "GB", "TB"};
    if (bytes < 1000)
        return fmt::format("{} B", bytes);
    double value = static_cast<double>(bytes) / 1000;
    std::size_t unit = 0;
    while (value >= 999.95 && unit + 1 < kUnits.size()) {
        value /= 1000;
        ++unit;
    }
    return fmt::format("{:.1f} {}", value, kUnits[unit]);
}

std::string FormatByteRange(int64_t least, int64_t most) {
    return fmt::format("{} to {}", FormatBytes(least), FormatBytes(most));
}

} // namespace movieconv
