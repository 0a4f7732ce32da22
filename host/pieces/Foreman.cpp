#include "host/pieces/Foreman.h"

#include "host/convert/Amounts.h"
#include "host/convert/Failure.h"
#include "host/convert/OutputCheck.h"
#include "host/convert/Room.h"
#include "host/pieces/OutputNames.h"
#include "host/pieces/PiecePlaces.h"
#include "host/pieces/PieceRequest.h"
#include "host/pieces/PieceSeal.h"
#include "host/pieces/PlanChecks.h"
#include "host/pieces/PlanStore.h"
#include "host/pieces/PlanText.h"
#include "host/pieces/Planner.h"
#include "host/pieces/WholeFile.h"
#include "host/source/MediaTime.h"

#include <algorithm>
#include <chrono>
#include <fmt/format.h>
#include <fstream>
#include <memory>
#include <thread>
#include <unistd.h>
#include <utility>

namespace movieconv {
namespace {

double Seconds(const Piece& piece) {
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

} // namespace

/// One piece being made, from its conversion to its name.
class Foreman::PieceErrand final : public Errand {
public:
    /// `length`: seconds of pictures that the piece brings.
    PieceErrand(Foreman& foreman, int number, std::string file, double length, bool fromStart)
        : foreman_(foreman),
          number_(number),
          file_(std::move(file)),
          length_(length),
          fromStart_(fromStart) {}

    double Share(const Progress& latest) const override { return std::min(latest.position, length_); }
    void Closed(const ClosedFile& news) override { pictures_ = news.pictures; }
    void Warned(const Warning& news) override { foreman_.TellOf(number_, news); }
    void LeftBehind(const NotCarried& news) override { foreman_.News().LeftBehind(news); }
    void Conclude(Verdict& verdict) override {
        const bool done = verdict.outcome == Outcome::kDone;
        const bool lacks = Lacks(verdict);
        if (done && !lacks) {
            verdict.bytes = SealPiece(file_, foreman_.plan_, foreman_.order_.planPath, number_);
            verdict.position = length_;
            return;
        }
        unlink(file_.c_str()); // whatever was made is not the piece
        if (lacks && !fromStart_)
            HandBack(verdict);
        else if (lacks && done)
            throw Failure(
                Category::kSource,
                fmt::format("piece {} has {} pictures, {} were planned: \"{}\" holds others than its "
                            "stamps tell, and can only be converted undivided",
                            number_, pictures_, Planned(), foreman_.plan_.source.path));
    }

private:
    /// It is to be made again, from the source's start. So far this is no failure, and no file.
    void HandBack(Verdict& verdict) {
        const std::lock_guard lock(foreman_.mutex_);
        foreman_.lacking_.insert(number_);
        verdict = Verdict{};
        verdict.outcome = Outcome::kDone;
    }

    int64_t Planned() const { return foreman_.plan_.pictures[static_cast<std::size_t>(number_)].pictures; }

    /// Whether not every planned picture was taken, though the source is not damaged there. That can be
    /// because decoding began at a key picture after which a decoder keeps pictures back.
    bool Lacks(const Verdict& verdict) const {
        if (foreman_.plan_.IsRest(number_))
            return false;
        if (verdict.outcome == Outcome::kDone)
            return pictures_ != Planned() && (pictures_ > Planned() || verdict.damaged == 0);
        return verdict.failure && verdict.failure->Kind() == Category::kSource;
    }

