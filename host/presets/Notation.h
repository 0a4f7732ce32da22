// The notations of the command line and of presets: times, bit rates, picture sizes.
#ifndef MOVIECONV_HOST_PRESETS_NOTATION_H
#define MOVIECONV_HOST_PRESETS_NOTATION_H

#include "host/convert/Preferences.h"
#include "host/convert/Request.h"

#include <cstdint>
#include <optional>
#include <string_view>

namespace movieconv {

/// A decimal number from 0 on, as "23" or "23.5", whatever the locale. Nothing for anything else.
std::optional<double> ParseNumber(std::string_view text);

/// A whole number from `least` to `most`. Nothing for anything else.
std::optional<int> ParseWhole(std::string_view text, int least, int most);

/// Seconds from "83.5", "1:23.5" or "0:01:23.5". Nothing for anything else, negative times included.
std::optional<double> ParseTime(std::string_view text);

/// Bits per second from "512000", "512k" or "1.5M" (powers of 1000). Nothing for anything else, 0 included.
std::optional<int32_t> ParseRate(std::string_view text);

/// Bytes from "25000000", "700k", "25M" or "4.7G" (powers of 1000). Nothing for anything else, 0 included.
std::optional<int64_t> ParseBytes(std::string_view text);

/// From "640x360", both from 2 to kLargestSide. Nothing for anything else.
std::optional<Size> ParseSize(std::string_view text);

/// Pictures per second from "25", "23.976" or "30000/1001", from 0.1 to 200. Nothing for anything else.
std::optional<double> ParseFrameRate(std::string_view text);

/// From "T:B:L:R", each up to 32768. Nothing for anything else.
std::optional<Crop> ParseCrop(std::string_view text);

} // namespace movieconv

#endif
