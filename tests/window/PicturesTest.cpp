// Real conversions in the window; with a display, pictures of it for people to look at.
#include "host/window/App.h"
#include "host/window/runner/ConvertRunner.h"
#include "host/window/widgets/Look.h"
#include "host/window/widgets/QueueView.h"
#include "host/window/widgets/RangeStrip.h"
#include "host/window/widgets/WorkPage.h"
#include "tests/support/Process.h"
#include "tests/window/Holiday.h"
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

    void AwaitExamined(size_t count) { ASSERT_TRUE(::AwaitExamined(app.TheQueue(), count)); }

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

} // namespace

TEST_F(PicturesTest, ConvertsMoviesWithALivePicture) {
    const bool forPeople = qEnvironmentVariableIsSet("MOVIECONV_PICTURES");
    std::vector<std::string> movies;
    for (const char* name : {"Beach.mkv", "Mountains at dawn.mkv", "Grandma’s birthday.mkv", "Harbour.mkv"}) {
        // The first one long enough for the time that is left to be foretold.
        const int seconds = !movies.empty() ? 1 : forPeople ? 10 : 4;
        std::filesystem::copy_file(Holiday(seconds, forPeople ? "1280x720" : "640x360"), folder / name);
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
    EXPECT_EQ(At(0).facts->width, forPeople ? 1280 : 640);
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
    const auto isUnderWay = [&] {
        const Figures& figures = At(0).figures;
        return figures.fraction > 0.3 && (!forPeople || figures.left);
    };
    ASSERT_TRUE(Await([&] { return !picture->Picture().isNull() && (isUnderWay() || At(0).IsOver()); }));
    QApplication::processEvents(); // the words just shown get their places
    Photograph("work");
    QApplication::setPalette(OwnPalette(true)); // as the desktop does it in the evening, in the middle
    QApplication::processEvents();
    Photograph("dark");
    QApplication::setPalette(OwnPalette(false));
    ASSERT_TRUE(AwaitDone());
    for (size_t row = 0; row < 4; ++row) {
        EXPECT_EQ(At(row).state, State::kDone) << At(row).outcome.sentence.toStdString();
        EXPECT_GT(std::filesystem::file_size(At(row).target), 10'000U);
    }
    view->Select(At(0).id);
    QApplication::processEvents();
    Photograph("done");
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
    std::filesystem::copy_file(Holiday(10), folder / "movie.mkv");
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