    Foreman& foreman_;
    const int number_;
    const std::string file_;
    const double length_;
    const bool fromStart_;
    int64_t pictures_ = 0;
};

Foreman::Foreman(PieceOrder order, Observer& observer, Loop loop)
    : Crew(observer, std::move(loop)), order_(std::move(order)) {}

Verdict Foreman::Perform() {
    verdict_.outcome = Outcome::kStopped;
    std::optional<Plan> plan = Prepare();
    if (!plan)
        return verdict_;
    plan_ = std::move(*plan);
    CheckAgainst(plan_);
    Announce();
    missing_ = FindMissing();
    if (Stopped())
        return verdict_;
    TellWhatIsMade();
    verdict_.outcome = Outcome::kDone;
    WorkOff(missing_.empty() ? 0 : JobsFor());
    if (Stopped() && verdict_.outcome == Outcome::kDone)
        verdict_.outcome = Outcome::kStopped;
    verdict_.position = done_;
    verdict_.earlier = earlier_;
    verdict_.worked = Worked();
    verdict_.bytes = bytes_;
    if (order_.join) { // a piece is no file that was asked for
        verdict_.files = 0;
        verdict_.bytes = 0;
    }
    if (verdict_.outcome == Outcome::kDone && order_.join)
        JoinAll();
    if (verdict_.outcome != Outcome::kDone && order_.request)
        TellWhatStays();
    return verdict_;
}

/// A piece's warning. What is lost is lost in all pieces and told once; how often the source's pictures were
/// wrong was counted in that piece alone.
void Foreman::TellOf(int number, Warning news) {
    if (news.kind == Warning::Kind::kSource && !plan_.IsRest(number))
        news.text = Sentence(fmt::format("in piece {}: {}", number, news.text.Text()));
    if (news.kind == Warning::Kind::kSource || news.kind == Warning::Kind::kLoss) {
        const std::lock_guard lock(mutex_);
        if (!told_.insert(news.text.Text()).second)
            return;
    }
    News().Warned(news);
}

void Foreman::TellWhatStays() {
    if (const int pieces = CountPieces(order_.planPath); pieces > 0)
        News().Warned(
            {Warning::Kind::kLeftover, fmt::format("{} of {} pieces are made and stay beside \"{}\"", pieces,
                                                   plan_.Pieces(), order_.planPath)});
}

/// The plan, made and written where that was asked for; nothing when it was stopped.
std::optional<Plan> Foreman::Prepare() {
    const PlanStore store(order_.planPath);
    if (!order_.request)
        return store.Given(order_.only);
    CheckOutput(*order_.request);
    store.CheckPlaces(*order_.request);
    lock_.emplace(order_.planPath);
    Plan begun = BeginPlan(*order_.request, order_.division);
    PlanStore::Leftover left = store.Take(begun, *order_.request,
                                          order_.resume    ? IfThere::kResume
                                          : order_.replace ? IfThere::kReplace
                                                           : IfThere::kRefuse);
    leftover_ = left.removed;
    if (left.plan)
        return left.plan;
    std::optional<Plan> plan = MakePlan(std::move(begun), [this] { return Stopped(); });
    if (plan && !WritePlan(order_.planPath, *plan, false))
        throw Failure(Category::kOutput,
                      fmt::format("another run has made \"{}\" meanwhile", order_.planPath));
    return plan;
}

/// Seconds that a piece brings: the rest none, unless nothing else is made.
double Foreman::LengthOf(int number) const {
    if (order_.only)
        return length_;
    return plan_.IsRest(number) ? 0 : Seconds(plan_.pictures[static_cast<std::size_t>(number)]);
}

/// While old pieces are read, of which nothing is made: false when that is to end. Waits in a pause.
bool Foreman::GoesOnReading() {
    SkipClock();
    FollowWishes();
    if (Paused()) {
        TellReading(Phase::kPaused);
        for (; Paused(); FollowWishes())
            Ringer().Wait(std::nullopt);
        TellReading(Phase::kConverting);
    }
    return !Stopped();
}

/// Tells the phase alone: how far everything is, and how fast it goes on, is not known before all are read.
void Foreman::TellReading(Phase phase) {
    Progress report;
    report.phase = phase;
    report.phaseChanged = true;
    report.worked = Worked();
    report.length = length_;
    News().Progressed(report);
}

bool Foreman::IsMade(int number) {
    return FaultOf(plan_, order_.planPath, number, [this] { return GoesOnReading(); }) == "";
}

/// The numbers of the pieces that are to be made; the rest first, which takes longest.
std::deque<int> Foreman::FindMissing() {
    if (order_.only)
        return IsMade(*order_.only) ? std::deque<int>{} : std::deque{*order_.only};
    std::deque<int> missing;
    if (!order_.request) // the pieces were made elsewhere
        return missing;
    for (int number = plan_.Pieces() - 1; number >= 0 && !Stopped(); --number) // each is read whole
        if (!IsMade(number))
            missing.push_back(number);
    std::sort(missing.begin(), missing.end());
    if (!missing.empty() && plan_.IsRest(missing.back())) {
        missing.push_front(missing.back());
        missing.pop_back();
    }
    return missing;
}

void Foreman::Announce() {
    for (int number = 0; number < plan_.Pieces() - 1; ++number)
        if (!order_.only || number == *order_.only)
            length_ += Seconds(plan_.pictures[static_cast<std::size_t>(number)]);
    if (order_.only && plan_.IsRest(*order_.only)) // its progress is the sound's
        length_ = ToSeconds(plan_.pictures.back().end - plan_.pictures.front().begin);
    News().Started({plan_.source.path, order_.only ? PiecePath(order_.planPath, *order_.only) : plan_.output,
                    length_, true});
    if (!leftover_.empty())
        News().Warned({Warning::Kind::kChosen, leftover_});
}

void Foreman::TellWhatIsMade() {
    for (int number = 0; number < plan_.Pieces(); ++number)
        if (number == order_.only.value_or(number) &&
            std::find(missing_.begin(), missing_.end(), number) == missing_.end())
            done_ += LengthOf(number);
    earlier_ = done_;
    if (order_.only && missing_.empty())
        News().Warned({Warning::Kind::kChosen, fmt::format("piece {} is made already", *order_.only)});
    if (order_.request && order_.resume && static_cast<int>(missing_.size()) < plan_.Pieces())
        News().Warned({Warning::Kind::kChosen,
                       fmt::format("{} of {} pieces are made already",
                                   plan_.Pieces() - static_cast<int>(missing_.size()), plan_.Pieces())});
    if (const std::string cost = order_.request ? TellBitRate(plan_) : std::string(); !cost.empty())
        News().Warned({Warning::Kind::kChosen, cost});
}

int Foreman::JobsFor() {
    if (order_.only)
        return 1;
    int jobs = order_.jobs;
    if (jobs == 0) { // half of what is free is left to others
        const int64_t fit = AvailableMemory() / 2 / std::max<int64_t>(1, plan_.memory);
        jobs =
            static_cast<int>(std::clamp<int64_t>(fit, 1, std::max(1U, std::thread::hardware_concurrency())));
    }
    jobs = std::min(jobs, plan_.Pieces());
    News().Warned(
        {Warning::Kind::kChosen, fmt::format("{} {} at once, of about {} of memory each", jobs,
                                             jobs == 1 ? "piece" : "pieces", FormatBytes(plan_.memory))});
    return jobs;
}

Crew::Mood Foreman::HowToGoOn() const {
    return Stopped() || verdict_.outcome != Outcome::kDone ? Mood::kBreaksOff : Mood::kGoesOn;
}

std::optional<Crew::Assignment> Foreman::Next() {
    const int number = missing_.front();
    missing_.pop_front();
    const double length = LengthOf(number);
    const std::string file = NameInTheMaking(PiecePath(order_.planPath, number));
    const bool fromStart = plan_.fromStart || fromStart_.count(number) > 0;
    Request request = RequestOf(order_, plan_, number, file);
    request.piece->fromStart = fromStart;
    return Assignment{request, std::make_unique<PieceErrand>(*this, number, file, length, fromStart)};
}

std::set<int> Foreman::TakeLacking() {
    const std::lock_guard lock(mutex_);
    return std::exchange(lacking_, {});
}

/// The first failure stays.
void Foreman::Take(const std::string& /*input*/, const Verdict& ending) {
    for (const int number : TakeLacking())
        if (fromStart_.insert(number).second)
            missing_.push_front(number);
    if (ending.outcome == Outcome::kDone) {
        verdict_.files += ending.files;
        bytes_ += ending.bytes;
        done_ += ending.position;
    } else if (verdict_.outcome == Outcome::kDone || (ending.failure && !verdict_.failure)) {
        verdict_.outcome = ending.outcome;
        verdict_.failure = ending.failure;
    }
}

void Foreman::Report() {
    Progress report = UnderWay();
    report.position += done_;
    report.bytes += bytes_;
    report.length = length_;
    Tell(report);
}

/// Tells how far the joining is.
Going Foreman::FollowJoining(const Joining& latest) {
    constexpr std::chrono::milliseconds kShortest{100}; // between two reports
    const bool waits = latest.waitsFor > 0;
    const bool waited = joining_ && joining_->waitsFor > 0;
    if (joining_) // before the first report comes work without waits
        TickAfterWait();
    FollowWishes();
    TickClock(waits);
    if (Stopped())
        return Going::kEnds;
    const Going going = Paused() ? Going::kPaused : Going::kOn;
    const Phase phase = Paused() ? Phase::kPaused : waits ? Phase::kWaitingForRoom : Phase::kFinishing;
    if (joining_ && phase == joiningPhase_ && WorkClock::Now() - toldAt_ < kShortest)
        return going;
    if (waits && !waited)
        News().Warned(WaitsForRoom(plan_.output, latest.waitsFor));
    joining_ = latest;
    joiningPhase_ = phase;
    toldAt_ = WorkClock::Now();
    Progress report;
    report.phase = phase;
    report.finished = latest.share;
    report.position = done_;
    report.bytes = bytes_;
    report.length = length_;
    Tell(report);
    return going;
}

void Foreman::JoinAll() {
    CheckAgainst(plan_); // pieces of what was changed meanwhile do not belong together
    if (order_.resume)   // what a killed joining left
        RemoveUnfinished(plan_.output, *order_.request);
    Verdict joined = JoinPieces(plan_, order_.planPath, {order_.replace, order_.onFull}, News(), Ringer(),
                                [&](const Joining& latest) { return FollowJoining(latest); });
    TickClock();
    joined.earlier = earlier_;
    joined.worked = Worked();
    if (Stopped() && joined.outcome != Outcome::kDone) {
        joined.outcome = Outcome::kStopped;
        joined.failure.reset();
    }
    // Of an output that is there, if larger than asked for, the pieces would give the same again.
    if (joined.files > 0 && !order_.keepPieces) {
        RemovePieces(order_.planPath, WholeRequest(plan_));
        if (order_.request) // it was of our own making
            unlink(order_.planPath.c_str());
    }
    verdict_ = joined;
}

} // namespace movieconv
