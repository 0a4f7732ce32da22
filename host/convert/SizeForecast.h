// How large an output is going to be, learned from what was written of it so far.
#ifndef MOVIECONV_HOST_CONVERT_SIZEFORECAST_H
#define MOVIECONV_HOST_CONVERT_SIZEFORECAST_H

#include "host/convert/Observer.h"

#include <cstdint>
#include <optional>

namespace movieconv {

/// For outputs whose size follows from a quality and not from rates. The range is the wider the more the rate
/// has varied, and closes in as the rest gets shorter. The truth may still lie outside: what follows may be
/// of another kind.
class SizeForecast {
public:
    /// `bytes` are in the output when so many seconds of the source were converted. Neither falls.
    void Add(double position, int64_t bytes);

    /// Of the whole output; nothing before ten seconds of the source and three lumps of bytes.
    std::optional<ByteRange> Total(double length) const;

private:
    struct Point {
        double position = 0;
        int64_t bytes = 0;
    };

    Point first_; // where encoders and queues had filled
    Point last_;  // where the last part ended
    Point now_;
    int parts_ = 0;
    double mean_ = 0;    // bytes a second, of the parts
    double squares_ = 0; // sum of the squared distances from it
};

} // namespace movieconv

#endif
