// The five functions with arguments that make no sense, and what the status header says of a file.
#include "MovieReader.h"
#include "tests/support/Folder.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <filesystem>
#include <string>
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
        ASSERT_EQ(MWGetLastFailure(&status), 1);
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
}

TEST(MediaWriter, KeepsAnExistingFileWhenAsked) {
    const Folder folder;
    const std::string path = folder / "movie";
    WriteFile(path, "precious");
    WriterOptions options{};
    options.bKeepExisting = 1;
    MWSetWriterOptions(&options);
    EXPECT_EQ(TestMovie().Create(path), nullptr);
    EXPECT_EQ(Latest().nError, kWriterErrorExists);
    // One that appears in the meantime is kept as well.
    std::filesystem::remove(path);
    void* file = TestMovie().Create(path);
    TestMovie().WriteAll(file);
    WriteFile(path, "precious");
    EXPECT_EQ(MWCloseMediaFile(file, nullptr, nullptr), 0);
    EXPECT_EQ(Latest().nSystemError, EEXIST);
    EXPECT_EQ(std::filesystem::file_size(path), 8U);
    EXPECT_EQ(ReadMovieFile(Latest().szTemporaryPath).pictures.size(), 50U);
    MWSetWriterOptions(nullptr);
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

TEST(MediaWriter, TellsAListenerOfAFilesLife) {
    struct Heard {
        std::vector<int> events;
        std::vector<double> finished;
        WriterStatus last;
    } heard{};
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
    MWSetWriterOptions(&options);
    const Folder folder;
    EXPECT_TRUE(TestMovie().Write(folder / "movie"));
    EXPECT_EQ(heard.events,
              (std::vector<int>{kWriterEventOpened, kWriterEventFinishing, kWriterEventClosed}));
    EXPECT_TRUE(std::is_sorted(heard.finished.begin(), heard.finished.end()));
    EXPECT_GT(heard.finished.size(), 3U);
    EXPECT_EQ(heard.last.nState, kWriterFileComplete);
    EXPECT_EQ(heard.last.llBytesWritten, static_cast<int64_t>(std::filesystem::file_size(folder / "movie")));
    EXPECT_EQ(std::string(heard.last.szTemporaryPath), "");
    EXPECT_EQ(heard.last.llPicturesReceived, 50);
    EXPECT_DOUBLE_EQ(heard.last.dVideoReceived, 2.0);
    EXPECT_NEAR(heard.last.dAudioReceived, 2.0, 1e-6);
    EXPECT_DOUBLE_EQ(heard.last.dFinished, 1.0);
    MWSetWriterOptions(nullptr);
}

TEST(MediaWriter, RemembersTheLatestFilesOnly) {
    WriterStatus status{};
    EXPECT_EQ(MWGetFileStatus(0, &status), 0);
    EXPECT_EQ(MWGetFileStatus(MWGetFileCount() + 1, &status), 0);
    const Folder folder;
    void* open = TestMovie().Create(folder / "open");
    const int number = MWGetFileCount();
    for (int i = 0; i < 80; ++i)
        MWCreateMediaFile(L"", nullptr, nullptr, nullptr);
    EXPECT_EQ(MWGetFileStatus(number, &status), 1) << "an open file is forgotten";
    EXPECT_EQ(status.nState, kWriterFileWriting);
    EXPECT_EQ(MWGetFileStatus(number + 1, &status), 0);
    EXPECT_EQ(MWGetFileStatus(number + 80, &status), 1);
    EXPECT_EQ(MWGetFileStatus(number, nullptr), 0);
    MWCloseMediaFile(open, nullptr, nullptr);
}

} // namespace
