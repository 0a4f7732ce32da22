#include "tests/window/ScriptedRunner.h"

#include "tests/support/Folder.h"

#include <filesystem>
#include <stdexcept>

using namespace movieconv::window;

namespace {

class ScriptedRun : public Run {
public:
    ScriptedRun(std::shared_ptr<ScriptedRunner::Script> script, bool endsWhenStopped)
        : script_(std::move(script)), endsWhenStopped_(endsWhenStopped) {}
    ~ScriptedRun() override { script_->gone = true; }

    void Pause() override {
        script_->paused = true;
        script_->Phase(Phase::kPaused);
    }
    void Resume() override {
        script_->paused = false;
        script_->Phase(Phase::kConverting);
    }
    void Stop() override {
        script_->stopped = true;
        if (endsWhenStopped_)
            script_->End(Ending::kStopped, QStringLiteral("stopped"));
    }
    void ShowPictures(bool wanted) override { script_->shown = wanted; }

private:
    std::shared_ptr<ScriptedRunner::Script> script_;
    const bool endsWhenStopped_;
};

} // namespace

void ScriptedRunner::Script::Figure(double position, double length, double speed) {
    Figures figures;
    figures.phase = Phase::kConverting;
    figures.position = position;
    figures.length = length;
    figures.fraction = position / length;
    figures.speed = speed;
    figures.left = (length - position) / speed;
    figures.bytes = static_cast<int64_t>(position * 100'000);
    figures.expected = {5'000'000, 7'000'000};
    listener->OnFigures(figures);
}

void ScriptedRunner::Script::Phase(movieconv::window::Phase phase) {
    Figures figures;
    figures.phase = phase;
    listener->OnFigures(figures);
}

void ScriptedRunner::Script::End(Ending ending, const QString& sentence) {
    Outcome outcome;
    outcome.ending = ending;
    outcome.sentence = sentence;
    if (ending != Ending::kFailed)
        outcome.files = {order.target};
    listener->OnEnd(outcome);
}

std::vector<PresetFacts> ScriptedRunner::Presets() {
    return {{QStringLiteral("kept"),
             QStringLiteral("Kept"),
             QStringLiteral("Leaves the sound as it is."),
             QStringLiteral("mkv"),
             60,
             true,
             {}},
            {QStringLiteral("standard"),
             QStringLiteral("Standard"),
             QStringLiteral("Plays everywhere."),
             QStringLiteral("mp4"),
             60,
             false,
             {}},
            {QStringLiteral("web"),
             QStringLiteral("Web"),
             QStringLiteral("For web pages."),
             QStringLiteral("webm"),
             50,
             false,
             {}}};
}

std::vector<FormatFacts> ScriptedRunner::Formats() {
    return {{QStringLiteral("mp4"), QStringLiteral("MP4"), true, {QStringLiteral("m4v")}},
            {QStringLiteral("mkv"), QStringLiteral("Matroska"), true, {}},
            {QStringLiteral("webm"), QStringLiteral("WebM"), true, {}},
            {QStringLiteral("m4a"), QStringLiteral("M4A"), false, {}}};
}

PresetFacts ScriptedRunner::LoadPreset(const std::string& path) {
    if (!saved.contains(path))
        throw std::runtime_error("This is no preset.");
    return Presets().back();
}

QStringList ScriptedRunner::SavePreset(const std::string& path, const Wishes& wishes) {
    saved[path] = wishes;
    return unkept;
}

std::unique_ptr<Run> ScriptedRunner::Start(const Order& order, std::shared_ptr<RunListener> listener) {
    auto script = std::make_shared<Script>();
    script->order = order;
    script->listener = std::move(listener);
    scripts.push_back(script);
    return std::make_unique<ScriptedRun>(script, endsWhenStopped);
}

MovieFacts ScriptedRunner::Look(const std::string& path) {
    looking.Pass();
    ++looks;
    const std::string text = ReadFile(path);
    if (text.rfind("movie", 0) != 0)
        throw std::runtime_error("This is no movie.");
    MovieFacts facts;
    facts.seconds = text.size() > 5 ? std::stod(text.substr(5)) : 60;
    facts.lengthKnown = true;
    facts.width = 1920;
    facts.height = 1080;
    facts.rate = 25;
    facts.pictureCodec = QStringLiteral("h264");
    facts.sounds = {{1, QStringLiteral("en"), {}, QStringLiteral("aac, stereo")},
                    {2, QStringLiteral("de"),
                     QStringLiteral("Kommentar & mehr, von allen, die dabei waren und noch etwas wissen"),
                     QStringLiteral("aac, stereo")}};
    facts.subtitles = {{3, QStringLiteral("fre"), {}, QStringLiteral("subrip")}};
    for (int number = 1; number < subtitles; ++number)
        facts.subtitles.push_back(
            {3 + number, number == 1 ? QStringLiteral("de") : QStringLiteral("en"), {}, {}});
    facts.hdr = true;
    facts.chapters = 2;
    facts.title = QStringLiteral("A title");
    facts.bytes = 123'456'789;
    return facts;
}

std::string ScriptedRunner::FileInTheWay(const Order& order) {
    std::filesystem::path file = order.target;
    if (order.wishes.clip)
        file.replace_filename(file.stem().string() + "_00" + file.extension().string());
    return std::filesystem::exists(file) ? file.string() : std::string();
}

Findings ScriptedRunner::Check(const Order& order) {
    Findings findings;
    findings.targetExists = !FileInTheWay(order).empty();
    if (findings.targetExists)
        findings.warnings += QStringLiteral("The target exists.");
    return findings;
}

QImage ScriptedRunner::PictureAt(const std::string&, double seconds, int width) {
    QImage picture(width, width * 9 / 16, QImage::Format_RGB32);
    picture.fill(QColor::fromHsv(static_cast<int>(seconds * 7) % 360, 120, 180));
    return picture;
}
