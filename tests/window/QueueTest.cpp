// Adding, editing, reordering.
#include "tests/window/Bench.h"

#include <gtest/gtest.h>

#include <QAbstractItemModelTester>

using namespace movieconv::window;
using Names = std::vector<std::string>;

TEST(Queue, AddsFilesAndFoldersAndLooksAtThem) {
    Bench bench;
    const QAbstractItemModelTester tester(&bench.queue,
                                          QAbstractItemModelTester::FailureReportingMode::Fatal);
    std::filesystem::create_directory(bench.folder / "more");
    bench.Movie("more/2.mkv", "90");
    WriteFile(bench.folder / "notes.txt", "words");
    bench.queue.Add(
        {bench.Movie("1.avi"), bench.folder / "more", bench.folder / "notes.txt", bench.folder / "gone"});
    bench.AwaitExamined();
    EXPECT_EQ(bench.Names(), (Names{"1.avi", "2.mkv", "notes.txt"}));
    EXPECT_EQ(bench.At(1).facts->seconds, 90);
    EXPECT_EQ(bench.At(1).target, bench.folder / "more/2.mp4");
    EXPECT_TRUE(bench.At(0).IsStartable());
    EXPECT_EQ(bench.At(2).unusable, "This is no movie.");
    EXPECT_FALSE(bench.At(2).IsStartable());
    EXPECT_EQ(bench.complaints.size(), 1);
}

TEST(Queue, TakesMoreWhileAMovieDoesNotOpen) {
    Bench bench;
    bench.runner.looking.Shut();
    bench.queue.Add({bench.Movie("hangs.mkv")});
    ASSERT_TRUE(Await([&] { return bench.queue.Entries().size() == 1; }));
    bench.runner.looking.AwaitHeld();
    bench.queue.Add({bench.Movie("b.mkv")});
    EXPECT_TRUE(Await([&] { return bench.queue.Entries().size() == 2; }));
    bench.runner.looking.Open();
    bench.AwaitExamined();
}

TEST(Queue, GivesEveryEntryATargetOfItsOwn) {
    Bench bench;
    WriteFile(bench.folder / "a.mp4", "movie");
    WriteFile(bench.folder / "a (2).mp4", "something of the user's");
    bench.Add({"a.mkv", "a.avi"});
    bench.queue.Add({bench.folder / "a.mp4"});
    bench.AwaitExamined();
    std::set<std::string> targets;
    for (const Entry& entry : bench.queue.Entries()) {
        EXPECT_FALSE(std::filesystem::exists(entry.target)) << entry.target;
        targets.insert(entry.target);
    }
    EXPECT_EQ(targets.size(), 3U);
}

TEST(Queue, GivesClipsANameOfTheirOwn) {
    Bench bench;
    WriteFile(bench.folder / "a_00.mp4", "a clip of the user's");
    WriteFile(bench.folder / "b.mp4", "which clips do not touch");
    bench.Add({"a.avi", "b.avi"});
    Wishes wishes;
    wishes.clip = 60;
    bench.queue.SetWishesOfAll(wishes);
    bench.AwaitExamined();
    EXPECT_EQ(bench.At(0).target, bench.folder / "a (2).mp4");
    EXPECT_EQ(bench.At(1).target, bench.folder / "b.mp4");
}

TEST(Queue, FollowsEditsAndNamingUntilTheUserNamesTheTarget) {
    Bench bench;
    bench.Add({"a.avi", "b.avi"});
    Wishes wishes = bench.At(0).wishes;
    wishes.format = "mkv";
    bench.queue.SetWishes(bench.Id(0), wishes);
    bench.queue.SetTarget(bench.Id(1), bench.folder / "a.mp4");
    bench.queue.SetNaming({"{name} new", bench.folder.Path()});
    bench.AwaitExamined();
    EXPECT_EQ(bench.At(0).target, bench.folder / "a new.mkv");
    EXPECT_EQ(bench.At(1).target, bench.folder / "a.mp4");
    bench.queue.SetTarget(bench.Id(1), {});
    bench.AwaitExamined();
    EXPECT_EQ(bench.At(1).target, bench.folder / "b new.mp4");
    bench.queue.SetTarget(bench.Id(1), bench.Movie("there.mp4"));
    bench.AwaitExamined();
    EXPECT_EQ(bench.At(1).findings.warnings.size(), 1);
}

TEST(Queue, TakesTheFormatOfANameThatIsTyped) {
    Bench bench;
    bench.Add({"a.avi"});
    const struct {
        const char* typed;
        std::optional<QString> format;
    } cases[] = {{"x.MKV", "mkv"},        {"y", "mkv"},     {"y.avi.tar", "mkv"},   {"x.webm", "webm"},
                 {"x.mp4", std::nullopt}, {"x.mkv", "mkv"}, {"x.m4v", std::nullopt}};
    for (const auto& test : cases) {
        bench.queue.SetTarget(bench.Id(0), bench.folder / test.typed);
        EXPECT_EQ(bench.At(0).wishes.format, test.format) << test.typed;
    }
    bench.AwaitExamined();
}

