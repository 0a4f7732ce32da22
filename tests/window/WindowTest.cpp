// Every action of the window, over a scripted runner.
#include "host/window/widgets/EntryPage.h"
#include "host/window/widgets/Look.h"
#include "host/window/widgets/NamingDialog.h"
#include "host/window/widgets/OverPage.h"
#include "host/window/widgets/RangeStrip.h"
#include "host/window/widgets/WorkPage.h"
#include "tests/window/WindowBench.h"

#include <QComboBox>
#include <QFileDialog>
#include <QLineEdit>
#include <QSignalSpy>
#include <QSlider>
#include <QSpinBox>
#include <QToolButton>

using namespace movieconv::window;

using WindowTest = WindowBench;

TEST_F(WindowTest, ExplainsItselfWhenItIsEmptyAndOpensFiles) {
    EXPECT_TRUE(The<QPushButton>("openButton")->isVisible());
    EXPECT_FALSE(The<QPushButton>("startButton")->isVisible());
    Movie("a.mkv");
    Press(The<QPushButton>("openButton"));
    auto* dialog = The<QFileDialog>("openFiles");
    EXPECT_FALSE(dialog->isModal());
    Q_EMIT dialog->filesSelected({QString::fromStdString(folder / "a.mkv")});
    dialog->close();
    Act("openFolder");
    dialog = The<QFileDialog>("openFolder");
    std::filesystem::create_directory(folder / "more");
    Movie("more/b.mkv");
    Q_EMIT dialog->filesSelected({QString::fromStdString(folder / "more")});
    dialog->close();
    ASSERT_TRUE(Await([&] { return app->TheQueue().Entries().size() == 2; }));
    EXPECT_TRUE(Await([&] { return The<QPushButton>("startButton")->isEnabled(); }));
    EXPECT_TRUE(Shows<EntryPage>());
}

TEST_F(WindowTest, TakesWhatIsDropped) {
    Movie("ü %.mkv");
    WriteFile(folder / "words.txt", "words");
    Drop("file://" + QByteArray::fromStdString(folder.Path()) + "/%C3%BC%20%25.mkv\r\nfile://" +
         QByteArray::fromStdString(folder / "words.txt") + "\r\nhttps://example.org/movie\r\n");
    ASSERT_TRUE(Await([&] { return app->TheQueue().Entries().size() == 2 && !At(1).unusable.isEmpty(); }));
    EXPECT_EQ(At(0).source, folder / "ü %.mkv");
    EXPECT_TRUE(Tells("example.org"));
    auto* target = Named<QLineEdit>("File to save as");
    const QString before = target->text();
    Drop("file://" + QByteArray::fromStdString(Movie("b.mkv")), target);
    ASSERT_TRUE(Await([&] { return app->TheQueue().Entries().size() == 3; })) << "also on a field of text";
    EXPECT_EQ(target->text(), before);
    Select(2);
    Act("remove");
    Select(1);
    EXPECT_TRUE(Named<QLabel>("Why it cannot be converted")->isVisible());
    WriteFile(folder / "words.txt", "movie");
    Click("Look again");
    ASSERT_TRUE(Await([&] { return At(1).IsStartable(); }));
    Act("remove");
    EXPECT_EQ(app->TheQueue().Entries().size(), 1U);
}

