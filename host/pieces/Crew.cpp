#include "host/pieces/Crew.h"

#include "host/convert/Attempt.h"

#include <algorithm>
#include <mutex>
#include <utility>

namespace movieconv {
/// One conversion under way.
class Crew::Hand final : public Observer {
public:
    Hand(Crew& crew, Assignment assignment)
        : crew_(crew),
          input_(assignment.request.input),
          errand_(std::move(assignment.errand)),
          job_(std::move(assignment.request), *this) {}

    Job& Conversion() { return job_; }
    const std::string& Input() const { return input_; }

    Progress Latest() const {
        const std::lock_guard lock(mutex_);
        return latest_;
    }
    double Share() const { return errand_->Share(Latest()); }

    /// How it ended; nothing before.
    std::optional<Verdict> Ending() const {
        const std::lock_guard lock(mutex_);
        return ending_;
    }

    void Progressed(const Progress& news) override {
        const std::lock_guard lock(mutex_);
        latest_ = news;
    }
    void Opened(const OpenedFile& news) override { errand_->Opened(news); }
    void Closed(const ClosedFile& news) override { errand_->Closed(news); }
    void Warned(const Warning& news) override { errand_->Warned(news); }
    void LeftBehind(const NotCarried& news) override { errand_->LeftBehind(news); }
    void Ended(const Verdict& news) override {
        concluding_ = &news;
        Verdict verdict = Attempt(*this, &Hand::Conclude);
        {
            const std::lock_guard lock(mutex_);
            ending_ = std::move(verdict);
        }
        crew_.bell_.Ring();
    }

private:
    Verdict Conclude() {
        Verdict verdict = *concluding_;
        errand_->Conclude(verdict);
        return verdict;
    }

    Crew& crew_;
    const std::string input_;
    const std::unique_ptr<Errand> errand_;
    const Verdict* concluding_ = nullptr; // while Ended runs
    mutable std::mutex mutex_;
    Progress latest_;
    std::optional<Verdict> ending_;
    Job job_; // last: the others hear from it
};

Crew::Crew(Observer& observer, Loop loop) : outlet_(observer, std::move(loop)), clock_(WorkClock::Now()) {}

Crew::~Crew() = default;

void Crew::Start() {
    thread_ = std::thread([this] { Run(); });
}

void Crew::Pause() {
    pause_ = true;
    bell_.Ring();
}

void Crew::Resume() {
    pause_ = false;
    bell_.Ring();
}

void Crew::Stop() {
    stop_ = true;
    bell_.Ring();
}

void Crew::Finish() {
    Stop();
    if (thread_.joinable())
        thread_.join();
}

const Verdict* Crew::Result() const {
    return ending_.Result();
}

void Crew::Wait() {
    ending_.Wait();
}

void Crew::Run() noexcept {
    // cppcheck-suppress throwInNoexceptFunction ; Attempt catches it
    Verdict verdict = Attempt(*this, &Crew::Perform);
    hands_.clear();
    ending_.Come(std::move(verdict), outlet_);
}

void Crew::WorkOff(int atOnce) {
    clock_.Skip(WorkClock::Now());
    for (;;) {
        TickAfterWait();
        FollowWishes();
        const Mood mood = HowToGoOn();
        if (mood == Mood::kBreaksOff)
            for (const auto& hand : hands_)
                hand->Conversion().Stop();
        while (HowToGoOn() == Mood::kGoesOn && !paused_ && HasMore() &&
               static_cast<int>(hands_.size()) < atOnce) {
            if (std::optional<Assignment> assignment = Next()) {
                auto hand = std::make_unique<Hand>(*this, std::move(*assignment));
                hand->Conversion().Start();
                hands_.push_back(std::move(hand));
            }
        }
        if (hands_.empty() && (mood != Mood::kGoesOn || !HasMore()))
            return;
        Report();
        TickAfterWait(); // all of this is short: what takes long is that the whole process was suspended
        TickClock(AllWaitForRoom());
        bell_.Wait(paused_ ? std::nullopt : std::optional(WorkClock::kTick));
        TakeEnded();
    }
}

void Crew::TakeEnded() {
    for (auto hand = hands_.begin(); hand != hands_.end();) {
        const std::optional<Verdict> ending = (*hand)->Ending();
        if (!ending) {
            ++hand;
            continue;
        }
        const std::string input = (*hand)->Input();
        hand = hands_.erase(hand);
        Take(input, *ending);
    }
}

void Crew::FollowWishes() {
    if (pause_ != paused_ && !stop_) {
        paused_ = pause_;
        for (const auto& hand : hands_) {
            if (paused_)
                hand->Conversion().Pause();
            else
                hand->Conversion().Resume();
        }
    }
    paused_ = paused_ && !stop_;
    TickClock(AllWaitForRoom());
}

bool Crew::AllWaitForRoom() const {
    return !hands_.empty() && std::all_of(hands_.begin(), hands_.end(), [](const auto& hand) {
        return hand->Latest().phase == Phase::kWaitingForRoom;
    });
}

void Crew::TickClock(bool stands) {
    if (paused_ || stands)
        clock_.Stand(WorkClock::Now());
    else
        clock_.Go(WorkClock::Now());
}

Progress Crew::UnderWay() const {
    Progress sum;
    sum.phase = paused_ ? Phase::kPaused : Phase::kConverting;
    for (const auto& hand : hands_) {
        const Progress latest = hand->Latest();
        sum.position += hand->Share();
        sum.length += std::max(latest.length, latest.position);
        sum.bytes += latest.bytes;
        if (latest.phase == Phase::kWaitingForRoom)
            sum.phase = Phase::kWaitingForRoom;
    }
    return sum;
}

void Crew::Tell(Progress report) {
    report.phaseChanged = std::exchange(told_, report.phase) != report.phase;
    report.worked = clock_.Seconds();
    speed_.Add(report.worked, report.position);
    report.speed = speed_.Speed();
    report.left = speed_.Left(report.length);
    if (report.length > 0)
        report.percent = std::min(report.position / report.length * 100, kMostPercent);
    outlet_.Progressed(report);
}

} // namespace movieconv
