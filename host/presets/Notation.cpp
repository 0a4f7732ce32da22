#include "host/presets/Notation.h"

#include "media/Limits.h"

#include <algorithm>
#include <charconv>
#include <cmath>

namespace movieconv {
namespace {

constexpr double kMostSeconds = 1e9; // thirty years; keeps sums of 100 ns units far from their limit

bool IsDigits(std::string_view text) {
    return !text.empty() &&
           std::all_of(text.begin(), text.end(), [](char c) { return c >= '0' && c <= '9'; });
}

/// A number from 1 to `most`, perhaps with one of `prefixes` behind it, the first of which is a thousand,
/// each further one a thousand times the one before.
std::optional<double> ParseScaled(std::string_view text, std::string_view prefixes, double most) {
    double factor = 1;
    const char last = text.empty() ? ' ' : text.back() == 'K' ? 'k' : text.back();
    if (const std::size_t place = prefixes.find(last); place != std::string_view::npos) {
        factor = std::pow(1000.0, static_cast<double>(place + 1));
        text.remove_suffix(1);
    }
    const auto number = ParseNumber(text);
    if (!number || *number * factor < 1 || *number * factor > most)
        return std::nullopt;
    return *number * factor;
}

} // namespace

std::optional<double> ParseNumber(std::string_view text) {
    double value = 0;
    const auto [end, error] =
        std::from_chars(text.data(), text.data() + text.size(), value, std::chars_format::fixed);
    const bool whole = error == std::errc() && end == text.data() + text.size();
    if (!whole || !std::isfinite(value) || std::signbit(value))
        return std::nullopt;
    return value;
}

std::optional<int> ParseWhole(std::string_view text, int least, int most) {
    int value = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
    const bool whole = error == std::errc() && end == text.data() + text.size();
    return whole && value >= least && value <= most ? std::optional(value) : std::nullopt;
}

std::optional<double> ParseTime(std::string_view text) {
    double whole = 0;
    int colons = 0;
    for (std::size_t colon = text.find(':'); colon != std::string_view::npos; colon = text.find(':')) {
        const std::string_view part = text.substr(0, colon);
        const auto value = ParseNumber(part);
        if (!IsDigits(part) || ++colons > 2 || !value || (colons == 2 && *value >= 60))
            return std::nullopt;
        whole = (whole + *value) * 60;
        text.remove_prefix(colon + 1);
    }
    const auto seconds = ParseNumber(text);
    if (!seconds || (colons > 0 && *seconds >= 60) || whole + *seconds > kMostSeconds)
        return std::nullopt;
    return whole + *seconds;
}

std::optional<int32_t> ParseRate(std::string_view text) {
    const auto rate = ParseScaled(text, "kM", INT32_MAX);
    return rate ? std::optional(static_cast<int32_t>(std::lround(*rate))) : std::nullopt;
}

std::optional<int64_t> ParseBytes(std::string_view text) {
    constexpr double kMost = 1e15;
    const auto bytes = ParseScaled(text, "kMG", kMost);
    return bytes ? std::optional<int64_t>(std::llround(*bytes)) : std::nullopt;
}

std::optional<Size> ParseSize(std::string_view text) {
    const std::size_t cross = text.find('x');
    if (cross == std::string_view::npos || !IsDigits(text.substr(0, cross)) ||
        !IsDigits(text.substr(cross + 1)))
        return std::nullopt;
    const double width = *ParseNumber(text.substr(0, cross));
    const double height = *ParseNumber(text.substr(cross + 1));
    constexpr double kLeast = 2;
    if (std::min(width, height) < kLeast || std::max(width, height) > kLargestSide)
        return std::nullopt;
    return Size{static_cast<int32_t>(width), static_cast<int32_t>(height)};
}

std::optional<Crop> ParseCrop(std::string_view text) {
    constexpr int kMost = 32768;
    Crop crop;
    for (int* edge : {&crop.top, &crop.bottom, &crop.left, &crop.right}) {
        const std::string_view part = text.substr(0, text.find(':'));
        const auto pixels = ParseNumber(part);
        if (!IsDigits(part) || !pixels || *pixels > kMost)
            return std::nullopt;
        *edge = static_cast<int>(*pixels);
        const bool isLast = edge == &crop.right;
        if (isLast != (part.size() == text.size()))
            return std::nullopt;
        text.remove_prefix(isLast ? part.size() : part.size() + 1);
    }
    return crop;
}

std::optional<double> ParseFrameRate(std::string_view text) {
    const std::size_t slash = text.find('/');
    const auto number = ParseNumber(text.substr(0, slash));
    const auto divisor =
        slash == std::string_view::npos ? std::optional(1.0) : ParseNumber(text.substr(slash + 1));
    if (!number || !divisor || *divisor <= 0)
        return std::nullopt;
    const double rate = *number / *divisor;
    return rate >= kLowestFrameRate && rate <= kHighestFrameRate ? std::optional(rate) : std::nullopt;
}

} // namespace movieconv
