#include "host/presets/Notation.h"

#include "media/Limits.h"

#include <algorithm>
#include <charconv>
#include <cmath>

namespace movieconv {
namespace {

constexpr double kMostSeconds = 1e9; // thirty years; keeps sums of 100 ns units far from their limit

/// A plain non-negative decimal number, whatever the locale.
std::optional<double> ParseNumber(std::string_view text) {
    double value = 0;
    const auto [end, error] =
        std::from_chars(text.data(), text.data() + text.size(), value, std::chars_format::fixed);
    const bool whole = error == std::errc() && end == text.data() + text.size();
    if (!whole || !std::isfinite(value) || std::signbit(value))
        return std::nullopt;
    return value;
}

bool IsDigits(std::string_view text) {
    return !text.empty() &&
           std::all_of(text.begin(), text.end(), [](char c) { return c >= '0' && c <= '9'; });
}

} // namespace

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
    double factor = 1;
    if (!text.empty() && (text.back() == 'k' || text.back() == 'K'))
        factor = 1e3;
    else if (!text.empty() && text.back() == 'M')
        factor = 1e6;
    if (factor > 1)
        text.remove_suffix(1);
    const auto number = ParseNumber(text);
    if (!number || *number * factor < 1 || *number * factor > INT32_MAX)
        return std::nullopt;
    return static_cast<int32_t>(std::lround(*number * factor));
}

std::optional<int64_t> ParseBytes(std::string_view text) {
    constexpr double kMost = 1e15;
    double factor = 1;
    if (!text.empty() && (text.back() == 'k' || text.back() == 'K'))
        factor = 1e3;
    else if (!text.empty() && text.back() == 'M')
        factor = 1e6;
    else if (!text.empty() && text.back() == 'G')
        factor = 1e9;
    if (factor > 1)
        text.remove_suffix(1);
    const auto number = ParseNumber(text);
    if (!number || *number * factor < 1 || *number * factor > kMost)
        return std::nullopt;
    return std::llround(*number * factor);
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
    if (!number || !divisor || *divisor <= 0 || *number <= 0 || *number / *divisor > kHighestFrameRate)
        return std::nullopt;
    return *number / *divisor;
}

} // namespace movieconv
