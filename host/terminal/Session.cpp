#include "host/terminal/Session.h"

#include "host/convert/Job.h"
#include "host/pieces/Batch.h"
#include "host/pieces/ClipRun.h"
#include "host/pieces/Foreman.h"
#include "host/pieces/OutputNames.h"

#include <chrono>
#include <functional>
#include <string>
#include <utility>

namespace movieconv {
namespace {

constexpr std::chrono::milliseconds kTick{500};

std::unique_ptr<Work> MakeConversion(const Options& options, Observer& observer, Loop loop) {
    if (options.request.split)
        return std::make_unique<ClipRun>(options.request, options.resume, observer, std::move(loop));
    return std::make_unique<Job>(options.request, observer, std::move(loop));
}

/// What the options ask for: one conversion, or pieces of it.
std::unique_ptr<Work> MakeWork(const Options& options, Observer& observer, Loop loop) {
    if (options.into) {
        BatchOrder order;
        order.request = options.request;
        order.folder = *options.into;
        order.jobs = options.jobs.value_or(1);
        if (options.names)
            order.names = *options.names;
        order.inputs = options.inputs;
        return std::make_unique<Batch>(std::move(order), observer, std::move(loop));
    }
    if (options.task == Task::kConvert && !options.jobs)
        return MakeConversion(options, observer, std::move(loop));
    PieceOrder order;
    order.keepPieces = options.keepPieces;
    order.onFull = options.request.onFull;
    order.niceness = options.request.niceness;
    order.replace = options.request.overwrite;
    order.join = options.task != Task::kPiece;
    if (options.task == Task::kConvert) {
        order.planPath = PlanPathFor(options.request.output);
        order.request = options.request;
        order.division = options.division;
        order.resume = options.resume;
        order.jobs = options.jobs.value_or(0);
    } else {
        order.planPath = options.request.input;
        if (options.task == Task::kPiece)
            order.only = options.piece;
    }
    return std::make_unique<Foreman>(std::move(order), observer, std::move(loop));
}

} // namespace

Session::Session(const Options& options, const StandardStreams& streams, MainLoop& loop,
                 ControlInput& control)
    : options_(options),
      loop_(loop),
      control_(control),
      reporter_(MakeReporter(options, streams)),
      work_(MakeWork(options, *this, [&loop](std::function<void()> work) { loop.Post(std::move(work)); })) {}

ExitCode Session::Run() {
    if (options_.jobs || options_.into || options_.task != Task::kConvert)
        Arm(); // a stop ends this before the first conversion starts, too
    work_->Start();
    while (!code_) {
        const bool quiet = !loop_.RunNext(kTick);
        control_.FollowTerminal();
        if (const Verdict* verdict = work_->Result(); quiet && !code_ && verdict != nullptr)
            Ended(*verdict); // there was no memory to tell it
    }
    return *code_;
}

void Session::Started(const Start& news) {
    started_ = true;
    if (options_.preview)
        preview_.emplace(*options_.preview, options_.request.overwrite);
    Arm();
    reporter_->Started(news); // whoever reads this may send signals
    for (const Sentence& complaint : options_.complaints)
        reporter_->Warn(complaint.Text(), {});
}

void Session::Arm() {
    if (!std::exchange(armed_, true))
        control_.Arm(options_.progress == ProgressStyle::kBar && !options_.quiet,
                     [this](Command command) { Obey(command); });
}

void Session::Progressed(const Progress& news) {
    reporter_->Progressed(news);
}

void Session::Opened(const OpenedFile& news) {
    if (news.input.empty()) // of many, several are open
        control_.NoteFile(news.temporaryPath);
    reporter_->Opened(news);
}

void Session::Closed(const ClosedFile& news) {
    control_.NoteFile({});
    reporter_->Closed(news);
}

void Session::Warned(const Warning& news) {
    reporter_->Warned(news);
}

void Session::LeftBehind(const NotCarried& news) {
    reporter_->LeftBehind(news);
}

void Session::Showed(const std::shared_ptr<const ShownPicture>& news) {
    if (preview_)
        preview_->Offer(news);
}

void Session::Ended(const Verdict& news) {
    if (!started_ && news.failure)
        throw Failure(*news.failure);
    if (preview_) {
        if (const std::string failure = preview_->Finish(); !failure.empty())
            reporter_->Warn(failure, {});
    }
    reporter_->Ended(news);
    code_ = CodeOf(news);
}

void Session::Obey(Command command) {
    switch (command) {
    case Command::kStop:
        work_->Stop();
        break;
    case Command::kPauseKey:
        paused_ = !paused_;
        if (paused_)
            work_->Pause();
        else
            work_->Resume();
        break;
    case Command::kSuspend:
        reporter_->LeaveLine();
        control_.Suspend();
        break;
    }
}

} // namespace movieconv
