#include "host/pieces/Batch.h"

#include "host/convert/Attempt.h"
#include "host/convert/EncodePlan.h"
#include "host/convert/Failure.h"
#include "host/convert/Sources.h"
#include "host/pieces/SettingsText.h"

#include <algorithm>
#include <chrono>
#include <filesystem>
#include <fmt/format.h>
#include <map>
#include <new>
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

void Replace(std::string& text, const std::string& what, const std::string& by) {
    for (std::size_t at = text.find(what); at != std::string::npos; at = text.find(what, at + by.size()))
        text.replace(at, what.size(), by);
}

} // namespace

/// One movie being converted.
class Batch::Task final : public Observer {
public:
    Task(Batch& batch, BatchJournal& journal, Movie movie, SourceMark source, Request request)
        : batch_(batch),
          journal_(journal),
          movie_(std::move(movie)),
          source_(std::move(source)),
          job_(std::move(request), *this) {}

    Job& Conversion() { return job_; }

    /// Ends it; what is converted until then is not the whole movie.
    void Stop() { job_.Stop(); }
    const Movie& What() const { return movie_; }
    Progress Latest() const {
        const std::lock_guard lock(mutex_);
        return latest_;
    }
    std::optional<Verdict> Ending() const {
        const std::lock_guard lock(mutex_);
        return ending_;
    }

    void Progressed(const Progress& news) override {
        const std::lock_guard lock(mutex_);
        latest_ = news;
    }
    void Closed(const ClosedFile& news) override { batch_.outlet_.Closed(news); }
    void Warned(const Warning& news) override { batch_.outlet_.Warned(news); }
    void LeftBehind(const NotCarried& news) override { batch_.outlet_.LeftBehind(news); }
    void Ended(const Verdict& news) override {
        Verdict verdict = news;
        try {
            if (verdict.outcome == Outcome::kDone)
                journal_.NoteDone(movie_.output, source_, batch_.settings_);
        } catch (const Failure& failure) {
            verdict.outcome = Outcome::kFailed;
            verdict.failure = failure;
        }
        {
            const std::lock_guard lock(mutex_);
            ending_ = std::move(verdict);
        }
        batch_.bell_.Ring();
    }

private:
    Batch& batch_;
    BatchJournal& journal_;
    const Movie movie_;
    const SourceMark source_;
    mutable std::mutex mutex_;
    Progress latest_;
    std::optional<Verdict> ending_;
    Job job_; // last: the others hear from it
};

Batch::Batch(BatchOrder order, Observer& observer, Loop loop)
    : order_(std::move(order)), outlet_(observer, std::move(loop)), clock_(WorkClock::Now()) {}

Batch::~Batch() {
    Stop();
    if (thread_.joinable())
        thread_.join();
}

void Batch::Start() {
    thread_ = std::thread([this] { Run(); });
}

void Batch::Pause() {
    pause_ = true;
    bell_.Ring();
}

void Batch::Resume() {
    pause_ = false;
    bell_.Ring();
}

void Batch::Stop() {
    stop_ = true;
    bell_.Ring();
}

const Verdict* Batch::Result() const {
    const std::lock_guard lock(mutex_);
    return ended_ ? &verdict_ : nullptr;
}

void Batch::Run() noexcept {
    // cppcheck-suppress throwInNoexceptFunction ; Attempt catches it
    Verdict verdict = Attempt(*this, &Batch::Perform);
    tasks_.clear();
    {
        const std::lock_guard lock(mutex_);
        verdict_ = std::move(verdict);
        ended_ = true;
    }
    try {
        outlet_.Ended(verdict_);
    } catch (const std::bad_alloc&) { // Result tells it
    }
}

