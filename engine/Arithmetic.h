// Integer arithmetic with a defined result for every input.
#ifndef MOVIECONV_ENGINE_ARITHMETIC_H
#define MOVIECONV_ENGINE_ARITHMETIC_H

#include <cmath>
#include <limits>
#include <type_traits>

/// Sum, difference and product modulo 2^n, for time stamps and counts that a source may drive to any value.
template <class T>
constexpr T WrapAdd(T a, T b) {
    using Unsigned = std::make_unsigned_t<T>;
    return static_cast<T>(static_cast<Unsigned>(a) + static_cast<Unsigned>(b));
}

template <class T>
constexpr T WrapSub(T a, T b) {
    using Unsigned = std::make_unsigned_t<T>;
    return static_cast<T>(static_cast<Unsigned>(a) - static_cast<Unsigned>(b));
}

template <class T>
constexpr T WrapMul(T a, T b) {
    using Unsigned = std::make_unsigned_t<T>;
    return static_cast<T>(static_cast<Unsigned>(a) * static_cast<Unsigned>(b));
}

/// Truncates toward zero; what does not fit becomes the nearest value that does, and what is not a number 0.
template <class T>
T Truncate(double value) {
    using Limits = std::numeric_limits<T>;
    if (std::isnan(value))
        return 0;
    if (value <= static_cast<double>(Limits::min()))
        return Limits::min();
    // For 64 bits this limit rounds up to 2^63, which is out of range itself.
    if (value >= static_cast<double>(Limits::max()))
        return Limits::max();
    return static_cast<T>(value);
}

#endif
