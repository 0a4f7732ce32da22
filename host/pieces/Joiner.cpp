#include "host/pieces/Joiner.h"

#include "api/MovieConv.h"
#include "host/convert/CarryOver.h"
#include "host/convert/EncodePlan.h"
#include "host/convert/Engine.h"
#include "host/convert/Failure.h"
#include "host/convert/FileLedger.h"
#include "host/convert/Judgement.h"
#include "host/convert/OutputCheck.h"
#include "host/convert/Sources.h"
#include "host/convert/Timecode.h"
#include "host/convert/WorkClock.h"
#include "host/convert/WriterWatch.h"
#include "host/pieces/OutputNames.h"
#include "host/pieces/PieceRequest.h"
#include "host/pieces/PieceSeal.h"
#include "host/pieces/PlanChecks.h"
#include "host/source/MediaTime.h"
#include "media/MediaWriter.h"
#include "text/Utf8.h"

#include <atomic>
#include <condition_variable>
#include <cstddef>
#include <fmt/format.h>
#include <future>
#include <mutex>
#include <optional>
#include <utility>
#include <vector>

namespace movieconv {
namespace {

constexpr double kCheckingShare = 0.3; // of the time that all of it takes

/// `bell` ends a pause.
void CheckPieces(const Plan& plan, const std::string& planPath, Bell& bell,
                 const std::function<Going(const Joining&)>& follow) {
    constexpr std::size_t kMostTold = 5;
    std::string faults;
    std::size_t count = 0;
    for (int number = 0; number < plan.Pieces(); ++number) {
        const auto goesOn = [&, latest = Joining{kCheckingShare * number / plan.Pieces(), 0}] {
            Going going = follow(latest);
            for (; going == Going::kPaused; going = follow(latest))
                bell.Wait(std::nullopt);
            return going == Going::kOn;
        };
        const std::optional<std::string> fault = FaultOf(plan, planPath, number, goesOn);
        if (!fault)
            break;
        if (!fault->empty() && ++count <= kMostTold)
            faults += (faults.empty() ? "" : "; ") + *fault;
    }
    if (count > kMostTold)
        faults += fmt::format("; and {} more", count - kMostTold);
    if (count > 0)
        throw Failure(Category::kSource, faults);
}

Request JoinRequest(const Plan& plan, const JoinOrder& order) {
    Request request = WholeRequest(plan);
    request.overwrite = order.replace;
    request.onFull = order.onFull;
    request.keepPartial = false; // it can be joined again
    request.bitExact = true;     // the multiplexers' numbers of their own are drawn by lot
    return request;
}

/// Has the media writer join them. `goesOn` is asked with the share that is done whether to go on.
void Join(const Plan& plan, const std::string& planPath, const Request& request, Movie& movie,
          const Engine& engine, std::function<bool(double)> goesOn) {
    const auto count = static_cast<std::size_t>(plan.Pieces());
    std::vector<std::string> paths;
    paths.reserve(count);
    for (int number = 0; number < plan.Pieces(); ++number)
        paths.push_back(PiecePath(planPath, number));
    std::vector<const char*> names;
    names.reserve(count);
    for (const std::string& path : paths)
        names.push_back(path.c_str());
    WriterJoin join{};
    join.nPieces = plan.Pieces();
    join.pszPieces = names.data();
    join.llSourceBegin = plan.pictures.front().begin;
    join.pContext = &goesOn;
    join.pfnGoesOn = [](void* context, double share) {
        return (*static_cast<std::function<bool(double)>*>(context))(share) ? 1 : 0;
    };
    EncodeParam param{};
    MCGetEncodeParam(engine.get(), &param);
    const VideoFormat pictures = movie.Pictures()->GetVideoInfo()->format;
    const AudioFormat sound =
        movie.Sound() != nullptr ? movie.Sound()->GetAudioInfo()->format : AudioFormat{};
    MWJoinPieces(text::FromUtf8(request.output).c_str(), &param, &pictures,
                 movie.Sound() != nullptr ? &sound : nullptr, &join);
}

/// The joining on a thread of its own, which can wait for room while this one hears of a stop.
class JoiningThread {
public:
    JoiningThread(WriterWatch& watch, Bell& bell) : watch_(watch), bell_(bell) {}
    JoiningThread(const JoiningThread&) = delete;
    JoiningThread& operator=(const JoiningThread&) = delete;
    ~JoiningThread() { End(); }

