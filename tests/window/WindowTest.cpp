// Every action of the window but what is chosen for a movie, over a scripted runner.
#include "host/window/widgets/EntryPage.h"
#include "host/window/widgets/Look.h"
#include "host/window/widgets/NamingDialog.h"
#include "host/window/widgets/OverPage.h"
#include "host/window/widgets/WorkPage.h"
#include "tests/window/WindowBench.h"

#include <QFileDialog>
#include <QLineEdit>
#include <QSignalSpy>

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
