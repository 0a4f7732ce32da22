// What is dropped, and what the files are called.
#include "host/window/model/Intake.h"
#include "host/window/model/CodecNames.h"
#include "host/window/model/Naming.h"
#include "host/window/model/Words.h"
#include "tests/support/Folder.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <set>

using namespace movieconv::window;

TEST(UriList, GivesPathsByteForByte) {
    QStringList others;
    const QByteArray list = "# a comment\r\nfile:///movies/a%20b%25.mp4\r\nfile://host/c%FF%0A.mkv\r\n"
                            "file:/plain.avi\r\n/bare path.ts\r\nhttps://example.org/x.mp4\r\n\r\n";
    const std::vector<std::string> expected = {"/movies/a b%.mp4", "/c\xFF\n.mkv", "/plain.avi",
                                               "/bare path.ts"};
    EXPECT_EQ(PathsOfUriList(list, others), expected);
    EXPECT_EQ(others, QStringList{QStringLiteral("https://example.org/x.mp4")});
}

TEST(FindMovies, LooksIntoFoldersAndTellsWhatHoldsNone) {
    const Folder folder;
    std::filesystem::create_directories(folder / "shows/deep");
    std::filesystem::create_directories(folder / "empty");
    for (const char* name : {"shows/Part 10.MKV", "shows/Part 2.mkv", "shows/deep/Part 3.mp4",
                             "shows/notes.txt", "shows/.mp4", "empty/readme", "picked.txt"})
        WriteFile(folder / name, "x");
    std::filesystem::create_directory_symlink(folder / "shows", folder / "shows/deep/round");
    QStringList complaints;
    const auto movies =
        FindMovies({folder / "picked.txt", folder / "shows", folder / "empty", folder / "none"}, complaints);
    const std::vector<std::string> expected = {folder / "picked.txt", folder / "shows/deep/Part 3.mp4",
                                               folder / "shows/Part 2.mkv", folder / "shows/Part 10.MKV"};
    EXPECT_EQ(movies, expected);
    ASSERT_EQ(complaints.size(), 2);
    EXPECT_TRUE(complaints[0].contains(QStringLiteral("empty")));
    EXPECT_TRUE(complaints[1].contains(QStringLiteral("not found")));
}

TEST(Naming, FollowsThePattern) {
    struct Case {
        std::string source;
        QString pattern;
        std::string folder;
        std::string expected;
    };
    const QDate today(2026, 3, 9);
    const std::vector<Case> cases = {
        {"/m/a.b.avi", "{name}", "", "/m/a.b.mp4"},
        {"/m/.hidden", "{name}", "/out", "/out/.hidden.mp4"},
        {"/x.mkv", "{name}", "", "/x.mp4"},
        {"/m/{date}.mkv", "{name} {preset} {height} {date}", "", "/m/{date} standard 720p 2026-03-09.mp4"},
        {"/m/a.mkv", "../{name}/x", "", "/m/..-a-x.mp4"},
        {"/m/a.mkv", "  ", "", "/m/a.mp4"},
        {"/m/\xFF\xFE.mkv", "{name}", "", "/m/\xFF\xFE.mp4"},
        {"/m/taken.mkv", "{name}", "", "/m/taken (3).mp4"},
    };
    const std::set<std::string> taken = {"/m/taken.mp4", "/m/taken (2).mp4"};
    for (const Case& c : cases) {
        Entry entry;
        entry.source = c.source;
        entry.wishes.height = 720;
        const Naming naming{c.pattern, c.folder};
        EXPECT_EQ(TargetFor(entry, naming, "mp4", today,
                            [&](const std::string& path) { return taken.contains(path); }),
                  c.expected);
    }
}

