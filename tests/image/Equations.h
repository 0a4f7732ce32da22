// The colour equations once more, in the plainest form there is: what the conversions are tested against.
#ifndef MOVIECONV_TESTS_IMAGE_EQUATIONS_H
#define MOVIECONV_TESTS_IMAGE_EQUATIONS_H

#include <algorithm>
#include <cstdint>

namespace equations {

struct Rgb {
    int r, g, b;
};

struct Yuv {
    int y, u, v;
};

/// The quotient rounded toward minus infinity.
constexpr int Floor(int dividend, int divisor) {
    return dividend % divisor < 0 ? dividend / divisor - 1 : dividend / divisor;
}

/// Y, U and V as stored, for components of 0 to 255. A block's chroma is the average of its pixels', which
/// are never negative, rounded down.
constexpr Yuv FastYuv(Rgb p) {
    return {Floor(4211 * p.r + 8258 * p.g + 1606 * p.b, 16384) + 16,
            Floor(7193 * p.b - 4768 * p.g - 2425 * p.r, 16384) + 128,
            Floor(7193 * p.r - 6029 * p.g - 1163 * p.b, 16384) + 128};
}

constexpr Yuv SimpleYuv(Rgb p) {
    return {Floor(263 * p.r + 516 * p.g + 100 * p.b + 16896, 1024),
            Floor(-152 * p.r - 298 * p.g + 450 * p.b + 131584, 1024),
            Floor(450 * p.r - 377 * p.g - 73 * p.b + 131584, 1024)};
}

constexpr Rgb ClampedRgb(int r, int g, int b) {
    return {std::clamp(r, 0, 255), std::clamp(g, 0, 255), std::clamp(b, 0, 255)};
}

constexpr Rgb FastRgb(Yuv p) {
    return ClampedRgb(Floor(9536 * p.y + 13074 * p.v - 1826095, 8192),
                      Floor(9536 * p.y - 3203 * p.u - 6660 * p.v + 1109918, 8192),
                      Floor(9536 * p.y + 16532 * p.u - 2268594, 8192));
}

constexpr Rgb SimpleRgb(Yuv p) {
    return ClampedRgb(Floor(1192 * p.y + 1634 * p.v - 227712, 1024),
                      Floor(1192 * p.y - 401 * p.u - 833 * p.v + 139392, 1024),
                      Floor(1192 * p.y + 2065 * p.u - 282880, 1024));
}

} // namespace equations

#endif