    /// `join` is told what to ask with the share that is done whether to go on.
    void Start(std::function<void(std::function<bool(double)>)> join) {
        work_ = std::async(std::launch::async, [this, join = std::move(join)] {
            const Finally ring(*this);
            join([this](double share) {
                share_ = share;
                std::unique_lock lock(mutex_);
                changed_.wait(lock, [this] { return !paused_ || ends_; });
                return !ends_;
            });
        });
    }

    bool HasEnded() const { return ended_; }
    double Share() const { return share_; }

    void SetPaused(bool paused) {
        {
            const std::lock_guard lock(mutex_);
            paused_ = paused;
        }
        changed_.notify_one();
    }

    void End() {
        {
            const std::lock_guard lock(mutex_);
            ends_ = true;
        }
        changed_.notify_one();
        watch_.GiveUp();
    }

    /// Throws what the work has thrown.
    void Wait() { work_.get(); }

private:
    class Finally {
    public:
        explicit Finally(JoiningThread& thread) : thread_(thread) {}
        Finally(const Finally&) = delete;
        Finally& operator=(const Finally&) = delete;
        ~Finally() {
            thread_.ended_ = true;
            thread_.bell_.Ring();
        }

    private:
        JoiningThread& thread_;
    };

    WriterWatch& watch_;
    Bell& bell_;
    std::atomic<double> share_{0};
    std::atomic<bool> ended_{false};
    std::mutex mutex_; // guards the wishes
    std::condition_variable changed_;
    bool paused_ = false;
    bool ends_ = false;
    std::future<void> work_; // last: it waits for the end
};

Verdict VerdictOn(const Plan& plan, const Request& request, const FileLedger& files) {
    Verdict verdict;
    verdict.failure = files.FirstFailure();
    const std::optional<Sentence> missing = files.FindMissing();
    if (missing && !verdict.failure)
        verdict.failure = Failure(Category::kOutput, *missing);
    if (!verdict.failure && files.Complete() != 1)
        verdict.failure = Failure(Category::kInternal, Sentence("the pieces were not joined"));
    if (!verdict.failure)
        verdict.failure = FindExcess(request, files);
    verdict.outcome = verdict.failure ? Outcome::kFailed : Outcome::kDone;
    verdict.position = ToSeconds(plan.pictures.back().end - plan.pictures.front().begin);
    verdict.bytes = files.Bytes();
    verdict.files = missing ? 0 : files.Complete();
    return verdict;
}

} // namespace

Verdict JoinPieces(const Plan& plan, const std::string& planPath, const JoinOrder& order, Observer& observer,
                   Bell& bell, const std::function<Going(const Joining&)>& follow) {
    const Request request = JoinRequest(plan, order);
    CheckOutput(request);
    CheckPieces(plan, planPath, bell, follow);
    Request reading = request;
    reading.piece.emplace().pictures = false;
    reading.burnSubtitles.clear(); // the pieces' pictures have them
    Movie movie = OpenMovie(reading);
    WriterWatch watch(request, movie.Info(), bell);
    FileLedger files(observer);
    const Engine engine =
        MakeEngine(request, movie.Info(), movie.Pictures(), movie.Sound(), watch.OptionSet());
    const Carried carried = CarryOver(movie, request, ChooseFormat(request), watch.OptionSet());
    for (const NotCarried& left : carried.left)
        observer.LeftBehind(left);
    CarryTimecode(movie.Info(), request, ChooseFormat(request), watch.OptionSet(), request.begin);
    const auto enterNews = [&] {
        while (const auto news = watch.Take())
            files.Enter(*news);
    };
    JoiningThread joining(watch, bell);
    const auto heed = [&] {
        const Going going =
            follow({kCheckingShare + joining.Share() * (1 - kCheckingShare), watch.WaitsForRoom()});
        joining.SetPaused(going == Going::kPaused);
        if (going == Going::kEnds)
            joining.End();
    };
    heed(); // a pause may have begun before
    joining.Start([&](std::function<bool(double)> goesOn) {
        Join(plan, planPath, request, movie, engine, std::move(goesOn));
    });
    while (!joining.HasEnded()) {
        enterNews();
        bell.Wait(WorkClock::kTick);
        heed();
    }
    joining.Wait();
    enterNews();
    return VerdictOn(plan, request, files);
}

} // namespace movieconv
