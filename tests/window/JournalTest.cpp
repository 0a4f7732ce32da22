// The queue on the disk.
#include "host/window/model/Journal.h"
#include "tests/support/Folder.h"
#include "tests/support/Process.h"
#include "tests/window/ScriptedRunner.h"

#include <gtest/gtest.h>

#include <atomic>
#include <csignal>
#include <fcntl.h>
#include <filesystem>
#include <unistd.h>

using namespace movieconv::window;

namespace {

void Ignore(const QString&) {}

std::vector<Entry> Load(const std::string& path) {
    QString complaint;
    return Journal(path, Ignore).Load(complaint);
}

/// Another program that has a journal until it is ended.
class Owner {
public:
    explicit Owner(const std::string& journal) : child_(fork()) {
        if (child_ != 0)
            return;
        const int lock = open((journal + ".lock").c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0600);
        struct flock whole {};
        whole.l_type = F_WRLCK;
        fcntl(lock, F_SETLK, &whole);
        close(open((journal + ".held").c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, 0600));
        for (;;)
            pause();
    }
    Owner(const Owner&) = delete;
    Owner& operator=(const Owner&) = delete;
    ~Owner() {
        kill(child_, SIGKILL);
        AwaitEnd(child_);
    }

private:
    const pid_t child_;
};

Entry FullEntry() {
    Entry entry;
    entry.source = "/movies/a b%\xFF\"\n.mkv";
    entry.target = "/out/ä.mp4";
    entry.targetNamed = entry.replace = true;
    entry.state = State::kDone;
    entry.wishes = {.preset = "web",
                    .format = "webm",
                    .quality = 40,
                    .height = 720,
                    .rate = 29.97,
                    .begin = 1.5,
                    .end = 90,
                    .clip = 30,
                    .sounds = QList<int>{2, 1},
                    .subtitles = QList<int>{},
                    .subtitleFiles = {{"/subs/\xFF.srt", "de"}, {"/subs/b.ass", {}}},
                    .subtitleCharset = "WINDOWS-1251",
                    .burning = {{}, "/subs/\xFF%.srt"},
                    .copySound = false,
                    .channels = 1,
                    .deinterlace = Wishes::Deinterlace::kAll,
                    .crop = true,
                    .cut = Margins{2, 4, 6, 8},
                    .hdr = Wishes::Hdr::kUsual,
                    .depth = 10,
                    .chapters = false,
                    .texts = false,
                    .title = "",
                    .withPictures = true,
                    .withSound = false};
    entry.outcome = {.ending = Ending::kDone,
                     .sentence = "well",
                     .files = {"/out/ä.mp4", "/out/\xFF"},
                     .notCarried = {"a cover"},
                     .bytes = 123'456'789'012,
                     .position = 88.5,
                     .worked = 9};
    entry.notes = QStringList{"12:00:00  a note"};
    return entry;
}

} // namespace

TEST(Journal, KeepsEverythingOfAnEntry) {
    const Folder folder;
    const Entry entry = FullEntry();
    Journal(folder / "queue", Ignore).Keep({entry});
    const std::vector<Entry> loaded = Load(folder / "queue");
    ASSERT_EQ(loaded.size(), 1U);
    EXPECT_EQ(loaded[0].source, entry.source);
    EXPECT_EQ(loaded[0].target, entry.target);
    EXPECT_TRUE(loaded[0].targetNamed && loaded[0].replace);
    EXPECT_EQ(loaded[0].state, State::kDone);
    EXPECT_EQ(loaded[0].wishes, entry.wishes);
    EXPECT_EQ(loaded[0].outcome.ending, Ending::kDone);
    EXPECT_EQ(loaded[0].outcome.sentence, entry.outcome.sentence);
    EXPECT_EQ(loaded[0].outcome.files, entry.outcome.files);
    EXPECT_EQ(loaded[0].outcome.notCarried, entry.outcome.notCarried);
    EXPECT_EQ(loaded[0].outcome.bytes, entry.outcome.bytes);
    EXPECT_EQ(loaded[0].outcome.position, 88.5);
    EXPECT_EQ(loaded[0].notes, entry.notes);
    Entry burnt;
    burnt.source = "/m";
    burnt.wishes.burning.track = 3;
    burnt.wishes.copySound = true;
    Journal(folder / "queue", Ignore).Keep({burnt});
    EXPECT_EQ(Load(folder / "queue").at(0).wishes, burnt.wishes);
}

