// Disks that fail: at every write, at the sync, at the rename. Nothing is presented as complete, what was
// written can be played, and nobody waits for ever.
#include "MovieReader.h"
#include "tests/support/Folder.h"
#include "writer/MediaFile.h"
#include "writer/OutputFile.h"
#include "writer/StatusBoard.h"

#include <gtest/gtest.h>

#include <atomic>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <memory>
#include <string>
#include <thread>
#include <utility>
#include <vector>

namespace {

/// When and how the disk fails; counts what was asked of it.
struct Faults {
    int failingWrite = -1; ///< The write with this number, from 0, and all later ones.
    int writeError = ENOSPC;
    int syncError = 0;
    int renameError = 0;
    std::atomic<int> writes{0};
};

class FaultyFile final : public writer::ByteFile {
public:
    FaultyFile(std::unique_ptr<writer::ByteFile> file, Faults& faults)
        : file_(std::move(file)), faults_(faults) {}

    int64_t Write(const uint8_t* data, int64_t size) override {
        const int number = faults_.writes++;
        if (faults_.failingWrite < 0 || number < faults_.failingWrite)
            return file_->Write(data, size);
        // A full disk takes what still fits.
        if (number == faults_.failingWrite && size > 1)
            return file_->Write(data, size / 2);
        return -faults_.writeError;
    }
    int64_t Read(uint8_t* data, int64_t size) override { return file_->Read(data, size); }
    int64_t Seek(int64_t offset, int whence) override { return file_->Seek(offset, whence); }
    int64_t Truncate(int64_t size) override { return file_->Truncate(size); }
    int64_t Sync() override { return faults_.syncError != 0 ? -faults_.syncError : file_->Sync(); }

private:
    std::unique_ptr<writer::ByteFile> file_;
    Faults& faults_;
};

class FaultyFiles final : public writer::FileSystem {
public:
    explicit FaultyFiles(Faults& faults) : faults_(faults) {}

    std::unique_ptr<writer::ByteFile> Create(const std::string& path, int& error) override {
        std::unique_ptr<writer::ByteFile> file = writer::SystemFiles().Create(path, error);
        return file ? std::make_unique<FaultyFile>(std::move(file), faults_) : nullptr;
    }
    int Rename(const std::string& from, const std::string& to, bool replace) override {
        return faults_.renameError != 0 ? faults_.renameError
                                        : writer::SystemFiles().Rename(from, to, replace);
    }
    int Remove(const std::string& path) override { return writer::SystemFiles().Remove(path); }
    bool IsMissing(const std::string& path) override { return writer::SystemFiles().IsMissing(path); }
    int SyncFolder(const std::string& path) override { return writer::SystemFiles().SyncFolder(path); }

private:
    Faults& faults_;
};

struct Outcome {
    bool created = false;
    bool complete = false;
    WriterStatus status{};
};

class Fault : public testing::Test {
protected:
    Fault() {
        movie_.pictures = 100;
        movie_.soundSeconds = 4;
        movie_.param.nVideoBitrate = 2'000'000;
    }
    ~Fault() override { MWSetWriterOptions(nullptr); }

    Outcome Run(Faults& faults) {
        FaultyFiles files(faults);
        const VideoFormat video = movie_.Video();
        const AudioFormat audio = movie_.Audio();
        const auto record = writer::StatusBoard::Instance().Open(path_);
        Outcome outcome;
        try {
            auto file =
                std::make_unique<writer::MediaFile>(path_, movie_.param, &video, &audio, record, files);
            outcome.created = true;
            movie_.WriteAll(file.get());
            outcome.complete = file->Close();
        } catch (const writer::WriterFailure& failure) {
            record->Fail(failure);
        }
        outcome.status = record->Snapshot();
        return outcome;
    }

    /// Writes of a whole file without any fault.
    int CountWrites() {
        Faults faults;
        EXPECT_TRUE(Run(faults).complete);
        return faults.writes;
    }

