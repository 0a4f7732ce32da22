// Frame rates as fractions.
#ifndef MOVIECONV_FFMPEG_EXACTRATE_H
#define MOVIECONV_FFMPEG_EXACTRATE_H

extern "C" {
#include <libavutil/rational.h>
}

#include <cmath>

namespace av {

/// The fraction that a frame rate stands for: whole rates and those of the n/1001 family exactly, others as
/// near as a fraction with terms up to 60000 comes. `rate` is a finite number above 0.
inline AVRational ExactRate(double rate) {
    constexpr double kNear = 0.005;
    const double whole = std::round(rate);
    if (whole >= 1 && whole <= 60000 && std::abs(rate - whole) < 0.0005)
        return {static_cast<int>(whole), 1};
    const double ntsc = std::round(rate * 1.001);
    if (ntsc >= 1 && ntsc <= 1000 && std::abs(rate * 1.001 - ntsc) < kNear) {
        AVRational exact{static_cast<int>(ntsc) * 1000, 1001};
        av_reduce(&exact.num, &exact.den, exact.num, exact.den, 1'000'000);
        return exact;
    }
    const AVRational near = av_d2q(rate, 60000);
    return near.num > 0 ? near : AVRational{1, 60000};
}

} // namespace av

#endif
