// What runs when, and what is told of it.
#include "tests/window/Bench.h"

#include <gtest/gtest.h>

#include <QSignalSpy>

using namespace movieconv::window;

namespace {

struct DispatcherTest : testing::Test, Bench {
    QSignalSpy ended{&dispatcher, &Dispatcher::WorkEnded};

    ScriptedRunner::Script& Script(size_t number) { return *runner.scripts.at(number); }
    bool AwaitScripts(size_t count) {
        return Await([&] { return runner.scripts.size() == count; });
    }
    bool AwaitEnd() {
        return Await([&] { return !ended.isEmpty(); });
    }
};

} // namespace

TEST_F(DispatcherTest, RunsOneAfterTheOtherInTheQueuesOrder) {
    Add({"1", "2", "3"});
    queue.Move(Id(2), 0);
    dispatcher.Start();
    ASSERT_TRUE(AwaitScripts(1));
    EXPECT_EQ(Script(0).order.source, folder / "3");
    EXPECT_EQ(At(0).state, State::kActive);
    Script(0).End(Ending::kDone);
    ASSERT_TRUE(AwaitScripts(2));
    EXPECT_TRUE(Script(0).gone);
    EXPECT_EQ(At(0).state, State::kDone);
    Script(1).End(Ending::kFailed, "It broke.");
    ASSERT_TRUE(AwaitScripts(3));
    Script(2).End(Ending::kDone);
    ASSERT_TRUE(AwaitEnd());
    EXPECT_EQ(At(1).outcome.sentence, "It broke.");
    const auto totals = ended[0][0].value<Totals>();
    EXPECT_EQ(totals.done, 2);
    EXPECT_EQ(totals.failed, 1);
    EXPECT_FALSE(dispatcher.IsWorking());
}

TEST_F(DispatcherTest, ReplacesNothingThatTheQueueHasMade) {
    Add({"1", "2"});
    WriteFile(folder / "out.mp4", "the user's");
    for (const int row : {0, 1}) {
        queue.SetTarget(Id(row), folder / "out.mp4");
        queue.SetReplace(Id(row), true);
    }
    AwaitExamined();
    dispatcher.Start();
    ASSERT_TRUE(AwaitScripts(1));
    EXPECT_TRUE(Script(0).order.replace);
    Script(0).End(Ending::kDone);
    ASSERT_TRUE(AwaitScripts(2));
    EXPECT_FALSE(Script(1).order.replace);
    Script(1).End(Ending::kFailed);
    ASSERT_TRUE(AwaitEnd());
}

TEST_F(DispatcherTest, RunsEightAtOnceAndMoreWhenAllowedMore) {
    std::vector<std::string> names;
    for (int i = 0; i < 10; ++i)
        names.push_back(std::to_string(i));
    Add(names);
    dispatcher.SetAtOnce(3);
    dispatcher.Start();
    ASSERT_TRUE(AwaitScripts(3));
    dispatcher.SetAtOnce(99);
    ASSERT_TRUE(AwaitScripts(8));
    EXPECT_EQ(dispatcher.Now().active, 8);
    EXPECT_EQ(dispatcher.Now().waiting, 2);
    dispatcher.SetAtOnce(1);
    for (size_t i = 0; i < 7; ++i)
        Script(i).End(Ending::kDone);
    ASSERT_TRUE(Await([&] { return dispatcher.Now().active == 1; }));
    EXPECT_EQ(runner.scripts.size(), 8U);
    Script(7).End(Ending::kDone);
    ASSERT_TRUE(AwaitScripts(9));
}

TEST_F(DispatcherTest, StopsAfterThisOneAndCanBeToldOtherwise) {
    Add({"1", "2", "3"});
    dispatcher.Start();
    ASSERT_TRUE(AwaitScripts(1));
    dispatcher.SetStopAfterThis(true);
    Script(0).End(Ending::kDone);
    ASSERT_TRUE(AwaitEnd());
    EXPECT_EQ(At(1).state, State::kWaiting);
    EXPECT_FALSE(dispatcher.StopsAfterThis());
    dispatcher.Start();
    ASSERT_TRUE(AwaitScripts(2));
    dispatcher.SetStopAfterThis(true);
    dispatcher.SetStopAfterThis(false);
    Script(1).End(Ending::kDone);
    EXPECT_TRUE(AwaitScripts(3));
}

TEST_F(DispatcherTest, PausesResumesAndStops) {
    Add({"1", "2", "3"});
    dispatcher.SetAtOnce(2);
    dispatcher.Start();
    ASSERT_TRUE(AwaitScripts(2));
    EXPECT_FALSE(dispatcher.IsPaused());
    dispatcher.Pause(Id(0));
    EXPECT_FALSE(dispatcher.IsPaused());
    dispatcher.PauseAll();
    EXPECT_TRUE(dispatcher.IsPaused());
    EXPECT_TRUE(Script(0).paused && Script(1).paused);
    EXPECT_TRUE(Await([&] { return At(1).figures.phase == Phase::kPaused; }));
    dispatcher.Resume(Id(0));
    EXPECT_FALSE(Script(0).paused);
    dispatcher.ResumeAll();
    EXPECT_FALSE(Script(1).paused);
    dispatcher.Stop(Id(0)); // the next one begins
    ASSERT_TRUE(AwaitScripts(3));
    EXPECT_EQ(At(0).state, State::kStopped);
    dispatcher.StopAll();
    ASSERT_TRUE(AwaitEnd());
    EXPECT_TRUE(Script(1).stopped && Script(2).stopped);
    EXPECT_EQ(At(2).state, State::kStopped);
}

