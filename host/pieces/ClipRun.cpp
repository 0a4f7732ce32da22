#include "host/pieces/ClipRun.h"

#include "host/convert/Failure.h"
#include "host/convert/OutputCheck.h"
#include "host/pieces/FileBirth.h"
#include "text/FileNames.h"

#include <fmt/format.h>
#include <string>
#include <string_view>
#include <utility>

namespace movieconv {

ClipRun::ClipRun(Request request, bool resume, Observer& observer, Loop loop)
    : request_(std::move(request)), resume_(resume), outlet_(observer, std::move(loop)), journal_(request_) {
    Prepare();
    job_.emplace(request_, static_cast<Observer&>(*this));
}

void ClipRun::Prepare() {
    keeps_ = journal_.IsPossible();
    if (resume_ && !keeps_)
        throw Failure(Category::kRequest,
                      fmt::format("\"{}\" is a playlist, a pipe or a device: whether it is still the same "
                                  "cannot be told, so clips of it cannot be gone on with",
                                  request_.input));
    if (keeps_)
        TakePlace();
    found_ = journal_.Exists();
    takesOver_ = resume_ && found_;
    if (takesOver_)
        TakeOver();
    worth_ = request_.firstClip.has_value();
    isLeft_ = found_ && !worth_;
    try {
        CheckOutput(request_);
    } catch (const Failure& failure) {
        if (!isLeft_ || failure.Why() != Reason::kExists)
            throw;
        throw Failure(
            failure.Kind(),
            fmt::format("{}, of an earlier run of which \"{}\" tells", failure.Text(), journal_.Path()),
            Reason::kLeftover);
    }
}

void ClipRun::TakePlace() {
    Request any = request_;
    any.overwrite = true;
    CheckOutput(any); // where no clip can be made nothing is locked
    lock_.emplace(journal_.Path());
    journal_.RequirePlace();
}

/// Clips of the run that broke off are replaced, and nothing else that has come there meanwhile.
void ClipRun::TakeOver() {
    request_.firstClip = journal_.Leftover();
    for (const auto& [number, clip] : ClipsOf(request_.output))
        if (number >= FirstNumber() && !request_.overwrite && !journal_.IsOurs(clip))
            throw Failure(Category::kOutput, fmt::format("\"{}\" exists", clip), Reason::kExists);
    request_.overwrite = true;
}

void ClipRun::Start() {
    if (takesOver_) { // what the run that broke off left of it
        const auto number = static_cast<std::size_t>(FirstNumber());
        RemoveUnfinished(text::ClipName(std::string_view(request_.output), number), request_);
    }
    job_->Start();
}

void ClipRun::Pause() {
    job_->Pause();
}

void ClipRun::Resume() {
    job_->Resume();
}

void ClipRun::Stop() {
    job_->Stop();
}

const Verdict* ClipRun::Result() const {
    return job_->Result();
}

void ClipRun::Started(const struct Start& news) {
    outlet_.Started(news);
    if (request_.firstClip)
        outlet_.Warned(
            {Warning::Kind::kChosen, fmt::format("{} clips are made already", request_.firstClip->number)});
    if (isLeft_)
        outlet_.Warned(
            {Warning::Kind::kChosen,
             fmt::format("\"{}\" was left of an earlier run; its clips are made anew", journal_.Path())});
}

/// When a clip is opened, the one before it is finished and under its name.
void ClipRun::Opened(const OpenedFile& news) {
    const std::string birth = BirthOf(news.temporaryPath, news.path);
    try {
        if (keeps_ && !begun_) {
            journal_.Begin(birth);
            begun_ = true;
        } else if (keeps_) {
            journal_.NoteFinished(closed_, {news.number - 1, news.begin}, birth);
            worth_ = true;
        }
    } catch (const Failure& failure) {
        keeps_ = false;
        outlet_.Warned(
            {Warning::Kind::kSource,
             fmt::format("{}; should the conversion break off, it cannot be gone on with", failure.Text())});
    }
    outlet_.Opened(news);
}

void ClipRun::Closed(const ClosedFile& news) {
    closed_ = news.path;
    outlet_.Closed(news);
}

void ClipRun::Ended(const Verdict& news) {
    const bool useless = begun_ && !worth_ && !journal_.HasClips();
    if (news.outcome == Outcome::kDone ? begun_ || found_ : useless)
        journal_.Remove();
    outlet_.Ended(news);
}

} // namespace movieconv
