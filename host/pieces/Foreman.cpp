#include "host/pieces/Foreman.h"

#include "host/convert/Amounts.h"
#include "host/convert/Attempt.h"
#include "host/convert/Failure.h"
#include "host/convert/OutputCheck.h"
#include "host/convert/Sources.h"
#include "host/pieces/Joiner.h"
#include "host/pieces/PieceFile.h"
#include "host/pieces/WholeFile.h"
#include "host/source/MediaTime.h"

#include <algorithm>
#include <chrono>
#include <filesystem>
#include <fmt/format.h>
#include <fstream>
#include <new>
#include <unistd.h>
#include <utility>

namespace movieconv {
namespace {

double LengthOf(const Piece& piece) {
    return ToSeconds(piece.end - piece.begin);
}

/// Bytes that new programs can have; 0 when it is not told.
int64_t AvailableMemory() {
    std::ifstream file("/proc/meminfo");
    std::string name;
    int64_t kilobytes = 0;
    std::string unit;
    while (file >> name >> kilobytes && std::getline(file, unit))
        if (name == "MemAvailable:")
            return kilobytes * 1024;
    return 0;
}

Request RequestOf(const PieceOrder& order, const Plan& plan, int number, const std::string& file) {
    Request request = RequestFor(plan, number, file);
    request.onFull = order.onFull;
    request.niceness = order.niceness;
    return request;
}

/// What making one piece takes at most: pictures waiting for each other, and the encoder's view of its
/// future.
int64_t MemoryPerPiece(const PictureStreamInfo& pictures) {
    constexpr int64_t kFixed = 40 << 20;
    constexpr int64_t kPicturesHeld = 70;
    return kFixed + kPicturesHeld * pictures.width * pictures.height * 3 / 2;
}

} // namespace

std::string PlanPathFor(const std::string& output) {
    return output + ".plan";
}

/// One piece being made, from its conversion to its name.
class Foreman::Task final : public Observer {
public:
    Task(Foreman& foreman, const Plan& plan, int number)
        : foreman_(foreman),
          plan_(plan),
          number_(number),
          file_(NameInTheMaking(PiecePath(foreman.order_.planPath, number))),
          job_(RequestOf(foreman.order_, plan, number, file_), *this) {}

    Job& Conversion() { return job_; }

    /// Ends it; whatever it then has made is not the piece.
    void Stop() { job_.Stop(); }

    /// Seconds of pictures that it brings; of the rest none, unless nothing else is made.
    double Length() const {
        if (!plan_.IsRest(number_))
            return LengthOf(plan_.pictures[static_cast<std::size_t>(number_)]);
        return foreman_.order_.only ? foreman_.length_ : 0;
    }

    /// How far it is, and how it ended, which is nothing before.
    Progress Latest() const {
        const std::lock_guard lock(mutex_);
        return latest_;
    }
    std::optional<Verdict> Ending() const {
        const std::lock_guard lock(mutex_);
        return ending_;
    }
    int64_t Bytes() const {
        const std::lock_guard lock(mutex_);
        return bytes_;
    }

    void Progressed(const Progress& news) override {
        const std::lock_guard lock(mutex_);
        latest_ = news;
    }
    void Closed(const ClosedFile& news) override { pictures_ = news.pictures; }
    void Warned(const Warning& news) override { foreman_.outlet_.Warned(news); }
    void Ended(const Verdict& news) override {
        Verdict verdict = news;
        int64_t bytes = 0;
        try {
            if (verdict.outcome == Outcome::kDone) {
                CheckCount(verdict);
                bytes = SealPiece(file_, plan_, foreman_.order_.planPath, number_);
            }
        } catch (const Failure& failure) {
            verdict.outcome = Outcome::kFailed;
            verdict.failure = failure;
        } catch (const std::bad_alloc&) {
            verdict.outcome = Outcome::kFailed;
            verdict.failure = Failure(Category::kInternal, {}, Reason::kNoMemory);
        }
        if (verdict.outcome != Outcome::kDone)
            unlink(file_.c_str());
        {
            const std::lock_guard lock(mutex_);
            bytes_ = bytes;
            ending_ = std::move(verdict);
        }
        foreman_.bell_.Ring();
    }

private:
    /// Throws Failure when not every planned picture was taken, unless the source is damaged there.
    void CheckCount(const Verdict& verdict) const {
        if (plan_.IsRest(number_))
            return;
        const int64_t planned = plan_.pictures[static_cast<std::size_t>(number_)].pictures;
        if (pictures_ == planned || (pictures_ < planned && verdict.damaged > 0))
            return;
        throw Failure(Category::kSource,
                      fmt::format("piece {} has {} pictures, {} were planned: \"{}\" holds others than its "
                                  "stamps tell, and can only be converted undivided",
                                  number_, pictures_, planned, plan_.source.path));
    }

