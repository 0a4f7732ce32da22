#include "host/terminal/ExitCode.h"

namespace movieconv {
namespace {

const char* AdviceFor(Reason reason) {
    switch (reason) {
    case Reason::kNoFormat:
        return "; use --format, see \"movieconv --list-formats\"";
    case Reason::kExists:
        return "; use another name or --overwrite";
    case Reason::kCodec:
        return "; see \"movieconv --list-formats\"";
    case Reason::kBeginTooLate:
        return "; choose an earlier --begin";
    case Reason::kPlaylist:
        return "; see --allow-playlists";
    case Reason::kUnknownLength:
        return "; use --length";
    case Reason::kLeftover:
        return "; --resume goes on with it, --overwrite makes it anew";
    case Reason::kCannotResume:
        return "; without --resume it is made anew";
    case Reason::kNoPreset:
        return "; see \"movieconv --list-presets\"";
    case Reason::kNoMemory:
    case Reason::kOther:
        break;
    }
    return "";
}

} // namespace

ExitCode CodeOf(Category category) {
    switch (category) {
    case Category::kRequest:
        return ExitCode::kUsage;
    case Category::kSource:
        return ExitCode::kCannotRead;
    case Category::kOutput:
        return ExitCode::kCannotWrite;
    case Category::kNoSpace:
        return ExitCode::kNoSpace;
    case Category::kInternal:
        break;
    }
    return ExitCode::kInternal;
}

ExitCode CodeOf(const Verdict& verdict) {
    switch (verdict.outcome) {
    case Outcome::kDone:
        return ExitCode::kDone;
    case Outcome::kStopped:
        return ExitCode::kStopped;
    case Outcome::kFailed:
        break;
    }
    return verdict.failure ? CodeOf(verdict.failure->Kind()) : ExitCode::kInternal;
}

Failure FailureOf(const PresetError& error) {
    const bool isMissing = dynamic_cast<const NoPresetError*>(&error) != nullptr;
    return {Category::kRequest, error.Words(), isMissing ? Reason::kNoPreset : Reason::kOther};
}

std::string Explain(const Failure& failure) {
    if (failure.Why() == Reason::kNoMemory && failure.Text().empty())
        return "there is not enough memory";
    return failure.Text() + AdviceFor(failure.Why());
}

std::string Explain(const Warning& warning) {
    switch (warning.kind) {
    case Warning::Kind::kWaitsForRoom:
        return warning.text.Text() + ", Ctrl-C gives up";
    case Warning::Kind::kLeftover:
        return warning.text.Text() + "; the same command with --resume goes on with them";
    default:
        return warning.text.Text();
    }
}

} // namespace movieconv