TEST_F(WindowTest, EditsAnEntry) {
    Add({"a.mkv", "b.mkv"});
    Select(1);
    auto* preset = Named<QComboBox>("Preset");
    QTest::keyClick(preset, Qt::Key_Down);
    EXPECT_EQ(At(1).wishes.preset, "web");
    auto* format = Named<QComboBox>("File format");
    EXPECT_TRUE(format->currentText().contains(QStringLiteral("webm")));
    QTest::keyClick(format, Qt::Key_Down);
    QTest::keyClick(Named<QComboBox>("Picture size"), Qt::Key_Down);
    QTest::keyClick(Named<QSlider>("Quality"), Qt::Key_Home);
    EXPECT_EQ(At(1).wishes.format, "mp4");
    EXPECT_EQ(At(1).wishes.height, 2160);
    EXPECT_EQ(At(1).wishes.quality, 0);
    auto* begin = Named<QLineEdit>("Begin of the range");
    begin->selectAll();
    QTest::keyClicks(begin, "0:10");
    QTest::keyClick(begin, Qt::Key_Return);
    auto* end = Named<QLineEdit>("End of the range");
    end->selectAll();
    QTest::keyClicks(end, "50\r");
    EXPECT_EQ(At(1).wishes.begin, 10);
    EXPECT_EQ(At(1).wishes.end, 50);
    end->selectAll();
    QTest::keyClicks(end, "rubbish\r");
    EXPECT_FALSE(At(1).wishes.end);
    EXPECT_EQ(end->text(), "1:00");
    EXPECT_EQ(At(0).wishes, Wishes());

    Click("Use for all that wait");
    EXPECT_EQ(At(0).wishes.preset, "web");
    EXPECT_EQ(At(0).wishes.begin, 0);
    Add({"c.mkv"});
    EXPECT_EQ(At(2).wishes.preset, "web"); // the last choice is the next one's
    EXPECT_EQ(At(2).wishes.begin, 0) << "but for what belongs to one movie";
    EXPECT_EQ(Settings(QString::fromStdString(folder / "settings")).LoadWishes().format, "mp4");
}

TEST_F(WindowTest, ChoosesTracks) {
    Add({"a.mkv"});
    const auto press = [&](const QString& words) {
        for (QCheckBox* check : Window().findChildren<QCheckBox*>())
            if (check->text().contains(words) && check->isVisible())
                QTest::keyClick(check, Qt::Key_Space);
    };
    press("Kommentar");
    press("French");
    EXPECT_EQ(At(0).wishes.sounds, QList<int>{1});
    EXPECT_EQ(At(0).wishes.subtitles, QList<int>{});
    press("French");
    EXPECT_FALSE(At(0).wishes.subtitles) << "all of them";
    runner.subtitles = 30;
    Add({"b.mkv"});
    Select(1);
    QApplication::processEvents(); // what is new on the page appears
    for (const bool all : {false, true}) {
        Press(Named<QPushButton>(all ? "Subtitles: All" : "Subtitles: None"));
        EXPECT_EQ(At(1).wishes.subtitles.has_value(), !all);
        press("German");
        ASSERT_TRUE(At(1).wishes.subtitles);
        EXPECT_EQ(At(1).wishes.subtitles->size(), all ? 29 : 1);
    }
    EXPECT_EQ(At(0).wishes.sounds, QList<int>{1}) << "the other movie's";
}

TEST_F(WindowTest, AddsFilesOfSubtitles) {
    Add({"a.mkv"});
    for (const char* name : {"a.de.srt", "a.srt"}) {
        Click("Add a subtitle file…");
        auto* dialog = The<QFileDialog>("openSubtitles");
        EXPECT_FALSE(dialog->isModal());
        Q_EMIT dialog->filesSelected({QString::fromStdString(folder / name)});
        delete dialog;
    }
    using Files = std::vector<SubtitleFile>;
    EXPECT_EQ(At(0).wishes.subtitleFiles, (Files{{folder / "a.de.srt", "de"}, {folder / "a.srt", {}}}));
    auto* language = Named<QComboBox>("Language of a.srt");
    EXPECT_EQ(language->currentText(), "Language not told");
    QTest::keyClicks(language, "Fren");
    EXPECT_EQ(At(0).wishes.subtitleFiles[1].language, "fr");
    Press(Named<QToolButton>("Leave a.de.srt out"));
    EXPECT_EQ(At(0).wishes.subtitleFiles, (Files{{folder / "a.srt", "fr"}}));
    Add({"b.mkv"});
    EXPECT_TRUE(At(1).wishes.subtitleFiles.empty());
}

