// What all fuzz targets share.
#ifndef MOVIECONV_FUZZ_FUZZ_H
#define MOVIECONV_FUZZ_FUZZ_H

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <limits>

#include <fuzzer/FuzzedDataProvider.h>

/// Ends the process, which the fuzzer takes for a finding, unless `condition` holds.
#define FUZZ_CHECK(condition)                                                                                \
    ((condition) ? static_cast<void>(0)                                                                      \
                 : (static_cast<void>(                                                                       \
                        std::fprintf(stderr, "%s:%d: not true: %s\n", __FILE__, __LINE__, #condition)),      \
                    std::abort()))

/// Mostly `usual`, sometimes anywhere in the range, sometimes small or at its ends.
template <class Integer>
Integer WildInteger(FuzzedDataProvider& input, Integer usual) {
    switch (input.ConsumeIntegralInRange(0, 7)) {
    case 0:
        return input.ConsumeIntegral<Integer>();
    case 1:
        return input.PickValueInArray<Integer>({0, 1, 2, 3, std::numeric_limits<Integer>::max(),
                                                std::numeric_limits<Integer>::min(),
                                                static_cast<Integer>(-1)});
    default:
        return usual;
    }
}

inline double WildDouble(FuzzedDataProvider& input, double usual) {
    switch (input.ConsumeIntegralInRange(0, 7)) {
    case 0:
        return input.ConsumeFloatingPoint<double>();
    case 1:
        return input.PickValueInArray({0.0, -0.0, 0.001, 1e-300, -1.0, 1e300, -1e300,
                                       std::numeric_limits<double>::infinity(),
                                       std::numeric_limits<double>::quiet_NaN()});
    default:
        return usual;
    }
}

#endif
