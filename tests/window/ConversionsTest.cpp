// Real conversions of a queue, without a window.
#include "host/window/model/Dispatcher.h"
#include "host/window/model/Words.h"
#include "host/window/runner/ConvertRunner.h"
#include "tests/support/SmallDisk.h"
#include "tests/window/Holiday.h"
#include "tests/window/ScriptedRunner.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <set>

using namespace movieconv::window;

namespace {

struct ConversionsTest : testing::Test {
    Folder folder;
    ConvertRunner runner;
    Journal journal{folder / "queue", [](const QString&) {}};
    Queue queue{runner, journal};
    Dispatcher dispatcher{queue, runner};

    const Entry& At(size_t row) { return queue.Entries().at(row); }

    bool AwaitDone() {
        return Await([&] { return !dispatcher.IsWorking(); });
    }

    void AwaitExamined(size_t count) { ASSERT_TRUE(::AwaitExamined(queue, count)); }
};

} // namespace

TEST_F(ConversionsTest, ConvertsSeveralAtOnceAndStopsThem) {
    const std::string movie = Holiday(10);
    queue.SetNaming({QStringLiteral("{name}"), folder.Path()});
    queue.Add(std::vector<std::string>(8, movie));
    dispatcher.SetAtOnce(8);
    AwaitExamined(8);
    dispatcher.Start();
    ASSERT_TRUE(Await([&] {
        return std::all_of(queue.Entries().begin(), queue.Entries().end(),
                           [](const Entry& entry) { return entry.figures.position > 0; });
    }));
    dispatcher.PauseAll();
    EXPECT_TRUE(Await([&] { return At(7).figures.phase == Phase::kPaused; }));
    dispatcher.StopAll();
    ASSERT_TRUE(AwaitDone());
    std::set<std::string> targets;
    for (const Entry& entry : queue.Entries()) {
        EXPECT_EQ(entry.state, State::kStopped) << entry.outcome.sentence.toStdString();
        EXPECT_TRUE(std::filesystem::exists(entry.target)) << entry.target;
        targets.insert(entry.target);
    }
    EXPECT_EQ(targets.size(), 8U);
}

