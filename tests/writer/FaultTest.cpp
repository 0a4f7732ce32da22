// Disks that fail: at every write, at the sync, at the rename. Nothing is presented as complete, what was
// written can be played, and nobody waits for ever.
#include "MovieReader.h"
#include "tests/support/Folder.h"
#include "tests/support/Process.h"
#include "writer/FileSystem.h"
#include "writer/MediaFile.h"
#include "writer/OptionSets.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <fcntl.h>
#include <filesystem>
#include <memory>
#include <string>
#include <sys/syscall.h>
#include <unistd.h>
#include <utility>
#include <vector>

namespace {

/// What a file system refuses: that of the tests has it all.
int g_exclusiveRenameError = 0;
int g_unlinkError = 0;

} // namespace

extern "C" int renameat2(int /*fromFolder*/, const char* from, int /*toFolder*/, const char* to,
                         unsigned flags) noexcept {
    errno = g_exclusiveRenameError;
    return errno != 0 ? -1 : static_cast<int>(syscall(SYS_renameat2, AT_FDCWD, from, AT_FDCWD, to, flags));
}

extern "C" int unlink(const char* path) noexcept {
    errno = g_unlinkError;
    return errno != 0 ? -1 : static_cast<int>(syscall(SYS_unlinkat, AT_FDCWD, path, 0));
}

namespace {

/// When and how the disk fails; counts what was asked of it.
struct Faults {
    int failingWrite = -1; ///< The write with this number, from 0, and all later ones.
    /// Where nothing fails yet, the first write that it holds of becomes that one: how the packets fall into
    /// writes depends on the threads, so none at the end has a number.
    bool (*failsAt)(const uint8_t* data, int64_t size) = nullptr;
    int writeError = ENOSPC;
    int syncError = 0; ///< Once: a system that has told it takes the data for written.
    int renameError = 0;
    std::atomic<int> writes{0};
};

class FaultyFile final : public writer::ByteFile {
public:
    FaultyFile(std::unique_ptr<writer::ByteFile> file, Faults& faults)
        : file_(std::move(file)), faults_(faults) {}

    int64_t Write(const uint8_t* data, int64_t size) override {
        const int number = faults_.writes++;
        constexpr int kHeaderWrites = 3; // at most
        if (faults_.failingWrite < 0 && number >= kHeaderWrites && faults_.failsAt &&
            faults_.failsAt(data, size))
            faults_.failingWrite = number;
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
    int64_t Sync() override {
        const int error = std::exchange(faults_.syncError, 0);
        return error != 0 ? -error : file_->Sync();
    }

private:
    std::unique_ptr<writer::ByteFile> file_;
    Faults& faults_;
};

class FaultyFiles final : public writer::FileSystem {
public:
    explicit FaultyFiles(Faults& faults) : faults_(faults) {}

