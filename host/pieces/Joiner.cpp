#include "host/pieces/Joiner.h"

#include "api/MovieConv.h"
#include "host/convert/Bell.h"
#include "host/convert/CarryOver.h"
#include "host/convert/EncodePlan.h"
#include "host/convert/Engine.h"
#include "host/convert/Failure.h"
#include "host/convert/FileLedger.h"
#include "host/convert/Judgement.h"
#include "host/convert/OutputCheck.h"
#include "host/convert/Sources.h"
#include "host/convert/Timecode.h"
#include "host/convert/WriterWatch.h"
#include "host/pieces/PieceFile.h"
#include "host/source/MediaTime.h"
#include "media/MediaWriter.h"
#include "text/Utf8.h"

#include <fmt/format.h>
#include <utility>
#include <vector>

namespace movieconv {
namespace {

constexpr double kCheckingShare = 0.3; // of the time that all of it takes

void CheckPieces(const Plan& plan, const std::string& planPath, const std::function<bool(double)>& goesOn) {
    constexpr std::size_t kMostTold = 5;
    std::string faults;
    std::size_t count = 0;
    for (int number = 0; number < plan.Pieces() && goesOn(double(number) / plan.Pieces()); ++number) {
        const std::string fault = FaultOf(plan, planPath, number);
        if (!fault.empty() && ++count <= kMostTold)
            faults += (faults.empty() ? "" : "; ") + fault;
    }
    if (count > kMostTold)
        faults += fmt::format("; and {} more", count - kMostTold);
    if (count > 0)
        throw Failure(Category::kSource, faults);
}

Request JoinRequest(const Plan& plan, bool replace) {
    Request request = WholeRequest(plan);
    request.overwrite = replace;
    request.keepPartial = false; // it can be joined again
    request.bitExact = true;     // the multiplexers' numbers of their own are drawn by lot
    return request;
}

/// Has the media writer join them. `follow` is asked with the share that is done whether to go on.
void Join(const Plan& plan, const std::string& planPath, const Request& request, Movie& movie,
          const Engine& engine, std::function<bool(double)> follow) {
    std::vector<std::string> paths;
    for (int number = 0; number < plan.Pieces(); ++number)
        paths.push_back(PiecePath(planPath, number));
    std::vector<const char*> names;
    for (const std::string& path : paths)
        names.push_back(path.c_str());
    WriterJoin join{};
    join.nPieces = plan.Pieces();
    join.pszPieces = names.data();
    join.llSourceBegin = plan.pictures.front().begin;
    join.pContext = &follow;
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

Verdict VerdictOn(const Plan& plan, const Request& request, const FileLedger& files) {
    Verdict verdict;
    verdict.failure = files.FirstFailure();
    if (const auto missing = verdict.failure ? std::nullopt : files.FindMissing())
        verdict.failure = Failure(Category::kOutput, *missing);
    if (!verdict.failure && files.Complete() != 1)
        verdict.failure = Failure(Category::kInternal, "the pieces were not joined");
    if (!verdict.failure)
        verdict.failure = FindExcess(request, files);
    verdict.outcome = verdict.failure ? Outcome::kFailed : Outcome::kDone;
    verdict.position = ToSeconds(plan.pictures.back().end - plan.pictures.front().begin);
    verdict.bytes = files.Bytes();
    verdict.files = files.Complete();
    return verdict;
}

} // namespace

Verdict JoinPieces(const Plan& plan, const std::string& planPath, bool replace, Observer& observer,
                   const std::function<bool(double)>& goesOn) {
    const Request request = JoinRequest(plan, replace);
    CheckOutput(request);
    CheckPieces(plan, planPath, [&](double share) { return goesOn(share * kCheckingShare); });
    Request reading = request;
    reading.piece.emplace().pictures = false;
    Movie movie = OpenMovie(reading);
    Bell bell;
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
    Join(plan, planPath, request, movie, engine, [&](double share) {
        enterNews();
        return goesOn(kCheckingShare + share * (1 - kCheckingShare));
    });
    enterNews();
    return VerdictOn(plan, request, files);
}

} // namespace movieconv