TEST(Journal, BringsBackEachStateAndWhatWasActiveAsInterrupted) {
    const Folder folder;
    std::vector<Entry> entries;
    for (int state = 0; state <= static_cast<int>(State::kInterrupted); ++state) {
        entries.emplace_back();
        entries.back().source = "/m";
        entries.back().state = static_cast<State>(state);
    }
    Journal(folder / "queue", Ignore).Keep(entries);
    const std::vector<Entry> loaded = Load(folder / "queue");
    ASSERT_EQ(loaded.size(), entries.size());
    for (size_t i = 0; i < loaded.size(); ++i) {
        const State state = entries[i].state;
        EXPECT_EQ(loaded[i].state, state == State::kActive ? State::kInterrupted : state);
    }
}

TEST(Journal, SetsAsideWhatItCannotRead) {
    for (const char* text : {"", "{", "[]", "{\"version\":99,\"entries\":[]}", "\xFF\xFE"}) {
        const Folder folder;
        WriteFile(folder / "queue", text);
        QString complaint;
        EXPECT_TRUE(Journal(folder / "queue", Ignore).Load(complaint).empty());
        EXPECT_TRUE(complaint.contains(QStringLiteral("queue.unreadable"))) << text;
        EXPECT_EQ(ReadFile(folder / "queue.unreadable"), text);
    }
    const Folder folder; // what cannot be opened, beside what was set aside before
    std::filesystem::create_directory(folder / "closed");
    WriteFile(folder / "closed.unreadable", "older");
    QString complaint;
    EXPECT_TRUE(Journal(folder / "closed", Ignore).Load(complaint).empty());
    EXPECT_TRUE(complaint.contains(QStringLiteral("closed.unreadable-2")));
    EXPECT_TRUE(std::filesystem::is_directory(folder / "closed.unreadable-2"));
    EXPECT_EQ(ReadFile(folder / "closed.unreadable"), "older");
    WriteFile(folder / "queue", R"({"version":1,"entries":[5,{},{"source":"/a","state":"odd"},
        {"source":"/b","state":"waiting","wishes":{"quality":"high","height":-3,"begin":"x","sounds":7,
        "burnt_track":-2,"burnt_file":5,"copy_sound":"yes"}}]})");
    const std::vector<Entry> loaded = Load(folder / "queue");
    ASSERT_EQ(loaded.size(), 1U);
    EXPECT_EQ(loaded[0].source, "/b");
    EXPECT_EQ(loaded[0].wishes, Wishes());
}

TEST(Journal, TellsOnceThatItCannotWriteAndGoesOn) {
    const Folder folder;
    std::atomic<int> complaints = 0;
    Journal journal(folder / "below/queue", [&](const QString& sentence) {
        EXPECT_TRUE(sentence.contains(QStringLiteral("below/queue")));
        ++complaints;
    });
    for (int i = 0; i < 2; ++i) {
        journal.Keep({FullEntry()});
        journal.Settle();
    }
    EXPECT_EQ(complaints, 1);
    std::filesystem::create_directory(folder / "below");
    journal.Keep({FullEntry()});
    journal.Settle();
    EXPECT_EQ(Load(folder / "below/queue").size(), 1U);
}

TEST(Journal, IsWholeAtWhateverMomentTheProgramIsKilled) {
    const Folder folder;
    const std::string path = folder / "queue";
    std::vector<Entry> entries(300, FullEntry());
    for (int round = 0; round < 5; ++round) {
        int ready[2];
        ASSERT_EQ(pipe(ready), 0);
        const pid_t child = fork();
        if (child == 0) {
            Journal journal(path, Ignore);
            journal.Keep(entries);
            journal.Settle();
            [[maybe_unused]] const ssize_t told = write(ready[1], "x", 1);
            while (true)
                journal.Keep(entries);
        }
        char told = 0;
        ASSERT_EQ(read(ready[0], &told, 1), 1);
        kill(child, SIGKILL);
        AwaitEnd(child);
        close(ready[0]);
        close(ready[1]);
        QString complaint;
        EXPECT_EQ(Journal(path, Ignore).Load(complaint).size(), entries.size());
        EXPECT_TRUE(complaint.isEmpty());
    }
}

TEST(Journal, BelongsToOneProgram) {
    const Folder folder;
    const std::string path = folder / "queue";
    { Journal(path, Ignore).Keep({FullEntry()}); }
    const std::string before = ReadFile(path);
    {
        const Owner other(path);
        ASSERT_TRUE(Await([&] { return std::filesystem::exists(path + ".held"); }));
        Journal second(path, Ignore);
        QString complaint;
        EXPECT_TRUE(second.Load(complaint).empty());
        EXPECT_FALSE(complaint.isEmpty());
        second.Keep({});
        second.Settle();
        EXPECT_EQ(ReadFile(path), before);
    }
    EXPECT_EQ(Load(path).size(), 1U) << "once it is gone";
}