TEST(Naming, CutsLongNamesBetweenCharacters) {
    Entry entry;
    entry.source = "/m/";
    for (int i = 0; i < 125; ++i)
        entry.source += "ä";
    entry.source += ".mkv";
    const std::string path = TargetFor(entry, {}, "mp4", {}, [](const std::string&) { return false; });
    const std::string name = path.substr(3);
    EXPECT_LE(name.size(), 240U);
    EXPECT_GT(name.size(), 230U);
    EXPECT_FALSE(QString::fromStdString(name).contains(QChar::ReplacementCharacter));
}

TEST(Clock, IsReadAndWritten) {
    EXPECT_EQ(ClockText(59.4), "0:59");
    EXPECT_EQ(ClockText(3599.6), "1:00:00");
    EXPECT_EQ(ClockText(-3), "0:00");
    EXPECT_EQ(ExactClockText(62.0004), "1:02");
    EXPECT_EQ(ExactClockText(3599.9996), "1:00:00");
    EXPECT_EQ(ExactClockText(59.05), "0:59.05");
    const std::vector<std::pair<QString, std::optional<double>>> cases = {{"90", 90},
                                                                          {"1:30", 90},
                                                                          {" 1:02:03,5 ", 3723.5},
                                                                          {"0", 0},
                                                                          {"", std::nullopt},
                                                                          {"x", std::nullopt},
                                                                          {"1:60", std::nullopt},
                                                                          {"-1", std::nullopt},
                                                                          {"1:2:3:4", std::nullopt},
                                                                          {"nan", std::nullopt},
                                                                          {"1e99", std::nullopt}};
    for (const auto& [text, seconds] : cases)
        EXPECT_EQ(ParseClock(text), seconds) << text.toStdString();
}

TEST(Range, HoldsWhatMakesSense) {
    Wishes wishes;
    SetEnd(wishes, 50, 60);
    SetBegin(wishes, 70, 60);
    EXPECT_EQ(wishes.begin, 0);
    SetBegin(wishes, 20, 60);
    EXPECT_EQ(wishes.begin, 20);
    EXPECT_EQ(wishes.end, 50);
    for (const std::optional<double> end :
         {std::optional(10.0), std::optional(60.0), std::optional<double>()}) {
        SetEnd(wishes, end, 60);
        EXPECT_FALSE(wishes.end);
    }
    SetEnd(wishes, 30, 60);
    SetBegin(wishes, 40, 60);
    EXPECT_FALSE(wishes.end);
}

TEST(Names, AreThosePeopleKnow) {
    EXPECT_EQ(CodecName("hevc"), "HEVC");
    EXPECT_EQ(CodecName("pcm_s24le"), "PCM");
    EXPECT_EQ(CodecName("mov_text"), "timed text");
    EXPECT_EQ(CodecName("something_new"), "something_new");
    for (const int sign : {0x202E, 0x2066, 0x2028, 0x0A, 0x1B})
        EXPECT_EQ(NameOf("/m/a" + QString(QChar(sign)).toStdString() + "b.mkv"), "a\uFFFDb.mkv") << sign;
    EXPECT_EQ(NameOf("/m/سفر\u200Cها 👩\u200D💻.mkv"), QStringLiteral("سفر\u200Cها 👩\u200D💻.mkv"));
    EXPECT_EQ(ForToolTip("/m/a & b.mkv"), "/m/a & b.mkv");
    EXPECT_EQ(ForToolTip("/m/<h1>a</h1>.mkv"), "<p>/m/&lt;h1&gt;a&lt;/h1&gt;.mkv</p>");
    EXPECT_EQ(ChannelsName("5.1(side)"), "5.1");
    EXPECT_EQ(ChannelsName("stereo"), "stereo");
}

TEST(LeftText, IsNoMoreExactThanItCanBe) {
    EXPECT_EQ(LeftText(4), "a few seconds");
    EXPECT_EQ(LeftText(55), "less than a minute");
    EXPECT_EQ(LeftText(7500), "about 2 h 5 min");
    EXPECT_FALSE(LeftText(1e300).isEmpty());
}
