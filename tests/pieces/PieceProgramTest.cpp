// The program's plans, pieces and joins, as a farm and as people use them.
#include "host/pieces/Foreman.h"
#include "host/pieces/Joiner.h"
#include "host/pieces/PieceRequest.h"
#include "host/pieces/PieceSeal.h"
#include "host/pieces/PlanText.h"
#include "tests/pieces/ExitCodes.h"
#include "tests/pieces/Packets.h"
#include "tests/support/Folder.h"
#include "tests/support/Program.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fmt/format.h>
#include <future>
#include <string>
#include <utility>
#include <vector>

namespace {

using program::Call;
using program::Result;
using test_movies::Args;

/// Eight seconds, plain but for sound that ends early.
std::string Source() {
    return test_movies::Make("pieces.mkv",
                             test_movies::Join(test_movies::CountedPictures(8), test_movies::Beeps(7.8),
                                               Args{"-c:v", "libx264", "-preset", "ultrafast", "-g", "40",
                                                    "-bf", "2", "-c:a", "aac"}));
}

/// A plan of four pieces and the sound.
struct Planned {
    static constexpr char kOutput[] = "\xE9t\xE9.mp4"; ///< Names of files are bytes; this one is no UTF-8.
    Folder folder;
    std::string plan = folder / "movie.plan";
    std::string output = folder / kOutput;

