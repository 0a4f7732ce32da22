// The clock of recordings that were joined end to end, which starts anew in the middle.
#ifndef MOVIECONV_HOST_SOURCE_CLOCKREPAIR_H
#define MOVIECONV_HOST_SOURCE_CLOCKREPAIR_H

#include <cstdint>
#include <deque>
#include <map>
#include <optional>

namespace movieconv {

/// Finds where the clock jumps and by how much the stamps from there on have to be shifted, so that time goes
/// on where it stopped. A small step backwards of one stream alone is an overlap; if it is a jump, pictures
/// and sound both have it. All times are media time.
class ClockRepair {
public:
    struct Packet {
        int stream;
        bool sound;     ///< Else pictures.
        int64_t stamp;  ///< When it is decoded.
        int64_t length; ///< 0 where it is not known.
    };

    /// Takes the next packet of the file; nothing for one whose stamp tells nothing, since its stream's come
    /// seldom.
    void Push(std::optional<Packet> packet);

    /// What to add to the stamps of the first packet that waits for that. Nothing when there is none, or when
    /// it depends on those that follow, unless these were `all`.
    std::optional<int64_t> Pop(bool all = false);

    int Jumps() const { return jumps_; }

private:
    struct Waiting {
        std::optional<Packet> packet;
        int64_t fall; // behind where the one before it in its stream ended
    };
    struct Stream {
        bool sound = false;
        int64_t due = 0;   // where its next packet is expected, shifted
        bool lags = false; // it has not come to the latest jump
    };

    std::optional<int64_t> ShiftFor(const Packet& packet, bool certain);
    bool IsEarlier(const Packet& packet, const Stream& stream) const;
    int64_t Ahead(const Packet& packet, const Stream& stream, int64_t shift) const;
    bool OthersFall(bool sound, int64_t fall) const;
    bool HasOthers(bool sound) const;

    std::deque<Waiting> waiting_;
    std::map<int, int64_t> due_; // where the next packet of a stream is expected that is pushed, not shifted
    int64_t shift_ = 0;
    int64_t earlier_ = 0; // the shift before the latest jump
    std::map<int, Stream> streams_;
    int jumps_ = 0;
};

} // namespace movieconv

#endif
