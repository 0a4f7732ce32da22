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

TEST_F(ClosingTest, EndsSoonWithoutAsking) {
    const QSignalSpy closed(&Window(), &MainWindow::Closed);
    settings.Save(AtEnd{false, AtEnd::Then::kNothing});
    StartOne("a.mkv");
    app->EndSoon();
    EXPECT_TRUE(Script(0).stopped);
    EXPECT_TRUE(Await([&] { return closed.size() == 1; }));
}
