// How the window is closed, and what is kept when it is.
#include "host/window/widgets/EntryPage.h"
#include "tests/window/WindowBench.h"

#include <QLineEdit>
#include <QSignalSpy>
#include <QSplitter>

using namespace movieconv::window;

namespace {

struct ClosingTest : WindowBench {
    void StartOne(const std::string& name) {
        const size_t before = runner.scripts.size();
        Add({name});
        Act("start");
        ASSERT_TRUE(AwaitScripts(before + 1));
    }
    void Finish(size_t number) {
        Script(number).End(Ending::kDone);
        ASSERT_TRUE(Await([&] { return !app->TheDispatcher().IsWorking(); }));
    }
    /// "Close at once" would end the tests.
    void DoNotLeave() { QObject::disconnect(&Window(), &MainWindow::LeaveWanted, app.get(), nullptr); }
};

} // namespace

TEST_F(ClosingTest, AsksAnewInEveryConversion) {
    const QSignalSpy closed(&Window(), &MainWindow::Closed);
    StartOne("a.mkv");
    Act("quit");
    EXPECT_TRUE(Tells("Movies are being converted."));
    Finish(0);
    EXPECT_FALSE(Tells("Movies are being converted.")) << "there is nothing to decide any more";
    EXPECT_TRUE(closed.isEmpty());
    StartOne("b.mkv");
    Act("quit");
    EXPECT_FALSE(Script(1).stopped);
    EXPECT_TRUE(Tells("Movies are being converted."));
    Click("Close when done");
    EXPECT_TRUE(closed.isEmpty());
    Act("quit");
    EXPECT_FALSE(Script(1).stopped);
    Finish(1);
    EXPECT_EQ(closed.size(), 1);
}

TEST_F(ClosingTest, StaysWhenWhoWantedToCloseGoesOn) {
    const QSignalSpy closed(&Window(), &MainWindow::Closed);
    StartOne("a.mkv");
    Act("quit");
    Click("Close when done");
    Act("quit");
    Click("Go on");
    Finish(0);
    EXPECT_TRUE(closed.isEmpty());
}

TEST_F(ClosingTest, ConvertsByWhatIsTyped) {
    Add({"a.mkv"});
    Window().activateWindow();
    ASSERT_TRUE(QTest::qWaitForWindowActive(&Window()));
    for (const auto& [field, words] :
         {std::pair("File to save as", QString::fromStdString(folder / "mine.mp4")),
          std::pair("End of the range", QStringLiteral("0:30"))}) {
        auto* edit = Named<QLineEdit>(field);
        edit->setFocus();
        edit->selectAll();
        QTest::keyClicks(edit, words);
        QTest::keyClick(edit, Qt::Key_Return, Qt::ControlModifier);
        ASSERT_TRUE(AwaitScripts(1));
        const Order order = Script(0).order;
        Script(0).End(Ending::kStopped);
        ASSERT_TRUE(Await([&] { return !app->TheDispatcher().IsWorking(); }));
        runner.scripts.clear();
        Act("again");
        ASSERT_TRUE(Await([&] { return At(0).IsStartable(); }));
        EXPECT_EQ(order.target, folder / "mine.mp4");
        EXPECT_EQ(order.wishes.end.has_value(), QByteArray(field).startsWith("End"));
    }
}

TEST_F(ClosingTest, KeepsWhatIsTyped) {
    Add({"a.mkv"});
    Window().activateWindow();
    ASSERT_TRUE(QTest::qWaitForWindowActive(&Window()));
    auto* target = Named<QLineEdit>("File to save as");
    target->setFocus();
    target->selectAll();
    QTest::keyClicks(target, QString::fromStdString(folder / "mine.mp4"));
    std::string kept;
    QObject::connect(&Window(), &MainWindow::Closed, &Window(), [&] { kept = At(0).target; });
    Act("quit");
    EXPECT_EQ(kept, folder / "mine.mp4");
}

TEST_F(ClosingTest, KeepsHowTheWindowIsDivided) {
    Add({"a.mkv"});
    auto* splitter = The<QSplitter>();
    splitter->setSizes({300, 780});
    const QList<int> sizes = splitter->sizes();
    Window().close();
    Begin();
    QApplication::processEvents();
    EXPECT_EQ(The<QSplitter>()->sizes(), sizes);
}

TEST_F(ClosingTest, KeepsTheSettingsWhenItLeaves) {
    runner.endsWhenStopped = false;
    DoNotLeave();
    std::string kept;
    QObject::connect(&Window(), &MainWindow::LeaveWanted, &Window(),
                     [&] { kept = ReadFile(folder / "settings"); });
    StartOne("a.mkv");
    Act("quit");
    Act("quit");
    Click("Close at once");
    for (const char* name : {"geometry", "splitter"})
        EXPECT_NE(kept.find(name), std::string::npos) << name;
    Script(0).End(Ending::kStopped);
}

TEST_F(ClosingTest, EndsSoonWithoutAsking) {
    const QSignalSpy closed(&Window(), &MainWindow::Closed);
    settings.Save(AtEnd{false, AtEnd::Then::kNothing});
    StartOne("a.mkv");
    app->EndSoon();
    EXPECT_TRUE(Script(0).stopped);
    EXPECT_TRUE(Await([&] { return closed.size() == 1; }));
}

TEST_F(ClosingTest, CannotEndInOrderWhileAMovieDoesNotOpen) {
    runner.looking.Shut();
    app->TheQueue().Add({Movie("a.mkv")});
    ASSERT_TRUE(Await([&] { return !app->TheQueue().Entries().empty(); }));
    runner.looking.AwaitHeld();
    Window().close();
    EXPECT_FALSE(App::CanEnd());
    runner.looking.Open();
    EXPECT_TRUE(App::CanEnd());
}