    Foreman& foreman_;
    const Plan& plan_;
    const int number_;
    const std::string file_;
    int64_t pictures_ = 0;
    mutable std::mutex mutex_;
    Progress latest_;
    std::optional<Verdict> ending_;
    int64_t bytes_ = 0;
    Job job_; // last: the others hear from it
};

Foreman::Foreman(PieceOrder order, Observer& observer, Loop loop)
    : order_(std::move(order)), outlet_(observer, std::move(loop)), clock_(WorkClock::Now()) {}

Foreman::~Foreman() {
    Stop();
    if (thread_.joinable())
        thread_.join();
}

void Foreman::Start() {
    thread_ = std::thread([this] { Run(); });
}

void Foreman::Pause() {
    pause_ = true;
    bell_.Ring();
}

void Foreman::Resume() {
    pause_ = false;
    bell_.Ring();
}

void Foreman::Stop() {
    stop_ = true;
    bell_.Ring();
}

const Verdict* Foreman::Result() const {
    const std::lock_guard lock(mutex_);
    return ended_ ? &verdict_ : nullptr;
}

void Foreman::Wait() {
    std::unique_lock lock(mutex_);
    end_.wait(lock, [this] { return ended_; });
}

void Foreman::Run() noexcept {
    // cppcheck-suppress throwInNoexceptFunction ; Attempt catches it
    Verdict verdict = Attempt(*this, &Foreman::Perform);
    {
        const std::lock_guard lock(mutex_);
        tasks_.clear();
        verdict_ = std::move(verdict);
        ended_ = true;
    }
    end_.notify_all();
    try {
        outlet_.Ended(verdict_);
    } catch (const std::bad_alloc&) { // Result tells it
    }
}

Verdict Foreman::Perform() {
    const std::optional<Plan> plan = Prepare();
    Verdict stopped;
    stopped.outcome = Outcome::kStopped;
    if (!plan)
        return stopped;
    CheckAgainst(*plan);
    std::deque<int> missing = Missing(*plan);
    Announce(*plan, missing);
    Verdict verdict = MakeAll(*plan, std::move(missing));
    if (verdict.outcome != Outcome::kDone || !order_.join)
        return verdict;
    return JoinAll(*plan);
}

/// The plan, made and written where that was asked for; nothing when it was stopped.
std::optional<Plan> Foreman::Prepare() {
    if (!order_.request) {
        Plan plan = ReadPlan(order_.planPath);
        if (order_.only && (*order_.only < 0 || *order_.only >= plan.Pieces()))
            throw Failure(Category::kRequest, fmt::format("the plan has the pieces 0 to {}, no piece {}",
                                                          plan.Pieces() - 1, *order_.only));
        return plan;
    }
    CheckOutput(*order_.request);
    if (std::optional<Plan> before = Leftover(BeginPlan(*order_.request, order_.division)))
        return before;
    std::optional<Plan> plan = MakePlan(
        *order_.request, order_.division,
        [](void* self) { return static_cast<Foreman*>(self)->stop_.load(); }, this);
    if (plan)
        WritePlan(order_.planPath, *plan);
    return plan;
}

/// The plan of an earlier run that is to be gone on with. Otherwise what is left of one is told, and removed.
std::optional<Plan> Foreman::Leftover(const Plan& now) {
    const bool planned = std::filesystem::exists(order_.planPath);
    const int pieces = CountPieces(order_.planPath);
    if (planned && order_.resume) {
        Plan before = ReadPlan(order_.planPath);
        if (const std::string difference = Difference(before, now); !difference.empty())
            throw Failure(Category::kRequest,
                          fmt::format("\"{}\" is of another conversion: {}", order_.planPath, difference),
                          Reason::kCannotResume);
        return before;
    }
    if (!order_.resume && (planned || pieces > 0)) {
        outlet_.Warned({Warning::Kind::kLeftover,
                        fmt::format("\"{}\" with {} pieces is left of an earlier run; it is made anew",
                                    order_.planPath, pieces)});
    }
    RemovePieces(order_.planPath);
    return std::nullopt;
}

/// The numbers of the pieces that are to be made; the rest first, which takes longest.
std::deque<int> Foreman::Missing(const Plan& plan) const {
    if (order_.only)
        return FaultOf(plan, order_.planPath, *order_.only).empty() ? std::deque<int>{}
                                                                    : std::deque{*order_.only};
    std::deque<int> missing;
    if (!order_.request) // the pieces were made elsewhere
        return missing;
    for (int number = plan.Pieces() - 1; number >= 0; --number)
        if (!FaultOf(plan, order_.planPath, number).empty())
            missing.push_back(number);
    std::sort(missing.begin(), missing.end());
    if (!missing.empty() && plan.IsRest(missing.back())) {
        missing.push_front(missing.back());
        missing.pop_back();
    }
    return missing;
}

void Foreman::Announce(const Plan& plan, const std::deque<int>& missing) {
    for (int number = 0; number < plan.Pieces() - 1; ++number) {
        if (order_.only && number != *order_.only)
            continue;
        const double length = LengthOf(plan.pictures[static_cast<std::size_t>(number)]);
        length_ += length;
        if (std::find(missing.begin(), missing.end(), number) == missing.end())
            done_ += length;
    }
    if (order_.only && plan.IsRest(*order_.only)) // its progress is the sound's
        length_ = ToSeconds(plan.pictures.back().end - plan.pictures.front().begin);
    outlet_.Started({plan.source.path, order_.only ? PiecePath(order_.planPath, *order_.only) : plan.output,
                     length_, true});
    if (order_.only && missing.empty())
        outlet_.Warned({Warning::Kind::kChosen, fmt::format("piece {} is made already", *order_.only)});
    if (order_.request && order_.resume && static_cast<int>(missing.size()) < plan.Pieces())
        outlet_.Warned({Warning::Kind::kChosen,
                        fmt::format("{} of {} pieces are made already",
                                    plan.Pieces() - static_cast<int>(missing.size()), plan.Pieces())});
    if (const std::string cost = order_.request ? TellBitRate(plan) : std::string(); !cost.empty())
        outlet_.Warned({Warning::Kind::kChosen, cost});
}

int Foreman::JobsFor(const Plan& plan) {
    if (order_.only)
        return 1;
    Request request = plan.settings;
    request.input = plan.source.path;
    const SourceInfo source = LookAtSource(request);
    const int64_t memory = source.pictures ? MemoryPerPiece(*source.pictures) : 1;
    int jobs = order_.jobs;
    if (jobs == 0) { // half of what is free is left to others
        const int64_t fit = AvailableMemory() / 2 / memory;
        jobs =
            static_cast<int>(std::clamp<int64_t>(fit, 1, std::max(1U, std::thread::hardware_concurrency())));
    }
    jobs = std::min(jobs, plan.Pieces());
    outlet_.Warned(
        {Warning::Kind::kChosen, fmt::format("{} {} at once, of about {} of memory each", jobs,
                                             jobs == 1 ? "piece" : "pieces", FormatBytes(memory))});
    return jobs;
}

Verdict Foreman::MakeAll(const Plan& plan, std::deque<int> missing) {
    Verdict verdict;
    verdict.outcome = Outcome::kDone;
    const int jobs = missing.empty() ? 0 : JobsFor(plan);
    clock_.Skip(WorkClock::Now());
    while (verdict.outcome == Outcome::kDone || !tasks_.empty()) {
        if (stop_ && verdict.outcome == Outcome::kDone)
            verdict.outcome = Outcome::kStopped;
        if (verdict.outcome != Outcome::kDone)
            for (const auto& task : tasks_)
                task->Stop();
        while (verdict.outcome == Outcome::kDone && !missing.empty() &&
               static_cast<int>(tasks_.size()) < jobs) {
            StartTask(plan, missing.front());
            missing.pop_front();
        }
        if (tasks_.empty())
            break;
        bell_.Wait(paused_ ? std::nullopt : std::optional(WorkClock::kTick));
        FollowWishes();
        TakeEnded(verdict);
        Report(Phase::kConverting);
    }
    verdict.position = done_;
    verdict.worked = clock_.Seconds();
    verdict.bytes = bytes_;
    return verdict;
}

void Foreman::StartTask(const Plan& plan, int number) {
    auto task = std::make_unique<Task>(*this, plan, number);
    task->Conversion().Start();
    tasks_.push_back(std::move(task));
}

/// Enters the pieces that have come to an end. The first failure stays.
void Foreman::TakeEnded(Verdict& verdict) {
    for (auto task = tasks_.begin(); task != tasks_.end();) {
        const std::optional<Verdict> ending = (*task)->Ending();
        if (!ending) {
            ++task;
            continue;
        }
        if (ending->outcome == Outcome::kDone) {
            ++verdict.files;
            bytes_ += (*task)->Bytes();
            done_ += (*task)->Length();
        } else if (verdict.outcome == Outcome::kDone || (ending->failure && !verdict.failure)) {
            verdict.outcome = ending->outcome;
            verdict.failure = ending->failure;
        }
        task = tasks_.erase(task);
    }
}

void Foreman::FollowWishes() {
    if (pause_ != paused_ && !stop_) {
        paused_ = pause_;
        ForAll(paused_ ? &Job::Pause : &Job::Resume);
    }
    if (stop_)
        paused_ = false;
    if (paused_)
        clock_.Stand(WorkClock::Now());
    else
        clock_.Go(WorkClock::Now());
}

void Foreman::ForAll(void (Job::*tell)()) {
    for (const auto& task : tasks_)
        (task->Conversion().*tell)();
}

Progress Foreman::Figures() {
    Progress report;
    report.position = done_;
    report.bytes = bytes_;
    report.phase = paused_ ? Phase::kPaused : Phase::kConverting;
    for (const auto& task : tasks_) {
        const Progress latest = task->Latest();
        report.position += std::min(latest.position, task->Length());
        report.bytes += latest.bytes;
        if (latest.phase == Phase::kWaitingForRoom)
            report.phase = Phase::kWaitingForRoom;
    }
    return report;
}

void Foreman::Report(Phase phase, double finished) {
    Progress report = Figures();
    if (phase == Phase::kFinishing)
        report.phase = phase;
    report.finished = finished;
    report.phaseChanged = std::exchange(told_, report.phase) != report.phase;
    report.length = length_;
    report.worked = clock_.Seconds();
    speed_.Add(report.worked, report.position);
    report.speed = speed_.Speed();
    report.percent = length_ > 0 ? std::min(report.position / length_ * 100, kMostPercent) : 0;
    report.left = speed_.Left(length_);
    outlet_.Progressed(report);
}

Verdict Foreman::JoinAll(const Plan& plan) {
    Report(Phase::kFinishing, 0);
    double told = 0;
    Verdict joined = JoinPieces(plan, order_.planPath, order_.replace, outlet_, [&](double share) {
        constexpr double kStep = 0.05;
        clock_.Go(WorkClock::Now());
        if (share >= told + kStep) {
            told = share;
            Report(Phase::kFinishing, share);
        }
        return !stop_;
    });
    clock_.Go(WorkClock::Now());
    joined.worked = clock_.Seconds();
    if (stop_ && joined.outcome != Outcome::kDone) {
        joined.outcome = Outcome::kStopped;
        joined.failure.reset();
    }
    if (joined.outcome == Outcome::kDone && !order_.keepPieces) {
        RemovePieces(order_.planPath);
        if (order_.request) // it was of our own making
            unlink(order_.planPath.c_str());
    }
    return joined;
}

} // namespace movieconv
