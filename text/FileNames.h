// The names that an output has: its clips', and those of files that are not complete yet.
#ifndef MOVIECONV_TEXT_FILENAMES_H
#define MOVIECONV_TEXT_FILENAMES_H

#include <algorithm>
#include <cstddef>
#include <string>
#include <string_view>
#include <utility>

namespace text {

/// Characters that the extension of an output can have at most that is split into clips, with its dot.
constexpr std::size_t kLongestClipExtension = 19;

/// A name up to its last dot, and the rest.
template <class Char>
std::pair<std::basic_string_view<Char>, std::basic_string_view<Char>>
SplitName(std::basic_string_view<Char> name) {
    const std::size_t dot = std::min(name.rfind(Char{'.'}), name.size());
    return {name.substr(0, dot), name.substr(dot)};
}

/// The name of clip `number`, from 0, of the output `name`: NAME_00.EXT, with as many digits as it takes.
template <class Char>
std::basic_string<Char> ClipName(std::basic_string_view<Char> name, std::size_t number) {
    constexpr std::size_t kLeastDigits = 2;
    const auto [base, extension] = SplitName(name);
    std::basic_string<Char> digits;
    for (; number > 0 || digits.size() < kLeastDigits; number /= 10)
        digits.insert(digits.begin(), static_cast<Char>('0' + number % 10));
    std::basic_string<Char> clip(base);
    clip += Char{'_'};
    clip += digits;
    return clip += extension;
}

/// What a file is called until it is complete: its name with this behind it, and then a number from 2 where
/// that name is taken.
constexpr std::string_view kPartialSuffix = ".part";
constexpr int kMostPartials = 1000;

inline std::string PartialSuffix(int number) {
    return std::string(kPartialSuffix) + (number == 1 ? "" : std::to_string(number));
}

} // namespace text

#endif
