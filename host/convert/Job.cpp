#include "host/convert/Job.h"

#include "host/convert/Attempt.h"
#include "host/convert/Course.h"
#include "host/convert/EncodePlan.h"
#include "host/convert/Outlet.h"
#include "host/convert/OutputCheck.h"
#include "host/convert/Sources.h"

#include <algorithm>
#include <condition_variable>
#include <mutex>
#include <new>
#include <sys/resource.h>
#include <thread>
#include <utility>

namespace movieconv {
namespace {

/// For the calling thread, and so for all that it is going to make.
void StandBack(int niceness) {
    constexpr int kMost = 19;
    if (niceness > 0) // a refusal leaves it as it is
        setpriority(PRIO_PROCESS, 0, std::min(getpriority(PRIO_PROCESS, 0) + niceness, kMost));
}

} // namespace

class Job::Impl {
public:
    Impl(Request request, Observer& observer, Loop loop)
        : request_(std::move(request)), outlet_(observer, std::move(loop)), wishes_(request_.preview) {}
    ~Impl() {
        Stop();
        if (thread_.joinable())
            thread_.join();
    }

    void Start() {
        thread_ = std::thread([this] { Run(); });
    }

    /// The source is interrupted only while it is opened: afterwards it is the course that stops it.
    void Stop() {
        wishes_.stop = true;
        wishes_.bell.Ring();
        const std::lock_guard lock(mutex_);
        if (opening_)
            opening_->Interrupt();
    }

    Wishes& WhatIsWanted() { return wishes_; }

    void Wait() {
        std::unique_lock lock(mutex_);
        end_.wait(lock, [this] { return ended_; });
    }

    const Verdict* Result() const {
        const std::lock_guard lock(mutex_);
        return ended_ ? &verdict_ : nullptr;
    }

private:
    void Run() noexcept;
    Verdict Convert();
    void SetOpening(std::shared_ptr<Interruption> opening);

    const Request request_;
    Outlet outlet_;
    Wishes wishes_;
    mutable std::mutex mutex_;
    std::shared_ptr<Interruption> opening_; // null unless the source is being opened
    std::condition_variable end_;
    bool ended_ = false;
    Verdict verdict_;
    std::thread thread_;
};

void Job::Impl::Run() noexcept {
    StandBack(request_.niceness);
    // cppcheck-suppress throwInNoexceptFunction ; Attempt catches it
    Verdict verdict = Attempt(*this, &Impl::Convert);
    {
        const std::lock_guard lock(mutex_);
        verdict_ = std::move(verdict);
        ended_ = true;
    }
    end_.notify_all();
    try {
        outlet_.Ended(verdict_);
    } catch (const std::bad_alloc&) { // Result tells it
    }
}

Verdict Job::Impl::Convert() {
    ChooseFormat(request_);
    CheckOutput(request_);
    Verdict stopped;
    stopped.outcome = Outcome::kStopped;
    const auto interruption = std::make_shared<Interruption>();
    bool open = false;
    try {
        SetOpening(interruption);
        if (wishes_.stop)
            return stopped;
        Movie movie = OpenMovie(request_, interruption);
        SetOpening(nullptr);
        if (interruption->Interrupted())
            return stopped;
        open = true;
        return Course(request_, movie, wishes_, outlet_).Run();
    } catch (const Failure&) {
        if (open || !interruption->Interrupted())
            throw;
        return stopped;
    }
}

void Job::Impl::SetOpening(std::shared_ptr<Interruption> opening) {
    const std::lock_guard lock(mutex_);
    opening_ = std::move(opening);
}

Job::Job(Request request, Observer& observer, Loop loop)
    : impl_(std::make_unique<Impl>(std::move(request), observer, std::move(loop))) {}

Job::~Job() = default;

void Job::Start() {
    impl_->Start();
}

void Job::Pause() {
    impl_->WhatIsWanted().pause = true;
    impl_->WhatIsWanted().bell.Ring();
}

void Job::Resume() {
    impl_->WhatIsWanted().pause = false;
    impl_->WhatIsWanted().bell.Ring();
}

void Job::Stop() {
    impl_->Stop();
}

void Job::RetryWrite() {
    impl_->WhatIsWanted().retryWrite = true;
    impl_->WhatIsWanted().bell.Ring();
}

void Job::GiveUpWrite() {
    impl_->WhatIsWanted().giveUpWrite = true;
    impl_->WhatIsWanted().bell.Ring();
}

void Job::ShowPictures(std::optional<std::chrono::milliseconds> interval) {
    impl_->WhatIsWanted().pictures.SetInterval(interval);
    impl_->WhatIsWanted().bell.Ring();
}

void Job::Wait() {
    impl_->Wait();
}

const Verdict* Job::Result() const {
    return impl_->Result();
}

} // namespace movieconv