Verdict Batch::Perform() {
    std::error_code error;
    fs::create_directories(order_.folder, error);
    if (error)
        throw Failure(Category::kOutput,
                      fmt::format("the folder \"{}\" cannot be made: {}", order_.folder, error.message()));
    Json settings = SettingsAsJson(order_.request);
    settings["maxSize"] = order_.request.maxSize.value_or(0);
    settings["noVideo"] = order_.request.noVideo;
    settings["detectCrop"] = order_.request.detectCrop;
    settings["madeWith"] = CurrentVersions();
    settings_ = settings.dump(-1, ' ', false, Json::error_handler_t::replace);
    BatchJournal journal(order_.folder);
    if (journal.Damaged() > 0)
        outlet_.Warned({Warning::Kind::kSource,
                        fmt::format("{} lines of the journal in \"{}\" are damaged and not believed",
                                    journal.Damaged(), order_.folder)});
    const std::vector<Movie> movies = List();
    std::deque<Movie> waiting(movies.begin(), movies.end());
    count_ = static_cast<int>(movies.size());
    outlet_.Started({fmt::format("{} movies", count_), order_.folder, 0, false});
    const auto processors = static_cast<int>(std::max(1U, std::thread::hardware_concurrency()));
    const int jobs = order_.jobs > 0 ? order_.jobs : (processors + 1) / 2;
    clock_.Skip(WorkClock::Now());
    while (!tasks_.empty() || !waiting.empty()) {
        const bool ends = stop_ || (worst_ && worst_->Kind() == Category::kNoSpace);
        for (const auto& task : tasks_)
            if (stop_)
                task->Stop();
        while (!ends && !waiting.empty() && static_cast<int>(tasks_.size()) < jobs) {
            const Movie movie = waiting.front();
            waiting.pop_front();
            StartOne(movie, journal);
        }
        if (tasks_.empty() && (ends || waiting.empty()))
            break;
        bell_.Wait(paused_ ? std::nullopt : std::optional(WorkClock::kTick));
        FollowWishes();
        TakeEnded();
        Report(waiting.size());
    }
    return Conclude(waiting.size());
}

std::vector<Batch::Movie> Batch::List() const {
    const std::string extension = ExtensionFor(order_.request);
    std::vector<Movie> movies;
    for (const std::string& input : order_.inputs) {
        std::error_code error;
        if (!fs::is_directory(input, error)) {
            movies.push_back({input, OutputFor(input, extension), true});
            continue;
        }
        if (fs::equivalent(input, order_.folder, error))
            throw Failure(Category::kRequest,
                          fmt::format("\"{}\" is where the outputs go; choose another folder", input));
        std::vector<std::string> found;
        for (const auto& entry : fs::directory_iterator(input, error))
            if (entry.is_regular_file(error) && entry.path().filename().string().front() != '.')
                found.push_back(entry.path().string());
        if (error)
            throw Failure(Category::kSource, fmt::format("cannot read \"{}\": {}", input, error.message()));
        std::sort(found.begin(), found.end());
        for (const std::string& file : found)
            movies.push_back({file, OutputFor(file, extension), false});
    }
    std::map<std::string, std::string> taken;
    for (const Movie& movie : movies)
        if (const auto [first, isNew] = taken.emplace(movie.output, movie.input); !isNew)
            throw Failure(Category::kRequest,
                          fmt::format("\"{}\" and \"{}\" would both become \"{}\"; choose other names",
                                      first->second, movie.input, movie.output));
    return movies;
}

std::string Batch::OutputFor(const std::string& input, const std::string& extension) const {
    std::string name = order_.names;
    Replace(name, "{ext}", extension);
    Replace(name, "{name}", fs::path(input).stem().string());
    if (name.empty() || name.find('/') != std::string::npos)
        throw Failure(Category::kRequest, fmt::format("\"{}\" makes no name of \"{}\"", order_.names, input));
    return order_.folder + "/" + name;
}

