// Whether the output of a conversion finds room on its disk.
#ifndef MOVIECONV_HOST_CONVERT_ROOMWATCH_H
#define MOVIECONV_HOST_CONVERT_ROOMWATCH_H

#include "host/convert/Observer.h"
#include "host/convert/SizeForecast.h"

#include <cstdint>
#include <optional>
#include <string>

namespace movieconv {

/// Warns once at most.
class RoomWatch {
public:
    RoomWatch(std::string output, Observer& observer);

    /// Of an output that is going to have so many bytes, as its rates tell.
    void CheckKnown(int64_t needed);

    /// No rate tells the size: it is reckoned from what is written.
    void Forecast();

    /// `bytes` are in the output when so many seconds of the source were converted.
    void Add(double position, int64_t bytes);

    /// The whole output, of so many seconds; nothing as long as that is open, or where no forecast is made.
    std::optional<ByteRange> Expected(double length) const;

    /// Warns when not even the middle of what is expected finds room.
    void Check(const Progress& report);

private:
    template <class Tell>
    void Warn(int64_t further, Tell tell);

    const std::string output_;
    Observer& observer_;
    std::optional<SizeForecast> forecast_;
    bool isSmall_ = false; // which was told
};

} // namespace movieconv

#endif