TEST_F(WindowTest, LeavesTheSoundAsItIs) {
    Add({"a.mkv"});
    QCheckBox* keep = Check("Leave the sound as it is");
    auto* channels = Named<QComboBox>("Sound channels");
    const Wishes& wishes = At(0).wishes;
    QTest::keyClick(keep, Qt::Key_Space);
    EXPECT_EQ(wishes.copySound, true);
    EXPECT_FALSE(channels->isEnabled());
    EXPECT_FALSE(channels->toolTip().isEmpty()) << "why not";
    QTest::keyClick(keep, Qt::Key_Space);
    EXPECT_FALSE(wishes.copySound) << "as the preset has it";
    EXPECT_TRUE(channels->isEnabled());
    QTest::keyClick(Named<QComboBox>("Preset"), Qt::Key_Up);
    EXPECT_EQ(wishes.preset, "kept");
    EXPECT_TRUE(keep->isChecked());
    QTest::keyClick(keep, Qt::Key_Space);
    EXPECT_EQ(wishes.copySound, false);
    Add({"b.mkv"});
    EXPECT_EQ(At(1).wishes.copySound, false) << "the last choice is the next one's";
}

TEST_F(WindowTest, DrawsSubtitlesIntoThePictures) {
    runner.subtitles = 3;
    Add({"a.mkv"});
    auto* box = Named<QComboBox>("Subtitles drawn into the pictures");
    const Wishes& wishes = At(0).wishes;
    QTest::keyClick(box, Qt::Key_Down);
    EXPECT_EQ(wishes.burning.track, 3);
    EXPECT_FALSE(wishes.subtitles) << "all others are carried";
    QCheckBox* track = Check("French");
    EXPECT_FALSE(track->isChecked());
    QTest::keyClick(track, Qt::Key_Space);
    EXPECT_EQ(wishes.subtitles, (QList<int>{3, 4, 5})) << "carried as well, since it is asked for";
    QTest::keyClick(box, Qt::Key_Down);
    EXPECT_EQ(wishes.burning.track, 4);
    EXPECT_EQ(wishes.subtitles, (QList<int>{3, 5}));
    Press(Named<QPushButton>("Draw the subtitles of a file"));
    auto* dialog = The<QFileDialog>("openSubtitles");
    EXPECT_FALSE(dialog->isModal());
    Q_EMIT dialog->fileSelected(QString::fromStdString(folder / "a.srt"));
    delete dialog;
    EXPECT_FALSE(wishes.burning.track);
    EXPECT_EQ(wishes.burning.file, folder / "a.srt");
    EXPECT_EQ(box->currentText(), "a.srt");
    Add({"b.mkv"});
    EXPECT_FALSE(At(1).wishes.burning.IsWanted()) << "it belongs to one movie";
    Select(0);
    QTest::keyClick(box, Qt::Key_Home);
    EXPECT_FALSE(wishes.burning.IsWanted());
}

