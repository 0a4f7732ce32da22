// One conversion under control, on a thread of its own.
#ifndef MOVIECONV_HOST_CONVERT_JOB_H
#define MOVIECONV_HOST_CONVERT_JOB_H

#include "host/convert/Observer.h"
#include "host/convert/Request.h"
#include "host/convert/Work.h"

#include <chrono>
#include <functional>
#include <memory>
#include <optional>

namespace movieconv {

/// Runs a function soon on the thread that the observer chose, in the order of the calls. Called on any
/// thread. May throw std::bad_alloc: the news is lost, and the conversion ends for want of memory.
using Loop = std::function<void(std::function<void()>)>;

/// Converts one movie, once. A process may have any number of them. All functions may be called on any
/// thread and return at once, but for Wait and the destructor.
class Job final : public Work {
public:
    /// `observer` hears the news by means of `loop`; without one on the conversion's own thread, where it
    /// must return soon and must not wait for the job.
    Job(Request request, Observer& observer, Loop loop = {});
    /// Stops and waits for the end. No news comes afterwards. On the observer's thread.
    ~Job() override;

    void Start() override;
    void Pause() override;
    void Resume() override;

    /// What was converted so far becomes a complete file.
    void Stop() override;

    /// While it waits for room on a full disk: try the write again now; or give up, and the file fails.
    void RetryWrite();
    void GiveUpWrite();

    /// Changes Request::preview.
    void ShowPictures(std::optional<std::chrono::milliseconds> interval);

    /// Waits until the conversion has ended. The last news may still wait in the loop.
    void Wait();

    const Verdict* Result() const override;

private:
    class Impl;
    const std::unique_ptr<Impl> impl_;
};

} // namespace movieconv

#endif