TEST_F(ConversionsTest, TellsWhatGoesWrongInWords) {
    const std::string movie = Holiday();
    queue.Add({movie});
    AwaitExamined(1);
    queue.SetTarget(At(0).id, folder / "there is no such folder/x.mp4");
    AwaitExamined(1);
    EXPECT_EQ(At(0).findings.warnings.size(), 1);
    dispatcher.Start();
    ASSERT_TRUE(AwaitDone());
    EXPECT_EQ(At(0).state, State::kFailed);
    EXPECT_TRUE(At(0).outcome.sentence.endsWith(QLatin1Char('.')));
    queue.Retry({At(0).id});
    queue.SetTarget(At(0).id, movie);
    AwaitExamined(1);
    EXPECT_TRUE(At(0).findings.targetExists);
    queue.SetReplace(At(0).id, true);
    dispatcher.Start(); // a source is never replaced by what is made of it
    ASSERT_TRUE(AwaitDone());
    EXPECT_EQ(At(0).state, State::kFailed);
    EXPECT_GT(std::filesystem::file_size(movie), 10'000U);

    std::filesystem::copy_file(movie, folder / "on a stick.mkv");
    queue.Add({folder / "on a stick.mkv"});
    AwaitExamined(2);
    std::filesystem::remove(folder / "on a stick.mkv");
    dispatcher.Start();
    ASSERT_TRUE(AwaitDone());
    EXPECT_TRUE(At(1).outcome.sentence.contains(QStringLiteral("connected")))
        << At(1).outcome.sentence.toStdString();
    queue.Retry({At(1).id});
    AwaitExamined(2);
    EXPECT_TRUE(At(1).unusable.contains(QStringLiteral("connected")));
}

namespace {

/// A movie with an English and a German sound and French subtitles, and a file of subtitles beside it.
struct TracksTest : ConversionsTest {
    void SetUp() override {
        WriteFile(Texts(), "1\n00:00:00,500 --> 00:00:01,500\nGrüße\n");
        queue.SetNaming({QStringLiteral("{name}"), folder.Path()});
        queue.Add({test_movies::Make(
            "window-tracks.mkv",
            test_movies::Join(
                test_movies::Words("-f lavfi -i testsrc2=s=320x180:r=25 -f lavfi -i sine=440 "
                                   "-f lavfi -i sine=880"),
                test_movies::Args{"-i", Texts()},
                test_movies::Words("-map 0 -map 1 -map 2 -map 3 -t 2 -c:v libx264 -preset "
                                   "ultrafast -c:a aac -c:s srt -metadata:s:a:0 language=eng "
                                   "-metadata:s:a:1 language=ger -metadata:s:s:0 language=fre")))});
        AwaitExamined(1);
        wishes.subtitleFiles = {{Texts(), QStringLiteral("de")}};
        ASSERT_EQ(At(0).facts->sounds.size(), 2U);
    }

    std::string Texts() const { return folder / "a.srt"; }

    void Choose() {
        queue.SetWishes(At(0).id, wishes);
        AwaitExamined(1);
    }

    /// What the movie became.
    MovieFacts Converted() {
        dispatcher.Start();
        EXPECT_TRUE(AwaitDone());
        EXPECT_EQ(At(0).state, State::kDone) << At(0).outcome.sentence.toStdString();
        return runner.Look(At(0).target);
    }

    Wishes wishes;
};

} // namespace

TEST_F(TracksTest, AreTheFilesUnlessItsFormatHoldsLess) {
    EXPECT_EQ(TrackLine(At(0).facts->sounds[1]), "German (AAC, mono)");
    EXPECT_TRUE(At(0).findings.notes.isEmpty()) << At(0).findings.notes.join("; ").toStdString();
    wishes.format = QStringLiteral("flv"); // holds one sound and no subtitles
    Choose();
    const QString notes = At(0).findings.notes.join(QLatin1Char('\n'));
    for (const char* told : {"sound 2 (AAC, German)", "subtitles 3 (SRT, French)", "subtitles (SRT, German)"})
        EXPECT_TRUE(notes.contains(QLatin1String(told))) << notes.toStdString();
    EXPECT_TRUE(At(0).findings.warnings.isEmpty());
}

TEST_F(TracksTest, AreThoseThatAreChosen) {
    wishes.format = QStringLiteral("mkv");
    wishes.sounds = QList<int>{At(0).facts->sounds[1].number};
    wishes.subtitles = QList<int>{};
    wishes.title = QStringLiteral("Mine");
    Choose();
    EXPECT_TRUE(At(0).findings.notes.isEmpty()) << At(0).findings.notes.join("; ").toStdString();
    const MovieFacts made = Converted();
    ASSERT_EQ(made.sounds.size(), 1U);
    EXPECT_EQ(made.sounds[0].language, "ger");
    ASSERT_EQ(made.subtitles.size(), 1U);
    EXPECT_EQ(made.subtitles[0].language, "ger");
    EXPECT_EQ(made.title, "Mine");
}

TEST_F(TracksTest, AreCopiedOrDrawn) {
    wishes.format = QStringLiteral("mkv");
    wishes.sounds = QList<int>{At(0).facts->sounds[1].number};
    wishes.copySound = true;
    wishes.channels = 1;
    Burn(wishes, {At(0).facts->subtitles[0].number, {}});
    Choose();
    EXPECT_EQ(At(0).findings.notes, QStringList{"The sound stays as it is, and so do its channels."});
    const MovieFacts kept = Converted();
    EXPECT_TRUE(At(0).outcome.notCarried.isEmpty());
    ASSERT_EQ(kept.sounds.size(), 1U);
    EXPECT_EQ(kept.sounds[0].details, "AAC, mono");
    ASSERT_EQ(kept.subtitles.size(), 1U) << "the file, but not the track that is drawn";
    EXPECT_EQ(kept.subtitles[0].language, "ger");
}

TEST_F(TracksTest, ThatAreNotThereAreWarnedOf) {
    wishes.sounds = QList<int>{17}; // the file is another one now
    wishes.subtitleFiles[0].path = folder / "gone.srt";
    wishes.depth = 10;
    wishes.format = QStringLiteral("flv");
    Choose();
    EXPECT_EQ(At(0).findings.warnings.size(), 2) << At(0).findings.warnings.join("; ").toStdString();
}

TEST_F(ConversionsTest, KeepsWhatTheDecoderSaysInTheLogOfTheMovie) {
    std::string movie = ReadFile(Holiday());
    for (size_t at = movie.size() / 3; at < movie.size() / 3 + 20'000; ++at)
        movie[at] = static_cast<char>(movie[at] ^ 0x55);
    WriteFile(folder / "scratched.mkv", movie);
    queue.SetNaming({QStringLiteral("{name}"), folder.Path()});
    queue.Add({folder / "scratched.mkv"});
    AwaitExamined(1);
    testing::internal::CaptureStderr();
    dispatcher.Start();
    ASSERT_TRUE(AwaitDone());
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "");
    EXPECT_FALSE(At(0).notes.filter(QStringLiteral(" @ 0x")).isEmpty())
        << "no line of a decoder's in\n"
        << At(0).notes.join(QLatin1Char('\n')).toStdString();
}

TEST_F(ConversionsTest, WaitsOnADiskThatIsFullUntilThereIsRoom) {
    const SmallDisk disk(folder / "disk", "200k");
    if (!disk.IsThere())
        GTEST_SKIP() << "no mounts here";
    queue.SetNaming({QStringLiteral("{name}"), folder / "disk"});
    queue.Add({Holiday()});
    AwaitExamined(1);
    EXPECT_FALSE(At(0).findings.warnings.isEmpty()) << "the page warns that there is little room";
    dispatcher.Start();
    ASSERT_TRUE(Await([&] { return At(0).figures.phase == Phase::kWaitingForRoom || At(0).IsOver(); }));
    EXPECT_EQ(At(0).state, State::kActive) << At(0).outcome.sentence.toStdString();
    ASSERT_TRUE(disk.Grow());
    ASSERT_TRUE(AwaitDone());
    EXPECT_EQ(At(0).state, State::kDone) << At(0).outcome.sentence.toStdString();
    EXPECT_GT(std::filesystem::file_size(At(0).target), 200'000U);
}