TEST(Queue, TellsWhereSeveralMoviesGoToOneFile) {
    Bench bench;
    bench.Add({"a.avi", "b.avi", "c.avi"});
    const auto shared = [&] {
        std::vector<bool> all;
        for (const Entry& entry : bench.queue.Entries())
            all.push_back(entry.targetShared);
        return all;
    };
    using Shared = std::vector<bool>;
    bench.queue.SetTarget(bench.Id(0), bench.folder / "c.mp4");
    EXPECT_EQ(bench.At(2).target, bench.folder / "c (2).mp4") << "which was not named";
    EXPECT_EQ(shared(), (Shared{false, false, false}));
    bench.queue.SetTarget(bench.Id(1), bench.folder / "c.mp4");
    EXPECT_EQ(shared(), (Shared{true, true, false}));
    bench.AwaitExamined();
    EXPECT_EQ(shared(), (Shared{true, true, false}));
    bench.journal.Settle();
    Journal journal(bench.folder / "queue", [](const QString&) {});
    Queue again(bench.runner, journal);
    again.Restore();
    EXPECT_TRUE(again.Entries().at(0).targetShared);
    bench.queue.SetTarget(bench.Id(0), {});
    EXPECT_EQ(shared(), (Shared{false, false, false}));
    bench.queue.SetTarget(bench.Id(0), bench.At(1).target);
    bench.queue.Remove({bench.Id(0)});
    EXPECT_EQ(shared(), (Shared{false, false}));
    bench.AwaitExamined();
}

TEST(Queue, MovesAndRemoves) {
    Bench bench;
    const QAbstractItemModelTester tester(&bench.queue,
                                          QAbstractItemModelTester::FailureReportingMode::Fatal);
    bench.Add({"1", "2", "3", "4"});
    bench.queue.Move(bench.Id(0), 2);
    EXPECT_EQ(bench.Names(), (Names{"2", "3", "1", "4"}));
    bench.queue.Move(bench.Id(3), 0);
    EXPECT_EQ(bench.Names(), (Names{"4", "2", "3", "1"}));
    bench.queue.Move(bench.Id(3), 99);
    bench.queue.Move(99, 0);
    EXPECT_FALSE(bench.queue.moveRows({}, 0, 5, {}, 0));
    bench.queue.Remove({bench.Id(1), bench.Id(3), 99});
    EXPECT_EQ(bench.Names(), (Names{"4", "3"}));
}

TEST(Queue, MovesManyAtOnce) {
    const struct {
        std::vector<int> rows;
        int before;
        Names result;
    } cases[] = {{{3, 4}, 0, {"4", "5", "1", "2", "3"}},
                 {{0, 2, 3}, 5, {"2", "5", "1", "3", "4"}},
                 {{4, 0}, 2, {"2", "5", "1", "3", "4"}},
                 {{1, 2, 3}, 2, {"1", "2", "3", "4", "5"}},
                 {{1, 9, 3}, 0, {"2", "1", "3", "4", "5"}}};
    for (const auto& [rows, before, result] : cases) {
        Bench bench;
        const QAbstractItemModelTester tester(&bench.queue,
                                              QAbstractItemModelTester::FailureReportingMode::Fatal);
        bench.Add({"1", "2", "3", "4", "5"});
        QList<quint64> ids;
        for (const int row : rows)
            ids.append(row < 5 ? bench.Id(row) : 99);
        bench.queue.MoveBefore(ids, before);
        EXPECT_EQ(bench.Names(), result);
    }
}

TEST(Queue, SurvivesTheProgram) {
    Bench bench;
    bench.Add({"1", "2", "3"});
    bench.queue.Change(
        bench.Id(0), [](Entry& entry) { entry.state = State::kDone; }, true);
    bench.queue.Change(
        bench.Id(1), [](Entry& entry) { entry.state = State::kActive; }, true);
    bench.journal.Settle();

    Journal journal(bench.folder / "queue", [](const QString&) {});
    Queue again(bench.runner, journal);
    EXPECT_TRUE(again.Restore().isEmpty());
    ASSERT_EQ(again.Entries().size(), 3U);
    EXPECT_EQ(again.Entries()[0].state, State::kDone);
    EXPECT_EQ(again.Entries()[1].state, State::kInterrupted);
    again.Retry({again.Entries()[1].id});
    EXPECT_TRUE(Await([&] { return again.Entries()[1].IsStartable() && again.Entries()[2].IsStartable(); }));
}

TEST(Queue, TakesFiveHundredEntriesAndOddNames) {
    Bench bench;
    std::vector<std::string> paths;
    for (int i = 0; i < 494; ++i)
        paths.push_back(bench.Movie("m" + std::to_string(i)));
    for (const char* name : {"-o.mp4", "a\nb.mkv", "\xFF\xFE.avi", "100%25.mov", "日本.mkv", " .mp4"})
        paths.push_back(bench.Movie(name));
    bench.queue.Add(paths);
    bench.AwaitExamined();
    std::set<std::string> targets;
    for (const Entry& entry : bench.queue.Entries()) {
        EXPECT_TRUE(entry.IsStartable()) << entry.source << entry.unusable.toStdString();
        targets.insert(entry.target);
    }
    EXPECT_EQ(targets.size(), 500U);
    bench.journal.Settle();
    Journal journal(bench.folder / "queue", [](const QString&) {});
    QString complaint;
    const std::vector<Entry> kept = journal.Load(complaint);
    ASSERT_EQ(kept.size(), 500U);
    for (size_t i = 0; i < kept.size(); ++i)
        EXPECT_EQ(kept[i].source, paths[i]);
}

TEST(Queue, LeavesAloneWhatIsConverted) {
    Bench bench;
    bench.Add({"1"});
    const Entry before = bench.At(0);
    bench.queue.Change(
        before.id, [](Entry& entry) { entry.state = State::kActive; }, true);
    Wishes wishes;
    wishes.format = "mkv";
    bench.queue.SetWishes(before.id, wishes);
    bench.queue.SetTarget(before.id, "/elsewhere");
    bench.queue.SetReplace(before.id, true);
    bench.queue.Retry({before.id});
    bench.queue.Remove({before.id});
    ASSERT_EQ(bench.queue.Entries().size(), 1U);
    EXPECT_EQ(bench.At(0).target, before.target);
    EXPECT_EQ(bench.At(0).wishes, before.wishes);
    EXPECT_EQ(bench.At(0).state, State::kActive);
}