    std::unique_ptr<writer::ByteFile> Create(const std::string& path, const std::string& like,
                                             int& error) override {
        std::unique_ptr<writer::ByteFile> file = writer::SystemFiles().Create(path, like, error);
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

class Fault : public testing::Test {
protected:
    Fault() {
        movie_.pictures = 100;
        movie_.soundSeconds = 4;
        movie_.param.nVideoBitrate = 2'000'000;
        options_.pContext = this;
        options_.pfnListener = [](void* context, int event, const WriterStatus*) {
            if (event != kWriterEventFinishing)
                static_cast<Fault*>(context)->events_.push_back(event);
        };
    }
    /// Writes the movie and gives the last status of the file.
    WriterStatus Run() {
        writer::OptionSet set(kWriterDefaultSet, options_);
        set.ChangeExtras([this](writer::Extras& extras) {
            if (withChapter_)
                extras.chapters.push_back({0, 20'000'000, "One"});
            return true;
        });
        events_.clear();
        created_ = false;
        faults_.writes = 0;
        FaultyFiles files(faults_);
        VideoFormat video = movie_.Video();
        if (lengthUnknown_)
            video.dDuration = 0;
        const AudioFormat audio = movie_.Audio();
        const auto record = set.Open(path_);
        try {
            auto file = std::make_unique<writer::MediaFile>(
                path_, movie_.param, movie_.hasVideo ? &video : nullptr, &audio, record, files);
            created_ = true;
            movie_.WriteAll(file.get());
            const bool complete = file->Close();
            EXPECT_EQ(complete, record->Snapshot().nState == kWriterFileComplete);
        } catch (const writer::WriterFailure& failure) {
            record->Fail(failure);
        }
        return record->Snapshot();
    }

    Folder folder_;
    std::string path_ = folder_ / "movie";
    TestMovie movie_;
    Faults faults_;
    WriterOptions options_{};
    std::vector<int> events_;
    bool created_ = false;
    bool withChapter_ = false;
    bool lengthUnknown_ = false;
    int asked_ = 0; ///< For more room.
};

/// The index of an MP4, which is written when all else is.
bool IsIndex(const uint8_t* data, int64_t size) {
    return size > 8 && std::memcmp(data + 4, "moov", 4) == 0;
}

/// The last write of an MP4, by which players see its index.
bool IsSwitch(const uint8_t*, int64_t size) {
    return size == 1;
}

struct Disk {
    const char* name;
    uint32_t format;
    uint32_t video; ///< 0: sound alone.
    uint32_t audio;
    int error = ENOSPC;
    double seconds = 4;
};

/// From one failing write to the next that is tried. Under a sanitizer a few of all are enough.
int WriteStep([[maybe_unused]] int writes) {
#ifdef MOVIECONV_SANITIZED
    return 1 + writes / 16;
#else
    return 1;
#endif
}

/// The file's packets, the number of their stream before each.
std::vector<std::string> Packets(const std::string& path) {
    std::vector<std::string> packets;
    AVFormatContext* context = nullptr;
    if (avformat_open_input(&context, ("file:" + path).c_str(), nullptr, nullptr) < 0)
        return packets;
    const av::Input input(context);
    const av::Packet packet(av_packet_alloc());
    for (; av_read_frame(context, packet.get()) >= 0; av_packet_unref(packet.get()))
        packets.push_back(std::to_string(packet->stream_index) +
                          std::string(packet->data, packet->data + packet->size));
    return packets;
}

/// Whether what is left of a movie holds nothing but whole packets of it: in each stream the first ones.
bool HoldsWholePackets(const std::vector<std::string>& part, const std::vector<std::string>& whole) {
    for (const char stream : {'0', '1'}) {
        const auto of = [stream](std::vector<std::string> packets) {
            std::erase_if(packets, [&](const std::string& packet) { return packet[0] != stream; });
            return packets;
        };
        const std::vector<std::string> rest = of(part);
        const std::vector<std::string> all = of(whole);
        if (rest.size() > all.size() || !std::equal(rest.begin(), rest.end(), all.begin()))
            return false;
    }
    return true;
}

class FaultIn : public Fault, public testing::WithParamInterface<Disk> {};

TEST_P(FaultIn, EveryWriteIsToldAndLeavesAPlayablePart) {
    movie_.param.fccFileFormat = GetParam().format;
    movie_.param.fccVideo = GetParam().video;
    movie_.param.fccAudio = GetParam().audio;
    movie_.hasVideo = GetParam().video != 0;
    movie_.pictures = static_cast<int>(GetParam().seconds * 25);
    movie_.soundSeconds = GetParam().seconds;
    ASSERT_EQ(Run().nState, kWriterFileComplete);
    const std::vector<std::string> whole = Packets(path_);
    const int writes = faults_.writes;
    int playable = 0;
    ASSERT_GT(writes, 1);
    faults_.writeError = GetParam().error;
    for (int number = 0; number < writes; number += WriteStep(writes)) {
        SCOPED_TRACE("write " + std::to_string(number));
        WriteFile(path_, "earlier");
        faults_.failingWrite = number;
        const WriterStatus status = Run();
        if (status.nState == kWriterFileComplete) {
            // The data was whole in the temporary file, only its tidier form found no room.
            EXPECT_EQ(Packets(path_).size(), whole.size());
            EXPECT_EQ(folder_.Names(), std::vector<std::string>{"movie"});
            continue;
        }
        EXPECT_EQ(ReadFile(path_), "earlier");
        EXPECT_EQ(status.nError, GetParam().error == ENOSPC ? kWriterErrorNoSpace : kWriterErrorWrite);
        EXPECT_EQ(status.nSystemError, GetParam().error);
        EXPECT_NE(std::string(status.szWhat).find(std::strerror(GetParam().error)), std::string::npos);
        if (created_) {
            EXPECT_EQ(status.nState, kWriterFileFailed);
            EXPECT_EQ(events_, (std::vector<int>{kWriterEventFailed, kWriterEventClosed}));
        }
        EXPECT_EQ(*status.szTemporaryPath != '\0', status.llBytesWritten > 0);
        if (status.llBytesWritten > 0) {
            EXPECT_EQ(status.llBytesWritten,
                      static_cast<int64_t>(std::filesystem::file_size(status.szTemporaryPath)));
            const std::vector<std::string> part = Packets(status.szTemporaryPath);
            EXPECT_TRUE(HoldsWholePackets(part, whole));
            EXPECT_FALSE(part.empty()) << "nothing of it plays";
            playable += !part.empty() && ReadMovieFile(status.szTemporaryPath).readable ? 1 : 0;
            std::filesystem::remove(status.szTemporaryPath);
        }
        EXPECT_EQ(folder_.Names(), std::vector<std::string>{"movie"});
    }
    EXPECT_GT(playable, 0);
}

INSTANTIATE_TEST_SUITE_P(
    Disks, FaultIn,
    testing::Values(Disk{"FullMp4", FourCC("MP4 "), FourCC("XVID"), FourCC("MP3 ")},
                    Disk{"FullMov", FourCC("MOV "), FourCC("XVID"), FourCC("PCM ")},
                    Disk{"FullM4a", FourCC("M4A "), 0, FourCC("AAC ")},
                    Disk{"FullMkv", FourCC("MKV "), FourCC("XVID"), FourCC("MP3 ")},
                    Disk{"FullWebm", FourCC("WEBM"), FourCC("VP80"), FourCC("OPUS"), ENOSPC, 2},
                    Disk{"FullAvi", FourCC("AVI "), FourCC("XVID"), FourCC("MP3 ")},
                    Disk{"FullTs", FourCC("TS  "), FourCC("XVID"), FourCC("MP3 ")},
                    Disk{"FullFlv", FourCC("FLV "), FourCC("FLV1"), FourCC("MP3 ")},
                    Disk{"FullWav", FourCC("WAV "), 0, FourCC("PCM ")},
                    Disk{"FullFlac", FourCC("FLAC"), 0, FourCC("FLAC")},
                    Disk{"FullMp3", FourCC("MP3 "), 0, FourCC("MP3 ")},
                    Disk{"FullOgg", FourCC("OGG "), 0, FourCC("VORB")},
                    Disk{"BrokenMp4", FourCC("MP4 "), FourCC("XVID"), FourCC("MP3 "), EIO},
                    Disk{"BrokenMkv", FourCC("MKV "), FourCC("XVID"), FourCC("MP3 "), EIO},
                    Disk{"BarredAvi", FourCC("AVI "), FourCC("XVID"), FourCC("MP3 "), EACCES}),
    [](const auto& info) { return info.param.name; });

TEST_F(Fault, SyncAndRenameKeepTheDataUnderItsTemporaryName) {
    const struct {
        int Faults::*where;
        int error;
        int told;
        bool lengthUnknown; // the index comes behind, for want of room
    } cases[] = {{&Faults::syncError, EIO, kWriterErrorFinish, false},
                 {&Faults::syncError, ENOSPC, kWriterErrorNoSpace, true},
                 {&Faults::renameError, EIO, kWriterErrorFinish, false},
                 {&Faults::renameError, EISDIR, kWriterErrorFinish, true}};
    movie_.pictures = 900;
    movie_.soundSeconds = 36;
    for (const auto& test : cases) {
        SCOPED_TRACE(&test - cases);
        faults_.syncError = faults_.renameError = 0;
        faults_.*test.where = test.error;
        lengthUnknown_ = test.lengthUnknown;
        const WriterStatus status = Run();
        EXPECT_EQ(status.nState, kWriterFileFailed);
        EXPECT_EQ(status.nError, test.told);
        EXPECT_EQ(status.nSystemError, test.error);
        EXPECT_EQ(ReadMovieFile(status.szTemporaryPath).pictures.size(), 900U);
        EXPECT_EQ(std::filesystem::file_size(status.szTemporaryPath),
                  static_cast<std::uintmax_t>(status.llBytesWritten));
        EXPECT_FALSE(std::filesystem::exists(path_));
        EXPECT_EQ(folder_.Names().size(), 1U);
        std::filesystem::remove(status.szTemporaryPath);
    }
}

// Where a file gets its name without replacing another only as a second one.
TEST(PosixFiles, ThatHaveTheirNameAreDoneThoughTheFirstOneStays) {
    const Folder folder;
    WriteFile(folder / "movie.part", "movie");
    g_exclusiveRenameError = EINVAL;
    g_unlinkError = EACCES;
    const int error = writer::SystemFiles().Rename(folder / "movie.part", folder / "movie", false);
    g_exclusiveRenameError = g_unlinkError = 0;
    EXPECT_EQ(error, 0) << std::strerror(error);
    EXPECT_EQ(ReadFile(folder / "movie"), "movie");
    EXPECT_EQ(writer::SystemFiles().Rename(folder / "movie.part", folder / "movie", false), EEXIST);
}

// Without it the fragmented file is a whole movie, unless something is in the index alone.
TEST_F(Fault, NoRoomForTheIndexLosesNothing) {
    for (const bool withChapter : {false, true}) {
        withChapter_ = withChapter;
        faults_.failingWrite = -1;
        faults_.failsAt = IsSwitch;
        const WriterStatus status = Run();
        EXPECT_EQ(status.nState, withChapter ? kWriterFileFailed : kWriterFileComplete);
        EXPECT_EQ(status.nError, withChapter ? kWriterErrorNoSpace : kWriterErrorNone);
        const std::string kept = withChapter ? status.szTemporaryPath : path_;
        EXPECT_EQ(ReadMovieFile(kept).pictures.size(), 100U);
        std::filesystem::remove(kept);
    }
}

TEST_F(Fault, APartialFileIsRemovedWhenTheHostWantsThat) {
    options_.bRemovePartial = 1;
    faults_.failingWrite = 3;
    const WriterStatus status = Run();
    EXPECT_EQ(status.nState, kWriterFileFailed);
    EXPECT_EQ(std::string(status.szTemporaryPath), "");
    EXPECT_TRUE(folder_.Names().empty());
}

// Also for the index, which comes last.
TEST_F(Fault, AFullDiskCanBeWaitedFor) {
    options_.bBitExact = 1;
    ASSERT_EQ(Run().nState, kWriterFileComplete);
    const std::string undisturbed = ReadFile(path_);
    options_.pfnFullDisk = [](void* context, const WriterStatus* status) {
        auto* self = static_cast<Fault_AFullDiskCanBeWaitedFor_Test*>(context);
        EXPECT_NE(std::string(status->szTemporaryPath), "");
        if (++self->asked_ == 3) { // There is room again.
            self->faults_.failingWrite = -1;
            self->faults_.failsAt = nullptr;
        }
        return 1;
    };
    const struct {
        const char* name;
        int write;
        bool (*at)(const uint8_t*, int64_t);
    } places[] = {{"packets", 3, nullptr}, {"index", -1, IsIndex}, {"switch", -1, IsSwitch}};
    for (const auto& place : places) {
        SCOPED_TRACE(place.name);
        asked_ = 0;
        faults_.failingWrite = place.write;
        faults_.failsAt = place.at;
        EXPECT_EQ(Run().nState, kWriterFileComplete);
        EXPECT_EQ(asked_, 3);
        EXPECT_EQ(ReadFile(path_), undisturbed);
    }
}

TEST_F(Fault, NeitherFilesNorThreadsAreLeftBehind) {
    movie_.pictures = 10;
    movie_.soundSeconds = 0.4;
    const auto runAll = [&] {
        for (const int failing : {-1, 0, 1}) {
            faults_.failingWrite = failing;
            Run();
        }
        MWCloseMediaFile(movie_.Create(folder_ / "no/such/folder/movie"), nullptr, nullptr);
    };
    runAll();
    const int64_t descriptors = CountEntries("/proc/self/fd");
    const int64_t threads = CountThreads();
    for (int round = 0; round < 5; ++round)
        runAll();
    EXPECT_EQ(CountEntries("/proc/self/fd"), descriptors);
    EXPECT_EQ(CountThreads(), threads);
}

} // namespace
