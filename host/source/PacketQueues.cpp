#include "host/source/PacketQueues.h"

#include "host/source/MediaTime.h"

#include <algorithm>
#include <utility>

namespace movieconv {
namespace {

constexpr int64_t kLatest =
    10 * kTicksPerSecond; // by which sound may come later in the file than its pictures

void Enqueue(PacketQueues::Queue& queue, av::Packet packet, std::optional<int64_t> end) {
    queue.end = std::max(queue.end, end); // nothing is less than any
    queue.bytes += static_cast<std::size_t>(packet->size);
    queue.packets.push_back(std::move(packet));
}

} // namespace

av::Packet PacketQueues::Queue::Pop() {
    if (packets.empty())
        return nullptr;
    av::Packet packet = std::move(packets.front());
    packets.pop_front();
    bytes -= static_cast<std::size_t>(packet->size);
    return packet;
}

bool PacketQueues::Add(av::Packet packet, std::optional<int64_t> end) {
    const auto converted = queues_.find({packet->stream_index});
    const auto beside = queues_.find({packet->stream_index, true});
    if (converted == queues_.end() && beside == queues_.end())
        return false;
    if (converted == queues_.end()) {
        Enqueue(beside->second, std::move(packet), end);
        return true;
    }
    if (beside != queues_.end())
        Enqueue(beside->second, av::CopyOf(*packet), end);
    Enqueue(converted->second, std::move(packet), end);
    return true;
}

std::optional<int64_t> PacketQueues::EndOf(int stream) const {
    const auto found = queues_.find({stream});
    return found != queues_.end() ? found->second.end : std::nullopt;
}

std::size_t PacketQueues::Bytes() const {
    std::size_t bytes = 0;
    for (const auto& [taker, queue] : queues_)
        bytes += queue.bytes;
    return bytes;
}

bool PacketQueues::Holds(std::size_t packets, std::size_t bytes) const {
    bool allFilled = true;
    std::size_t held = 0;
    for (const auto& [taker, queue] : queues_) {
        if (taker.beside ? IsAwaited(queue) : queue.packets.empty() && !Silence(queue))
            return false;
        allFilled = allFilled && (taker.beside || queue.packets.size() >= packets);
        held += taker.beside ? 0 : queue.bytes;
    }
    return allFilled || held >= bytes;
}

std::optional<int64_t> PacketQueues::Silence(const Queue& queue) const {
    if (!queue.mayBeSilent || !queue.packets.empty() || !IsFull())
        return std::nullopt;
    const int64_t silentUntil = Reached() - kLatest;
    const bool isNews = silentUntil > std::max(queue.silentUntil, queue.end.value_or(INT64_MIN));
    return isNews ? std::optional(silentUntil) : std::nullopt;
}

bool PacketQueues::IsAwaited(const Queue& queue) const {
    return queue.packets.empty() && queue.end.value_or(INT64_MIN) < queue.wanted &&
           Reached() - kLatest < queue.wanted && !IsFull();
}

/// How far the pictures and the sound that are converted have been read.
int64_t PacketQueues::Reached() const {
    int64_t reached = INT64_MIN + kLatest;
    for (const auto& [taker, queue] : queues_)
        if (!taker.beside)
            reached = std::max(reached, queue.end.value_or(reached));
    return reached;
}

} // namespace movieconv
