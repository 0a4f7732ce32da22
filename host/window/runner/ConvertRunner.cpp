#include "host/window/runner/ConvertRunner.h"

#include "host/convert/Formats.h"
#include "host/convert/Job.h"
#include "host/convert/Sources.h"
#include "host/convert/StillPicture.h"
#include "host/window/runner/Foresight.h"
#include "host/window/runner/LibraryWords.h"
#include "host/window/runner/PresetShelf.h"
#include "host/window/runner/SourceFacts.h"
#include "host/window/runner/Translation.h"

#include <QCoreApplication>

#include <atomic>
#include <chrono>
#include <filesystem>
#include <stdexcept>
#include <system_error>
#include <utility>

namespace movieconv::window {
namespace {

constexpr std::chrono::milliseconds kBetweenPictures{250};

struct Texts {
    Q_DECLARE_TR_FUNCTIONS(ConvertRunner)
};

/// A picture that shares the memory of the library's.
QImage ToImage(const std::shared_ptr<const ShownPicture>& picture) {
    if (!picture || picture->width <= 0)
        return {};
    auto* held = new std::shared_ptr<const ShownPicture>(picture);
    return {picture->bgra.data(),
            picture->width,
            picture->height,
            picture->width * 4,
            QImage::Format_RGB32,
            [](void* owner) { delete static_cast<std::shared_ptr<const ShownPicture>*>(owner); },
            held};
}

QString FailureSentence(const Failure& failure, const std::string& source) {
    std::error_code unknown;
    const QString what = failure.Why() == Reason::kNoMemory && failure.Text().empty()
                             ? Texts::tr("There was not enough memory.")
                             : SentenceOf(failure.Words());
    QString advice;
    if (failure.Why() == Reason::kExists)
        advice = Texts::tr("Choose another name, or let it be replaced.");
    else if (failure.Kind() == Category::kNoSpace)
        advice = Texts::tr("Make room on the disk, or choose another folder.");
    else if (failure.Kind() == Category::kOutput)
        advice = Texts::tr("Choose another folder that you may write to.");
    else if (failure.Kind() == Category::kSource && !std::filesystem::exists(source, unknown))
        advice = Texts::tr("Is the disk that holds it connected?");
    return advice.isEmpty() ? what : what + QLatin1Char(' ') + advice;
}

/// Hears a job and tells a listener in the window's terms.
class Interpreter : public Observer {
public:
    Interpreter(std::string source, std::shared_ptr<RunListener> listener)
        : source_(std::move(source)), listener_(std::move(listener)) {}

    void StopWasAskedFor() { stopping_ = true; }

    void Started(const movieconv::Start& start) override {
        Figures figures;
        figures.length = start.lengthIsKnown ? start.length : 0;
        listener_->OnFigures(figures);
    }
    void Progressed(const Progress& progress) override {
        Figures figures;
        figures.phase = stopping_                                             ? Phase::kStopping
                        : progress.phase == movieconv::Phase::kPaused         ? Phase::kPaused
                        : progress.phase == movieconv::Phase::kFinishing      ? Phase::kFinishing
                        : progress.phase == movieconv::Phase::kWaitingForRoom ? Phase::kWaitingForRoom
                                                                              : Phase::kConverting;
        figures.position = progress.position;
        figures.length = progress.percent ? progress.length : 0;
        figures.fraction = progress.percent ? *progress.percent / 100 : -1;
        figures.speed = progress.speed;
        figures.left = progress.left;
        figures.worked = progress.worked;
        figures.bytes = progress.bytes;
        if (progress.expected)
            figures.expected = {progress.expected->least, progress.expected->most};
        listener_->OnFigures(figures);
    }
    void LeftBehind(const NotCarried& what) override { leftBehind_ += LineOf(what); }
    void Closed(const ClosedFile& file) override { files_.push_back(file.path); }
    void Warned(const movieconv::Warning& warning) override { listener_->OnNote(SentenceOf(warning.text)); }
    void Showed(const std::shared_ptr<const ShownPicture>& picture) override {
        listener_->OnPicture(ToImage(picture));
    }
    void Ended(const Verdict& verdict) override {
        Outcome outcome;
        outcome.ending = verdict.outcome == movieconv::Outcome::kDone      ? Ending::kDone
                         : verdict.outcome == movieconv::Outcome::kStopped ? Ending::kStopped
                                                                           : Ending::kFailed;
        outcome.files = std::move(files_);
        if (!outcome.files.empty())
            outcome.notCarried = leftBehind_;
        outcome.bytes = verdict.bytes;
        outcome.position = verdict.position;
        outcome.worked = verdict.worked;
        if (verdict.failure)
            outcome.sentence = FailureSentence(*verdict.failure, source_);
        else if (outcome.ending == Ending::kStopped && outcome.files.empty())
            outcome.sentence = Texts::tr("It was stopped before anything was converted.");
        listener_->OnEnd(outcome);
    }

private:
    const std::string source_;
    const std::shared_ptr<RunListener> listener_;
    QStringList leftBehind_;
    std::vector<std::string> files_;
    std::atomic<bool> stopping_{false};
};

class ConvertRun : public Run {
public:
    ConvertRun(const Request& request, std::shared_ptr<RunListener> listener, Worker& remover)
        : parts_(std::make_shared<Parts>(request, std::move(listener))), remover_(remover) {}
    ~ConvertRun() override {
        remover_.Do(0, [parts = std::move(parts_)]() mutable { parts.reset(); });
    }

