#include "host/convert/Course.h"

#include "host/convert/Amounts.h"
#include "host/convert/EncodePlan.h"
#include "host/convert/Judgement.h"
#include "host/convert/OutputCheck.h"
#include "host/convert/Room.h"
#include "host/convert/SizePlan.h"
#include "host/convert/SoundLoss.h"
#include "host/convert/Sources.h"
#include "host/convert/Timecode.h"
#include "host/sentence/Say.h"
#include "host/source/MediaTime.h"
#include "text/FileNames.h"
#include "text/Utf8.h"

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cmath>
#include <cstring>
#include <limits>
#include <string_view>
#include <utility>

namespace movieconv {
namespace {

constexpr std::chrono::milliseconds kShortestInterval{100}; // between two reports of progress
constexpr double kLeastLength = 0.0011;                     // seconds: less means all the rest to the engine

/// Of a piece the plan knows it better than the source.
double LengthOf(const Request& request, const SourceInfo& source) {
    return request.piece && request.piece->pictures ? ToSeconds(request.piece->end - request.piece->begin)
                                                    : LengthToConvert(request, source);
}

} // namespace

Course::Course(const Request& request, Movie& movie, Wishes& wishes, Observer& observer)
    : request_(FitIntoSize(request, movie.Info())),
      movie_(movie),
      wishes_(wishes),
      observer_(observer),
      length_(LengthOf(request_, movie.Info())),
      clips_(movie, request.begin, request.split),
      watch_(request_, movie.Info(), wishes.bell),
      files_(observer, request.firstClip ? request.firstClip->number : 0),
      engine_(MakeEngine(request_, movie.Info(), clips_.Pictures(), clips_.Sound(), watch_.OptionSet())),
      clock_(WorkClock::Now()),
      room_(request_.output, observer) {
    if (request.firstClip) {
        clips_.BeginAt(request.firstClip->begin);
        earlier_ = clips_.Offset();
    }
    if (request.piece && request.piece->pictures)
        movie.EndPicturesAt(ToSeconds(request.piece->until));
    else if (request.length)
        movie.EndAt(request.begin + *request.length);
    if (movie.Info().pictures)
        wishes.pictures.Expect(*movie.Info().pictures, movie.KeepsHdr());
}

void Course::Prepare() {
    const bool lengthKnown = movie_.Info().certainty != Certainty::kGuessed;
    observer_.Started({request_.input, request_.output, length_, lengthKnown});
    if (!request_.piece || !request_.piece->pictures) {
        Carried carried = CarryOver(movie_, request_, ChooseFormat(request_), watch_.OptionSet());
        subtitles_ = std::move(carried.subtitles);
        for (const NotCarried& left : carried.left)
            if (!request_.piece) // who joins the pieces tells it
                observer_.LeftBehind(left);
    }
    if (request_.maxSize)
        observer_.Warned({Warning::Kind::kChosen, TellSize(request_)});
    if (!request_.piece && request_.detectCrop && movie_.Info().pictures)
        observer_.Warned({Warning::Kind::kChosen, TellCrop(movie_.Info())});
    if (!request_.piece && (lengthKnown || request_.length))
        LookAtRoom();
}

Verdict Course::Run() {
    clock_.Skip(WorkClock::Now());
    if (request_.firstClip)
        RunClip();
    else
        RunEngine(request_.begin, request_.length ? std::max(*request_.length, kLeastLength) : 0);
    while (GoesOn())
        RunClip();
    return Conclude();
}

/// A clip that is not the movie's first.
void Course::RunClip() {
    RunEngine(0, request_.length ? std::max(*request_.length - clips_.Offset(), kLeastLength) : 0);
}

/// One file: all of an output that is not split.
void Course::RunEngine(double begin, double length) {
    if (!request_.piece) // its file is not written here
        CarryTimecode(movie_.Info(), request_, ChooseFormat(request_), watch_.OptionSet(),
                      ToSeconds(clips_.Begin()));
    if (request_.split) {
        files_.BeginsAt(clips_.Begin());
        const std::string clip =
            text::ClipName(std::string_view(request_.output), static_cast<std::size_t>(files_.Opened()));
        MCSetOutputFile(engine_.get(), text::FromUtf8(clip).c_str());
    }
    position_ = 0;
    outcome_ = kNone;
    if (MCStart(engine_.get(), begin, length, nullptr, OnProgress, this) != 0)
        throw Failure(Category::kInternal, Say("the conversion could not be started"));
    if (MCWait(engine_.get(), 0) == 0 && outcome_ == kNone)
        throw Failure(Category::kInternal, Say("no thread could be started for the conversion"));
    try {
        WaitForEnd();
    } catch (...) {
        Stop(); // lest the engine's end wait for a slow source
        throw;
    }
    MCWait(engine_.get(), MC_INFINITE);
}

/// Whether another clip is to be made, after a pause if there is one just now.
bool Course::GoesOn() {
    TakeNews();
    if (outcome_ != kOutcomeCompleted || files_.FirstFailure() || brokenOff_ || !clips_.Next())
        return false;
    position_ = 0; // of the next clip
    AwaitResume();
    FollowWishes();
    if (userStopped_)
        outcome_ = kOutcomeStopped;
    return !userStopped_;
}

void Course::AwaitResume() {
    while (wishes_.pause && !wishes_.stop) {
        paused_ = true;
        UpdateClock();
        ReportProgress();
        wishes_.bell.Wait(std::nullopt);
    }
    paused_ = false;
    UpdateClock();
}

/// Before anything is converted.
void Course::LookAtRoom() {
    EncodeParam param{};
    MCGetEncodeParam(engine_.get(), &param);
    if (const std::optional<int64_t> needed = NeededBytes(param, request_, movie_.Info(), length_))
        room_.CheckKnown(*needed);
    else
        room_.Forecast();
}

/// The engine's worker calls this.
unsigned Course::OnProgress(void* context, unsigned kind, unsigned value, uintptr_t info) {
    auto* course = static_cast<Course*>(context);
    if (const auto* progress = reinterpret_cast<const ProgressInfo*>(info)) {
        course->position_ = progress->dPosition;
        if (progress->pPreviewImage != nullptr)
            course->wishes_.pictures.Offer(*progress->pPreviewImage);
    }
    if (kind == 1)
        course->outcome_ = static_cast<int>(value);
    course->wishes_.bell.Ring();
    return 1;
}

void Course::WaitForEnd() {
    while (outcome_ == kNone) {
        wishes_.bell.Wait(paused_ ? std::nullopt : std::optional(WorkClock::kTick));
        UpdateClock();
        FollowWishes();
        TakeNews();
        Show();
        room_.Add(Reached(), watch_.Bytes());
        LookAfterFile();
        if (outcome_ == kNone)
            ReportProgress();
    }
}

/// Ends the conversion when the open file has lost its place: whatever else were converted would be lost.
void Course::LookAfterFile() {
    const std::optional<std::string> vanished =
        outcome_ == kNone && !brokenOff_ ? watch_.VanishedFile() : std::nullopt;
    if (!vanished)
        return;
    brokenOff_.emplace(Category::kOutput,
                       Say("\"{}\" vanished while it was written: {}", *vanished, std::strerror(ENOENT)));
    Stop();
}

void Course::UpdateClock() {
    const WorkClock::Time now = WorkClock::Now();
    clock_.TickAfterWait(now);
    if (paused_ || watch_.WaitsForRoom() > 0)
        clock_.Stand(now);
    else
        clock_.Go(now);
}

void Course::FollowWishes() {
    if (wishes_.stop && !userStopped_) {
        userStopped_ = true;
        cutShort_ = outcome_ == kNone;
        Stop();
    }
    if (!userStopped_ && wishes_.pause != paused_)
        SetPaused(wishes_.pause);
    if (wishes_.giveUpWrite.exchange(false))
        watch_.GiveUp();
    if (wishes_.retryWrite.exchange(false))
        watch_.Retry();
}

void Course::TakeNews() {
    while (const auto news = watch_.Take())
        if (!files_.Enter(*news))
            Stop();
}

void Course::Show() {
    MCEnablePreview(engine_.get(), wishes_.pictures.Wants() ? 1 : 0);
    if (const auto picture = wishes_.pictures.Take())
        observer_.Showed(picture);
}

/// Ends the conversion; what was written so far is finished as a file.
void Course::Stop() {
    watch_.GiveUp();
    MCAbort(engine_.get());
    movie_.Stop();
    paused_ = false;
}

void Course::SetPaused(bool pause) {
    if (pause)
        paused_ = MCPause(engine_.get()) > 0;
    else
        MCResume(engine_.get());
    paused_ = paused_ && pause;
}

/// Seconds converted, as the engine tells.
double Course::Position() const {
    return clips_.Offset() + position_;
}

/// Seconds converted when the movie is at `position`. A picture can reach beyond the length that was asked
/// for, and a movie beyond the one it announces.
double Course::Converted(double position) const {
    return std::clamp(position, 0.0, request_.length.value_or(std::numeric_limits<double>::max()));
}

/// While the rest of the sound is converted after the last picture, only the sound tells how far it is.
double Course::Reached() const {
    return Converted(std::max(Position(), movie_.SoundSeconds()));
}

Progress Course::Figures() {
    Progress report;
    report.position = Reached();
    report.length = length_;
    report.worked = clock_.Seconds();
    speed_.Add(report.worked, report.position);
    report.speed = speed_.Speed();
    if (movie_.Info().certainty != Certainty::kGuessed && length_ > 0) {
        report.percent = std::min(report.position / length_ * 100, kMostPercent);
        report.left = speed_.Left(length_);
    }
    report.bytes = watch_.Bytes();
    report.expected = room_.Expected(length_);
    report.finished = files_.Finishing().value_or(0);
    report.clip = request_.split ? files_.Opened() : 0;
    return report;
}

Phase Course::CurrentPhase() const {
    return watch_.WaitsForRoom() > 0 ? Phase::kWaitingForRoom
           : paused_                 ? Phase::kPaused
           : files_.Finishing()      ? Phase::kFinishing
                                     : Phase::kConverting;
}

void Course::ReportProgress() {
    const WorkClock::Time now = WorkClock::Now();
    const Phase phase = CurrentPhase();
    const bool changed = phase != toldPhase_;
    if (!changed && now - toldAt_ < kShortestInterval)
        return;
    if (changed && phase == Phase::kWaitingForRoom)
        observer_.Warned(WaitsForRoom(request_.output, watch_.WaitsForRoom()));
    toldPhase_ = phase;
    toldAt_ = now;
    Progress report = Figures();
    report.phase = phase;
    report.phaseChanged = changed;
    observer_.Progressed(report);
    room_.Check(report);
}

Verdict Course::Conclude() {
    TakeNews();
    if (cutShort_ && outcome_ == kOutcomeCompleted)
        outcome_ = kOutcomeStopped; // to the engine a source that is stopped may seem to have ended
    if (const VideoImage* last = movie_.LastPicture(); last != nullptr && wishes_.pictures.Wants())
        wishes_.pictures.OfferLast(*last); // the engine shows but some
    Show();
    ReportComplaints();
    for (const NotCarried& lost : LostCues(subtitles_, watch_.OptionSet()))
        observer_.LeftBehind(lost);
    const Sentence shortfall =
        outcome_ == kOutcomeCompleted
            ? WhyItEndedEarly(movie_, request_, std::max(Position(), movie_.SoundSeconds()))
            : Sentence();
    Verdict verdict;
    verdict.failure = FindFailure({request_, files_, brokenOff_, movie_.ReadError(), shortfall, userStopped_,
                                   outcome_, request_.begin + Position()});
    verdict.outcome = verdict.failure                               ? Outcome::kFailed
                      : userStopped_ && outcome_ == kOutcomeStopped ? Outcome::kStopped
                                                                    : Outcome::kDone;
    verdict.position = Converted(Position());
    verdict.earlier = earlier_;
    verdict.worked = clock_.Seconds();
    verdict.bytes = files_.Bytes();
    verdict.files = files_.Complete();
    verdict.damaged = movie_.DamagedPictures();
    if (verdict.outcome == Outcome::kDone && request_.split)
        if (const std::optional<Warning> older = OlderClips(request_.output, files_.Opened()))
            observer_.Warned(*older);
    return verdict;
}

void Course::ReportComplaints() {
    EncodeParam param{};
    MCGetEncodeParam(engine_.get(), &param);
    Complain(Warning::Kind::kLoss, TellSoundLoss(movie_.Info(), request_, param));
    if (const Sentence loss = TellRateLoss(request_, movie_.Info()); !loss.IsEmpty())
        Complain(Warning::Kind::kLoss, {loss});
    Complain(Warning::Kind::kLoss, movie_.Losses());
    Complain(Warning::Kind::kSource, movie_.Complaints());
    if (!request_.piece)
        for (const std::string& file : files_.WithoutPictures())
            observer_.Warned({Warning::Kind::kLoss,
                              Say("\"{}\" has no pictures: none came from its part of the source", file)});
}

void Course::Complain(Warning::Kind kind, const std::vector<Sentence>& complaints) {
    for (const Sentence& complaint : complaints)
        observer_.Warned({kind, Say("\"{}\": {}", request_.input, complaint)});
}

} // namespace movieconv
