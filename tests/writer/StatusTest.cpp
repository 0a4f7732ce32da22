// The five functions with arguments that make no sense, and what the status header says of a file.
#include "MovieReader.h"
#include "tests/support/Folder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <climits>
#include <cstddef>
#include <filesystem>
#include <memory>
#include <string>
#include <sys/stat.h>
#include <thread>
#include <unistd.h>
#include <vector>

namespace {

TEST(MediaWriter, TakesNullHandlesAndRecords) {
    const VideoImage image{};
    const AudioFrame frame{};
    EXPECT_EQ(MWWriteVideoFrame(nullptr, &image), 0);
    EXPECT_EQ(MWWriteAudioData(nullptr, &frame), 0);
    EXPECT_EQ(MWCloseMediaFile(nullptr, nullptr, nullptr), 0);
    const Folder folder;
    void* file = TestMovie().Create(folder / "movie");
    ASSERT_NE(file, nullptr);
    EXPECT_EQ(MWWriteVideoFrame(file, nullptr), 0);
    EXPECT_EQ(MWWriteAudioData(file, nullptr), 0);
    EXPECT_EQ(MWCloseMediaFile(file, nullptr, nullptr), 0);
    EXPECT_EQ(Latest().nState, kWriterFileEmpty);
    EXPECT_EQ(Latest().nError, kWriterErrorNone);
    EXPECT_TRUE(folder.Names().empty());
}

TEST(MediaWriter, RefusesRecordsThatMakeNoSense) {
    const Folder folder;
    void* file = TestMovie().Create(folder / "movie");
    ASSERT_NE(file, nullptr);
    TestPicture picture(160, 120);
    const VideoImage goodImage = picture.Paint(0, 0);
    void (*const imageFaults[])(VideoImage&) = {
        [](auto& image) { image.nFormat = 1; },       [](auto& image) { image.pU = nullptr; },
        [](auto& image) { image.nWidth = 0; },        [](auto& image) { image.nHeight = -120; },
        [](auto& image) { image.nPitchY = 159; },     [](auto& image) { image.nPitchV = 79; },
        [](auto& image) { image.nWidth = INT32_MAX; }};
    for (const auto& spoil : imageFaults) {
        VideoImage image = goodImage;
        spoil(image);
        EXPECT_EQ(MWWriteVideoFrame(file, &image), 0);
    }
    TestSound sound(44100, 2, 16);
    const AudioFrame goodFrame = sound.Next(100, 0);
    void (*const frameFaults[])(AudioFrame&) = {
        [](auto& frame) { frame.nSampleRate = 0; },     [](auto& frame) { frame.nChannels = 0; },
        [](auto& frame) { frame.nBitsPerSample = 12; }, [](auto& frame) { frame.pData = nullptr; },
        [](auto& frame) { frame.nLength = 0; },         [](auto& frame) { frame.nLength = -4; }};
    for (const auto& spoil : frameFaults) {
        AudioFrame frame = goodFrame;
        spoil(frame);
        EXPECT_EQ(MWWriteAudioData(file, &frame), 0);
    }
    EXPECT_EQ(MWWriteVideoFrame(file, &goodImage), 1);
    EXPECT_EQ(MWWriteAudioData(file, &goodFrame), 1);
    EXPECT_EQ(MWCloseMediaFile(file, nullptr, nullptr), 1);
    EXPECT_EQ(Latest().llPicturesReceived, 1);
    EXPECT_EQ(Latest().llSamplesReceived, 100);
}

TEST(MediaWriter, GivesNullAndTheReason) {
    const struct {
        const char* name;
        void (*spoil)(TestMovie&);
        int error;
    } refusals[] = {
        {"NoSuchFormat", [](auto& movie) { movie.param.fccFileFormat = FourCC("XXXX"); }, kWriterErrorFormat},
        {"Copy", [](auto& movie) { movie.param.fccFileFormat = FourCC("COPY"); }, kWriterErrorFormat},
        {"UnknownVideo", [](auto& movie) { movie.param.fccVideo = FourCC("ABCD"); }, kWriterErrorCodec},
        {"ForeignVideo", [](auto& movie) { movie.param.fccVideo = FourCC("VP80"); }, kWriterErrorCodec},
        {"ForeignSound", [](auto& movie) { movie.param.fccAudio = FourCC("PCM "); }, kWriterErrorCodec},
        {"NegativeSize", [](auto& movie) { movie.param.nWidth = -160; }, kWriterErrorArgument},
        {"NoSize", [](auto& movie) { movie.width = 0; }, kWriterErrorArgument},
        {"NoStream", [](auto& movie) { movie.hasVideo = movie.hasAudio = false; }, kWriterErrorArgument},
        {"BothLeftOut", [](auto& movie) { movie.param.bNoVideo = movie.param.bNoAudio = 1; },
         kWriterErrorArgument},
        {"NoRate", [](auto& movie) { movie.sampleRate = 0; }, kWriterErrorArgument},
    };
    for (const auto& refusal : refusals) {
        SCOPED_TRACE(refusal.name);
        const Folder folder;
        TestMovie movie;
        refusal.spoil(movie);
        EXPECT_EQ(movie.Create(folder / "movie"), nullptr);
        WriterStatus status{};
        ASSERT_EQ(MWGetLastFailure(kWriterDefaultSet, &status), 1);
        EXPECT_EQ(status.nError, refusal.error);
        EXPECT_EQ(status.nState, kWriterFileFailed);
        EXPECT_EQ(status.szPath, folder / "movie");
        EXPECT_NE(std::string(status.szWhat), "");
        EXPECT_TRUE(folder.Names().empty());
    }
}

TEST(MediaWriter, RefusesTargetsThatAreNotFiles) {
    const Folder folder;
    EXPECT_EQ(MWCreateMediaFile(nullptr, nullptr, nullptr, nullptr), nullptr);
    EXPECT_EQ(Latest().nError, kWriterErrorArgument);
    EXPECT_EQ(TestMovie().Create(folder.Path()), nullptr);
    EXPECT_EQ(Latest().nSystemError, EISDIR);
    EXPECT_EQ(TestMovie().Create("/dev/null"), nullptr);
    EXPECT_EQ(Latest().nError, kWriterErrorOpen);
    EXPECT_EQ(TestMovie().Create(folder / "missing/movie"), nullptr);
    EXPECT_EQ(Latest().nError, kWriterErrorOpen);
    EXPECT_EQ(Latest().nSystemError, ENOENT);
    EXPECT_EQ(TestMovie().Create(folder / (std::string(NAME_MAX, 'n') + ".mp4")), nullptr);
    EXPECT_EQ(Latest().nSystemError, ENAMETOOLONG); // at once, not when the movie is to take the name
    EXPECT_TRUE(folder.Names().empty());
}

TEST(MediaWriter, NamesTheSizeThatItWasAskedFor) {
    const Folder folder;
    TestMovie movie;
    movie.param.nWidth = -160;
    EXPECT_EQ(movie.Create(folder / "movie"), nullptr);
    EXPECT_NE(std::string(Latest().szWhat).find("-160x"), std::string::npos) << Latest().szWhat;
}

TEST(MediaWriter, KeepsAnExistingFileWhenAsked) {
    const Folder folder;
    const std::string path = folder / "movie";
    WriteFile(path, "precious");
    WriterOptions options{};
    options.bKeepExisting = 1;
    const RegisteredOptions registered(options);
    TestMovie movie;
    movie.Use(registered);
    EXPECT_EQ(movie.Create(path), nullptr);
    EXPECT_EQ(Latest(registered.Set()).nError, kWriterErrorExists);
    // One that appears in the meantime is kept as well.
    std::filesystem::remove(path);
    void* file = movie.Create(path);
    movie.WriteAll(file);
    WriteFile(path, "precious");
    EXPECT_EQ(MWCloseMediaFile(file, nullptr, nullptr), 0);
    const WriterStatus status = Latest(registered.Set());
    EXPECT_EQ(status.nSystemError, EEXIST);
    EXPECT_EQ(std::filesystem::file_size(path), 8U);
    EXPECT_EQ(ReadMovieFile(status.szTemporaryPath).pictures.size(), 50U);
}

TEST(MediaWriter, KeepsPermissionsAndOwnerOfWhatItReplaces) {
    const Folder folder;
    const std::string path = folder / "movie";
    const mode_t mask = umask(022);
    WriteFile(path, "old");
    const bool isRoot = geteuid() == 0;
    ASSERT_EQ(chmod(path.c_str(), 0660), 0);
    ASSERT_EQ(chown(path.c_str(), isRoot ? 12345 : geteuid(), isRoot ? 23456 : getegid()), 0);
    struct stat old {};
    struct stat part {};
    struct stat now {};
    ASSERT_EQ(stat(path.c_str(), &old), 0);
    void* file = TestMovie().Create(path);
    ASSERT_EQ(stat((path + ".part").c_str(), &part), 0);
    EXPECT_EQ(part.st_mode, old.st_mode) << "others can read it while it grows";
    TestMovie().WriteAll(file);
    EXPECT_EQ(MWCloseMediaFile(file, nullptr, nullptr), 1);
    ASSERT_EQ(stat(path.c_str(), &now), 0);
    EXPECT_EQ(now.st_mode, old.st_mode);
    EXPECT_EQ(now.st_uid, old.st_uid);
    EXPECT_EQ(now.st_gid, old.st_gid);
    EXPECT_TRUE(TestMovie().Write(folder / "new"));
    ASSERT_EQ(stat((folder / "new").c_str(), &now), 0);
    EXPECT_EQ(now.st_mode & 0777, 0644U);
    umask(mask);
}

TEST(MediaWriter, WritesThroughALinkAndLeavesIt) {
    const Folder folder;
    WriteFile(folder / "real", "old");
    std::filesystem::create_symlink("real", folder / "link");
    EXPECT_TRUE(TestMovie().Write(folder / "link"));
    EXPECT_TRUE(std::filesystem::is_symlink(folder / "link"));
    EXPECT_EQ(ReadMovieFile(folder / "real").pictures.size(), 50U);
}

TEST(MediaWriter, DoesNotTouchTheRemainsOfAnEarlierRun) {
    const Folder folder;
    WriteFile(folder / "movie.part", "remains");
    EXPECT_TRUE(TestMovie().Write(folder / "movie"));
    EXPECT_EQ(folder.Names(), (std::vector<std::string>{"movie", "movie.part"}));
    EXPECT_EQ(std::filesystem::file_size(folder / "movie.part"), 7U);
}

struct Heard {
    std::vector<int> events;
    std::vector<double> finished;
    WriterStatus last;
};

WriterOptions ToldTo(Heard& heard) {
    WriterOptions options{};
    options.pContext = &heard;
    options.pfnListener = [](void* context, int event, const WriterStatus* status) {
        auto* self = static_cast<Heard*>(context);
        if (self->events.empty() || self->events.back() != event)
            self->events.push_back(event);
        if (event == kWriterEventFinishing)
            self->finished.push_back(status->dFinished);
        self->last = *status;
    };
    return options;
}

const std::vector<int> kWholeLife{kWriterEventOpened, kWriterEventFinishing, kWriterEventClosed};

TEST(MediaWriter, TellsAListenerOfAFilesLife) {
    Heard heard{};
    const RegisteredOptions registered(ToldTo(heard));
    TestMovie movie;
    movie.Use(registered);
    const Folder folder;
    EXPECT_TRUE(movie.Write(folder / "movie"));
    EXPECT_EQ(heard.events, kWholeLife);
    EXPECT_TRUE(std::is_sorted(heard.finished.begin(), heard.finished.end()));
    EXPECT_GT(heard.finished.size(), 3U);
    EXPECT_EQ(heard.last.nState, kWriterFileComplete);
    EXPECT_EQ(heard.last.llBytesWritten, static_cast<int64_t>(std::filesystem::file_size(folder / "movie")));
    EXPECT_EQ(std::string(heard.last.szTemporaryPath), "");
    EXPECT_EQ(heard.last.llPicturesReceived, 50);
    EXPECT_DOUBLE_EQ(heard.last.dVideoReceived, 2.0);
    EXPECT_NEAR(heard.last.dAudioReceived, 2.0, 1e-6);
    EXPECT_DOUBLE_EQ(heard.last.dFinished, 1.0);
}

TEST(MediaWriter, RemembersTheLatestFilesOnly) {
    WriterStatus status{};
    const RegisteredOptions registered(WriterOptions{});
    const uint32_t set = registered.Set();
    TestMovie movie;
    movie.Use(registered);
    EXPECT_EQ(MWGetFileStatus(set, 0, &status), 0);
    EXPECT_EQ(MWGetFileStatus(set, 1, &status), 0);
    const Folder folder;
    void* open = movie.Create(folder / "open");
    for (int i = 0; i < 80; ++i)
        MWCreateMediaFile(L"", &movie.param, nullptr, nullptr);
    EXPECT_EQ(MWGetFileCount(set), 81);
    EXPECT_EQ(MWGetFileStatus(set, 1, &status), 1) << "an open file is forgotten";
    EXPECT_EQ(status.nState, kWriterFileWriting);
    EXPECT_EQ(MWGetFileStatus(set, 2, &status), 0);
    EXPECT_EQ(MWGetFileStatus(set, 81, &status), 1);
    MWCloseMediaFile(open, nullptr, nullptr);
}

TEST(OptionSets, KeepFilesFailuresAndListenersApart) {
    const Folder folder;
    Heard first{};
    Heard second{};
    const RegisteredOptions firstSet(ToldTo(first));
    const RegisteredOptions secondSet(ToldTo(second));
    ASSERT_NE(firstSet.Set(), secondSet.Set());
    TestMovie good;
    good.Use(firstSet);
    TestMovie bad;
    bad.Use(secondSet);
    bad.param.fccVideo = FourCC("ABCD");
    const int unnamed = MWGetFileCount(kWriterDefaultSet);
    EXPECT_EQ(bad.Create(folder / "bad"), nullptr);
    EXPECT_TRUE(good.Write(folder / "good"));
    EXPECT_EQ(first.events, kWholeLife);
    EXPECT_EQ(second.events, std::vector<int>{kWriterEventRefused});
    EXPECT_EQ(MWGetFileCount(firstSet.Set()), 1);
    EXPECT_EQ(MWGetFileCount(secondSet.Set()), 1);
    EXPECT_EQ(MWGetFileCount(kWriterDefaultSet), unnamed);
    WriterStatus status{};
    EXPECT_EQ(MWGetLastFailure(firstSet.Set(), &status), 0);
    EXPECT_EQ(MWGetLastFailure(secondSet.Set(), &status), 1);
    EXPECT_EQ(status.szPath, folder / "bad");
    EXPECT_EQ(status.nSet, secondSet.Set());
    EXPECT_EQ(Latest(firstSet.Set()).szPath, folder / "good");
}

TEST(OptionSets, AnOpenFileKeepsItsOwnWhateverBecomesOfThem) {
    const Folder folder;
    Heard before{};
    Heard after{};
    const WriterOptions other = ToldTo(after);
    auto registered = std::make_unique<RegisteredOptions>(ToldTo(before));
    const uint32_t set = registered->Set();
    TestMovie movie;
    movie.Use(*registered);
    void* file = movie.Create(folder / "movie");
    EXPECT_EQ(MWSetOptions(set, &other), 1);
    registered.reset();
    movie.WriteAll(file);
    EXPECT_EQ(MWCloseMediaFile(file, nullptr, nullptr), 1);
    EXPECT_EQ(before.events, kWholeLife);
    EXPECT_TRUE(after.events.empty());
    // Nothing is known of the set any more, and nothing falls back to other options.
    WriterStatus status{};
    EXPECT_EQ(MWGetFileCount(set), 0);
    EXPECT_EQ(MWGetFileStatus(set, 1, &status), 0);
    EXPECT_EQ(MWSetOptions(set, &other), 0);
    EXPECT_EQ(MWUnregisterOptions(set), 0);
    EXPECT_EQ(movie.Create(folder / "late"), nullptr);
    EXPECT_EQ(Latest().nError, kWriterErrorArgument);
    EXPECT_EQ(Latest().szPath, folder / "late");
}

TEST(OptionSets, TheDefaultOneServesWhoeverNamesNone) {
    const Folder folder;
    TestMovie movie;
    movie.param.nReserved[kWriterSetWord] = 12345; // not the number of a set: whatever it means, not to us
    EXPECT_TRUE(movie.Write(folder / "movie"));
    EXPECT_EQ(Latest().szPath, folder / "movie");
    EXPECT_EQ(MWUnregisterOptions(kWriterDefaultSet), 0);
    WriterOptions options{};
    options.bKeepExisting = 1;
    EXPECT_EQ(MWSetOptions(kWriterDefaultSet, &options), 1);
    EXPECT_EQ(TestMovie().Create(folder / "movie"), nullptr);
    options.bKeepExisting = 0;
    EXPECT_EQ(MWSetOptions(kWriterDefaultSet, &options), 1);
}

TEST(OptionSets, TakeRecordsOfEverySizeThatMakesSense) {
    constexpr size_t kFirstOptions = offsetof(WriterOptions, pContext) + sizeof(WriterOptions::pContext);
    constexpr size_t kFirstStatus =
        offsetof(WriterStatus, szTemporaryPath) + sizeof(WriterStatus::szTemporaryPath);
    const RegisteredOptions registered(WriterOptions{});
    struct {
        WriterOptions known{};
        int32_t later[4]{};
    } options;
    const auto set = [&](size_t size) {
        options.known.nSize = static_cast<uint32_t>(size);
        return MWSetOptions(registered.Set(), &options.known);
    };
    EXPECT_EQ(set(sizeof options), 1);
    options.later[3] = 1;
    EXPECT_EQ(set(sizeof options), 0) << "an option that is not known is passed over";
    EXPECT_EQ(set(sizeof(WriterOptions)), 1);
    EXPECT_EQ(set(kFirstOptions), 1) << "of a program that was built with the first version";
    EXPECT_EQ(set(kFirstOptions - 1), 0);
    EXPECT_EQ(set(0), 0);
    EXPECT_EQ(MWSetOptions(registered.Set(), nullptr), 0);
    EXPECT_EQ(MWRegisterOptions(nullptr), 0U);

    MWCreateMediaFile(L"", nullptr, nullptr, nullptr);
    struct {
        WriterStatus known{};
        int32_t later[4] = {7, 7, 7, 7};
    } status;
    const auto get = [&](size_t size) {
        status.known.nSize = static_cast<uint32_t>(size);
        return MWGetLastFailure(kWriterDefaultSet, &status.known);
    };
    EXPECT_EQ(get(sizeof status), 1);
    EXPECT_EQ(status.known.nSize, sizeof(WriterStatus)) << "how much was written must be told";
    EXPECT_EQ(status.later[0], 7);
    EXPECT_EQ(get(kFirstStatus), 1);
    EXPECT_EQ(get(kFirstStatus - 1), 0);
    EXPECT_EQ(get(0), 0);
    EXPECT_EQ(MWGetLastFailure(kWriterDefaultSet, nullptr), 0);
}

TEST(OptionSets, AreRegisteredUsedAndForgottenOnManyThreads) {
    const Folder folder;
    std::vector<std::thread> threads;
    std::atomic<int> good{0};
    for (int number = 0; number < 8; ++number) {
        threads.emplace_back([&, number] {
            for (int round = 0; round < 4; ++round) {
                Heard heard{};
                const RegisteredOptions registered(ToldTo(heard));
                TestMovie movie;
                movie.Use(registered);
                movie.pictures = 5;
                movie.soundSeconds = 0.2;
                const std::string path = folder / (std::to_string(number) + "-" + std::to_string(round));
                const bool complete = movie.Write(path);
                WriterStatus status{};
                if (complete && MWGetFileCount(registered.Set()) == 1 && heard.events == kWholeLife &&
                    MWGetFileStatus(registered.Set(), 1, &status) == 1 && status.szPath == path)
                    ++good;
            }
        });
    }
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_EQ(good, 32);
}

} // namespace