TEST_F(WindowTest, ChoosesWhatIsSeldomNeeded) {
    Add({"a.mkv"});
    for (QToolButton* button : The<EntryPage>()->findChildren<QToolButton*>())
        if (button->isCheckable())
            Press(button);
    for (const char* name : {"Pictures a second", "Sound channels", "Cut into clips", "Deinterlacing", "Crop",
                             "HDR pictures", "Colour depth"})
        QTest::keyClick(Named<QComboBox>(name), Qt::Key_Down);
    const Wishes& wishes = At(0).wishes;
    EXPECT_EQ(wishes.rate, 60);
    EXPECT_EQ(wishes.channels, 1);
    EXPECT_EQ(wishes.clip, 60);
    EXPECT_EQ(wishes.deinterlace, Wishes::Deinterlace::kOff);
    EXPECT_TRUE(wishes.crop);
    EXPECT_EQ(wishes.hdr, Wishes::Hdr::kKeep);
    EXPECT_EQ(wishes.depth, 8);
    QTest::keyClick(Named<QComboBox>("Crop"), Qt::Key_Down);
    auto* above = Named<QSpinBox>("Pixels to cut off: above");
    EXPECT_TRUE(above->isVisible());
    above->selectAll();
    QTest::keyClicks(above, "140");
    QTest::keyClick(Named<QSpinBox>("Pixels to cut off: left"), Qt::Key_Up);
    EXPECT_EQ(wishes.cut, (Margins{140, 0, 2, 0}));
    EXPECT_FALSE(wishes.crop);
    auto* title = Named<QLineEdit>("Title");
    EXPECT_EQ(title->text(), "A title");
    title->selectAll();
    QTest::keyClicks(title, "Mine");
    EXPECT_EQ(wishes.title, "Mine");
    for (QCheckBox* check : Window().findChildren<QCheckBox*>())
        if (check->text().remove('&').startsWith("Keep"))
            QTest::keyClick(check, Qt::Key_Space);
    EXPECT_FALSE(wishes.chapters || wishes.texts);
    EXPECT_TRUE(wishes.withSound);
}

TEST_F(WindowTest, ChoosesATarget) {
    Add({"a.mkv"});
    WriteFile(folder / "there.mp4", "something");
    auto* target = Named<QLineEdit>("File to save as");
    target->selectAll();
    QTest::keyClicks(target, QString::fromStdString(folder / "there.mp4") + "\r");
    ASSERT_TRUE(Await([&] { return At(0).findings.targetExists; }));
    EXPECT_TRUE(Named<QLabel>("Warnings")->isVisible());
    for (QCheckBox* check : Window().findChildren<QCheckBox*>())
        if (check->text().contains(QStringLiteral("Replace")))
            QTest::keyClick(check, Qt::Key_Space);
    EXPECT_TRUE(At(0).replace);
}

TEST_F(WindowTest, ChoosesARangeOnTheStrip) {
    Add({"a.mkv"});
    auto* strip = The<RangeStrip>();
    ASSERT_TRUE(Await([&] { return strip->isEnabled(); }));
    QTest::mousePress(strip, Qt::LeftButton, {}, QPoint(strip->width() / 4, 20));
    QTest::mouseRelease(strip, Qt::LeftButton);
    EXPECT_NEAR(At(0).wishes.begin, 15, 1);
    const double begin = At(0).wishes.begin;
    QTest::keyClick(strip, Qt::Key_Right);
    EXPECT_NEAR(At(0).wishes.begin, begin + 1, 1e-6);
    QTest::keyClick(strip, Qt::Key_E);
    QTest::keyClick(strip, Qt::Key_Left);
    EXPECT_NEAR(*At(0).wishes.end, 59, 1e-6);
    QTest::keyClick(strip, Qt::Key_PageUp);
    EXPECT_GT(*At(0).wishes.end, At(0).wishes.begin); // never before the begin
    QTest::keyClick(strip, Qt::Key_End);
    EXPECT_FALSE(At(0).wishes.end);
    QTest::keyClick(strip, Qt::Key_B);
    QTest::keyClick(strip, Qt::Key_Home);
    EXPECT_EQ(At(0).wishes.begin, 0);
}

TEST_F(WindowTest, SavesAndLoadsPresets) {
    Add({"a.mkv"});
    const QString path = QString::fromStdString(folder / "own.json");
    Click("Save as preset…");
    Q_EMIT The<QFileDialog>("savePreset")->fileSelected(path);
    The<QFileDialog>("savePreset")->close();
    EXPECT_EQ(runner.saved.at(folder / "own.json"), At(0).wishes);
    EXPECT_FALSE(Tells("The preset is saved"));
    runner.unkept = QStringList{"cropping", "HDR"};
    Click("Save as preset…");
    Q_EMIT The<QFileDialog>("savePreset")->fileSelected(path);
    EXPECT_TRUE(Tells("cropping, HDR"));
    Click("Load preset…");
    Q_EMIT The<QFileDialog>("loadPreset")->fileSelected(path);
    EXPECT_EQ(At(0).wishes.preset, "web");
    Q_EMIT The<QFileDialog>("loadPreset")->fileSelected(path + "x");
    EXPECT_TRUE(Tells("This is no preset."));
}