    void Begin() {
        try {
            parts_->job.Start();
        } catch (const std::system_error& error) {
            Fail(Category::kInternal, WordsOf(error));
        }
    }
    /// Instead of beginning.
    void Fail(Category category, const Sentence& words) {
        Verdict verdict;
        verdict.failure.emplace(category, words);
        parts_->interpreter.Ended(verdict);
    }
    void Pause() override { parts_->job.Pause(); }
    void Resume() override { parts_->job.Resume(); }
    void Stop() override {
        parts_->interpreter.StopWasAskedFor();
        parts_->job.Stop();
    }
    void ShowPictures(bool wanted) override {
        parts_->job.ShowPictures(wanted ? std::optional(kBetweenPictures) : std::nullopt);
    }

private:
    struct Parts {
        Parts(const Request& request, std::shared_ptr<RunListener> listener)
            : interpreter(request.input, std::move(listener)), job(request, interpreter) {}
        Interpreter interpreter;
        Job job;
    };

    std::shared_ptr<Parts> parts_;
    Worker& remover_;
};

} // namespace

Abilities ConvertRunner::Can() {
    Abilities abilities;
    abilities.tracks = true;
    abilities.deinterlace = true;
    abilities.crop = true;
    abilities.presetFiles = true;
    return abilities;
}

std::vector<PresetFacts> ConvertRunner::Presets() {
    return PresetsOnShelf();
}

std::vector<FormatFacts> ConvertRunner::Formats() {
    std::vector<FormatFacts> formats;
    for (const char* extension :
         {"mp4", "mkv", "mov", "webm", "avi", "ts", "flv", "gif", "m4a", "mp3", "flac", "ogg", "wav"})
        if (const FileFormatInfo* format = FindFormat(extension))
            formats.push_back({QLatin1String(extension), QString::fromUtf8(format->szName),
                               format->bHasVideo != 0,
                               QString::fromUtf8(format->szExtensions).split(QLatin1Char(',')).mid(1)});
    return formats;
}

PresetFacts ConvertRunner::LoadPreset(const std::string& path) {
    try {
        return TakeIntoShelf(path);
    } catch (const PresetError& error) {
        throw std::runtime_error(SentenceOf(error.Words()).toStdString());
    }
}

QStringList ConvertRunner::SavePreset(const std::string& path, const Wishes& wishes) {
    return WritePreset(path, wishes);
}

std::string ConvertRunner::PresetFolder() {
    return OwnPresetFolder();
}

std::unique_ptr<Run> ConvertRunner::Start(const Order& order, std::shared_ptr<RunListener> listener) {
    log_.Add(listener);
    try {
        auto run = std::make_unique<ConvertRun>(ToRequest(order), listener, remover_);
        run->Begin();
        return run;
    } catch (const PresetError& error) {
        auto run = std::make_unique<ConvertRun>(Request(), std::move(listener), remover_);
        run->Fail(Category::kRequest, error.Words());
        return run;
    }
}

MovieFacts ConvertRunner::Look(const std::string& path) {
    try {
        Request request;
        request.input = path;
        return FactsOf(LookAtSource(request));
    } catch (const Failure& failure) {
        throw std::runtime_error(FailureSentence(failure, path).toStdString());
    }
}

std::string ConvertRunner::FileInTheWay(const Order& order) {
    return ExistingFileOf(order);
}

Findings ConvertRunner::Check(const Order& order) {
    return Foresee(order);
}

QImage ConvertRunner::PictureAt(const std::string& path, double seconds, int width) {
    try {
        const QImage picture = ToImage(movieconv::PictureAt(path, seconds));
        return picture.isNull() ? picture : picture.scaledToWidth(width, Qt::SmoothTransformation);
    } catch (const Failure& failure) {
        throw std::runtime_error(failure.Text());
    }
}

} // namespace movieconv::window
