// Pictures on their way into the file: pitches, sizes, shapes, rates.
#include "MovieReader.h"
#include "ffmpeg/ExactRate.h"
#include "writer/PicturePacer.h"
#include "writer/PictureScaler.h"

#include <gtest/gtest.h>

#include <vector>

namespace {

/// Whether picture `number` of TestPicture is in the picture of the given size.
void ExpectNumber(const ReadPicture& picture, int number, int width, int height) {
    const int block = width / 10;
    EXPECT_NEAR(picture.At(number % 10 * block + block / 2, height / 4), 220, 25);
    EXPECT_LT(picture.At((number + 5) % 10 * block + block / 2, height / 4), 140);
}

TestMovie WithoutSound() {
    TestMovie movie;
    movie.hasAudio = false;
    return movie;
}

TEST(Pictures, EveryOneIsWrittenOnceWithoutItsPadding) {
    for (const int pitchExtra : {0, 1, 13, 64}) {
        TestMovie movie;
        movie.pitchExtra = pitchExtra;
        const ReadMovie read = WriteAndRead(movie);
        ASSERT_EQ(read.pictures.size(), 50U);
        for (int number = 0; number < 50; ++number)
            ExpectNumber(read.pictures[number], number, 160, 120);
    }
}

TEST(Pictures, OddSizesAreKeptOrPaddedByOne) {
    struct {
        uint32_t codec, format;
        int width, height;
    } const cases[] = {
        {FourCC("XVID"), FourCC("MP4 "), 161, 121}, {FourCC("H264"), FourCC("MP4 "), 162, 122},
        {FourCC("HEVC"), FourCC("MP4 "), 162, 122}, {FourCC("MJPG"), FourCC("MKV "), 161, 121},
        {FourCC("VP90"), FourCC("WEBM"), 161, 121},
    };
    for (const auto& [codec, format, width, height] : cases) {
        TestMovie movie = WithoutSound();
        movie.width = 161;
        movie.height = 121;
        movie.pictures = 5;
        movie.param.fccVideo = codec;
        movie.param.fccFileFormat = format;
        const ReadMovie read = WriteAndRead(movie);
        ASSERT_EQ(read.pictures.size(), 5U) << codec;
        EXPECT_EQ(read.pictures[0].width, width) << codec;
        EXPECT_EQ(read.pictures[0].height, height) << codec;
        EXPECT_NEAR(read.pictures[0].At(width - 1, 60), read.pictures[0].At(160, 60), 12) << codec;
    }
}

TEST(Pictures, AnotherOutputSizeIsBorderedOrStretchedAndTheShapeOfPixelsIsCarried) {
    TestMovie movie;
    movie.param.nWidth = 320;
    movie.param.nHeight = 120;
    const ReadMovie bordered = WriteAndRead(movie);
    ASSERT_EQ(bordered.pictures.size(), 50U);
    EXPECT_EQ(bordered.pictures[0].width, 320);
    EXPECT_NEAR(bordered.pictures[0].At(20, 60), 16, 4);
    EXPECT_NEAR(bordered.pictures[0].At(300, 60), 16, 4);
    EXPECT_GT(bordered.pictures[0].At(160, 60), 30);
    WriterOptions options{};
    options.nSampleAspectNum = 16;
    options.nSampleAspectDen = 11;
    const RegisteredOptions registered(options);
    movie.Use(registered);
    movie.param.bResize = 1;
    const ReadMovie stretched = WriteAndRead(movie);
    ASSERT_EQ(stretched.pictures.size(), 50U);
    EXPECT_GT(stretched.pictures[0].At(300, 60), 30);
    EXPECT_EQ(av_cmp_q(stretched.sampleAspect, {8, 11}), 0);
}

TEST(Pictures, BordersAreBlackUpToThePicture) {
    TestMovie movie = WithoutSound();
    movie.param.fccFileFormat = FourCC("MKV ");
    movie.param.fccVideo = FourCC("FFV1");
    movie.param.nWidth = 320;
    movie.param.nHeight = 100; // the picture becomes 133 wide, from 92 on
    const ReadMovie read = WriteAndRead(movie);
    ASSERT_FALSE(read.pictures.empty());
    EXPECT_GT(read.pictures[0].At(160, 50), 30);
    for (int x = 0; x < 320; ++x) {
        if (x < 92 || x > 225) {
            EXPECT_EQ(read.pictures[0].At(x, 50), 16) << x;
        }
    }
}

TEST(Pictures, ASizeThatChangesOnTheWayIsScaled) {
    const ReadMovie read = WriteAndRead(WithoutSound(), [](void* file) {
        int number = 0;
        for (const int height : {120, 240, 60, 120}) {
            TestPicture picture(height * 4 / 3, height);
            for (int i = 0; i < 5; ++i, ++number)
                EXPECT_EQ(MWWriteVideoFrame(file, &picture.Paint(number, number * 400'000)), 1);
        }
    });
    ASSERT_EQ(read.pictures.size(), 20U);
    for (int number = 0; number < 20; ++number)
        ExpectNumber(read.pictures[number], number, 160, 120);
}

TEST(Pictures, AnotherRateLeavesOutAndRepeats) {
    for (const double rate : {10.0, 12.5, 30.0, 50.0}) {
        TestMovie movie;
        movie.param.dFrameRate = rate;
        const ReadMovie read = WriteAndRead(movie);
        ASSERT_EQ(static_cast<double>(read.pictures.size()), 2.0 * rate) << rate;
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
    const std::vector<int64_t> times{0, 13'000, 170'000, 400'000, 1'111'000, 1'200'000, 9'000'000, 9'400'000};
    const ReadMovie read = WriteAndRead(WithoutSound(), [&](void* file) {
        TestPicture picture(160, 120);
        for (size_t i = 0; i < times.size(); ++i)
            MWWriteVideoFrame(file, &picture.Paint(static_cast<int>(i), times[i]));
    });
    ASSERT_EQ(read.pictures.size(), times.size());
    for (size_t i = 0; i < times.size(); ++i)
        EXPECT_NEAR(read.pictures[i].time, static_cast<double>(times[i]) / 1e7, 0.0002);
}

TEST(Pictures, AreKeyFramesEveryFewSecondsWhereTheyComeSeldom) {
    struct {
        uint32_t codec, format;
    } const cases[] = {{FourCC("H264"), FourCC("MP4 ")},
                       {FourCC("HEVC"), FourCC("MKV ")},
                       {FourCC("VP90"), FourCC("WEBM")},
                       {FourCC("XVID"), FourCC("MP4 ")}};
    std::vector<int64_t> times;
    for (int number = 0; number < 60;
         ++number) // two seconds as usual, then one picture a second, then as usual
        times.push_back(number < 20   ? number * int64_t{400'000}
                        : number < 40 ? (number - 18) * int64_t{kTicksPerSecond}
                                      : 22 * int64_t{kTicksPerSecond} + (number - 40) * int64_t{400'000});
    for (const auto& [codec, format] : cases) {
        SCOPED_TRACE(codec);
        TestMovie movie = WithoutSound();
        movie.param.fccVideo = codec;
        movie.param.fccFileFormat = format;
        const ReadMovie read = WriteAndRead(movie, [&](void* file) {
            TestPicture picture(160, 120);
            for (size_t i = 0; i < times.size(); ++i)
                EXPECT_EQ(MWWriteVideoFrame(file, &picture.Paint(static_cast<int>(i), times[i])), 1);
        });
        ASSERT_EQ(read.pictures.size(), times.size());
        double latest = 0;
        for (const ReadPicture& picture : read.pictures) {
            EXPECT_LE(picture.time - latest, 6.1) << "without a key frame";
            latest = picture.isKeyFrame ? picture.time : latest;
        }
    }
}

TEST(Pictures, TheLastOneStaysAsLongAsItTells) {
    constexpr int64_t kMs = kTicksPerSecond / 1000;
    struct {
        uint32_t codec, format;
    } const cases[] = {{FourCC("H264"), FourCC("MP4 ")},
                       {FourCC("MJPG"), FourCC("MP4 ")},
                       {FourCC("H264"), FourCC("MKV ")},
                       {FourCC("MJPG"), FourCC("MKV ")},
                       {FourCC("GIF "), FourCC("GIF ")}};
    for (const auto& [codec, format] : cases) {
        for (const int64_t stay : {20 * kMs, 40 * kMs, 700 * kMs, 5000 * kMs}) {
            SCOPED_TRACE(std::to_string(codec) + " " + std::to_string(format) + " " + std::to_string(stay));
            TestMovie movie = WithoutSound();
            movie.param.fccVideo = codec;
            movie.param.fccFileFormat = format;
            const ReadMovie read = WriteAndRead(movie, [stay = stay](void* file) {
                TestPicture picture(160, 120);
                for (int number = 0; number < 10; ++number) {
                    VideoImage image = picture.Paint(number, number * 80 * kMs);
                    image.nDuration = static_cast<int32_t>(number < 9 ? 80 * kMs : stay);
                    EXPECT_EQ(MWWriteVideoFrame(file, &image), 1);
                }
            });
            EXPECT_NEAR(read.duration, 0.72 + static_cast<double>(stay) / kTicksPerSecond, 0.005);
            const WriterStatus status = Latest();
            EXPECT_EQ(status.llPicturesReceived + status.llPicturesRepeated, status.llPicturesWritten);
            EXPECT_EQ(static_cast<int64_t>(read.pictures.size()), status.llPicturesWritten);
        }
    }
}

TEST(Pictures, LastThroughALongPause) {
    struct {
        uint32_t codec, format;
        size_t pictures;
    } const cases[] = {
        {FourCC("H264"), FourCC("MP4 "), 10}, // decodes pictures before others that are shown earlier
        {FourCC("GIF "), FourCC("GIF "), 12}, // shows a picture for 655 seconds at most
    };
    for (const auto& [codec, format, pictures] : cases) {
        TestMovie movie = WithoutSound();
        movie.param.fccVideo = codec;
        movie.param.fccFileFormat = format;
        const ReadMovie read = WriteAndRead(movie, [](void* file) {
            TestPicture picture(160, 120);
            for (int number = 0; number < 10; ++number) {
                const int64_t pause = number < 5 ? 0 : 1300 * int64_t{kTicksPerSecond};
                EXPECT_EQ(MWWriteVideoFrame(file, &picture.Paint(number, pause + number * 400'000)), 1);
            }
        });
        ASSERT_EQ(read.pictures.size(), pictures) << codec;
        EXPECT_NEAR(read.pictures[pictures - 5].time, 1300.2, 0.01) << codec;
        EXPECT_NEAR(read.duration, 1300.4, 0.05) << codec;
    }
}

TEST(Pictures, TooManyForASteadyRateAreLeftOut) {
    TestMovie movie = WithoutSound();
    movie.param.fccFileFormat = FourCC("AVI ");
    const ReadMovie read = WriteAndRead(movie, [](void* file) {
        TestPicture picture(160, 120);
        for (int number = 0; number < 100; ++number) // 2 s, twice as many as announced
            MWWriteVideoFrame(file, &picture.Paint(number, number * 200'000));
    });
    EXPECT_NEAR(static_cast<double>(read.pictures.size()), 50, 1);
    EXPECT_NEAR(read.pictures.back().time, 1.96, 0.05);
}

TEST(FitPicture, BordersKeepTheShapeAndStretchingFills) {
    struct {
        int width, height;
        AVRational shape;
        int outWidth, outHeight;
        bool stretch;
        int fittedWidth, fittedHeight, left, top;
        AVRational outShape;
    } const cases[] = {
        {1280, 720, {1, 1}, 640, 360, false, 640, 360, 0, 0, {1, 1}},
        {1280, 720, {1, 1}, 854, 480, true, 854, 480, 0, 0, {1, 1}}, // square but for the rounding
        {720, 576, {64, 45}, 1280, 960, false, 1280, 720, 0, 120, {1, 1}},
        {480, 640, {1, 1}, 1280, 720, false, 540, 720, 370, 0, {1, 1}},
        {720, 576, {64, 45}, 1280, 960, true, 1280, 960, 0, 0, {4, 3}},
    };
    for (const auto& test : cases) {
        SCOPED_TRACE(&test - cases);
        const writer::PictureFit fit = writer::FitPicture(test.width, test.height, test.shape, test.outWidth,
                                                          test.outHeight, test.stretch);
        EXPECT_EQ(fit.fittedWidth, test.fittedWidth);
        EXPECT_EQ(fit.fittedHeight, test.fittedHeight);
        EXPECT_EQ(fit.left, test.left);
        EXPECT_EQ(fit.top, test.top);
        EXPECT_EQ(av_cmp_q(fit.sampleAspect, test.outShape), 0);
    }
}

TEST(ExactRate, IsTheFractionThatIsMeant) {
    struct {
        double rate;
        AVRational exact;
    } const cases[] = {{25, {25, 1}},          {29.97, {30000, 1001}},  {23.976, {24000, 1001}},
                       {23.98, {24000, 1001}}, {59.94, {60000, 1001}},  {14.985, {15000, 1001}},
                       {12.5, {25, 2}},        {119.88, {120000, 1001}}};
    for (const auto& known : cases)
        EXPECT_EQ(av_cmp_q(av::ExactRate(known.rate), known.exact), 0) << known.rate;
    for (const double rate : {0.001, 0.3, 7.123, 999.9})
        EXPECT_NEAR(av_q2d(av::ExactRate(rate)), rate, rate * 0.001 + 0.0001);
}

} // namespace