    static void ExpectPlayablePart(const Outcome& outcome) {
        const std::string part = outcome.status.szTemporaryPath;
        ASSERT_FALSE(part.empty());
        const ReadMovie read = ReadMovieFile(part);
        if (outcome.status.llBytesWritten < 100'000 && read.pictures.empty())
            return; // Not even the first fragment was whole.
        EXPECT_TRUE(read.readable);
        EXPECT_GT(read.pictures.size(), 10U);
        EXPECT_LT(read.pictures.size(), 101U);
    }

    Folder folder_;
    std::string path_ = folder_ / "movie";
    TestMovie movie_;
};

struct Disk {
    const char* name;
    uint32_t format;
    int error;
};

class FaultIn : public Fault, public testing::WithParamInterface<Disk> {};

TEST_P(FaultIn, EveryWriteIsToldAndLeavesAPlayablePart) {
    movie_.param.fccFileFormat = GetParam().format;
    movie_.param.fccAudio = FourCC("MP3 ");
    const int writes = CountWrites();
    ASSERT_GT(writes, 1);
    for (int number = 0; number < writes; ++number) {
        SCOPED_TRACE("write " + std::to_string(number));
        WriteFile(path_, "earlier");
        Faults faults;
        faults.failingWrite = number;
        faults.writeError = GetParam().error;
        const Outcome outcome = Run(faults);
        if (outcome.complete) {
            // The data was whole in the temporary file, only its tidier form found no room.
            EXPECT_EQ(ReadMovieFile(path_).pictures.size(), 100U);
            EXPECT_EQ(folder_.Names(), std::vector<std::string>{"movie"});
            continue;
        }
        EXPECT_EQ(ReadFile(path_), "earlier");
        EXPECT_EQ(outcome.status.nError,
                  GetParam().error == ENOSPC ? kWriterErrorNoSpace : kWriterErrorWrite);
        EXPECT_EQ(outcome.status.nSystemError, GetParam().error);
        EXPECT_NE(std::string(outcome.status.szWhat).find(std::strerror(GetParam().error)),
                  std::string::npos);
        if (outcome.created) {
            EXPECT_EQ(outcome.status.nState, kWriterFileFailed);
            ExpectPlayablePart(outcome);
            std::filesystem::remove(outcome.status.szTemporaryPath);
        }
        EXPECT_EQ(folder_.Names(), std::vector<std::string>{"movie"});
    }
}

INSTANTIATE_TEST_SUITE_P(
    Disks, FaultIn,
    testing::Values(Disk{"FullMp4", FourCC("MP4 "), ENOSPC}, Disk{"FullMkv", FourCC("MKV "), ENOSPC},
                    Disk{"FullAvi", FourCC("AVI "), ENOSPC}, Disk{"FullTs", FourCC("TS  "), ENOSPC},
                    Disk{"BrokenMp4", FourCC("MP4 "), EIO}, Disk{"BrokenMkv", FourCC("MKV "), EIO},
                    Disk{"BarredMp4", FourCC("MP4 "), EACCES}, Disk{"BarredAvi", FourCC("AVI "), EACCES}),
    [](const auto& info) { return info.param.name; });

TEST_F(Fault, SyncAndRenameKeepTheDataUnderItsTemporaryName) {
    for (int Faults::*where : {&Faults::syncError, &Faults::renameError}) {
        Faults faults;
        faults.*where = EIO;
        const Outcome outcome = Run(faults);
        EXPECT_FALSE(outcome.complete);
        EXPECT_EQ(outcome.status.nError, kWriterErrorFinish);
        EXPECT_EQ(outcome.status.nSystemError, EIO);
        EXPECT_EQ(ReadMovieFile(outcome.status.szTemporaryPath).pictures.size(), 100U);
        EXPECT_FALSE(std::filesystem::exists(path_));
        EXPECT_EQ(folder_.Names().size(), 1U);
        std::filesystem::remove(outcome.status.szTemporaryPath);
    }
}

TEST_F(Fault, APartialFileIsRemovedWhenTheHostWantsThat) {
    WriterOptions options{};
    options.bRemovePartial = 1;
    MWSetWriterOptions(&options);
    Faults faults;
    faults.failingWrite = 3;
    const Outcome outcome = Run(faults);
    EXPECT_FALSE(outcome.complete);
    EXPECT_EQ(std::string(outcome.status.szTemporaryPath), "");
    EXPECT_TRUE(folder_.Names().empty());
}

TEST_F(Fault, AFullDiskCanBeWaitedFor) {
    struct Host {
        Faults* faults;
        int asked;
    };
    Faults faults;
    faults.failingWrite = 3;
    Host host{&faults, 0};
    WriterOptions options{};
    options.pContext = &host;
    options.pfnFullDisk = [](void* context, const WriterStatus* status) {
        auto* self = static_cast<Host*>(context);
        EXPECT_NE(std::string(status->szTemporaryPath), "");
        if (++self->asked == 3)
            self->faults->failingWrite = -1; // There is room again.
        return 1;
    };
    MWSetWriterOptions(&options);
    EXPECT_TRUE(Run(faults).complete);
    EXPECT_EQ(host.asked, 3);
    EXPECT_EQ(ReadMovieFile(path_).pictures.size(), 100U);
}

TEST_F(Fault, TheListenerHearsOfItOnceWhileTheConversionGoesOn) {
    std::vector<int> events;
    WriterOptions options{};
    options.pContext = &events;
    options.pfnListener = [](void* context, int event, const WriterStatus*) {
        if (event != kWriterEventFinishing)
            static_cast<std::vector<int>*>(context)->push_back(event);
    };
    MWSetWriterOptions(&options);
    Faults faults;
    faults.failingWrite = 2;
    faults.writeError = EIO;
    const Outcome outcome = Run(faults);
    EXPECT_EQ(outcome.status.nError, kWriterErrorWrite);
    EXPECT_EQ(events, (std::vector<int>{kWriterEventFailed, kWriterEventClosed}));
}

TEST_F(Fault, NeitherFilesNorThreadsAreLeftBehind) {
    movie_.pictures = 10;
    movie_.soundSeconds = 0.4;
    const auto runAll = [&] {
        for (const int failing : {-1, 0, 1}) {
            Faults faults;
            faults.failingWrite = failing;
            Run(faults);
        }
        MWCloseMediaFile(movie_.Create(folder_ / "no/such/folder/movie"), nullptr, nullptr);
    };
    runAll();
    const int64_t descriptors = CountEntries("/proc/self/fd");
    const int64_t threads = CountEntries("/proc/self/task");
    for (int round = 0; round < 5; ++round)
        runAll();
    EXPECT_EQ(CountEntries("/proc/self/fd"), descriptors);
    EXPECT_EQ(CountEntries("/proc/self/task"), threads);
}

} // namespace
