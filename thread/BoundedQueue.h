// A queue between two threads that holds only so much. It waits on condition variables, unlike the events
// that the engine polls.
#ifndef MOVIECONV_THREAD_BOUNDEDQUEUE_H
#define MOVIECONV_THREAD_BOUNDEDQUEUE_H

#include "thread/Stall.h"

#include <chrono>
#include <condition_variable>
#include <cstddef>
#include <deque>
#include <mutex>
#include <optional>
#include <utility>

/// How the two sides of a queue are named in the log when they wait for each other for long; see WaitAndTell.
struct QueueSides {
    const wchar_t* full;  ///< Who waits for room, and for whom.
    const wchar_t* empty; ///< Who waits for an item, and for whom.
    std::chrono::milliseconds limit = kStallLimit;
};

/// Items in the order they were pushed. All functions may be called on any thread. Who waits for room goes on
/// when the queue is half empty: waking for every single item would cost more than the item.
template <class Item>
class BoundedQueue {
public:
    /// At most `maxItems` items that weigh at most `maxWeight` together; a single item may weigh more.
    BoundedQueue(std::size_t maxItems, std::size_t maxWeight, QueueSides sides)
        : maxItems_(maxItems), maxWeight_(maxWeight), sides_(sides) {}
    BoundedQueue(const BoundedQueue&) = delete;
    BoundedQueue& operator=(const BoundedQueue&) = delete;

    /// Waits for room. False when the queue was finished or closed: the item is gone.
    bool Push(Item item, std::size_t weight = 0) {
        std::unique_lock lock(mutex_);
        if (!AwaitRoom(lock, weight))
            return false;
        items_.emplace_back(std::move(item), weight);
        weight_ += weight;
        lock.unlock();
        item_.notify_one();
        return true;
    }

    /// Waits for room for an item that is still to be made, which saves holding it while waiting. A Push that
    /// follows on the only pushing thread doesn't wait. False when the queue was finished or closed.
    bool WaitForRoom(std::size_t weight = 0) {
        std::unique_lock lock(mutex_);
        return AwaitRoom(lock, weight);
    }

    /// Waits for an item. Nothing once the queue is closed, or finished and empty.
    std::optional<Item> Pop() {
        std::unique_lock lock(mutex_);
        WaitAndTell(
            item_, lock, [&] { return finished_ || !items_.empty(); }, sides_.empty, sides_.limit);
        if (items_.empty())
            return std::nullopt;
        std::optional<Item> item(std::move(items_.front().first));
        weight_ -= items_.front().second;
        items_.pop_front();
        const bool halfEmpty = items_.size() <= maxItems_ / 2 && weight_ <= maxWeight_ / 2;
        lock.unlock();
        if (halfEmpty)
            room_.notify_all();
        return item;
    }

    /// No more items will come; those inside are still handed out.
    void Finish() {
        {
            const std::lock_guard lock(mutex_);
            finished_ = true;
        }
        WakeAll();
    }

    /// Drops what is inside and wakes everyone who waits.
    void Close() {
        {
            const std::lock_guard lock(mutex_);
            finished_ = true;
            items_.clear();
            weight_ = 0;
        }
        WakeAll();
    }

    std::size_t Size() const {
        const std::lock_guard lock(mutex_);
        return items_.size();
    }

private:
    bool AwaitRoom(std::unique_lock<std::mutex>& lock, std::size_t weight) {
        WaitAndTell(
            room_, lock, [&] { return finished_ || HasRoom(weight); }, sides_.full, sides_.limit);
        return !finished_;
    }

    bool HasRoom(std::size_t weight) const {
        return items_.empty() || (items_.size() < maxItems_ && weight_ + weight <= maxWeight_);
    }

    void WakeAll() {
        room_.notify_all();
        item_.notify_all();
    }

    const std::size_t maxItems_;
    const std::size_t maxWeight_;
    const QueueSides sides_;
    mutable std::mutex mutex_;
    std::condition_variable room_;
    std::condition_variable item_;
    std::deque<std::pair<Item, std::size_t>> items_;
    std::size_t weight_ = 0;
    bool finished_ = false;
};

#endif
