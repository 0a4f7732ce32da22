#include "host/window/model/Worker.h"

#include <algorithm>
#include <sys/resource.h>

namespace movieconv::window {

Worker::~Worker() {
    {
        const std::lock_guard lock(mutex_);
        tasks_.clear();
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
    if (same == tasks_.end())
        tasks_.emplace_back(key, std::move(task));
    else
        same->second = std::move(task);
    changed_.notify_all();
}

void Worker::Forget() {
    const std::lock_guard lock(mutex_);
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
        const Task task = std::move(tasks_.front().second);
        tasks_.pop_front();
        lock.unlock();
        task();
        lock.lock();
    }
}

} // namespace movieconv::window
