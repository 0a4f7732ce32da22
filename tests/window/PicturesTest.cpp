// Real conversions in the window; with a display, pictures of it for people to look at.
#include "host/window/App.h"
#include "host/window/model/Words.h"
#include "host/window/runner/ConvertRunner.h"
#include "host/window/widgets/Look.h"
#include "host/window/widgets/QueueView.h"
#include "host/window/widgets/RangeStrip.h"
#include "host/window/widgets/WorkPage.h"
#include "tests/support/Process.h"
#include "tests/support/SmallDisk.h"
#include "tests/support/TestMovies.h"
#include "tests/window/ScriptedRunner.h"

#include <gtest/gtest.h>

#include <QAction>
#include <QApplication>

#include <csignal>
#include <set>

using namespace movieconv::window;

namespace {

struct PicturesTest : testing::Test {
    Folder folder;
    ConvertRunner runner;
    Settings settings{QString::fromStdString(folder / "settings")};
    App app{runner, settings, folder / "queue"};

    const Entry& At(size_t row) { return app.TheQueue().Entries().at(row); }

    void Act(const char* name) { app.Window().findChild<QAction*>(QLatin1String(name))->trigger(); }

    bool AwaitDone() {
        return Await([&] { return !app.TheDispatcher().IsWorking(); });
    }

    void AwaitExamined(size_t count) {
        ASSERT_TRUE(Await([&] {
            const auto& entries = app.TheQueue().Entries();
            return entries.size() == count && std::none_of(entries.begin(), entries.end(), [](auto& entry) {
                       return entry.IsBeingExamined();
                   });
        }));
    }

    /// Keeps a picture of the window where the caller of the test wants one.
    void Photograph(const char* name) {
        const QByteArray place = qgetenv("MOVIECONV_PICTURES");
        const QImage picture = app.Window().grab().toImage();
        std::set<QRgb> colours;
        for (int x = 0; x < picture.width(); x += 7)
            for (int y = 0; y < picture.height(); y += 7)
                colours.insert(picture.pixel(x, y));
        EXPECT_GT(colours.size(), 8U) << "an empty picture";
        if (!place.isEmpty()) {
            EXPECT_TRUE(picture.save(QString::fromLocal8Bit(place) + "/window-" + name + ".png"));
        }
    }
};

std::string Holiday() {
    return test_movies::Make("window-4s.mkv",
                             {"-f", "lavfi", "-i",
                              "mandelbrot=s=1280x720:r=25:start_scale=0.6:end_scale=0.01:end_pts=250,"
                              "format=yuv420p",
                              "-f", "lavfi", "-i", "sine=440:r=48000", "-t", "4", "-c:v", "libx264",
                              "-preset", "veryfast", "-c:a", "aac"});
}

} // namespace

