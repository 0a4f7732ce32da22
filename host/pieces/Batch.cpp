#include "host/pieces/Batch.h"

#include "host/convert/EncodePlan.h"
#include "host/convert/Failure.h"
#include "host/convert/Sources.h"
#include "host/pieces/MarkText.h"
#include "host/pieces/MovieErrand.h"
#include "host/pieces/NamePattern.h"
#include "host/pieces/OutputNames.h"
#include "host/pieces/PlanChecks.h"
#include "host/pieces/SettingsText.h"
#include "host/sentence/Say.h"

#include <algorithm>
#include <filesystem>
#include <fmt/format.h>
#include <map>
#include <memory>
#include <sys/stat.h>
#include <thread>
#include <unistd.h>
#include <utility>

namespace movieconv {
namespace {

namespace fs = std::filesystem;

/// The more others are concerned, the worse.
int Badness(Category category) {
    switch (category) {
    case Category::kRequest:
        return 1;
    case Category::kSource:
        return 2;
    case Category::kOutput:
        return 3;
    case Category::kNoSpace:
        return 4;
    case Category::kInternal:
        break;
    }
    return 5;
}

/// The extension of what is asked for; MP4 where nothing is.
std::string ExtensionFor(const Request& request) {
    try {
        const std::string list = ChooseFormat(request).szExtensions;
        return list.substr(0, list.find(','));
    } catch (const Failure& failure) {
        if (failure.Why() != Reason::kNoFormat)
            throw;
        return "mp4";
    }
}

/// Those that are no secret, sorted. What a link leads to counts, if it leads anywhere.
std::vector<std::string> FilesIn(const std::string& folder) {
    std::vector<std::string> found;
    std::error_code error;
    fs::directory_iterator entry(folder, error);
    for (const fs::directory_iterator end; !error && entry != end; entry.increment(error)) {
        std::error_code leadsNowhere;
        if (entry->is_regular_file(leadsNowhere) && entry->path().filename().string().front() != '.')
            found.push_back(entry->path().string());
    }
    if (error)
        throw Failure(Category::kSource, fmt::format("cannot read \"{}\": {}", folder, error.message()));
    std::sort(found.begin(), found.end());
    return found;
}

/// What is written in the end, where a link stands under that name.
std::string TargetOf(const std::string& output) {
    std::error_code none;
    const fs::path real = fs::canonical(output, none);
    return none ? output : real.string();
}

/// Everything but the source that decides what comes out.
std::string SettingsOf(Request request) {
    const std::vector<SourceMark> texts = MarkTexts(request);
    Json settings = WishesAsJson(request);
    settings["texts"] = MarksAsJson(texts);
    settings["madeWith"] = CurrentVersions();
    return settings.dump();
}

/// Why a file that was found in a folder is none; empty when it is one.
Sentence WhyNoMovie(Request request) {
    request.detectCrop = false; // which takes long and does not matter here
    try {
        return LookAtSource(request).isImage ? Say("it is a single picture") : Sentence();
    } catch (const Failure& failure) {
        return failure.Words();
    }
}

bool IsPlaylist(Request request) {
    if (!request.playlists)
        return false;
    request.playlists = false;
    request.detectCrop = false;
    try {
        LookAtSource(request);
        return false;
    } catch (const Failure& failure) {
        return failure.Why() == Reason::kPlaylist;
    }
}

} // namespace

Batch::Batch(BatchOrder order, Observer& observer, Loop loop)
    : Crew(observer, std::move(loop)), order_(std::move(order)) {}

Verdict Batch::Perform() {
    settings_ = SettingsOf(order_.request);
    std::error_code error;
    fs::create_directories(order_.folder, error);
    if (error)
        throw Failure(Category::kOutput,
                      fmt::format("the folder \"{}\" cannot be made: {}", order_.folder, error.message()));
    lock_.emplace(order_.folder); // the journal tells what others did before, not what they do
    if (lock_->Result() == FileLock::State::kElsewhere)
        throw Failure(
            Category::kOutput,
            fmt::format("another run is working on \"{}\"; wait until it ends, or choose another folder",
                        order_.folder));
    journal_.emplace(order_.folder);
    List();
    count_ = static_cast<int>(waiting_.size());
    News().Started({fmt::format("{} {}", count_, count_ == 1 ? "movie" : "movies"), order_.folder, 0, false});
    if (journal_->Damaged() > 0)
        News().Warned({Warning::Kind::kSource,
                       fmt::format("{} lines of the journal in \"{}\" are damaged and not believed",
                                   journal_->Damaged(), order_.folder)});
    const auto processors = static_cast<int>(std::max(1U, std::thread::hardware_concurrency()));
    WorkOff(order_.jobs > 0 ? order_.jobs : (processors + 1) / 2);
    return Conclude();
}

Crew::Mood Batch::HowToGoOn() const {
    if (Stopped())
        return Mood::kBreaksOff;
    return worst_ && worst_->Kind() == Category::kNoSpace ? Mood::kBeginsNothing : Mood::kGoesOn;
}

/// Puts what is to be converted in its order.
void Batch::List() {
    const std::string extension = ExtensionFor(order_.request);
    std::vector<Candidate> candidates;
    for (const std::string& input : order_.inputs) {
        std::error_code error;
        if (!fs::is_directory(input, error)) {
            candidates.push_back({input, OutputFor(input, extension), true});
            continue;
        }
        if (fs::equivalent(input, order_.folder, error))
            throw Failure(Category::kRequest,
                          fmt::format("\"{}\" is where the outputs go; choose another folder", input));
        for (const std::string& file : FilesIn(input))
            candidates.push_back({file, OutputFor(file, extension), false});
    }
    for (const Candidate& candidate : candidates)
        NoteSource(candidate.input);
    RequireOwnOutputs(candidates);
    waiting_.assign(candidates.begin(), candidates.end());
}

/// Throws Failure when two would become the same file. What is no movie, and only stands in the same folder,
/// takes no name from one.
void Batch::RequireOwnOutputs(const std::vector<Candidate>& candidates) {
    std::map<std::string, std::vector<const Candidate*>> takers;
    for (const Candidate& candidate : candidates)
        takers[TargetOf(candidate.output)].push_back(&candidate);
    for (auto& [target, those] : takers) {
        if (those.size() == 1)
            continue;
        those.erase(std::remove_if(those.begin(), those.end(),
                                   [this](const Candidate* candidate) {
                                       return !candidate->named &&
                                              !WhyNoMovie(RequestFor(*candidate)).IsEmpty();
                                   }),
                    those.end());
        if (those.size() > 1)
            throw Failure(Category::kRequest,
                          fmt::format("\"{}\" and \"{}\" would both become \"{}\"; choose other names, as "
                                      "with --names \"{{folder}}-{{name}}-{{from}}.{{ext}}\"",
                                      those[0]->input, those[1]->input, target));
    }
}

Request Batch::RequestFor(const Candidate& candidate) const {
    Request request = order_.request;
    request.input = candidate.input;
    request.output = candidate.output;
    return request;
}

void Batch::NoteSource(const std::string& path) {
    struct stat status {};
    if (stat(path.c_str(), &status) == 0)
        sources_.emplace(status.st_dev, status.st_ino);
}

bool Batch::IsSource(const std::string& path) const {
    struct stat status {};
    return stat(path.c_str(), &status) == 0 && sources_.count({status.st_dev, status.st_ino}) > 0;
}

std::string Batch::OutputFor(const std::string& input, const std::string& extension) const {
    const std::string name = NameAfter(order_.names, input, extension);
    std::string path = order_.folder + "/" + name;
    if (name.empty() || name.find('/') != std::string::npos || path == JournalIn(order_.folder))
        throw Failure(Category::kRequest,
                      fmt::format("--names \"{}\" makes no file name of \"{}\"", order_.names, input));
    return path;
}

std::optional<Crew::Assignment> Batch::Next() {
    const Candidate candidate = waiting_.front();
    waiting_.pop_front();
    try {
        return Assign(candidate);
    } catch (const Failure& failure) {
        Fail(candidate.input, failure);
        return std::nullopt;
    }
}

/// Nothing when it is converted already, or no movie.
std::optional<Crew::Assignment> Batch::Assign(const Candidate& candidate) {
    Request request = RequestFor(candidate);
    if (IsSource(candidate.output))
        throw Failure(
            Category::kRequest,
            fmt::format("its output \"{}\" is one of the sources; choose other names", candidate.output));
    SourceMark source = MarkOf(candidate.input);
    const BatchJournal::State state = journal_->StateOf(candidate.output, source, settings_);
    if ((!candidate.named && !IsMovie(request)) || IsDone(request, state)) {
        ++skipped_;
        return std::nullopt;
    }
    RemoveUnfinished(candidate.output);
    request.overwrite = request.overwrite || state != BatchJournal::State::kUnknown;
    return Assignment{request, std::make_unique<MovieErrand>(News(), *journal_, opened_, request,
                                                             std::move(source), settings_)};
}

/// Whether nothing is left to do; tells it. Of a playlist the source's mark does not tell whether what it
/// names is still the same.
bool Batch::IsDone(const Request& request, BatchJournal::State state) {
    if (state != BatchJournal::State::kDone)
        return false;
    const bool isPlaylist = IsPlaylist(request);
    News().Warned({Warning::Kind::kChosen,
                   isPlaylist ? fmt::format("\"{}\" is made anew: it was made of a playlist, and what that "
                                            "names may have changed",
                                            request.output)
                              : fmt::format("\"{}\" is there already, from the same source", request.output),
                   request.input});
    return !isPlaylist;
}

/// What a run left that was killed; one that still runs holds its file.
void Batch::RemoveUnfinished(const std::string& output) const {
    const std::optional<std::string> left = journal_->Unfinished(output);
    if (left && !IsSource(*left) && FileLock(*left).Result() == FileLock::State::kHeld)
        unlink(left->c_str());
}

/// Of a file that was found in a folder; tells why not.
bool Batch::IsMovie(const Request& request) {
    const Sentence why = WhyNoMovie(request);
    if (!why.IsEmpty())
        News().Warned(
            {Warning::Kind::kSource, Say("\"{}\" is left out: {}", request.input, why), request.input});
    return why.IsEmpty();
}

void Batch::Take(const std::string& input, const Verdict& ending) {
    converted_ += ending.position;
    bytes_ += ending.bytes;
    files_ += ending.files;
    if (ending.outcome == Outcome::kDone)
        ++done_;
    else if (ending.failure)
        Fail(input, *ending.failure);
}

void Batch::Fail(const std::string& input, const Failure& failure) {
    ++failed_;
    News().Warned({Warning::Kind::kFailed, Say("\"{}\": {}", input, failure.Words()), input});
    if (!worst_ || Badness(failure.Kind()) > Badness(worst_->Kind()))
        worst_ = failure;
}

/// The lengths of movies that wait are taken to be those of the others on average.
void Batch::Report() {
    Progress report = UnderWay();
    report.position += converted_;
    report.length += converted_;
    report.bytes += bytes_;
    const std::size_t known = static_cast<std::size_t>(done_) + Busy();
    if (known > 0)
        report.length += report.length / static_cast<double>(known) * static_cast<double>(waiting_.size());
    Tell(report);
}

Verdict Batch::Conclude() {
    Verdict verdict;
    verdict.position = converted_;
    verdict.bytes = bytes_;
    verdict.files = files_;
    verdict.worked = Worked();
    verdict.outcome = failed_ > 0 ? Outcome::kFailed : Stopped() ? Outcome::kStopped : Outcome::kDone;
    if (failed_ > 0) {
        verdict.failure =
            Failure(worst_->Kind(), fmt::format("{} of {} movies failed; {} converted, {} left as "
                                                "they are, {} not begun",
                                                failed_, count_, done_, skipped_, waiting_.size()));
    }
    return verdict;
}

} // namespace movieconv
