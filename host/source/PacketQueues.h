// What was read of a source's streams and not taken yet.
#ifndef MOVIECONV_HOST_SOURCE_PACKETQUEUES_H
#define MOVIECONV_HOST_SOURCE_PACKETQUEUES_H

#include "ffmpeg/AvHandles.h"

#include <compare>
#include <cstddef>
#include <cstdint>
#include <deque>
#include <map>
#include <optional>

namespace movieconv {

/// Knows what is worth reading on for, too. Its owner guards it; times are media time.
class PacketQueues {
public:
    /// Who takes a stream's packets: a decoder, or what goes into the output beside pictures and sound.
    struct Taker {
        int stream;
        bool beside = false;

        auto operator<=>(const Taker&) const = default; // NOLINT(modernize-use-nullptr): it sees a 0
    };

    struct Queue {
        std::deque<av::Packet> packets;
        std::size_t bytes = 0;
        std::optional<int64_t> end;      // of what was read
        int64_t silentUntil = INT64_MIN; // told to the taker
        bool mayBeSilent = false;
        int64_t wanted = INT64_MIN; // up to there its taker waits for packets

        /// Null when it is empty.
        av::Packet Pop();
    };

    /// Makes the queue if there is none yet.
    Queue& For(Taker taker) { return queues_[taker]; }

    /// One that there is.
    Queue& At(Taker taker) { return queues_.at(taker); }

    /// Whether anybody takes a stream's packets.
    bool IsTaken(int stream) const { return queues_.count({stream}) + queues_.count({stream, true}) > 0; }

    /// Gives a packet, which ends at `end`, to all who take its stream. False when nobody does. Throws
    /// std::bad_alloc.
    bool Add(av::Packet packet, std::optional<int64_t> end);

    /// Where the last packet of a converted stream ends that was read so far.
    std::optional<int64_t> EndOf(int stream) const;

    /// Of all packets.
    std::size_t Bytes() const;

    /// Whether so much is held that nothing more is read for a stream that stays away.
    bool IsFull() const { return Bytes() >= kMostBytes; }

    /// Whether each converted stream has `packets`, or all of them `bytes`, and nobody waits for a packet.
    bool Holds(std::size_t packets, std::size_t bytes) const;

    /// Up to where an empty queue's stream is known to be silent; nothing unless that is news.
    std::optional<int64_t> Silence(const Queue& queue) const;

    /// Whether the taker of a stream that is read beside the others has to wait for more to be read.
    bool IsAwaited(const Queue& queue) const;

private:
    static constexpr std::size_t kMostBytes = 32 << 20; // while sound stays away

    int64_t Reached() const;

    std::map<Taker, Queue> queues_;
};

} // namespace movieconv

#endif
