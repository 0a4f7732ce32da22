// A thread for what may take its time: looking at files, at movies, at disks.
#ifndef MOVIECONV_HOST_WINDOW_MODEL_WORKER_H
#define MOVIECONV_HOST_WINDOW_MODEL_WORKER_H

#include <QObject>

#include <chrono>
#include <condition_variable>
#include <deque>
#include <functional>
#include <mutex>
#include <thread>
#include <utility>

namespace movieconv::window {

/// Does one task after the other. Its end drops what has not begun and waits for what has.
class Worker {
public:
    using Task = std::function<void()>;

    Worker() : thread_([this] { Run(); }) {}
    Worker(const Worker&) = delete;
    Worker& operator=(const Worker&) = delete;
    ~Worker();

    /// A task that takes the place of one of the same key that has not begun; key 0 replaces nothing.
    void Do(quint64 key, Task task);

    /// Drops what has not begun.
    void Forget();

    /// Waits until no worker of the program has anything to do. False when that is not so after `most`: what
    /// waits for a disk or a network may never return, and neither would the worker's end.
    static bool AwaitAll(std::chrono::milliseconds most);

private:
    void Run();

    std::mutex mutex_;
    std::condition_variable changed_;
    std::deque<std::pair<quint64, Task>> tasks_;
    bool ending_ = false;
    std::thread thread_;
};

} // namespace movieconv::window

#endif
