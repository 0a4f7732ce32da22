// Pictures on their way into the file: pitches, sizes, shapes, rates.
#include "MovieReader.h"
#include "TestSource.h"
#include "writer/PicturePacer.h"
#include "writer/PictureScaler.h"
#include "writer/WriterStatus.h"

#include <gtest/gtest.h>

#include <cmath>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <thread>
#include <vector>

namespace {

using writer::FitPicture;
using writer::PictureFit;

WriterStatus Latest() {
    WriterStatus status{};
    EXPECT_EQ(MWGetFileStatus(MWGetFileCount(), &status), 1);
    return status;
}

ReadMovie WriteAndRead(const TestMovie& movie) {
    const TemporaryFolder folder;
    EXPECT_TRUE(movie.Write(folder.Path("movie")));
    return ReadMovieFile(folder.Path("movie"));
}

/// Whether picture `number` of TestPicture is in the picture of the given size.
void ExpectNumber(const ReadPicture& picture, int number, int width, int height) {
    const int block = width / 10;
    EXPECT_NEAR(picture.At(number % 10 * block + block / 2, height / 4), 220, 25);
    EXPECT_LT(picture.At((number + 5) % 10 * block + block / 2, height / 4), 140);
}

TEST(Pictures, EveryOneIsWrittenOnceWithoutItsPadding) {
    for (const int pitch_extra : {0, 1, 13, 64}) {
        TestMovie movie;
        movie.pitchExtra = pitch_extra;
        const ReadMovie read = WriteAndRead(movie);
        ASSERT_EQ(read.pictures.size(), 50U);
        for (int number = 0; number < 50; ++number)
            ExpectNumber(read.pictures[number], number, 160, 120);
    }
}

TEST(Pictures, OddSizesAreKeptOrPaddedByOne) {
    for (const auto& [codec, format, width, height] :
         {std::tuple{"XVID", "MP4 ", 161, 121}, std::tuple{"H264", "MP4 ", 162, 122},
          std::tuple{"HEVC", "MP4 ", 162, 122}, std::tuple{"MJPG", "MKV ", 161, 121},
          std::tuple{"VP90", "WEBM", 161, 121}}) {
        TestMovie movie;
        movie.width = 161;
        movie.height = 121;
        movie.pictures = 5;
        movie.hasAudio = false;
        movie.param.fccVideo = FourCC(codec[0], codec[1], codec[2], codec[3]);
        movie.param.fccFileFormat = FourCC(format[0], format[1], format[2], format[3]);
        const ReadMovie read = WriteAndRead(movie);
        ASSERT_EQ(read.pictures.size(), 5U) << codec;
        EXPECT_EQ(read.pictures[0].width, width) << codec;
        EXPECT_EQ(read.pictures[0].height, height) << codec;
        EXPECT_NEAR(read.pictures[0].At(width - 1, 60), read.pictures[0].At(160, 60), 12) << codec;
    }
}

TEST(Pictures, AnotherOutputSizeIsBorderedOrStretched) {
    TestMovie movie;
    movie.param.nWidth = 320;
    movie.param.nHeight = 120;
    const ReadMovie bordered = WriteAndRead(movie);
    ASSERT_EQ(bordered.pictures.size(), 50U);
    EXPECT_EQ(bordered.pictures[0].width, 320);
    EXPECT_NEAR(bordered.pictures[0].At(20, 60), 16, 4);
    EXPECT_NEAR(bordered.pictures[0].At(300, 60), 16, 4);
    EXPECT_GT(bordered.pictures[0].At(160, 60), 30);
    movie.param.bResize = 1;
    const ReadMovie stretched = WriteAndRead(movie);
    ASSERT_EQ(stretched.pictures.size(), 50U);
    EXPECT_GT(stretched.pictures[0].At(300, 60), 30);
    EXPECT_EQ(av_cmp_q(stretched.sampleAspect, {1, 2}), 0);
}

TEST(Pictures, ASizeThatChangesOnTheWayIsScaled) {
    const TemporaryFolder folder;
    TestMovie movie;
    movie.hasAudio = false;
    void* file = movie.Create(folder.Path("movie"));
    int number = 0;
    for (const auto& [width, height] :
         {std::pair{160, 120}, std::pair{320, 240}, std::pair{80, 60}, std::pair{160, 120}}) {
        TestPicture picture(width, height);
        for (int i = 0; i < 5; ++i, ++number)
            EXPECT_EQ(MWWriteVideoFrame(file, &picture.Paint(number, number * 400'000)), 1);
    }
    EXPECT_EQ(MWCloseMediaFile(file, nullptr, nullptr), 1);
    const ReadMovie read = ReadMovieFile(folder.Path("movie"));
    ASSERT_EQ(read.pictures.size(), 20U);
    for (number = 0; number < 20; ++number)
        ExpectNumber(read.pictures[number], number, 160, 120);
}

TEST(Pictures, TheShapeOfPixelsIsCarried) {
    WriterOptions options{};
    options.nSampleAspectNum = 16;
    options.nSampleAspectDen = 11;
    MWSetWriterOptions(&options);
    const ReadMovie read = WriteAndRead(TestMovie());
    MWSetWriterOptions(nullptr);
    EXPECT_EQ(av_cmp_q(read.sampleAspect, {16, 11}), 0);
}

TEST(Pictures, AnotherRateLeavesOutAndRepeats) {
    for (const double rate : {10.0, 12.5, 30.0, 50.0}) {
        TestMovie movie;
        movie.param.dFrameRate = rate;
        const ReadMovie read = WriteAndRead(movie);
        ASSERT_NEAR(static_cast<double>(read.pictures.size()), 2.0 * rate, 1.0) << rate;
        for (size_t i = 0; i < read.pictures.size(); ++i)
            EXPECT_NEAR(read.pictures[i].time, static_cast<double>(i) / rate, 0.0005) << rate;
        const WriterStatus status = Latest();
        EXPECT_EQ(status.llPicturesReceived, 50);
        EXPECT_EQ(status.llPicturesWritten, static_cast<int64_t>(read.pictures.size()));
        EXPECT_EQ(status.llPicturesReceived - status.llPicturesDropped + status.llPicturesRepeated,
                  status.llPicturesWritten);
    }
}

TEST(Pictures, StampsOfAVariableRateAreKept) {
    const TemporaryFolder folder;
    TestMovie movie;
    movie.hasAudio = false;
    void* file = movie.Create(folder.Path("movie"));
    TestPicture picture(160, 120);
    const std::vector<int64_t> times{0, 170'000, 400'000, 1'111'000, 1'200'000, 9'000'000, 9'400'000};
    for (size_t i = 0; i < times.size(); ++i)
        MWWriteVideoFrame(file, &picture.Paint(static_cast<int>(i), times[i]));
    EXPECT_EQ(MWCloseMediaFile(file, nullptr, nullptr), 1);
    const ReadMovie read = ReadMovieFile(folder.Path("movie"));
    ASSERT_EQ(read.pictures.size(), times.size());
    for (size_t i = 0; i < times.size(); ++i)
        EXPECT_NEAR(read.pictures[i].time, static_cast<double>(times[i]) / 1e7, 0.0002);
}

TEST(Pictures, TheFileIsTheSameWhateverTheTiming) {
    WriterOptions options{};
    options.bBitExact = 1;
    MWSetWriterOptions(&options);
    const TemporaryFolder folder;
    const auto content = [&](const char* name) {
        std::ifstream in(folder.Path(name), std::ios::binary);
        return std::string(std::istreambuf_iterator<char>(in), {});
    };
    const TestMovie movie;
    EXPECT_TRUE(movie.Write(folder.Path("swift")));
    // The same calls with pauses between stretches of pictures and sound.
    void* file = movie.Create(folder.Path("slow"));
    TestPicture picture(movie.width, movie.height);
    TestSound sound(44100, 2, 16);
    int64_t written = 0;
    for (int number = 0; number <= movie.pictures; ++number) {
        const int64_t until = number < movie.pictures ? number * 400'000 : INT64_MAX;
        while (written < 88200 && written * 10'000'000 / 44100 <= until) {
            const int count = static_cast<int>(std::min<int64_t>(512, 88200 - written));
            MWWriteAudioData(file, &sound.Next(count, written * 10'000'000 / 44100));
            written += count;
        }
        if (number % 7 == 0)
            std::this_thread::sleep_for(std::chrono::milliseconds(number % 3 * 4));
        if (number < movie.pictures)
            MWWriteVideoFrame(file, &picture.Paint(number, until));
    }
    EXPECT_EQ(MWCloseMediaFile(file, nullptr, nullptr), 1);
    MWSetWriterOptions(nullptr);
    EXPECT_GT(content("swift").size(), 10'000U);
    EXPECT_TRUE(content("swift") == content("slow"));
}

TEST(FitPicture, BordersKeepTheShapeAndStretchingFills) {
    const PictureFit same = FitPicture(1280, 720, {1, 1}, 640, 360, false);
    EXPECT_EQ(same.fittedWidth, 640);
    EXPECT_EQ(same.fittedHeight, 360);
    const PictureFit rounded = FitPicture(1280, 720, {1, 1}, 854, 480, true);
    EXPECT_EQ(av_cmp_q(rounded.sampleAspect, {1, 1}), 0);
    const PictureFit wide = FitPicture(720, 576, {64, 45}, 1280, 960, false);
    EXPECT_EQ(wide.fittedWidth, 1280);
    EXPECT_EQ(wide.fittedHeight, 720);
    EXPECT_EQ(wide.top, 120);
    EXPECT_EQ(av_cmp_q(wide.sampleAspect, {1, 1}), 0);
    const PictureFit tall = FitPicture(480, 640, {1, 1}, 1280, 720, false);
    EXPECT_EQ(tall.fittedHeight, 720);
    EXPECT_EQ(tall.fittedWidth, 540);
    EXPECT_EQ(tall.left, 370);
    const PictureFit stretched = FitPicture(720, 576, {64, 45}, 1280, 960, true);
    EXPECT_NEAR(av_q2d(stretched.sampleAspect) * 1280 / 960, 16.0 / 9, 0.01);
}

TEST(ExactRate, IsTheFractionThatIsMeant) {
    struct {
        double rate;
        AVRational exact;
    } const cases[] = {{25, {25, 1}},          {29.97, {30000, 1001}},  {23.976, {24000, 1001}},
                       {23.98, {24000, 1001}}, {59.94, {60000, 1001}},  {14.985, {15000, 1001}},
                       {12.5, {25, 2}},        {119.88, {120000, 1001}}};
    for (const auto& known : cases)
        EXPECT_EQ(av_cmp_q(writer::ExactRate(known.rate), known.exact), 0) << known.rate;
    for (const double rate : {0.001, 0.3, 7.123, 999.9})
        EXPECT_NEAR(av_q2d(writer::ExactRate(rate)), rate, rate * 0.001 + 0.0001);
}

} // namespace
