// The program with --into: many movies, what is done already left as it is.
#include "tests/pieces/ExitCodes.h"
#include "tests/support/Folder.h"
#include "tests/support/Program.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <chrono>
#include <csignal>
#include <filesystem>
#include <map>
#include <regex>
#include <set>
#include <string>
#include <sys/stat.h>
#include <thread>
#include <vector>

namespace {

using program::Call;
using program::Result;
using program::Running;
using test_movies::Args;

std::string Short() {
    return test_movies::Make("many.mkv",
                             test_movies::Join(test_movies::CountedPictures(1), test_movies::Beeps(1)));
}

/// A source that takes long enough to be met at work.
std::string Lasting() {
    return test_movies::Make("many-lasting.mkv", {"-f", "lavfi", "-i", "testsrc2=s=640x360:r=25:d=30", "-c:v",
                                                  "libx264", "-preset", "ultrafast"});
}

/// A folder "in" of two movies and a text, and a movie beside it.
struct Movies {
    Folder folder;
    std::string out = folder / "out";

    Movies() {
        std::filesystem::create_directory(folder / "in");
        for (const char* name : {"in/a.mkv", "in/b.mkv", "c.mkv"})
            WriteFile(folder / name, ReadFile(Short()));
        WriteFile(folder / "in/notes.txt", "not a movie");
    }
    Result Convert(const Args& more = {}) const {
        return Call(test_movies::Join(Args{"--into", out, "--jobs", "2"}, more,
                                      Args{folder / "in", folder / "c.mkv"}));
    }
    int64_t Written(const std::string& name) const {
        return std::filesystem::last_write_time(out + "/" + name).time_since_epoch().count();
    }
};

TEST(ManyMovies, AreConvertedOnceAndAgainOnlyWhereSomethingChanged) {
    const Movies movies;
    std::filesystem::rename(movies.folder / "in/b.mkv", movies.folder / "in/\xE9.mkv"); // no UTF-8
    const Result first = movies.Convert();
    ASSERT_EQ(first.code, 0) << first.err;
    EXPECT_EQ(movies.folder.Names("out"),
              (std::vector<std::string>{"a.mp4", "c.mp4", "movieconv.journal", "\xE9.mp4"}));
    EXPECT_TRUE(Has(first.err, "notes.txt\" is left out")) << first.err;
    EXPECT_TRUE(Has(first.out, "in 3 files")) << first.out;

    const int64_t before = movies.Written("a.mp4");
    const Result second = movies.Convert();
    ASSERT_EQ(second.code, 0) << second.err;
    EXPECT_EQ(movies.Written("a.mp4"), before);
    EXPECT_TRUE(Has(second.err, "a.mp4\" is there already")) << second.err;
    EXPECT_FALSE(Has(second.err, "damaged")) << second.err;

    EXPECT_EQ(movies.Convert({"--size", "80x60"}).code, 4) << "other settings would replace what is there";
    EXPECT_EQ(movies.Convert({"--size", "80x60", "-y"}).code, 0);
    EXPECT_NE(movies.Written("a.mp4"), before);
    WriteFile(movies.folder / "in/a.mkv", ReadFile(Short()) + "more");
    std::filesystem::remove(movies.out + "/\xE9.mp4");
    const Result third = movies.Convert({"--size", "80x60", "-y"});
    EXPECT_TRUE(Has(third.out, "in 2 files")) << third.out << third.err;
    EXPECT_EQ(movies.Convert({"--names", "{name}-small.{ext}", "-f", "mkv"}).code, 0);
    EXPECT_TRUE(std::filesystem::exists(movies.out + "/c-small.mkv"));
}

TEST(ManyMovies, GoOnWhenOneFailsAndTellTheWorst) {
    const Movies movies;
    std::filesystem::create_directory(movies.out);
    WriteFile(movies.out + "/a.mp4", "precious");
    const Result result = movies.Convert({"-q", movies.folder / "nowhere.mkv"});
    EXPECT_EQ(result.code, 4) << result.err;
    for (const char* why : {"nowhere.mkv\": No such file", "a.mp4\" exists"})
        EXPECT_TRUE(Has(result.err, why)) << result.err;
    EXPECT_TRUE(Has(result.err, "2 of 4 movies failed") || Has(result.err, "2 of 5 movies failed"))
        << result.err;
    EXPECT_EQ(ReadFile(movies.out + "/a.mp4"), "precious");
    EXPECT_TRUE(std::filesystem::exists(movies.out + "/c.mp4"));
}

// What a movie asks for is no lack of memory that would end everything.
TEST(ManyMovies, GoOnBehindOneThatAsksForTooMuch) {
    const Movies movies;
    const std::string source = movies.folder / "in/a-hostile.mp4";
    ASSERT_EQ(program::Run({"ffmpeg", "-v", "error", "-f", "lavfi", "-i", "testsrc=s=64x48:d=1", "-c:v",
                            "mpeg4", source})
                  .code,
              0);
    std::string bytes = ReadFile(source);
    const std::size_t offsets = bytes.find("stco");
    ASSERT_NE(offsets, std::string::npos);
    WriteFile(source, bytes.replace(offsets + 8, 4, std::string("\x20\0\0\0", 4)));
    const Result alone = Call({"-q", source, movies.folder / "alone.mkv"});
    EXPECT_EQ(alone.code, 3) << alone.err;
    const Result result = movies.Convert();
    EXPECT_TRUE(Has(result.err, "asks for more memory")) << result.err;
    EXPECT_TRUE(std::filesystem::exists(movies.out + "/c.mp4"));
}

TEST(ManyMovies, BelieveNoLineOfTheJournalThatWasEdited) {
    const Movies movies;
    ASSERT_EQ(movies.Convert().code, 0);
    const std::string journal = movies.out + "/movieconv.journal";
    std::string text = ReadFile(journal);
    const std::size_t last = text.rfind("\"state\":\"done\",\"output\":\"c.mp4\"");
    ASSERT_NE(last, std::string::npos);
    text[text.find("\"task\":\"", last) + 8] ^= 1;
    WriteFile(journal, text + R"({"state":"do)"); // and one that was cut
    const Result again = movies.Convert();
    EXPECT_EQ(again.code, 0) << again.err;
    EXPECT_TRUE(Has(again.err, "damaged and not believed")) << again.err;
    EXPECT_TRUE(Has(again.out, "in one file")) << "c.mp4 alone had to be made again: " << again.out;
}

// A journal is nobody else's file, however it came there, and holds nothing that could do harm.
TEST(ManyMovies, AreEnteredInNothingButAJournal) {
    const Movies movies;
    std::filesystem::create_directory(movies.out);
    const std::string journal = movies.out + "/movieconv.journal";
    const std::string precious = movies.folder / "precious";
    WriteFile(precious, "precious");
    const auto refuses = [&] {
        const Result result = movies.Convert();
        EXPECT_EQ(result.code, 4) << result.err;
        EXPECT_TRUE(Has(result.err, "is no journal")) << result.err;
        std::filesystem::remove(journal);
    };
    std::filesystem::create_symlink(precious, journal);
    refuses();
    std::filesystem::create_symlink(movies.folder / "nowhere", journal);
    refuses();
    ASSERT_EQ(mkfifo(journal.c_str(), 0600), 0);
    refuses();
    std::filesystem::copy_file(precious, journal);
    EXPECT_EQ(movies.Convert().code, 4);
    EXPECT_EQ(ReadFile(journal), "precious");
    EXPECT_EQ(ReadFile(precious), "precious");
    EXPECT_FALSE(std::filesystem::exists(movies.folder / "nowhere"));

    WriteFile(journal, R"({"state":)" + std::string(1'000'000, '[') + std::string(1'000'000, ']') + "}\n");
    const Result nested = movies.Convert();
    EXPECT_EQ(nested.code, 0) << nested.err;
    EXPECT_TRUE(Has(nested.err, "1 lines of the journal")) << nested.err;
}

TEST(ManyMovies, LeaveWhatOthersPutInThePlaceOfOneThatWasBegun) {
    const Movies movies;
    ASSERT_EQ(movies.Convert().code, 0);
    const std::string journal = movies.out + "/movieconv.journal";
    std::string text = ReadFile(journal);
    const std::size_t end = text.rfind(R"({"state":"done")");
    const std::size_t name = text.find(R"("output":")", end) + 10;
    const std::string last = movies.out + "/" + text.substr(name, text.find('"', name) - name);
    text.resize(end); // as a kill leaves it before the last line
    WriteFile(journal, text);
    const Result again = movies.Convert();
    EXPECT_EQ(again.code, 0) << again.err;
    EXPECT_TRUE(Has(again.out, "in one file")) << again.out;
    WriteFile(journal, text);
    std::filesystem::remove(last);
    WriteFile(last, "precious");
    EXPECT_EQ(movies.Convert().code, 4);
    EXPECT_EQ(ReadFile(last), "precious");
}

TEST(ManyMovies, AreNotReplacedWhileTheyWait) {
    const Movies movies;
    const std::string in = movies.folder / "in";
    for (const char* name : {"b.mkv", "notes.txt"})
        std::filesystem::remove(in + "/" + name);
    WriteFile(movies.folder / "a-small.mkv", ReadFile(Short())); // what a.mkv is to become
    const Result result = Call({"--into", movies.folder.Path(), "--names", "{name}-small.mkv", "-f", "mkv",
                                "-y", in, movies.folder / "a-small.mkv"});
    EXPECT_EQ(result.code, 2) << result.err;
    EXPECT_TRUE(Has(result.err, "is one of the sources")) << result.err;
    EXPECT_TRUE(ReadFile(movies.folder / "a-small.mkv") == ReadFile(Short()));
    EXPECT_TRUE(std::filesystem::exists(movies.folder / "a-small-small.mkv"));
}

TEST(ManyMovies, OfAFolderAreFoundBesideLinksThatLeadNowhere) {
    const Movies movies;
    for (int link = 0; link < 20; ++link) // one of which the system tells last
        std::filesystem::create_symlink("nowhere", movies.folder / ("in/link" + std::to_string(link)));
    std::filesystem::create_symlink("loop", movies.folder / "in/loop");
    const Result result = movies.Convert();
    EXPECT_EQ(result.code, 0) << result.err;
    EXPECT_TRUE(Has(result.out, "in 3 files")) << result.out;
}

TEST(ManyMovies, NeedNamesOfTheirOwn) {
    const Movies movies;
    EXPECT_EQ(movies.Convert({"--names", "movieconv.journal", "-f", "mp4", "-y"}).code, 2);
    EXPECT_EQ(movies.Convert({"--names", "same.mp4"}).code, 2);
    std::filesystem::create_directory(movies.out);
    WriteFile(movies.out + "/b.mp4", "precious");
    std::filesystem::create_symlink("b.mp4", movies.out + "/a.mp4");
    EXPECT_EQ(movies.Convert({"-y"}).code, 2);
    EXPECT_EQ(ReadFile(movies.out + "/b.mp4"), "precious");
    EXPECT_EQ(Call({"--into", movies.folder / "in", movies.folder / "in"}).code, 2);
    EXPECT_EQ(Call({"--into", movies.out, "--split", "2", movies.folder / "c.mkv"}).code, 2);
    EXPECT_EQ(Call({movies.folder / "c.mkv", movies.folder / "d.mp4", movies.folder / "in/a.mkv"}).code, 2);
}

TEST(ManyMovies, TakeNoNamesFromWhatIsNone) {
    const Movies movies;
    WriteFile(movies.folder / "in/a.nfo", "about it");
    WriteFile(movies.folder / "in/a.srt", "1\n00:00:00,000 --> 00:00:01,000\nA cue\n");
    const Result result = movies.Convert();
    EXPECT_EQ(result.code, 0) << result.err;
    EXPECT_TRUE(Has(result.err, "a.nfo\" is left out") && Has(result.err, "a.srt\" is left out"))
        << result.err;
    // Photos beside the movies of a camera; an animation is none.
    const auto photo = [&](const std::string& name, const char* pictures) {
        test_movies::Ffmpeg(test_movies::Join(test_movies::Lavfi("testsrc=s=32x32:r=5:d=1"),
                                              Args{"-frames:v", pictures, movies.folder / "in/" + name}));
    };
    for (const char* name : {"a.jpg", "b.png", "gif.gif"})
        photo(name, "1");
    photo("moves.gif", "5");
    const Result photos = movies.Convert();
    EXPECT_EQ(photos.code, 0) << photos.err;
    for (const char* name : {"a.jpg", "b.png", "gif.gif"})
        EXPECT_TRUE(Has(photos.err, std::string(name) + "\" is left out: it is a single picture"))
            << photos.err;
    EXPECT_TRUE(std::filesystem::exists(movies.out + "/moves.mp4"));
    const Result named = Call({"--into", movies.out, movies.folder / "in/gif.gif"});
    EXPECT_EQ(named.code, 0) << "it was asked for by its name: " << named.err;
    EXPECT_TRUE(std::filesystem::exists(movies.out + "/gif.mp4"));
    WriteFile(movies.folder / "in/a.mka", ReadFile(Short()));
    const Result twice = movies.Convert();
    EXPECT_EQ(twice.code, 2);
    EXPECT_TRUE(Has(twice.err, "would both become")) << twice.err;
    const Result apart = movies.Convert({"--names", "{folder}-{name}{from}.{ext}"});
    EXPECT_EQ(apart.code, 0) << apart.err;
    for (const char* name : {"in-amkv.mp4", "in-amka.mp4"})
        EXPECT_TRUE(std::filesystem::exists(movies.out + "/" + name)) << name;
    EXPECT_TRUE(Has(movies.Convert({"--names", "{name}{nothing}.{ext}"}).err, "not \"{nothing}\""));
}

TEST(ManyMovies, AreNamedByWhatIsToldOfThem) {
    const Movies movies;
    const std::string source = movies.folder / "d.mkv";
    ASSERT_EQ(program::Run({"ffmpeg", "-v", "error", "-i", Short(), "-c", "copy", "-attach",
                            movies.folder / "in/notes.txt", "-metadata:s:t", "mimetype=text/plain", source})
                  .code,
              0);
    const Result json = movies.Convert({"--progress", "json", source});
    ASSERT_EQ(json.code, 0) << json.err;
    const std::regex pattern(R"re("event":"(\w+)"(?:,"number":(\d))?.*"input":".*/(\w+)\.\w+")re");
    std::map<std::string, std::set<std::string>> told; // by event
    std::set<std::string> numbers;
    for (std::sregex_iterator line(json.out.begin(), json.out.end(), pattern), end; line != end; ++line) {
        told[(*line)[1]].insert((*line)[2].str() + (*line)[3].str());
        numbers.insert((*line)[2]);
    }
    EXPECT_EQ(told["clip_opened"].size(), 4U) << json.out;
    EXPECT_EQ(told["clip_opened"], told["clip_closed"]) << json.out;
    EXPECT_EQ(numbers, (std::set<std::string>{"", "1", "2", "3", "4"})) << json.out;
    EXPECT_EQ(told["not_carried"], std::set<std::string>{"d"}) << json.out;
    EXPECT_EQ(told["warning"], std::set<std::string>{"notes"}) << json.out;

    std::filesystem::remove_all(movies.out);
    const Result text = movies.Convert({source});
    EXPECT_TRUE(Has(text.err, "not carried: \"" + source + "\": attachment")) << text.err;
}

/// The mark of a playlist does not tell what its parts are.
TEST(ManyMovies, ThatArePlaylistsAreMadeAnew) {
    const Folder folder;
    const std::string list = folder / "list.ffconcat";
    WriteFile(list, "ffconcat version 1.0\nfile part.mkv\n");
    WriteFile(folder / "part.mkv", ReadFile(Short()));
    const Args convert{"--allow-playlists", "--into", folder / "out", list};
    ASSERT_EQ(Call(convert).code, 0);
    const std::string before = ReadFile(folder / "out/list.mp4");
    WriteFile(folder / "part.mkv", ReadFile(Lasting()));
    const Result again = Call(convert);
    EXPECT_EQ(again.code, 0) << again.err;
    EXPECT_TRUE(Has(again.err, "is made anew: it was made of a playlist")) << again.err;
    EXPECT_FALSE(ReadFile(folder / "out/list.mp4") == before);
}

/// What a stop completes takes its name.
TEST(ManyMovies, AreCountedWhenTheyAreStoppedAndDoNotWorkWhileTheProgramIsSuspended) {
    constexpr double kSuspended = 3;
    const Folder folder;
    const auto begun = std::chrono::steady_clock::now();
    Running run({"--progress", "json", "--into", folder / "out", Lasting()}, false);
    ASSERT_TRUE(run.WaitFor(R"("phase":"converting".*"position_s":(0\.[1-9]|[1-9]))"));
    run.Signal(SIGSTOP);
    ASSERT_TRUE(run.WaitUntilSuspended());
    std::this_thread::sleep_for(std::chrono::duration<double>(kSuspended));
    run.Signal(SIGCONT);
    run.Signal(SIGTERM);
    const Result result = run.Finish();
    const std::chrono::duration<double> whole = std::chrono::steady_clock::now() - begun;
    EXPECT_EQ(result.code, 6) << result.err;
    EXPECT_TRUE(Has(result.out, R"("files":1)")) << result.out;
    std::smatch worked;
    const std::regex pattern(R"("event":"end".*"worked_s":([0-9.]+))");
    ASSERT_TRUE(std::regex_search(result.out, worked, pattern)) << result.out;
    EXPECT_LT(std::stod(worked[1]), whole.count() - kSuspended + 0.1) << result.out;
}

TEST(ManyMovies, LeaveNothingUnfinishedAfterKills) {
    const Folder folder;
    const std::string out = folder / "out";
    const std::string source = folder / "long.mkv";
    WriteFile(source, ReadFile(Lasting()));
    const Args convert{"--progress", "json", "--into", out, source};
    const auto kill = [&] {
        Running killed(convert, false);
        EXPECT_TRUE(killed.WaitFor(R"("event":"clip_opened")"));
        killed.Signal(SIGKILL);
        killed.Finish();
    };
    kill();
    kill();
    EXPECT_EQ(folder.Names("out"), (std::vector<std::string>{"long.mp4.part", "movieconv.journal"}));
    Running first(convert, false);
    ASSERT_TRUE(first.WaitFor(R"("event":"clip_opened")"));
    const Result second = Call(convert);
    EXPECT_EQ(second.code, kCannotWrite);
    EXPECT_TRUE(Has(second.err, "another run is working on")) << second.err;
    EXPECT_TRUE(std::filesystem::exists(out + "/long.mp4.part")) << "which the first one is writing";
    const Result result = first.Finish();
    EXPECT_EQ(result.code, 0) << result.out << result.err;
}

TEST(ManyMovies, KeepTheirJournalFromBeingALog) {
    const Movies movies;
    std::filesystem::create_directory(movies.out);
    const Result result = movies.Convert({"--log", movies.out + "/movieconv.journal"});
    EXPECT_EQ(result.code, 2);
    EXPECT_TRUE(Has(result.err, "is the journal of what is converted")) << result.err;
    EXPECT_TRUE(std::filesystem::is_empty(movies.out));
}

} // namespace
