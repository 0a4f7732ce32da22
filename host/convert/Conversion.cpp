#include "host/convert/Conversion.h"

#include "host/convert/EncodePlan.h"
#include "host/convert/OutputCheck.h"
#include "host/terminal/Units.h"
#include "text/Path.h"
#include "text/Utf8.h"

#include <algorithm>
#include <chrono>
#include <cmath>
#include <filesystem>
#include <fmt/format.h>
#include <limits>

namespace movieconv {
namespace {

constexpr double kTickSeconds = 0.5;
constexpr std::chrono::seconds kSuspicious{2}; // between two ticks: the process was suspended
constexpr double kMostPercent = 99.9;          // until the file has its name
constexpr double kEarlyEnd = 1; // seconds by which a source may fall short of the length asked for

/// Whether the file is shorter than when it was opened.
bool HasShrunk(const SourceInfo& source) {
    std::error_code unknown;
    const auto bytes = std::filesystem::file_size(source.path, unknown);
    return !unknown && static_cast<int64_t>(bytes) < source.bytes;
}

WorkClock::Time Now() {
    return std::chrono::steady_clock::now();
}

} // namespace

Converter MakeConverter(const Options& options, Movie& movie, uint32_t writerSet) {
    const FileFormatInfo& format = ChooseFormat(options);
    Converter converter(MCCreate(movie.Pictures(), movie.Sound()));
    EncodeParam defaults{};
    if (!converter || MCGetEncodeParam(converter.get(), &defaults) == 0)
        throw Failure(ExitCode::kInternal, "no memory for the converter");
    EncodeParam param = PlanEncoding(defaults, format, options, movie.Info());
    param.nReserved[kWriterSetWord] = writerSet;
    MCSetEncodeParam(converter.get(), &param);
    MCSetOutputFile(converter.get(), text::FromUtf8(options.output).c_str());
    if (options.split && param.bNoVideo != 0)
        throw Failure(ExitCode::kUsage, "--split needs pictures: sound alone is written as one file");
    if (options.split)
        MCSetSplitParam(converter.get(), 1, static_cast<unsigned long>(std::lround(*options.split * 1000)));
    MCEnablePreview(converter.get(), options.preview ? 1 : 0);
    return converter;
}

Conversion::Conversion(const Options& options, Movie& movie, Reporter& reporter, ControlInput& control)
    : options_(options),
      movie_(movie),
      reporter_(reporter),
      control_(control),
      length_(LengthToConvert(options, movie.Info())),
      watch_(options, movie.Info()),
      files_(reporter),
      converter_(MakeConverter(options, movie, watch_.OptionSet())),
      clock_(Now()) {
    if (options.length)
        movie.EndPicturesAt(options.begin + length_);
    if (options.preview)
        preview_.emplace(*options.preview, options.overwrite);
}

ExitCode Conversion::Run() {
    const bool lengthKnown = movie_.Info().certainty != Certainty::kGuessed;
    reporter_.Start({options_.input, options_.output, length_, lengthKnown});
    if (lengthKnown || options_.length)
        WarnOfSmallRoom();
    control_.Arm(options_.progress == ProgressStyle::kBar && !options_.quiet, watch_.OptionSet());
    clock_.Skip(Now());
    if (MCStart(converter_.get(), options_.begin, options_.length.value_or(0), nullptr, OnProgress, this) !=
        0)
        throw Failure(ExitCode::kInternal, "the conversion could not be started");
    if (MCWait(converter_.get(), 0) == 0 && outcome_ == kNone)
        throw Failure(ExitCode::kInternal, "no thread could be started for the conversion");
    try {
        WaitForEnd();
    } catch (...) {
        Stop(); // lest the converter's end wait for a slow source
        throw;
    }
    MCWait(converter_.get(), MC_INFINITE);
    return Conclude();
}

void Conversion::WarnOfSmallRoom() {
    EncodeParam param{};
    MCGetEncodeParam(converter_.get(), &param);
    const int64_t needed = MCGetEstimateDiskSpaceEx(&param, length_);
    const int64_t free = FreeBytes(text::FolderOf(options_.output));
    if (free >= 0 && free < needed) {
        reporter_.Warning(fmt::format("\"{}\" needs about {}, but only {} are free", options_.output,
                                      FormatBytes(needed), FormatBytes(free)));
    }
}

/// The engine's worker calls this.
unsigned Conversion::OnProgress(void* context, unsigned kind, unsigned value, uintptr_t info) {
    auto* conversion = static_cast<Conversion*>(context);
    if (const auto* progress = reinterpret_cast<const ProgressInfo*>(info)) {
        conversion->position_ = progress->dPosition;
        if (conversion->preview_ && progress->pPreviewImage != nullptr)
            conversion->preview_->Offer(*progress->pPreviewImage);
    }
    if (kind == 1) {
        conversion->outcome_ = static_cast<int>(value);
        PostHostEvent(EventKind::kFinished);
    }
    return 1;
}

void Conversion::WaitForEnd() {
    while (outcome_ == kNone) {
        const std::optional<EventKind> event = ReceiveHostEvent(paused_ ? -1 : kTickSeconds);
        UpdateClock();
        control_.FollowTerminal();
        if (event)
            Handle(*event);
        if (outcome_ == kNone && watch_.FileVanished())
            Stop(); // whatever else were converted would be lost
        if (outcome_ == kNone)
            ReportProgress();
    }
}

void Conversion::UpdateClock() {
    const WorkClock::Time now = Now();
    if (now - clock_.Last() > kSuspicious)
        clock_.Skip(now);
    if (paused_ || watch_.WaitsForRoom())
        clock_.Stand(now);
    else
        clock_.Go(now);
}

void Conversion::Handle(EventKind event) {
    switch (event) {
    case EventKind::kFinished:
    case EventKind::kProgress:
        break;
    case EventKind::kWriterNews:
        TakeNews();
        break;
    case EventKind::kStop:
        userStopped_ = true;
        Stop();
        break;
    case EventKind::kPauseKey:
        TogglePause();
        break;
    case EventKind::kSuspend:
        Suspend();
        break;
    }
}

void Conversion::TakeNews() {
    while (const auto news = watch_.Take())
        if (!files_.Enter(*news))
            Stop();
}

/// Ends the conversion; what was written so far is finished as a file.
void Conversion::Stop() {
    watch_.GiveUp();
    MCAbort(converter_.get());
    movie_.Stop();
    paused_ = false;
}

void Conversion::TogglePause() {
    if (paused_) {
        MCResume(converter_.get());
        paused_ = false;
    } else {
        paused_ = MCPause(converter_.get()) > 0;
    }
}

void Conversion::Suspend() {
    reporter_.LeaveLine();
    control_.Suspend();
    clock_.Skip(Now());
}

/// Seconds converted when the movie is at `position`. A picture can reach beyond the length that was asked
/// for, and a movie beyond the one it announces.
double Conversion::Converted(double position) const {
    return std::clamp(position, 0.0, options_.length ? length_ : std::numeric_limits<double>::max());
}

ProgressReport Conversion::Figures() {
    ProgressReport report{};
    // While the rest of the sound is converted after the last picture, only the sound tells how far it is.
    report.position = Converted(std::max(position_.load(), movie_.SoundSeconds()));
    report.length = length_;
    report.worked = clock_.Seconds();
    speed_.Add(report.worked, report.position);
    report.speed = speed_.Speed();
    if (movie_.Info().certainty != Certainty::kGuessed && length_ > 0) {
        report.percent = std::min(report.position / length_ * 100, kMostPercent);
        report.left = speed_.Left(length_);
    }
    report.bytes = watch_.Bytes();
    report.finished = files_.Finishing().value_or(0);
    report.clip = options_.split ? files_.Opened() : 0;
    report.phase = watch_.WaitsForRoom() ? Phase::kWaitingForRoom
                   : paused_             ? Phase::kPaused
                   : files_.Finishing()  ? Phase::kFinishing
                                         : Phase::kConverting;
    return report;
}

void Conversion::ReportProgress() {
    const ProgressReport report = Figures();
    const bool milestone = report.phase != shownPhase_;
    if (milestone && report.phase == Phase::kWaitingForRoom) {
        reporter_.Warning(fmt::format(
            "no space is left for \"{}\"; waiting until there is room, Ctrl-C gives up", options_.output));
    }
    shownPhase_ = report.phase;
    reporter_.Progress(report, milestone);
}

ExitCode Conversion::Conclude() {
    TakeNews();
    if (preview_) {
        if (const VideoImage* last = movie_.LastPicture()) // the engine shows but some
            preview_->Offer(*last);
        if (const std::string failure = preview_->Finish(); !failure.empty())
            reporter_.Warning(failure);
    }
    ReportComplaints();
    EndReport end{};
    const std::optional<Failure> failure = Verdict();
    end.code = failure                                       ? failure->Code()
               : userStopped_ && outcome_ == kOutcomeStopped ? ExitCode::kStopped
                                                             : ExitCode::kDone;
    end.outcome = failure ? "failed" : end.code == ExitCode::kStopped ? "stopped" : "done";
    end.position = Converted(position_);
    end.worked = clock_.Seconds();
    end.bytes = files_.Bytes();
    end.files = files_.Complete();
    if (failure) {
        reporter_.Error(failure->what());
    } else {
        end.summary = fmt::format("{}: {} converted in {} ({:.2f}x), {} in {}",
                                  end.code == ExitCode::kDone ? "100% done" : "stopped",
                                  FormatTime(end.position, true), FormatTime(end.worked, true),
                                  end.position / std::max(end.worked, 1e-3), FormatBytes(end.bytes),
                                  end.files == 1 ? "one file" : fmt::format("{} files", end.files));
    }
    reporter_.End(end);
    return end.code;
}

/// What went wrong, by the writer's word, the engine's and the source's.
std::optional<Failure> Conversion::Verdict() {
    if (files_.FirstFailure())
        return files_.FirstFailure();
    std::string reason = movie_.ReadError();
    if (files_.Complete() == 0) { // the writer keeps no empty file
        if (userStopped_ && reason.empty())
            return std::nullopt;
        return Failure(ExitCode::kCannotRead,
                       reason.empty() ? fmt::format("\"{}\" holds nothing to convert", options_.input)
                                      : fmt::format("cannot read \"{}\": {}", options_.input, reason));
    }
    if (reason.empty())
        reason = WhyItEndedEarly();
    if (!reason.empty() && !userStopped_) {
        return Failure(ExitCode::kCannotRead,
                       fmt::format("reading \"{}\" failed after {}: {}; what was read is converted",
                                   options_.input, FormatTime(options_.begin + position_, true), reason));
    }
    if (outcome_ == kOutcomeFailed) {
        return Failure(ExitCode::kInternal,
                       fmt::format("the conversion broke off after {}, for want of memory",
                                   FormatTime(options_.begin + position_, true)));
    }
    return std::nullopt;
}

/// Why the source ended before what it promises, and before the length that was asked for; empty when it did
/// not.
std::string Conversion::WhyItEndedEarly() const {
    const std::optional<Shortfall> missing = movie_.Missing();
    const double converted = std::max(position_.load(), movie_.SoundSeconds());
    const bool lengthReached = options_.length && length_ - converted <= kEarlyEnd;
    if (!missing || lengthReached || outcome_ != kOutcomeCompleted)
        return {};
    if (HasShrunk(movie_.Info()))
        return "the file was cut meanwhile";
    if (missing->announced <= 0)
        return "it is cut off";
    return fmt::format("{}it ends at {} although it announces {}", missing->cutOff ? "it is cut off: " : "",
                       FormatTime(missing->reached, true), FormatTime(missing->announced, true));
}

void Conversion::ReportComplaints() {
    for (const std::string& complaint : movie_.Complaints())
        reporter_.Warning(fmt::format("\"{}\": {}", options_.input, complaint));
}

} // namespace movieconv