    Planned() {
        const Result planned = Call({"--plan", plan, "--pieces", "4", Source(), output});
        EXPECT_EQ(planned.code, 0) << planned.err;
    }
    std::string Piece(int number) const { return fmt::format("{}.{:04}.piece", plan, number); }
    Result Make(int number) const { return Call({"-q", "--piece", std::to_string(number), plan}); }
    void MakeAll() const {
        for (const int number : {3, 0, 4, 1, 2}) {
            const Result made = Make(number);
            EXPECT_EQ(made.code, 0) << made.err;
        }
    }
    Result Join() const { return Call({"-q", "--join", plan}); }
};

TEST(Pieces, GiveTheSameBytesInAnyOrderAndInOneProcess) {
    const Planned farm;
    farm.MakeAll();
    // What is there already was not converted now, and has no speed.
    const Result again = Call({"--progress", "none", "--piece", "2", farm.plan});
    EXPECT_EQ(again.code, 0);
    EXPECT_EQ(again.out.find("100% done: 0:00:02.000 converted in 0:00:00.00"), 0U) << again.out;
    EXPECT_FALSE(Has(again.out, "x)")) << again.out;
    ASSERT_EQ(Call({"-q", "--join", "--keep-pieces", farm.plan}).code, 0);
    EXPECT_EQ(farm.folder.Names().size(), 7U);
    const std::string bytes = ReadFile(farm.output);
    std::filesystem::remove(farm.output);
    ASSERT_EQ(farm.Join().code, 0);
    EXPECT_EQ(farm.folder.Names(), (std::vector<std::string>{"movie.plan", Planned::kOutput}));
    EXPECT_EQ(ReadFile(farm.output), bytes);

    const std::string whole = farm.folder / "whole.mp4";
    ASSERT_EQ(Call({"-q", Source(), whole}).code, 0);
    EXPECT_EQ(packets::Difference(farm.output, whole), "");
    for (const char* jobs : {"1", "2", "5"}) {
        ASSERT_EQ(Call({"-q", "-y", "--jobs", jobs, "--pieces", "4", Source(), whole}).code, 0);
        EXPECT_EQ(ReadFile(whole), bytes) << jobs << " pieces at once";
    }
    EXPECT_EQ(farm.folder.Names(), (std::vector<std::string>{"movie.plan", "whole.mp4", Planned::kOutput}));
}

TEST(Pieces, ThatDoNotBelongTogetherAreRefusedByTheirNames) {
    const Planned farm;
    farm.MakeAll();
    const auto refuses = [&](int number, const char* why) {
        const Result joined = farm.Join();
        EXPECT_EQ(joined.code, kCannotRead);
        EXPECT_TRUE(Has(joined.err, fmt::format("piece {} (", number)) && Has(joined.err, why)) << joined.err;
        EXPECT_FALSE(std::filesystem::exists(farm.output));
    };
    const std::string second = ReadFile(farm.Piece(1));
    std::filesystem::remove(farm.Piece(1));
    refuses(1, "is missing");
    WriteFile(farm.Piece(1), second.substr(0, second.size() / 2));
    refuses(1, "is cut off");
    WriteFile(farm.Piece(1), ReadFile(farm.Piece(2)));
    refuses(1, "is another piece under its name");
    std::string changed = second;
    changed[changed.size() / 2] ^= 1;
    WriteFile(farm.Piece(1), changed);
    refuses(1, "was changed since it was made");
    const Planned other;
    ASSERT_EQ(other.Make(1).code, 0);
    WriteFile(farm.Piece(1), ReadFile(other.Piece(1)));
    refuses(1, "belongs to another plan");
    ASSERT_EQ(farm.Make(1).code, 0) << "a piece that is none is made again";
    EXPECT_EQ(farm.Join().code, 0);
}

TEST(Pieces, ArePlannedAgainOnlyForTheSameConversion) {
    const Planned farm;
    const std::string plan = ReadFile(farm.plan);
    const auto again = [&](const Args& options) {
        return Call(test_movies::Join(Args{"--plan", farm.plan, "--pieces", "4"}, options,
                                      Args{Source(), farm.output}));
    };
    EXPECT_EQ(again({}).code, 0);
    const Result other = again({"--size", "80x60"});
    EXPECT_EQ(other.code, kCannotWrite);
    EXPECT_TRUE(Has(other.err, "settings size was nothing, now [80,60]")) << other.err;
    EXPECT_EQ(ReadFile(farm.plan), plan);
    EXPECT_EQ(again({"--size", "80x60", "-y"}).code, 0);
    EXPECT_NE(ReadFile(farm.plan), plan);
    WriteFile(farm.plan, "precious");
    EXPECT_EQ(again({}).code, kCannotWrite);
    EXPECT_EQ(ReadFile(farm.plan), "precious");
}

/// Files of subtitles belong to the plan: named from anywhere, and noticed when they change.
TEST(Pieces, HaveTheSubtitlesThatWerePlanned) {
    const Planned farm;
    const std::string texts = farm.folder / "texts.srt";
    const std::string cue = "1\n00:00:01,000 --> 00:00:03,000\nA cue\n";
    WriteFile(texts, cue);
    const std::string relative = std::filesystem::relative(texts).string();
    const auto plan = [&](const char* option, const std::string& name) {
        return Call({"-q", "-y", "--plan", farm.plan, "--pieces", "4", option, name, Source(), farm.output});
    };
    for (const char* option : {"--subtitle-file", "--burn-subtitles"}) {
        ASSERT_EQ(plan(option, relative).code, 0);
        EXPECT_TRUE(Has(ReadFile(farm.plan), "\"" + texts + "\"")) << "named from anywhere";
        const Result made = farm.Make(4);
        EXPECT_EQ(made.code, 0) << made.err;
        WriteFile(texts, cue + "\n");
        const Result changed = farm.Make(0);
        EXPECT_EQ(changed.code, kCannotRead);
        EXPECT_TRUE(Has(changed.err, "is not the file of subtitles that was planned with")) << changed.err;
        EXPECT_EQ(plan(option, farm.folder / "nowhere.srt").code, kUsage);
    }
}

TEST(Pieces, ArePlannedOfNothingThatCannotBeReadTwice) {
    const Folder folder;
    const std::string plan = folder / "movie.plan";
    const auto refuses = [&](const Args& arguments, int code, const char* why) {
        const Result result = Call(test_movies::Join(Args{"-q", "--plan", plan}, arguments));
        EXPECT_EQ(result.code, code) << result.err;
        EXPECT_TRUE(Has(result.err, why)) << result.err;
        EXPECT_FALSE(std::filesystem::exists(plan));
    };
    const std::string pipe = folder / "pipe.mkv";
    ASSERT_EQ(mkfifo(pipe.c_str(), 0600), 0);
    refuses({pipe, folder / "out.mp4"}, kCannotRead, "cannot be read once for every piece");
    const std::string bare = test_movies::Make(
        "bare.h264", test_movies::Join(test_movies::CountedPictures(2), Args{"-c:v", "libx264", "-bf", "2"}));
    refuses({bare, folder / "out.mp4"}, kCannotRead, "only be converted undivided");
    const std::string cut = folder / "cut.mkv";
    WriteFile(cut, ReadFile(Source()).substr(0, ReadFile(Source()).size() / 2));
    refuses({cut, folder / "out.mp4"}, kCannotRead, "it is cut off");
    refuses({Source(), folder / "out.m4a"}, kUsage, "sound alone");
    refuses({Source(), folder / "out.gif"}, kUsage, "a GIF");
    refuses({"--split", "2", Source(), folder / "out.mp4"}, kUsage, "clips");
    refuses({"--pieces", "1000000", Source(), folder / "out.mp4"}, kUsage, "--pieces");
    refuses({"--pieces", "2", "--piece-length", "3", Source(), folder / "out.mp4"}, kUsage, "exclude");
    refuses({"--piece-length", "0.0001", Source(), folder / "out.mp4"}, kUsage, "0.001");
}

TEST(Pieces, TellWhenThePlanOrTheSourceWasChanged) {
    const Planned farm;
    const std::string plan = ReadFile(farm.plan);
    const auto refuses = [&](const std::string& text, const char* why) {
        WriteFile(farm.plan, text);
        const Result result = farm.Make(0);
        EXPECT_EQ(result.code, kUsage) << result.err;
        EXPECT_TRUE(Has(result.err, why)) << result.err;
        EXPECT_EQ(farm.folder.Names(), (std::vector<std::string>{"movie.plan"}));
    };
    const auto with = [&](const std::string& what, const std::string& instead) {
        std::string text = plan;
        const std::size_t at = text.find(what);
        EXPECT_NE(at, std::string::npos) << what;
        return text.replace(at, what.size(), instead);
    };
    refuses(plan.substr(0, plan.size() / 2), "only a part");
    refuses(with("\"pictures\": 50", "\"pictures\": 51"), "was changed");
    refuses(with("\"pictures\": 50", "\"pictures\": -1"), "not a number");
    refuses(with("\"hex\": \"", "\"hex\": \"2e2e"), "absolute path");
    refuses(with("\"hex\": \"", "\"hex\": \"2"), "no name in hexadecimal");
    refuses(with("\"path\": \"/", "\"path\": \""), "absolute path");
    refuses(with("\"version\": 1", "\"version\": 2"), "version 2");
    std::string tooMany;
    for (int piece = 0; piece < 10001; ++piece)
        tooMany += R"({"kind":"rest"},)";
    refuses(with("\"pieces\": [", "\"pieces\": [" + tooMany), "not a list of 2 to 10001");
    refuses("{}", "not a plan");
    WriteFile(farm.plan, plan);
    for (const char* number : {"5", "-1", "99999999999"})
        EXPECT_EQ(Call({"-q", "--piece", number, farm.plan}).code, kUsage);

    const std::string source = farm.folder / "source.mkv";
    WriteFile(source, ReadFile(Source()));
    ASSERT_EQ(Call({"-q", "-y", "--plan", farm.plan, "--pieces", "4", source, farm.output}).code, 0);
    ASSERT_EQ(farm.Make(0).code, 0);
    WriteFile(source, ReadFile(Source()) + "more");
    EXPECT_EQ(farm.Make(1).code, kCannotRead);
    std::filesystem::resize_file(source, 5000);
    EXPECT_EQ(farm.Make(1).code, kCannotRead);
    EXPECT_EQ(farm.Join().code, kCannotRead);
}

TEST(Pieces, NeverReplaceAnOutputWithoutLeave) {
    const Planned farm;
    farm.MakeAll();
    WriteFile(farm.output, "precious");
    EXPECT_EQ(farm.Join().code, kCannotWrite);
    EXPECT_EQ(ReadFile(farm.output), "precious");
    EXPECT_EQ(Call({"-q", "-y", "--join", farm.plan}).code, 0);
    EXPECT_NE(ReadFile(farm.output), "precious");

    const std::string other = farm.folder / "other.mp4";
    WriteFile(other + ".plan", "precious");
    for (const char* leave : {"-q", "-y", "--resume"}) { // which is one to replace the output
        EXPECT_EQ(Call({"-q", leave, "--jobs", "1", Source(), other}).code, kCannotWrite) << leave;
        EXPECT_EQ(ReadFile(other + ".plan"), "precious");
    }
}

TEST(Pieces, AreJoinedWhereTheNameLeadsAlsoBehindALink) {
    const Folder folder;
    std::filesystem::create_directories(folder / "archive/deep");
    std::filesystem::create_directory(folder / "here");
    std::filesystem::create_symlink("../archive/deep", folder / "here/link");
    WriteFile(folder / "here/out.mp4", "precious");
    const Result result = Call({"-q", "-y", "--jobs", "1", Source(), folder / "here/link/../out.mp4"});
    EXPECT_EQ(result.code, 0) << result.err;
    EXPECT_EQ(ReadFile(folder / "here/out.mp4"), "precious");
    EXPECT_EQ(folder.Names("archive"), (std::vector<std::string>{"deep", "out.mp4"}));
}

// Names that conversions in pieces and clips use for themselves.
TEST(Pieces, LeaveTheirSourceWhateverItIsCalled) {
    const Folder folder;
    const std::string output = folder / "out.mp4";
    const struct {
        const char* name;
        Args options;
        int code;
    } cases[] = {{".part", {"--jobs", "1", "--resume"}, 0},
                 {".plan", {"--jobs", "1", "-y"}, kCannotWrite},
                 {".plan.0000.piece", {"--jobs", "1", "-y"}, kUsage},
                 {".plan.making-desk-7", {"--jobs", "1", "-y"}, 0},
                 {".clips", {"--split", "4", "-y"}, kCannotWrite}};
    for (const auto& test : cases) {
        const std::string source = output + test.name;
        WriteFile(source, ReadFile(Source()));
        const Result result = Call(test_movies::Join(Args{"-q", source, output}, test.options));
        EXPECT_EQ(result.code, test.code) << test.name << result.err;
        EXPECT_TRUE(ReadFile(source) == ReadFile(Source())) << test.name;
        std::filesystem::remove(source);
        std::filesystem::remove(output);
    }
    EXPECT_TRUE(folder.Names().empty());
}

/// What else stands there under names that conversions in pieces use, or nearly so. Only what they made is
/// theirs.
TEST(Pieces, RemoveNothingButWhatTheyMade) {
    const Planned farm;
    farm.MakeAll();
    const std::string output = farm.folder / "out.mp4";
    const std::string cue = "1\n00:00:01,000 --> 00:00:03,000\nA cue\n";
    const struct {
        const char* name;
        std::string content;
        int code;
        bool stays;
    } cases[] = {{".0000.piece", cue, kUsage, true}, // which is read
                 {".0001.piece", cue, kCannotWrite, true},
                 {".0001.piece", ReadFile(farm.Piece(1)).substr(0, 5000), 0, false},
                 {".0001.piece", "", 0, false},
                 {".0001.piece.mine", ReadFile(farm.Piece(1)), 0, true},
                 {".00001.piece", ReadFile(farm.Piece(1)), 0, true},
                 {".0001.piece.making-desk-7.part2", ReadFile(farm.Piece(1)), 0, false},
                 {".0001.piece.making-desk-7", "MCP", 0, false},
                 {".0001.piece.making-of-2024-1", ReadFile(Source()), 0, true},
                 {".0001.piece.making-desk-7.part.mine", ReadFile(farm.Piece(1)), 0, true},
                 {".making-of-2024-1", ReadFile(Source()), 0, true},
                 {".making-desk-7", ReadFile(farm.plan).substr(0, 100), 0, false}};
    for (const auto& test : cases) {
        const std::string file = output + ".plan" + test.name;
        WriteFile(file, test.content);
        Args options{"-q", "--jobs", "1", Source(), output};
        if (test.code == kUsage)
            options.insert(options.end(), {"--subtitle-file", file});
        const Result result = Call(options);
        EXPECT_EQ(result.code, test.code) << test.name << result.err;
        EXPECT_EQ(std::filesystem::exists(file), test.stays) << test.name;
        EXPECT_TRUE(ReadFile(file) == (test.stays ? test.content : "")) << test.name;
        std::filesystem::remove(file);
        std::filesystem::remove(output);
    }
    WriteFile(farm.Piece(1), "precious");
    EXPECT_EQ(farm.Make(1).code, kCannotWrite);
    EXPECT_EQ(ReadFile(farm.Piece(1)), "precious");
}

// Values that are nested very deep take the stack of whoever copies or prints them.
TEST(Pieces, OfAPlanThatIsNestedWithoutEndAreRefused) {
    const Folder folder;
    const std::string plan = folder / "movie.plan";
    WriteFile(plan, "{\"version\":" + std::string(1'000'000, '[') + std::string(1'000'000, ']') + "}");
    const Result result = Call({"--piece", "0", plan});
    EXPECT_EQ(result.code, kUsage) << result.err;
    EXPECT_TRUE(Has(result.err, "is nested too deep")) << result.err;
}

TEST(Pieces, ResumeOnlyTheSameConversionAndTellWhatDiffers) {
    const Planned farm;
    const std::string plan = farm.output + ".plan";
    ASSERT_EQ(Call({"-q", "--plan", plan, "--pieces", "4", Source(), farm.output}).code, 0);
    ASSERT_EQ(Call({"-q", "--piece", "0", plan}).code, 0);
    const Args options{"--jobs", "1", "--pieces", "4"};
    const Result other =
        Call(test_movies::Join(options, Args{"--resume", "--size", "80x60", Source(), farm.output}));
    EXPECT_EQ(other.code, kUsage);
    EXPECT_TRUE(Has(other.err, "settings size was nothing, now [80,60]")) << other.err;
    const Result unasked = Call(test_movies::Join(options, Args{Source(), farm.output}));
    EXPECT_EQ(unasked.code, kCannotWrite);
    EXPECT_TRUE(Has(unasked.err, "1 of 5 pieces are left") && Has(unasked.err, "--resume")) << unasked.err;
    const Result resumed =
        Call(test_movies::Join(options, Args{"--resume", "--keep-pieces", Source(), farm.output}));
    EXPECT_EQ(resumed.code, 0);
    EXPECT_TRUE(Has(resumed.err, "1 of 5 pieces are made already")) << resumed.err;
    const Result anew = Call(test_movies::Join(options, Args{"-y", Source(), farm.output}));
    EXPECT_EQ(anew.code, 0);
    EXPECT_TRUE(Has(anew.err, "with 5 pieces was left of an earlier run")) << anew.err;
    EXPECT_FALSE(std::filesystem::exists(plan));
}

TEST(Pieces, AreNeitherCheckedNorJoinedDuringAPause) {
    struct : movieconv::Observer {
        void Ended(const movieconv::Verdict& /*news*/) override {}
    } nobody;
    constexpr int kQuestions = 4;
    constexpr double kChecked = 0.3;
    const Planned farm;
    farm.MakeAll();
    movieconv::Bell bell;
    int checking = 0;
    int joining = 0;
    const auto pause = [&](const movieconv::Joining& latest) {
        if (latest.share == 0)
            bell.Ring(); // as what ends a pause does
        const bool isPaused = latest.share == 0          ? ++checking <= kQuestions
                              : latest.share >= kChecked ? ++joining <= kQuestions
                                                         : false;
        return isPaused ? movieconv::Going::kPaused : movieconv::Going::kOn;
    };
    const movieconv::Verdict verdict =
        movieconv::JoinPieces(movieconv::ReadPlan(farm.plan), farm.plan, {}, nobody, bell, pause);
    EXPECT_EQ(verdict.outcome, movieconv::Outcome::kDone);
    EXPECT_GT(checking, kQuestions);
    EXPECT_GT(joining, kQuestions) << "it did not wait";
}

TEST(Pieces, ThatAreReadAreLeftAloneInTheMiddle) {
    const Planned farm;
    ASSERT_EQ(farm.Make(0).code, 0);
    const movieconv::Plan plan = movieconv::ReadPlan(farm.plan);
    EXPECT_EQ(movieconv::FaultOf(plan, farm.plan, 0, [] { return true; }), "");
    EXPECT_EQ(movieconv::FaultOf(plan, farm.plan, 0, [] { return false; }), std::nullopt);
}

/// Hears of a pause and of what is made already.
struct Waiting : movieconv::Observer {
    std::promise<void> paused;
    bool told = false;
    std::string warnings;