TEST_F(WindowTest, ConvertsWithALivePicture) {
    Add({"a.mkv", "b.mkv"});
    Click("Convert");
    ASSERT_TRUE(AwaitScripts(1));
    EXPECT_TRUE(Shows<WorkPage>());
    EXPECT_TRUE(Script(0).shown);
    Script(0).Figure(30, 60);
    Script(0).listener->OnPicture(runner.PictureAt({}, 0, 64));
    ASSERT_TRUE(Await([&] { return !The<PictureView>()->Picture().isNull(); }));
    EXPECT_EQ(Named<QLabel>("Progress in percent")->text(), "50.0 %");
    EXPECT_EQ(Named<QLabel>("Written")->text(), "3.0 MB of 5.0 MB to 7.0 MB");
    EXPECT_TRUE(Window().windowTitle().startsWith(QStringLiteral("25 %")));
    Script(0).End(Ending::kDone);
    ASSERT_TRUE(AwaitScripts(2)); // the window goes on to the next movie
    EXPECT_TRUE(Await([&] { return Script(1).shown; }));
    EXPECT_TRUE(The<PictureView>()->Picture().isNull());
    Window().showMinimized();
    EXPECT_TRUE(Await([&] { return !Script(1).shown; }));
    Window().showNormal();
    EXPECT_TRUE(Await([&] { return Script(1).shown; }));
    Script(1).End(Ending::kDone);
    ASSERT_TRUE(Await([&] { return !app->TheDispatcher().IsWorking(); }));
    EXPECT_TRUE(Shows<OverPage>());
    EXPECT_FALSE(The<QPushButton>("startButton")->isEnabled());
}

TEST_F(WindowTest, OpensWhatWasConverted) {
    // What the program does with them is the desktop's.
    QObject::disconnect(&Window(), &MainWindow::FileWanted, nullptr, nullptr);
    QObject::disconnect(&Window(), &MainWindow::FolderWanted, nullptr, nullptr);
    QSignalSpy files(&Window(), &MainWindow::FileWanted);
    QSignalSpy folders(&Window(), &MainWindow::FolderWanted);
    Add({"a.mkv"});
    Act("start");
    ASSERT_TRUE(AwaitScripts(1));
    Outcome outcome;
    outcome.ending = Ending::kDone;
    outcome.files = {folder / "a.mp4"};
    outcome.notCarried = QStringList{"cover: WebM cannot hold it"};
    Script(0).listener->OnEnd(outcome);
    ASSERT_TRUE(Await([&] { return Shows<OverPage>(); }));
    EXPECT_TRUE(Named<QLabel>("What was not carried over")->text().contains(QStringLiteral("cover")));
    EXPECT_EQ(The<QueueView>()->SelectedIds().size(), 1);
    Click("Play the movie");
    Act("play");
    Click("Show in folder");
    Act("folder");
    const QList<QVariant> wanted{QVariant::fromValue(folder / "a.mp4")};
    for (const QSignalSpy* opened : {&files, &folders}) {
        const QList<QList<QVariant>>& asked = *opened;
        EXPECT_EQ(asked, QList({wanted, wanted}));
    }
    Act("again");
    EXPECT_EQ(At(0).state, State::kWaiting);
    EXPECT_TRUE(At(0).outcome.files.empty());
}

