// How long the picture that is shown last stays, which no other picture's stamp tells.
#ifndef MOVIECONV_HOST_SOURCE_LASTSTAY_H
#define MOVIECONV_HOST_SOURCE_LASTSTAY_H

#include "host/source/PacketReader.h"
#include "host/source/StampRepair.h"

#include <cstdint>
#include <optional>

namespace movieconv {

/// Learns it from the packets of the pictures, so that who decodes them and who does not agree.
class LastStay {
public:
    /// In decoding order.
    void Add(const AVPacket& packet);

    /// The stamp of the picture that is shown last; nothing where it is not told how long it stays.
    std::optional<StampRepair::Stamp> Told(const PacketReader& reader, AVRational timeBase) const;

private:
    /// Of a packet, in the stream's unit.
    struct Times {
        int64_t shown;
        int64_t decoded;
        int64_t duration;
    };

    std::optional<Times> last_;   // of the packet that is shown last,
    std::optional<Times> behind_; // of the one decoded next,
    Times latest_{};              // of the one decoded last
};

} // namespace movieconv

#endif