    void Progressed(const movieconv::Progress& news) override {
        if (news.phase == movieconv::Phase::kPaused && !std::exchange(told, true))
            paused.set_value();
    }
    void Warned(const movieconv::Warning& news) override { warnings += news.text.Text() + "\n"; }
    void Ended(const movieconv::Verdict& /*news*/) override {}
};

TEST(Pieces, OfAnEarlierRunAreNotReadDuringAPause) {
    const Planned farm;
    movieconv::PieceOrder order;
    order.planPath = farm.output + ".plan";
    ASSERT_EQ(Call({"-q", "--plan", order.planPath, "--pieces", "4", Source(), farm.output}).code, 0);
    for (const char* number : {"0", "1"})
        ASSERT_EQ(Call({"-q", "--piece", number, order.planPath}).code, 0);
    order.request = movieconv::WholeRequest(movieconv::ReadPlan(order.planPath));
    order.division.pieces = 4;
    order.resume = true;
    Waiting observer;
    movieconv::Foreman foreman(order, observer, {});
    foreman.Pause();
    foreman.Start();
    observer.paused.get_future().wait();
    std::filesystem::remove(fmt::format("{}.{:04}.piece", order.planPath, 0)); // the last one to be read
    foreman.Resume();
    foreman.Wait();
    ASSERT_NE(foreman.Result(), nullptr);
    EXPECT_EQ(foreman.Result()->outcome, movieconv::Outcome::kDone);
    EXPECT_TRUE(Has(observer.warnings, "1 of 5 pieces are made already")) << observer.warnings;
}

TEST(Pieces, CostNothingWhereThereIsOne) {
    const Folder folder;
    const Result result = Call({"--jobs", "1", "--pieces", "1", Source(), folder / "out.mp4"});
    EXPECT_EQ(result.code, 0) << result.err;
    EXPECT_FALSE(Has(result.err, "the bit rate begins anew")) << result.err;
}

/// The files that pieces are made in have longer names than the output.
TEST(Pieces, OfOutputsWithLongNamesAreRefusedBeforeAnythingIsRead) {
    const Folder folder;
    for (const std::size_t length : {std::size_t{247}, std::size_t{225}}) {
        const std::string output = folder / (std::string(length, 'n') + ".mp4");
        const Result result = Call({"-q", "--jobs", "1", Source(), output});
        EXPECT_EQ(result.code, kCannotWrite) << result.err;
        EXPECT_TRUE(Has(result.err, "is too long for a conversion in pieces")) << result.err;
        EXPECT_TRUE(folder.Names().empty());
    }
}

TEST(Pieces, TellWhatAllOfThemLoseOnce) {
    const Folder folder;
    const std::string source = test_movies::Make(
        "interlaced-pieces.mkv", test_movies::Join(test_movies::CountedPictures(4),
                                                   Args{"-vf", "setfield=tff", "-c:v", "libx264", "-flags",
                                                        "+ilme+ildct", "-g", "10", "-bf", "0"}));
    const Result result =
        Call({"--progress", "none", "--jobs", "2", "--pieces", "4", source, folder / "o.mp4"});
    EXPECT_EQ(result.code, 0) << result.err;
    const std::string told = "interlaced pictures were made progressive";
    const std::size_t first = result.err.find(told);
    ASSERT_NE(first, std::string::npos) << result.err;
    EXPECT_EQ(result.err.find(told, first + 1), std::string::npos) << result.err;
}

TEST(Pieces, AreNamedWithWhatIsDamagedInThem) {
    const Folder folder;
    std::string bytes = ReadFile(test_movies::Make(
        "damageable.mp4",
        test_movies::Join(test_movies::CountedPictures(4), Args{"-c:v", "mpeg4", "-q:v", "2", "-g", "5"})));
    const std::size_t size = bytes.size();
    for (const std::size_t at : {size / 4, size * 3 / 4})
        bytes.replace(at, size / 20, size / 20, '\xFF');
    WriteFile(folder / "in.mp4", bytes);
    const Result result =
        Call({"--progress", "none", "--jobs", "2", "--pieces", "2", folder / "in.mp4", folder / "o.mp4"});
    EXPECT_EQ(result.code, 0) << result.err;
    for (const char* piece : {"in piece 0: \"", "in piece 1: \""})
        EXPECT_TRUE(Has(result.err, piece)) << result.err;
}

TEST(Pieces, TellWhatIsLeftOnceTheyHaveStarted) {
    const Planned farm;
    ASSERT_EQ(Call({"-q", "--plan", farm.output + ".plan", "--pieces", "2", Source(), farm.output}).code, 0);
    const Result result =
        Call({"--progress", "json", "--jobs", "1", "--pieces", "2", "-y", Source(), farm.output});
    EXPECT_EQ(result.code, 0);
    EXPECT_TRUE(Has(result.out, "was left of an earlier run")) << result.out;
    EXPECT_TRUE(Has(result.out.substr(0, result.out.find('\n')), R"("event":"start")")) << result.out;
}

} // namespace