TEST_F(WindowTest, RunsEightMoviesPausesStopsAndTellsTheDiskIsFull) {
    Add({"1", "2", "3", "4", "5", "6", "7", "8", "9"});
    Act("atOnce8");
    EXPECT_EQ(settings.LoadAtOnce(), 8);
    Act("start");
    ASSERT_TRUE(AwaitScripts(8));
    Act("pause");
    EXPECT_TRUE(
        std::all_of(runner.scripts.begin(), runner.scripts.end(), [](auto& one) { return one->paused; }));
    Click("Resume");
    EXPECT_FALSE(Script(7).paused);
    Script(3).Phase(Phase::kWaitingForRoom);
    ASSERT_TRUE(Await([&] { return Tells("is full"); }));
    Script(3).Figure(1, 60);
    ASSERT_TRUE(Await([&] { return !Tells("is full"); }));
    Act("stopAfter");
    EXPECT_TRUE(app->TheDispatcher().StopsAfterThis());
    Select(2);
    auto* page = The<WorkPage>();
    Press(page->findChild<QPushButton*>(QStringLiteral("pauseThis")));
    EXPECT_TRUE(Script(2).paused);
    EXPECT_FALSE(Script(1).paused);
    Press(page->findChild<QPushButton*>(QStringLiteral("stopThis")));
    ASSERT_TRUE(Await([&] { return At(2).state == State::kStopped; }));
    EXPECT_EQ(At(8).state, State::kWaiting);
    Press(The<QPushButton>("stopButton"));
    ASSERT_TRUE(Await([&] { return !app->TheDispatcher().IsWorking(); }));
    Act("removeOver");
    EXPECT_EQ(app->TheQueue().Entries().size(), 1U);
}

TEST_F(WindowTest, ShowsFailuresWithTheirLog) {
    Add({"a.mkv"});
    Act("start");
    ASSERT_TRUE(AwaitScripts(1));
    Script(0).listener->OnNote("A stamp was put right.");
    Script(0).End(Ending::kFailed, "It broke. Do this.");
    ASSERT_TRUE(Await([&] { return Shows<OverPage>(); }));
    EXPECT_EQ(Named<QLabel>("What became of the movie")->text(), "It broke. Do this.");
    const auto* log = The<OverPage>()->findChild<QWidget*>(QStringLiteral("log"));
    ASSERT_NE(log, nullptr);
    EXPECT_TRUE(log->isVisible());
    const auto sign = [&] { return Named<QWidget>("State")->grab().toImage(); };
    const QImage light = sign();
    QApplication::setPalette(OwnPalette(true));
    EXPECT_TRUE(Await([&] { return sign() != light; })) << "its colour is not that of dark windows";
    QApplication::setPalette(OwnPalette(false));
    EXPECT_TRUE(Await([&] { return sign() == light; }));
    Click("Convert again");
    EXPECT_EQ(At(0).state, State::kWaiting);
    EXPECT_TRUE(Shows<EntryPage>());
}

TEST_F(WindowTest, AsksOnceBeforeItClosesWhileWorking) {
    QSignalSpy closed(&Window(), &MainWindow::Closed);
    Add({"a.mkv", "b.mkv"});
    Act("start");
    ASSERT_TRUE(AwaitScripts(1));
    Act("quit");
    EXPECT_TRUE(Tells("Movies are being converted."));
    Click("Go on");
    EXPECT_FALSE(Script(0).stopped);
    Act("quit");
    Click("Stop and close");
    EXPECT_TRUE(Script(0).stopped);
    ASSERT_TRUE(Await([&] { return !closed.isEmpty(); }));
    EXPECT_EQ(runner.scripts.size(), 1U);
    EXPECT_FALSE(Window().isVisible());
    Begin(); // the rest is there the next time
    EXPECT_EQ(At(0).state, State::kStopped);
    EXPECT_EQ(At(1).state, State::kWaiting);
}

TEST_F(WindowTest, LeavesAConversionThatDoesNotAnswer) {
    runner.endsWhenStopped = false;
    QObject::disconnect(&Window(), &MainWindow::LeaveWanted, app.get(), nullptr); // it would end the tests
    const QSignalSpy left(&Window(), &MainWindow::LeaveWanted);
    Add({"a.mkv"});
    Act("start");
    ASSERT_TRUE(AwaitScripts(1));
    Act("quit");
    Act("quit");
    EXPECT_TRUE(Script(0).stopped);
    EXPECT_TRUE(Tells("Waiting until all is stopped."));
    EXPECT_TRUE(left.isEmpty());
    Click("Close at once");
    EXPECT_EQ(left.size(), 1);
    Script(0).End(Ending::kStopped);
}

