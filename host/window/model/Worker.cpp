#include "host/window/model/Worker.h"

#include <algorithm>
#include <cstddef>
#include <iterator>
#include <sys/resource.h>

namespace movieconv::window {
namespace {

/// Counts the tasks of all workers that are not done.
class TaskCount {
public:
    static void Add(std::ptrdiff_t tasks) {
        const std::lock_guard lock(mutex);
        count += tasks;
        changed.notify_all();
    }
    static bool AwaitNone(std::chrono::milliseconds most) {
        std::unique_lock lock(mutex);
        return changed.wait_for(lock, most, [] { return count == 0; });
    }

private:
    static inline std::mutex mutex;
    static inline std::condition_variable changed;
    static inline std::ptrdiff_t count = 0;
};

} // namespace

bool Worker::AwaitAll(std::chrono::milliseconds most) {
    return TaskCount::AwaitNone(most);
}

Worker::~Worker() {
    Forget();
    {
        const std::lock_guard lock(mutex_);
        ending_ = true;
        changed_.notify_all();
    }
    thread_.join();
}

void Worker::Do(quint64 key, Task task) {
    const std::lock_guard lock(mutex_);
    const auto same = key == 0 ? tasks_.end()
                               : std::find_if(tasks_.begin(), tasks_.end(),
                                              [&](const auto& waiting) { return waiting.first == key; });
    if (same == tasks_.end()) {
        tasks_.emplace_back(key, std::move(task));
        TaskCount::Add(1);
    } else {
        same->second = std::move(task);
    }
    changed_.notify_all();
}

void Worker::Forget() {
    const std::lock_guard lock(mutex_);
    TaskCount::Add(-std::ssize(tasks_));
    tasks_.clear();
}

void Worker::Run() {
    constexpr int kNiceness = 5; // behind the window, before conversions
    setpriority(PRIO_PROCESS, 0, kNiceness);
    std::unique_lock lock(mutex_);
    while (true) {
        changed_.wait(lock, [&] { return !tasks_.empty() || ending_; });
        if (ending_)
            return;
        Task task = std::move(tasks_.front().second);
        tasks_.pop_front();
        lock.unlock();
        task();
        task = nullptr; // what it holds may take its time to end
        TaskCount::Add(-1);
        lock.lock();
    }
}

} // namespace movieconv::window