TEST_F(PicturesTest, ConvertsMoviesWithALivePicture) {
    const std::string movie = Holiday();
    std::vector<std::string> movies;
    for (const char* name : {"Beach.mkv", "Mountains at dawn.mkv", "Grandma’s birthday.mkv", "Harbour.mkv"}) {
        std::filesystem::copy_file(movie, folder / name);
        movies.push_back(folder / name);
    }
    WriteFile(folder / "Packing list.mkv", "Socks");
    movies.push_back(folder / "Packing list.mkv");
    app.Window().resize(1080, 720);
    app.Begin({});
    QApplication::processEvents();
    Photograph("empty");
    app.TheQueue().Add(movies);
    AwaitExamined(movies.size());
    EXPECT_EQ(At(0).facts->width, 1280);
    EXPECT_FALSE(At(4).unusable.isEmpty());
    auto* view = app.Window().findChild<QueueView*>();
    view->Select(At(1).id);
    const auto* strip = app.Window().findChild<RangeStrip*>();
    ASSERT_TRUE(Await([&] { return strip->IsFilled(); }));
    QApplication::processEvents();
    Photograph("entry");

    view->Select(At(0).id);
    Act("start");
    const auto* picture = app.Window().findChild<PictureView*>();
    ASSERT_TRUE(Await(
        [&] { return !picture->Picture().isNull() && (At(0).figures.fraction > 0.3 || At(0).IsOver()); }));
    QApplication::processEvents(); // the words just shown get their places
    Photograph("work");
    ASSERT_TRUE(AwaitDone());
    for (size_t row = 0; row < 4; ++row) {
        EXPECT_EQ(At(row).state, State::kDone) << At(row).outcome.sentence.toStdString();
        EXPECT_GT(std::filesystem::file_size(At(row).target), 10'000U);
    }
    view->Select(At(0).id);
    QApplication::processEvents();
    Photograph("done");
    QApplication::setPalette(OwnPalette(true));
    view->Select(At(4).id);
    QApplication::processEvents();
    Photograph("dark");
    QApplication::setPalette(OwnPalette(false));
}

TEST_F(PicturesTest, ConvertsSeveralAtOnceAndStopsThem) {
    const std::string movie = Holiday();
    app.TheQueue().SetNaming({QStringLiteral("{name}"), folder.Path()});
    app.TheQueue().Add(std::vector<std::string>(8, movie));
    app.TheDispatcher().SetAtOnce(8);
    AwaitExamined(8);
    app.TheDispatcher().Start();
    ASSERT_TRUE(Await([&] {
        return std::all_of(app.TheQueue().Entries().begin(), app.TheQueue().Entries().end(),
                           [](const Entry& entry) { return entry.figures.position > 0; });
    }));
    app.TheDispatcher().PauseAll();
    EXPECT_TRUE(Await([&] { return At(7).figures.phase == Phase::kPaused; }));
    app.TheDispatcher().StopAll();
    ASSERT_TRUE(AwaitDone());
    std::set<std::string> targets;
    for (const Entry& entry : app.TheQueue().Entries()) {
        EXPECT_EQ(entry.state, State::kStopped) << entry.outcome.sentence.toStdString();
        EXPECT_TRUE(std::filesystem::exists(entry.target)) << entry.target;
        targets.insert(entry.target);
    }
    EXPECT_EQ(targets.size(), 8U);
}

TEST_F(PicturesTest, TellsWhatGoesWrongInWords) {
    const std::string movie = Holiday();
    app.TheQueue().Add({movie});
    AwaitExamined(1);
    app.TheQueue().SetTarget(At(0).id, folder / "there is no such folder/x.mp4");
    AwaitExamined(1);
    EXPECT_EQ(At(0).findings.warnings.size(), 1);
    app.TheDispatcher().Start();
    ASSERT_TRUE(AwaitDone());
    EXPECT_EQ(At(0).state, State::kFailed);
    EXPECT_TRUE(At(0).outcome.sentence.endsWith(QLatin1Char('.')));
    app.TheQueue().Retry({At(0).id});
    app.TheQueue().SetTarget(At(0).id, movie);
    AwaitExamined(1);
    EXPECT_TRUE(At(0).findings.targetExists);
    app.TheQueue().SetReplace(At(0).id, true);
    app.TheDispatcher().Start(); // a source is never replaced by what is made of it
    ASSERT_TRUE(AwaitDone());
    EXPECT_EQ(At(0).state, State::kFailed);
    EXPECT_GT(std::filesystem::file_size(movie), 10'000U);
}

TEST_F(PicturesTest, CarriesTheTracksThatAreChosen) {
    const std::string words = test_movies::Part("a.srt", "1\n00:00:00,500 --> 00:00:01,500\nGrüße\n");
    const std::string movie = test_movies::Make(
        "window-tracks.mkv",
        test_movies::Join(
            test_movies::Lavfi("testsrc2=s=320x180:r=25", "sine=440", "sine=880"),
            test_movies::Args{"-i", words},
            test_movies::Words("-map 0 -map 1 -map 2 -map 3 -t 2 -c:v libx264 -preset ultrafast "
                               "-c:a aac -c:s srt -metadata:s:a:0 language=eng "
                               "-metadata:s:a:1 language=ger -metadata:s:s:0 language=fre")));
    app.TheQueue().SetNaming({QStringLiteral("{name}"), folder.Path()});
    app.TheQueue().Add({movie});
    AwaitExamined(1);
    ASSERT_EQ(At(0).facts->sounds.size(), 2U);
    EXPECT_EQ(TrackLine(At(0).facts->sounds[1]), "German (aac, mono)");
    EXPECT_TRUE(At(0).findings.notes.isEmpty()) << At(0).findings.notes.join("; ").toStdString();

    Wishes wishes;
    wishes.format = QStringLiteral("flv"); // holds one sound and no subtitles
    wishes.subtitleFiles = {{folder / "a.srt", QStringLiteral("de")}};
    app.TheQueue().SetWishes(At(0).id, wishes);
    AwaitExamined(1);
    const QString notes = At(0).findings.notes.join(QLatin1Char('\n'));
    for (const char* told :
         {"sound 2 (aac, German)", "subtitles 3 (subrip, French)", "subtitles (subrip, German)"})
        EXPECT_TRUE(notes.contains(QLatin1String(told))) << notes.toStdString();
    EXPECT_TRUE(At(0).findings.warnings.isEmpty());

    wishes.format = QStringLiteral("mkv");
    wishes.sounds = QList<int>{At(0).facts->sounds[1].number};
    wishes.subtitles = QList<int>{};
    wishes.title = QStringLiteral("Mine");
    app.TheQueue().SetWishes(At(0).id, wishes);
    AwaitExamined(1);
    EXPECT_TRUE(At(0).findings.notes.isEmpty()) << At(0).findings.notes.join("; ").toStdString();
    app.TheDispatcher().Start();
    ASSERT_TRUE(AwaitDone());
    ASSERT_EQ(At(0).state, State::kDone) << At(0).outcome.sentence.toStdString();
    const MovieFacts made = runner.Look(At(0).target);
    ASSERT_EQ(made.sounds.size(), 1U);
    EXPECT_EQ(made.sounds[0].language, "ger");
    ASSERT_EQ(made.subtitles.size(), 1U);
    EXPECT_EQ(made.subtitles[0].language, "ger");
    EXPECT_EQ(made.title, "Mine");

    app.TheQueue().Retry({At(0).id});
    wishes.sounds = QList<int>{17}; // the file is another one now
    wishes.subtitleFiles[0].path = folder / "gone.srt";
    wishes.depth = 10;
    wishes.format = QStringLiteral("flv");
    app.TheQueue().SetWishes(At(0).id, wishes);
    AwaitExamined(1);
    EXPECT_EQ(At(0).findings.warnings.size(), 2) << At(0).findings.warnings.join("; ").toStdString();
}

TEST_F(PicturesTest, KeepsWhatTheDecoderSaysInTheLogOfTheMovie) {
    std::string movie = ReadFile(Holiday());
    for (size_t at = movie.size() / 3; at < movie.size() / 3 + 20'000; ++at)
        movie[at] = static_cast<char>(movie[at] ^ 0x55);
    WriteFile(folder / "scratched.mkv", movie);
    app.TheQueue().SetNaming({QStringLiteral("{name}"), folder.Path()});
    app.TheQueue().Add({folder / "scratched.mkv"});
    AwaitExamined(1);
    testing::internal::CaptureStderr();
    app.TheDispatcher().Start();
    ASSERT_TRUE(AwaitDone());
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "");
    EXPECT_FALSE(At(0).notes.filter(QStringLiteral(" @ 0x")).isEmpty())
        << "no line of a decoder's in\n"
        << At(0).notes.join(QLatin1Char('\n')).toStdString();
}

namespace {

constexpr char kKilled[] = "MOVIECONV_TEST_KILLED"; // the folder, for the process that is to be killed

/// Converts a movie in a window over the journal in `folder`, with a word on the output when it is under way.
void ConvertUntilKilled(const std::string& folder) {
    ConvertRunner runner;
    Settings settings(QString::fromStdString(folder + "/settings"));
    App app(runner, settings, folder + "/queue");
    app.TheQueue().SetNaming({QStringLiteral("{name} new"), folder});
    app.Begin({folder + "/movie.mkv"});
    const auto& entries = app.TheQueue().Entries();
    ASSERT_TRUE(Await([&] { return entries.size() == 1 && entries[0].IsStartable(); }));
    app.TheDispatcher().Start();
    ASSERT_TRUE(Await([&] {
        return entries[0].figures.position > 0 &&
               ReadFile(folder + "/queue").find("active") != std::string::npos;
    }));
    app.TheDispatcher().PauseAll();
    WriteFile(folder + "/under way", "");
    Await([] { return false; });
}

} // namespace

TEST_F(PicturesTest, ComesBackAfterAKill) {
    if (const char* killed = std::getenv(kKilled))
        return ConvertUntilKilled(killed);
    std::filesystem::copy_file(Holiday(), folder / "movie.mkv");
    setenv(kKilled, folder.Path().c_str(), 1);
    const pid_t child = fork();
    if (child == 0) {
        execl("/proc/self/exe", "window", "--gtest_filter=PicturesTest.ComesBackAfterAKill", nullptr);
        _exit(1);
    }
    unsetenv(kKilled);
    const bool underWay = Await([&] { return std::filesystem::exists(folder / "under way"); });
    kill(child, SIGKILL);
    EXPECT_EQ(AwaitEnd(child), 128 + SIGKILL);
    ASSERT_TRUE(underWay);

    app.Begin({});
    AwaitExamined(1);
    EXPECT_EQ(At(0).state, State::kInterrupted);
    EXPECT_EQ(NameOf(At(0).target), "movie new.mp4");
    EXPECT_FALSE(std::filesystem::exists(At(0).target));
    app.TheQueue().Retry({At(0).id});
    AwaitExamined(1);
    app.TheDispatcher().Start();
    ASSERT_TRUE(AwaitDone());
    EXPECT_EQ(At(0).state, State::kDone) << At(0).outcome.sentence.toStdString();
    EXPECT_TRUE(std::filesystem::exists(At(0).target));
}

TEST_F(PicturesTest, WaitsOnADiskThatIsFullUntilThereIsRoom) {
    const SmallDisk disk(folder / "disk", "700k");
    if (!disk.IsThere())
        GTEST_SKIP() << "no mounts here";
    app.TheQueue().SetNaming({QStringLiteral("{name}"), folder / "disk"});
    app.TheQueue().Add({Holiday()});
    AwaitExamined(1);
    EXPECT_FALSE(At(0).findings.warnings.isEmpty()) << "the page warns that there is little room";
    app.TheDispatcher().Start();
    ASSERT_TRUE(Await([&] { return At(0).figures.phase == Phase::kWaitingForRoom || At(0).IsOver(); }));
    EXPECT_EQ(At(0).state, State::kActive) << At(0).outcome.sentence.toStdString();
    ASSERT_TRUE(disk.Grow());
    ASSERT_TRUE(AwaitDone());
    EXPECT_EQ(At(0).state, State::kDone) << At(0).outcome.sentence.toStdString();
    EXPECT_GT(std::filesystem::file_size(At(0).target), 700'000U);
}
