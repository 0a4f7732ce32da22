#include "host/convert/Job.h"

#include "host/convert/Attempt.h"
#include "host/convert/Course.h"
#include "host/convert/EncodePlan.h"
#include "host/convert/Ending.h"
#include "host/convert/Outlet.h"
#include "host/convert/OutputCheck.h"
#include "host/convert/Sources.h"

#include <algorithm>
#include <atomic>
#include <exception>
#include <mutex>
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

struct StopWished : std::exception {};

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

    /// Reading is interrupted only until the course runs: afterwards it is the course that stops it.
    void Stop() {
        Want(&Wishes::stop);
        const std::lock_guard lock(mutex_);
        if (opening_)
            opening_->Interrupt();
    }

    void Want(std::atomic<bool> Wishes::*wish, bool on = true) {
        wishes_.*wish = on;
        wishes_.bell.Ring();
    }
    void ShowPictures(PictureTap::Interval interval) {
        wishes_.pictures.SetInterval(interval);
        wishes_.bell.Ring();
    }

    void Wait() { ending_.Wait(); }
    const Verdict* Result() const { return ending_.Result(); }

private:
    void Run() noexcept;
    Verdict Convert();
    void SetOpening(std::shared_ptr<Interruption> opening);
    void HeedStop() const;

    const Request request_;
    Outlet outlet_;
    Wishes wishes_;
    std::mutex mutex_;                      // guards this:
    std::shared_ptr<Interruption> opening_; // null unless the source is opened and looked at
    Ending ending_;
    std::thread thread_;
};

void Job::Impl::Run() noexcept {
    StandBack(request_.niceness);
    // cppcheck-suppress throwInNoexceptFunction ; Attempt catches it
    ending_.Come(Attempt(*this, &Impl::Convert), outlet_);
}

Verdict Job::Impl::Convert() {
    ChooseFormat(request_);
    CheckOutput(request_);
    const auto interruption = std::make_shared<Interruption>();
    bool open = false;
    try {
        SetOpening(interruption);
        HeedStop();
        Movie movie = OpenMovie(request_, interruption);
        HeedStop();
        Course course(request_, movie, wishes_, outlet_);
        course.Prepare();
        SetOpening(nullptr);
        HeedStop();
        open = true;
        return course.Run();
    } catch (const std::exception&) { // also what an interrupted source ends with
        if (open || !wishes_.stop)
            throw;
        Verdict stopped;
        stopped.outcome = Outcome::kStopped;
        return stopped;
    }
}

/// Ends what comes before the course.
void Job::Impl::HeedStop() const {
    if (wishes_.stop)
        throw StopWished();
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
    impl_->Want(&Wishes::pause);
}

void Job::Resume() {
    impl_->Want(&Wishes::pause, false);
}

void Job::Stop() {
    impl_->Stop();
}

void Job::RetryWrite() {
    impl_->Want(&Wishes::retryWrite);
}

void Job::GiveUpWrite() {
    impl_->Want(&Wishes::giveUpWrite);
}

void Job::ShowPictures(std::optional<std::chrono::milliseconds> interval) {
    impl_->ShowPictures(interval);
}

void Job::Wait() {
    impl_->Wait();
}

const Verdict* Job::Result() const {
    return impl_->Result();
}

} // namespace movieconv