TEST_F(WindowTest, OffersWhatWasInterruptedOnceMore) {
    Add({"a.mkv", "b.mkv"});
    Act("start");
    ASSERT_TRUE(AwaitScripts(1));
    // What a killed program leaves: the journal as it is now.
    ASSERT_TRUE(Await([&] { return ReadFile(folder / "queue").find("active") != std::string::npos; }));
    const std::string journal = ReadFile(folder / "queue");
    app.reset();
    WriteFile(folder / "queue", journal);
    runner.scripts.clear();
    Begin();
    EXPECT_EQ(At(0).state, State::kInterrupted);
    EXPECT_TRUE(Shows<OverPage>());
    Press(The<NoticeBar>()->findChild<QPushButton*>());
    ASSERT_TRUE(AwaitScripts(1));
    EXPECT_EQ(Script(0).order.source, folder / "a.mkv");
}

TEST_F(WindowTest, MovesByKeysAndByDragging) {
    Add({"a", "b", "c"});
    auto* view = The<QueueView>();
    Select(0);
    Act("down");
    EXPECT_EQ(NameOf(At(1).source), "a");
    Act("up");
    Act("up");
    EXPECT_EQ(NameOf(At(0).source), "a");
    view->selectAll();
    Act("remove");
    EXPECT_TRUE(app->TheQueue().Entries().empty());
    EXPECT_TRUE(The<QPushButton>("openButton")->isVisible());
}

TEST_F(WindowTest, NamesNewFiles) {
    Add({"a.mkv"});
    Act("naming");
    auto* dialog = The<NamingDialog>();
    auto* pattern = Named<QLineEdit>("Pattern of the names");
    pattern->setText(QStringLiteral("{name} small"));
    Named<QLineEdit>("Folder for new files")->clear();
    QTest::keyClicks(Named<QLineEdit>("Folder for new files"), "/elsewhere");
    QTest::keyClick(dialog, Qt::Key_Return);
    EXPECT_EQ(At(0).target, "/elsewhere/a small.mp4");
    EXPECT_EQ(settings.LoadNaming().folder, "/elsewhere");
}

TEST_F(WindowTest, RemembersWhatHappensAtTheEnd) {
    Act("endSound");
    Act("end1");
    EXPECT_TRUE(settings.LoadAtEnd().sound);
    EXPECT_EQ(settings.LoadAtEnd().then, AtEnd::Then::kQuit);
    QSignalSpy closed(&Window(), &MainWindow::Closed);
    Add({"a.mkv"});
    Act("start");
    ASSERT_TRUE(AwaitScripts(1));
    Act("stop"); // whoever stops is there, and wants no end
    ASSERT_TRUE(Await([&] { return !app->TheDispatcher().IsWorking(); }));
    QApplication::processEvents();
    EXPECT_TRUE(closed.isEmpty());
    Act("again");
    ASSERT_TRUE(Await([&] { return At(0).IsStartable(); }));
    Act("start");
    ASSERT_TRUE(AwaitScripts(2));
    Script(1).End(Ending::kDone);
    EXPECT_TRUE(Await([&] { return !closed.isEmpty(); }));
}

TEST_F(WindowTest, StaysWhollyUsableWithFiveHundredEntries) {
    std::vector<std::string> names;
    for (int i = 0; i < 500; ++i)
        names.push_back("movie " + std::to_string(i));
    Add(names);
    Select(499);
    EXPECT_TRUE(Shows<EntryPage>());
    Act("start");
    ASSERT_TRUE(AwaitScripts(1));
    EXPECT_EQ(app->TheDispatcher().Now().waiting, 499);
}
