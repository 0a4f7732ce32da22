// How fast the conversion has been of late, and how long the rest will take.
#ifndef MOVIECONV_HOST_CONVERT_SPEEDMETER_H
#define MOVIECONV_HOST_CONVERT_SPEEDMETER_H

#include <deque>
#include <optional>

namespace movieconv {

/// The progress that is told at most until an output has its name.
constexpr double kMostPercent = 99.9;

/// A mean over the last ten seconds of work, which is steady and still follows the material.
class SpeedMeter {
public:
    /// Takes the position in the source, in seconds, reached after so much work. Both never fall.
    void Add(double worked, double position);

    /// Seconds of source a second of work; nothing before half a second of work.
    std::optional<double> Speed() const;

    /// Seconds of work for the rest, up to `length`; nothing while there is no speed.
    std::optional<double> Left(double length) const;

private:
    struct Point {
        double worked;
        double position;
    };
    std::deque<Point> points_;
};

} // namespace movieconv

#endif
