#include "host/source/ClockRepair.h"

#include "host/source/MediaTime.h"

#include <algorithm>
#include <cstddef>
#include <cstdlib>

namespace movieconv {
namespace {

constexpr int64_t kLargestStep = 10 * kTicksPerSecond;  // between packets of one stream; more is a new clock
constexpr int64_t kLargestFall = kTicksPerSecond / 2;   // likewise, backwards
constexpr int64_t kSmallestFall = kTicksPerSecond / 20; // that is one if pictures and sound both have it
constexpr std::size_t kMostWaiting = 512;               // some seconds, by which one may follow the other

} // namespace

void ClockRepair::Push(std::optional<Packet> packet) {
    int64_t fall = 0;
    if (packet) {
        const auto due = due_.try_emplace(packet->stream, packet->stamp).first;
        fall = due->second - packet->stamp;
        due->second = packet->stamp + packet->length;
    }
    waiting_.push_back({packet, fall});
}

std::optional<int64_t> ClockRepair::Pop(bool all) {
    if (waiting_.empty())
        return std::nullopt;
    const std::optional<Packet> packet = waiting_.front().packet;
    int64_t shift = shift_;
    if (packet) {
        const std::optional<int64_t> known = ShiftFor(*packet, all || waiting_.size() >= kMostWaiting);
        if (!known)
            return std::nullopt;
        shift = *known;
        streams_[packet->stream] = {packet->sound, packet->stamp + shift + packet->length, shift != shift_};
    }
    waiting_.pop_front();
    return shift;
}

/// Nothing where it depends on what follows, unless it is `certain` that nothing more will tell.
std::optional<int64_t> ClockRepair::ShiftFor(const Packet& packet, bool certain) {
    const auto found = streams_.find(packet.stream);
    if (found == streams_.end())
        return shift_;
    const Stream& stream = found->second;
    const int64_t shift = IsEarlier(packet, stream) ? earlier_ : shift_;
    const int64_t fall = stream.due - (packet.stamp + shift);
    if (fall >= kSmallestFall && fall <= kLargestFall && !OthersFall(packet.sound, fall))
        return certain || !HasOthers(packet.sound) ? std::optional(shift) : std::nullopt;
    if (fall < kSmallestFall && Ahead(packet, stream, shift) <= kLargestStep)
        return shift;
    earlier_ = shift_;
    shift_ = stream.due - packet.stamp;
    ++jumps_;
    for (auto& [number, other] : streams_)
        other.lags = true;
    return shift_;
}

/// Whether a packet has the clock before the latest jump: where it changes, the last packets of one stream
/// can come after the first ones of the other.
bool ClockRepair::IsEarlier(const Packet& packet, const Stream& stream) const {
    const int64_t jump = std::abs(shift_ - earlier_);
    // A gap of a stream that has the new clock can be as long as a small jump.
    if (jump <= kLargestFall)
        return stream.lags && std::abs(packet.stamp + earlier_ - stream.due) * 2 < jump;
    const auto off = [&](int64_t shift) {
        return Ahead(packet, stream, shift) + std::max<int64_t>(stream.due - (packet.stamp + shift), 0);
    };
    return off(earlier_) < off(shift_);
}

/// Where others have gone on meanwhile, a step is a gap of this stream alone.
int64_t ClockRepair::Ahead(const Packet& packet, const Stream& stream, int64_t shift) const {
    int64_t reached = stream.due;
    for (const auto& [number, other] : streams_)
        reached = std::max(reached, other.due);
    return std::max<int64_t>(packet.stamp + shift - reached, 0);
}

/// Whether a packet of the other kind that waits falls by about as much.
bool ClockRepair::OthersFall(bool sound, int64_t fall) const {
    return std::any_of(waiting_.begin(), waiting_.end(), [&](const Waiting& waiting) {
        return waiting.packet && waiting.packet->sound != sound && std::abs(waiting.fall - fall) * 2 <= fall;
    });
}

bool ClockRepair::HasOthers(bool sound) const {
    return std::any_of(streams_.begin(), streams_.end(),
                       [&](const auto& stream) { return stream.second.sound != sound; });
}

} // namespace movieconv