/// Begins with a movie, unless it is converted already or cannot be.
void Batch::StartOne(const Movie& movie, BatchJournal& journal) {
    try {
        Request request = order_.request;
        request.input = movie.input;
        request.output = movie.output;
        SourceMark source = MarkOf(movie.input);
        if (!movie.named) {
            try {
                LookAtSource(request);
            } catch (const Failure&) {
                ++skipped_;
                outlet_.Warned(
                    {Warning::Kind::kSource, fmt::format("\"{}\" is left out: it is no movie", movie.input)});
                return;
            }
        }
        const BatchJournal::State state = journal.StateOf(movie.output, source, settings_);
        if (state == BatchJournal::State::kDone) {
            ++skipped_;
            outlet_.Warned({Warning::Kind::kChosen,
                            fmt::format("\"{}\" is there already, from the same source", movie.output)});
            return;
        }
        request.overwrite = request.overwrite || state == BatchJournal::State::kBegun;
        if (request.overwrite || access(movie.output.c_str(), F_OK) != 0) // else it will be refused
            journal.NoteBegun(movie.output, source, settings_);
        auto task = std::make_unique<Task>(*this, journal, movie, std::move(source), std::move(request));
        task->Conversion().Start();
        tasks_.push_back(std::move(task));
    } catch (const Failure& failure) {
        Fail(movie, failure);
    }
}

void Batch::TakeEnded() {
    for (auto task = tasks_.begin(); task != tasks_.end();) {
        const std::optional<Verdict> ending = (*task)->Ending();
        if (!ending) {
            ++task;
            continue;
        }
        converted_ += ending->position;
        bytes_ += ending->bytes;
        if (ending->outcome == Outcome::kDone)
            ++done_;
        else if (ending->failure)
            Fail((*task)->What(), *ending->failure);
        task = tasks_.erase(task);
    }
}

void Batch::Fail(const Movie& movie, const Failure& failure) {
    ++failed_;
    outlet_.Warned({Warning::Kind::kFailed, fmt::format("\"{}\": {}", movie.input, failure.Text())});
    if (!worst_ || Badness(failure.Kind()) > Badness(worst_->Kind()))
        worst_ = failure;
}

void Batch::FollowWishes() {
    if (pause_ != paused_ && !stop_) {
        paused_ = pause_;
        for (const auto& task : tasks_) {
            if (paused_)
                task->Conversion().Pause();
            else
                task->Conversion().Resume();
        }
    }
    paused_ = paused_ && !stop_;
    if (paused_)
        clock_.Stand(WorkClock::Now());
    else
        clock_.Go(WorkClock::Now());
}

/// The lengths of movies that wait are taken to be those of the others on average.
void Batch::Report(std::size_t waiting) {
    Progress report;
    report.position = converted_;
    report.bytes = bytes_;
    report.length = converted_;
    for (const auto& task : tasks_) {
        const Progress latest = task->Latest();
        report.position += latest.position;
        report.length += std::max(latest.length, latest.position);
        report.bytes += latest.bytes;
    }
    const auto known = done_ + static_cast<int>(tasks_.size());
    if (known > 0)
        report.length += report.length / known * static_cast<double>(waiting);
    report.phase = paused_ ? Phase::kPaused : Phase::kConverting;
    report.worked = clock_.Seconds();
    speed_.Add(report.worked, report.position);
    report.speed = speed_.Speed();
    report.left = speed_.Left(report.length);
    if (report.length > 0)
        report.percent = std::min(report.position / report.length * 100, kMostPercent);
    outlet_.Progressed(report);
}

Verdict Batch::Conclude(std::size_t waiting) {
    Verdict verdict;
    verdict.position = converted_;
    verdict.bytes = bytes_;
    verdict.files = done_;
    verdict.worked = clock_.Seconds();
    verdict.outcome = failed_ > 0 ? Outcome::kFailed : stop_ ? Outcome::kStopped : Outcome::kDone;
    if (failed_ > 0) {
        verdict.failure =
            Failure(worst_->Kind(), fmt::format("{} of {} movies failed; {} converted, {} left as "
                                                "they are, {} not begun",
                                                failed_, count_, done_, skipped_, waiting));
    }
    return verdict;
}

} // namespace movieconv
