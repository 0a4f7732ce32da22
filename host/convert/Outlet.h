// Brings the news of a conversion to its observer's thread.
#ifndef MOVIECONV_HOST_CONVERT_OUTLET_H
#define MOVIECONV_HOST_CONVERT_OUTLET_H

#include "host/convert/Job.h"
#include "host/convert/Observer.h"

#include <atomic>
#include <memory>
#include <mutex>
#include <utility>

namespace movieconv {

/// Hears news on any thread and hands it on by a Loop; without one itself, one news at a time. What still
/// waits in the loop when this object is destroyed, on the observer's thread, is dropped.
class Outlet final : public Observer {
public:
    Outlet(Observer& observer, Loop loop)
        : observer_(std::make_shared<std::atomic<Observer*>>(&observer)), loop_(std::move(loop)) {}
    ~Outlet() override { *observer_ = nullptr; }

    void Started(const Start& news) override {
        Post([news](Observer& observer) { observer.Started(news); });
    }
    void Progressed(const Progress& news) override {
        Post([news](Observer& observer) { observer.Progressed(news); });
    }
    void Opened(const OpenedFile& news) override {
        Post([news](Observer& observer) { observer.Opened(news); });
    }
    void Closed(const ClosedFile& news) override {
        Post([news](Observer& observer) { observer.Closed(news); });
    }
    void Warned(const Warning& news) override {
        Post([news](Observer& observer) { observer.Warned(news); });
    }
    void LeftBehind(const NotCarried& news) override {
        Post([news](Observer& observer) { observer.LeftBehind(news); });
    }
    void Showed(const std::shared_ptr<const ShownPicture>& news) override {
        Post([news](Observer& observer) { observer.Showed(news); });
    }
    void Ended(const Verdict& news) override {
        if (loop_)
            Post([news](Observer& observer) { observer.Ended(news); });
        else // without a copy, so that it is not lost for want of memory
            Post([&news](Observer& observer) { observer.Ended(news); });
    }

private:
    template <class Tell>
    void Post(Tell tell) {
        const auto run = [observer = observer_, tell = std::move(tell)] {
            if (Observer* present = *observer)
                tell(*present);
        };
        if (loop_) {
            loop_(run);
        } else {
            const std::lock_guard lock(turn_);
            run();
        }
    }

    const std::shared_ptr<std::atomic<Observer*>> observer_;
    const Loop loop_;
    std::mutex turn_; // where there is no loop to put the news in order
};

} // namespace movieconv

#endif
