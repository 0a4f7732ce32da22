// The output's place, the writer's word about its files, the books of them, and what follows from these.
#include "api/MovieConv.h"
#include "host/convert/FileLedger.h"
#include "host/convert/Judgement.h"
#include "host/convert/OutputCheck.h"
#include "host/convert/WriterWatch.h"
#include "tests/convert/Listener.h"
#include "tests/convert/Wanted.h"
#include "tests/support/Folder.h"
#include "tests/writer/TestSource.h"
#include "text/FileNames.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <cstdio>
#include <filesystem>
#include <string>

#include <sys/stat.h>

namespace {

namespace fs = std::filesystem;
using namespace movieconv;

TEST(OutputCheck, RefusesWhatWouldBeLost) {
    const Folder folder;
    WriteFile(folder / "there.mp4", "precious");
    WriteFile(folder / "c_07.mp4", "precious");
    fs::create_directory(folder / "folder.mp4");
    fs::create_symlink("nowhere", folder / "broken.mp4");
    fs::create_symlink("there.mp4", folder / "link.mp4");
    ASSERT_EQ(mkfifo((folder / "pipe.mp4").c_str(), 0600), 0);
    const struct {
        std::string output;
        std::optional<double> split;
        bool overwrite;
        std::optional<Category> refused;
    } cases[] = {{"new.mp4", {}, false, {}},
                 {"there.mp4", {}, false, Category::kOutput},
                 {"there.mp4", {}, true, {}},
                 {"there.mp4", 2, false, {}}, // its clips have other names
                 {"c.mp4", 2, false, Category::kOutput},
                 {"c.mp4", 2, true, {}},
                 {"c.mp4", {}, false, {}},
                 {"c", 2, false, Category::kRequest},
                 {".mp4", 2, false, Category::kRequest},
                 {"x." + std::string(19, 'e'), 2, false, Category::kRequest},
                 {"folder.mp4", {}, true, Category::kOutput},
                 {"broken.mp4", {}, true, Category::kOutput},
                 {"pipe.mp4", {}, true, Category::kOutput},
                 {"missing/new.mp4", {}, true, Category::kOutput},
                 {std::string(252, 'n') + ".mp4", {}, true, Category::kOutput},
                 {std::string(250, 'n') + ".mp4", 2, true, Category::kOutput},
                 {std::string(245, 'n') + ".mp4", 2, true, {}},
                 {std::string(245, 'n') + ".mp4", 0.1, true, Category::kOutput}, // many clips
                 {std::string(500, '/') + "clips.mp4", 2, true, Category::kRequest}};
    for (const auto& test : cases) {
        Request request = To(folder / test.output);
        request.overwrite = test.overwrite;
        request.split = test.split;
        std::optional<Category> refused;
        try {
            CheckOutput(request);
        } catch (const Failure& failure) {
            refused = failure.Kind();
        }
        EXPECT_EQ(refused, test.refused) << test.output;
    }
    for (const std::string other : {"there.mp4", "link.mp4"}) {
        Request itself = To(folder / other);
        itself.input = folder / "there.mp4";
        itself.overwrite = true;
        EXPECT_THROW(CheckOutput(itself), Failure);
    }
    EXPECT_EQ(ReadFile(folder / "there.mp4"), "precious");
}

TEST(OutputCheck, NamesTheFirstOfTheClipsThatAreThere) {
    const Folder folder;
    for (int number = 40; number > 2; --number) // a folder lists them in an order of its own
        WriteFile(folder / text::ClipName(std::string_view("c.mp4"), static_cast<std::size_t>(number)),
                  "precious");
    Request request = To(folder / "c.mp4");
    request.split = 2;
    try {
        CheckOutput(request);
        ADD_FAILURE() << "not refused";
    } catch (const Failure& failure) {
        EXPECT_NE(failure.Text().find("c_03.mp4"), std::string::npos) << failure.Text();
    }
}

TEST(OutputCheck, KnowsTheNamesOfAnOutput) {
    const Folder folder;
    Request whole = To(folder / "o.mp4");
    Request clips = whole;
    clips.split = 2;
    const struct {
        const char* name;
        bool ofWhole, ofClips;
    } cases[] = {{"o.mp4", true, true},      {"o.mp4.part", true, true},     {"o_00.mp4", false, true},
                 {"o_123.mp4", false, true}, {"o_01.mp4.part", false, true}, {"o_0.mp4", false, false},
                 {"o_x1.mp4", false, false}, {"p_01.mp4", false, false},     {"o_01.mkv", false, false}};
    for (const auto& test : cases) {
        EXPECT_EQ(IsOutput(folder / test.name, whole), test.ofWhole) << test.name;
        EXPECT_EQ(IsOutput(folder / test.name, clips), test.ofClips) << test.name;
    }
}

WriterStatus Status(const std::string& path, int32_t state, int64_t bytes, int32_t error = kWriterErrorNone) {
    WriterStatus status{};
    status.nState = state;
    status.nError = error;
    status.llBytesWritten = bytes;
    status.dVideoReceived = status.dVideoWritten = 4;
    status.llPicturesWritten = 100;
    status.dAudioReceived = status.dAudioWritten = 4;
    std::snprintf(status.szPath, sizeof status.szPath, "%s", path.c_str());
    return status;
}

/// A complete file, as it was closed.
WriterWatch::News Closed(const std::string& path, const std::string& content = "movie") {
    WriteFile(path, content);
    return {kWriterEventClosed, Status(path, kWriterFileComplete, static_cast<int64_t>(content.size())),
            IdentityOf(path)};
}

TEST(FileLedger, HoldsWhatWasClosedAgainstWhatIsThere) {
    const Folder folder;
    Listener listener;
    FileLedger ledger(listener);
    for (const std::string name : {"a", "b"}) {
        EXPECT_TRUE(ledger.Enter({kWriterEventOpened, Status(folder / name, kWriterFileWriting, 0), {}}));
        EXPECT_EQ(ledger.Finishing(), std::nullopt);
        EXPECT_TRUE(ledger.Enter(Closed(folder / name)));
    }
    EXPECT_EQ(ledger.Opened(), 2);
    EXPECT_EQ(ledger.Complete(), 2);
    EXPECT_EQ(ledger.Bytes(), 10);
    EXPECT_EQ(listener.closed, (std::vector<std::string>{folder / "a", folder / "b"}));
    EXPECT_EQ(ledger.FindMissing(), std::nullopt);
    WriteFile(folder / "other", "movie");
    fs::rename(folder / "other", folder / "a");
    EXPECT_NE(ledger.FindMissing()->Text().find("another file"), std::string::npos);
    fs::remove(folder / "a");
    EXPECT_NE(ledger.FindMissing()->Text().find("vanished"), std::string::npos);
    EXPECT_FALSE(ledger.FirstFailure());
}

TEST(FileLedger, KeepsTheFirstFailure) {
    const Folder folder;
    const struct {
        int32_t error;
        Category category;
        Reason reason;
    } cases[] = {{kWriterErrorNoSpace, Category::kNoSpace, Reason::kOther},
                 {kWriterErrorWrite, Category::kOutput, Reason::kOther},
                 {kWriterErrorCodec, Category::kRequest, Reason::kCodec},
                 {kWriterErrorInternal, Category::kInternal, Reason::kOther}};
    for (const auto& test : cases) {
        Listener listener;
        FileLedger ledger(listener);
        WriterStatus status = Status(folder / "o", kWriterFileFailed, 10, test.error);
        status.nSystemError = ENOSPC;
        std::snprintf(status.szTemporaryPath, sizeof status.szTemporaryPath, "%s", "o.part");
        EXPECT_FALSE(ledger.Enter({kWriterEventFailed, status, {}}));
        status.nError = kWriterErrorFinish;
        EXPECT_TRUE(ledger.Enter({kWriterEventClosed, status, {}})); // told once
        EXPECT_EQ(ledger.FirstFailure()->Kind(), test.category);
        EXPECT_EQ(ledger.FirstFailure()->Why(), test.reason);
        for (const std::string& part : {folder / "o", std::string("o.part")})
            EXPECT_NE(ledger.FirstFailure()->Text().find(part), std::string::npos) << part;
        EXPECT_EQ(ledger.Complete(), 0);
        status.szTemporaryPath[0] = '\0'; // it was empty
        EXPECT_TRUE(ledger.Enter({kWriterEventClosed, status, {}}));
        EXPECT_EQ(ledger.FirstFailure()->Text().find("o.part"), std::string::npos);
    }
}

TEST(FileLedger, BelievesNoFileThatIsShorterThanWhatWasSent) {
    const Folder folder;
    for (const bool sound : {false, true}) {
        Listener listener;
        FileLedger ledger(listener);
        WriterWatch::News news = Closed(folder / "o");
        if (sound)
            news.status.dAudioWritten = 3.8;
        else
            news.status.dVideoWritten = 3.8;
        EXPECT_FALSE(ledger.Enter(news));
        EXPECT_EQ(ledger.FirstFailure()->Kind(), Category::kInternal);
    }
    Listener listener;
    FileLedger ledger(listener);
    WriterWatch::News shorter = Closed(folder / "o");
    ++shorter.status.llBytesWritten;
    EXPECT_FALSE(ledger.Enter(shorter));
    EXPECT_EQ(ledger.FirstFailure()->Kind(), Category::kOutput);
}

TEST(Judgement, SuccessIsProved) {
    const Folder folder;
    Listener listener;
    FileLedger empty(listener);
    FileLedger full(listener);
    full.Enter(Closed(folder / "o"));
    FileLedger failed(listener);
    failed.Enter({kWriterEventFailed, Status(folder / "f", kWriterFileFailed, 0, kWriterErrorNoSpace), {}});
    FileLedger gone(listener);
    gone.Enter(Closed(folder / "gone"));
    fs::remove(folder / "gone");
    Request request = To(folder / "o");
    Request small = request;
    small.maxSize = 4;
    const Failure vanished(Category::kOutput, Sentence("vanished"));
    const Sentence bad("bad");
    const Sentence cut("it is cut off");
    const struct {
        const char* what;
        Evidence evidence;
        std::optional<Category> expected;
    } cases[] = {
        {"all is there", {request, full, {}, {}, {}}, {}},
        {"stopped by the user", {request, full, {}, {}, {}, true, kOutcomeStopped}, {}},
        {"stopped before anything was written", {request, empty, {}, {}, {}, true, kOutcomeStopped}, {}},
        {"stopped by nobody", {request, full, {}, {}, {}, false, kOutcomeStopped}, Category::kInternal},
        {"broken off", {request, full, vanished, {}, {}, false, kOutcomeStopped}, Category::kOutput},
        {"no memory", {request, full, {}, {}, {}, false, kOutcomeFailed}, Category::kInternal},
        {"nothing written", {request, empty, {}, {}, {}}, Category::kSource},
        {"unreadable", {request, empty, {}, bad, {}, true}, Category::kSource},
        {"read in part", {request, full, {}, bad, {}}, Category::kSource},
        {"cut off", {request, full, {}, {}, cut}, Category::kSource},
        {"cut off behind the stop", {request, full, {}, {}, cut, true, kOutcomeStopped}, {}},
        {"full disk", {request, failed, {}, bad, {}}, Category::kNoSpace},
        {"not there any more", {request, gone, {}, {}, {}}, Category::kOutput},
        {"too large", {small, full, {}, {}, {}}, Category::kOutput},
    };
    for (const auto& test : cases) {
        const std::optional<Failure> failure = FindFailure(test.evidence);
        EXPECT_EQ(failure ? std::optional(failure->Kind()) : std::nullopt, test.expected) << test.what;
        EXPECT_TRUE(!failure || !failure->Text().empty()) << test.what;
    }
}

TEST(WriterWatch, HearsItsOwnFilesOnly) {
    const Folder folder;
    Bell bell;
    const Request request = To(folder / "o.mkv");
    WriterWatch watch(request, {}, bell);
    WriterWatch other(request, {}, bell);
    TestMovie movie;
    movie.param.nReserved[kWriterSetWord] = watch.OptionSet();
    void* file = movie.Create(folder / "o.mkv");
    ASSERT_NE(file, nullptr);
    movie.WriteAll(file);
    EXPECT_EQ(watch.VanishedFile(), std::nullopt);
    ASSERT_EQ(MWCloseMediaFile(file, nullptr, nullptr), 1);
    EXPECT_EQ(watch.Bytes(), static_cast<int64_t>(fs::file_size(folder / "o.mkv")));
    std::vector<int> events;
    FileIdentity closed;
    while (const auto news = watch.Take()) {
        events.push_back(news->event);
        closed = news->identity;
    }
    ASSERT_GE(events.size(), 3u);
    EXPECT_EQ(events.front(), kWriterEventOpened);
    EXPECT_EQ(events.back(), kWriterEventClosed);
    EXPECT_EQ(closed, IdentityOf(folder / "o.mkv"));
    EXPECT_FALSE(other.Take());
    EXPECT_EQ(other.Bytes(), 0);
    EXPECT_EQ(watch.WaitsForRoom(), 0);

    file = movie.Create(folder / "p.mkv");
    fs::remove(folder / "p.mkv.part");
    EXPECT_EQ(watch.VanishedFile(), folder / "p.mkv.part");
    MWCloseMediaFile(file, nullptr, nullptr);
    EXPECT_EQ(watch.VanishedFile(), std::nullopt); // what is closed is entered in the books
}

} // namespace