TEST_F(DispatcherTest, BeginsNothingWhileEverythingIsPaused) {
    Add({"1"});
    dispatcher.SetAtOnce(2);
    dispatcher.Start();
    ASSERT_TRUE(AwaitScripts(1));
    dispatcher.PauseAll();
    Add({"2"});
    dispatcher.SetAtOnce(3);
    EXPECT_EQ(runner.scripts.size(), 1U);
    dispatcher.ResumeAll();
    ASSERT_TRUE(AwaitScripts(2));
}

TEST_F(DispatcherTest, WaitsForMoviesThatAreStillLookedAt) {
    runner.looking.Shut();
    queue.Add({Movie("1")});
    dispatcher.Start();
    EXPECT_TRUE(dispatcher.IsWorking());
    ASSERT_TRUE(Await([&] { return !queue.Entries().empty(); }));
    runner.looking.AwaitHeld();
    EXPECT_TRUE(runner.scripts.empty());
    runner.looking.Open();
    ASSERT_TRUE(AwaitScripts(1));
    WriteFile(folder / "words", "no movie");
    queue.Add({Movie("2"), folder / "words"}); // while it works
    Script(0).End(Ending::kDone);
    ASSERT_TRUE(AwaitScripts(2));
    AwaitExamined();
    Script(1).End(Ending::kDone);
    ASSERT_TRUE(AwaitEnd());
    EXPECT_EQ(At(2).state, State::kWaiting);
    ended.clear();
    dispatcher.Start(); // nothing that could be converted
    EXPECT_FALSE(dispatcher.IsWorking());
}

TEST_F(DispatcherTest, ReckonsTheQueuesProgressAndTime) {
    queue.Add({Movie("1", "100"), Movie("2", "300")});
    AwaitExamined();
    dispatcher.Start();
    ASSERT_TRUE(AwaitScripts(1));
    Script(0).Figure(50, 100, 10);
    ASSERT_TRUE(Await([&] { return At(0).figures.position == 50; }));
    EXPECT_DOUBLE_EQ(dispatcher.Now().fraction, 50.0 / 400);
    EXPECT_DOUBLE_EQ(*dispatcher.Now().left, 35);
    Script(0).End(Ending::kDone);
    ASSERT_TRUE(AwaitScripts(2));
    EXPECT_DOUBLE_EQ(dispatcher.Now().fraction, 100.0 / 400);
    EXPECT_FALSE(dispatcher.Now().left);
}

TEST_F(DispatcherTest, ShowsThePicturesOfOne) {
    Add({"1", "2"});
    QSignalSpy pictures(&dispatcher, &Dispatcher::PictureCame);
    dispatcher.SetAtOnce(2);
    dispatcher.ShowPicturesOf(Id(1));
    dispatcher.Start();
    ASSERT_TRUE(AwaitScripts(2));
    EXPECT_FALSE(Script(0).shown);
    EXPECT_TRUE(Script(1).shown);
    dispatcher.ShowPicturesOf(Id(0));
    EXPECT_TRUE(Script(0).shown);
    EXPECT_FALSE(Script(1).shown);
    const QImage picture = runner.PictureAt({}, 0, 160);
    dispatcher.SetPictureRoom({32, 100});
    for (int i = 0; i < 100; ++i)
        Script(0).listener->OnPicture(picture);
    ASSERT_TRUE(Await([&] { return !pictures.isEmpty(); }));
    EXPECT_EQ(pictures.size(), 1); // of a backlog only the newest
    EXPECT_EQ(pictures[0][0].value<quint64>(), Id(0));
    EXPECT_EQ(pictures[0][1].value<QImage>().size(), QSize(32, 18)); // as large as there is room
}

TEST_F(DispatcherTest, KeepsNotesAndTellsOfAFullDisk) {
    Add({"1"});
    dispatcher.Start();
    ASSERT_TRUE(AwaitScripts(1));
    Script(0).listener->OnNote("A stamp was put right.");
    Script(0).Phase(Phase::kWaitingForRoom);
    ASSERT_TRUE(Await([&] { return At(0).figures.phase == Phase::kWaitingForRoom; }));
    ASSERT_EQ(At(0).notes.size(), 1);
    EXPECT_TRUE(At(0).notes[0].endsWith(QStringLiteral("A stamp was put right.")));
    Script(0).End(Ending::kDone);
    ASSERT_TRUE(AwaitEnd());
    Journal again(folder / "queue", [](const QString&) {});
    QString complaint;
    journal.Settle();
    EXPECT_EQ(again.Load(complaint).at(0).notes, At(0).notes);
}
