// Every format with every codec that the table says it carries: written, then read back and decoded.
#include "MovieReader.h"
#include "media/CodeText.h"
#include "tests/support/Folder.h"
#include "writer/Encoder.h"
#include "writer/FormatTable.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <sched.h>
#include <string>
#include <unistd.h>
#include <vector>

namespace {

struct Pair {
    uint32_t format;
    uint32_t video; ///< 0: none.
    uint32_t audio; ///< 0: none.
};

std::string Name(const testing::TestParamInfo<Pair>& info) {
    std::string name;
    for (const uint32_t code : {info.param.format, info.param.video, info.param.audio})
        name += (name.empty() ? "" : "_") + (code == 0 ? "none" : CodeText(code));
    std::erase(name, ' ');
    return name;
}

/// Each codec of each format once, with the default of the other kind.
std::vector<Pair> AllPairs() {
    std::vector<Pair> pairs;
    for (const FileFormatInfo* info = MWGetFileFormatInfos(); info->fccFormat != 0; ++info) {
        for (const uint32_t* video = info->fccVideoCodecs; *video != 0; ++video)
            pairs.push_back({info->fccFormat, *video, info->fccAudioCodecs[0]});
        for (const uint32_t* audio = info->fccAudioCodecs + (info->bHasVideo != 0 ? 1 : 0); *audio != 0;
             ++audio)
            pairs.push_back({info->fccFormat, info->fccVideoCodecs[0], *audio});
    }
    return pairs;
}

std::vector<Pair> PicturePairs() {
    std::vector<Pair> pairs = AllPairs();
    std::erase_if(pairs, [](const Pair& pair) { return pair.video == 0; });
    return pairs;
}

class Formats : public testing::TestWithParam<Pair> {
protected:
    Formats() {
        movie_.pictures = 30;
        movie_.soundSeconds = 1.2;
        movie_.quietSeconds = 0.4;
        movie_.param.fccFileFormat = GetParam().format;
        movie_.param.fccVideo = GetParam().video;
        movie_.param.fccAudio = GetParam().audio;
        movie_.hasVideo = GetParam().video != 0;
        movie_.hasAudio = GetParam().audio != 0;
    }

    TestMovie movie_;
};

class PictureFormats : public Formats {};

TEST_P(Formats, AreReadBackComplete) {
    const ReadMovie read = WriteAndRead(movie_);
    const writer::Container* container = writer::FindContainer(GetParam().format);
    EXPECT_TRUE(read.readable);
    EXPECT_EQ(read.audioStreams, movie_.hasAudio ? 1 : 0);
    if (movie_.hasAudio) {
        EXPECT_EQ(read.audioCodec, writer::FindSoundCodec(*container, GetParam().audio)->id);
        EXPECT_EQ(read.channels, 2);
        // The decoder may hear the run-up and the padding of the codec's frames, nothing else.
        const double heard = static_cast<double>(read.samples) / read.sampleRate;
        EXPECT_NEAR(heard, 1.2, 0.09);
        EXPECT_GE(heard, 1.2 - 0.0001);
    }
    if (movie_.hasVideo) {
        EXPECT_EQ(read.videoStreams, 1);
        EXPECT_EQ(read.videoCodec, writer::FindPictureCodec(*container, GetParam().video)->id);
        ASSERT_EQ(read.pictures.size(), 30U);
        const double start = read.pictures.front().time;
        for (size_t i = 0; i < read.pictures.size(); ++i)
            ASSERT_NEAR(read.pictures[i].time - start, static_cast<double>(i) / 25.0, 0.0011) << i;
        if (movie_.hasAudio) {
            EXPECT_NEAR(read.audioStart, start, 0.04);
            EXPECT_NEAR(read.ToneBegins() - start, movie_.quietSeconds, 0.01);
        }
        EXPECT_NEAR(read.duration, 1.2, 0.1);
    }

    const WriterStatus status = Latest();
    EXPECT_EQ(status.nState, kWriterFileComplete);
    EXPECT_NEAR(status.dAudioWritten, movie_.hasAudio ? 1.2 : 0.0, 0.0001);
    EXPECT_NEAR(status.dVideoWritten, movie_.hasVideo ? 1.2 : 0.0, 0.0001);
    EXPECT_EQ(status.llPicturesWritten, movie_.hasVideo ? 30 : 0);
}

// A source can announce sound and have none.
TEST_P(PictureFormats, KeepPicturesWithoutSound) {
    movie_.pictures = 5;
    movie_.soundSeconds = 0;
    const ReadMovie read = WriteAndRead(movie_);
    EXPECT_TRUE(read.readable);
    EXPECT_EQ(read.pictures.size(), 5U);
}

/// Bytes of a short file of that codec, by itself, with these options; 0 when it is refused.
int64_t SizeWith(uint32_t format, uint32_t codec, const WriterOptions& options) {
    const Folder folder;
    const uint32_t set = MWRegisterOptions(&options);
    TestMovie movie;
    movie.width = 320;
    movie.height = 240;
    movie.pictures = 20;
    movie.hasAudio = false;
    movie.param.fccFileFormat = format;
    movie.param.fccVideo = codec;
    movie.param.nReserved[kWriterSetWord] = set;
    const bool written = movie.Write(folder / "movie");
    const int64_t size = Latest(set).llBytesWritten;
    MWUnregisterOptions(set);
    return written ? size : 0;
}

TEST_P(PictureFormats, TakeAQualityOfTheCodecsScale) {
    const auto [format, codec, sound] = GetParam();
    WriterOptions options{};
    options.bQuality = 1;
    double best = 0;
    double worst = 0;
    if (MWGetQualityScale(codec, &best, &worst) == 0) {
        EXPECT_EQ(SizeWith(format, codec, options), 0) << "a quality of no scale is refused";
        return;
    }
    const auto size = [&, format = format, codec = codec](double quality) {
        options.dQuality = quality;
        return SizeWith(format, codec, options);
    };
    const int64_t small = size(best + 0.8 * (worst - best));
    EXPECT_GT(small, 0);
    // Few packets fill a unit of 6144 bytes there, of which such a file consists.
    const int64_t least = format == FourCC("M2TS") ? small - 1 : small;
    EXPECT_GT(size(best + 0.05 * (worst - best)), least);
    EXPECT_EQ(size(worst + 1), 0);
    EXPECT_EQ(size(best - 1), 0);
}

TEST_P(PictureFormats, TakeTheDepthsThatTheyTell) {
    const auto [format, codec, sound] = GetParam();
    WriterOptions options{};
    for (const int depth : {8, 9, 10}) {
        options.nDepth = depth;
        const bool told = depth != 9 && depth <= MWGetPictureDepth(codec);
        EXPECT_EQ(SizeWith(format, codec, options) > 0, told) << depth;
    }
}

TEST(Speed, IsTheEncodersChoiceOfTools) {
    const auto size = [](int speed, int profile) {
        WriterOptions options{};
        options.bQuality = 1;
        options.dQuality = 24;
        options.nSpeed = speed;
        options.nProfile = profile;
        return SizeWith(FourCC("MKV "), FourCC("H264"), options);
    };
    EXPECT_EQ(size(0, 0), size(5, 0));
    EXPECT_LT(size(1, 0), size(7, 0));
    EXPECT_NE(size(5, 1), size(5, 0)) << "baseline has fewer tools";
    EXPECT_EQ(size(8, 0), 0);
    EXPECT_EQ(size(5, 4), 0);
}

INSTANTIATE_TEST_SUITE_P(All, Formats, testing::ValuesIn(AllPairs()), Name);
INSTANTIATE_TEST_SUITE_P(All, PictureFormats, testing::ValuesIn(PicturePairs()), Name);

TEST(Encoders, LeaveThreadsToTheUsualSchedule) {
    if (geteuid() != 0)
        GTEST_SKIP() << "only root may have real-time threads";
    const av::CodecContext context =
        writer::NewEncoder(avcodec_find_encoder_by_name("libsvtav1"), FourCC("AV01"), {});
    context->width = 64;
    context->height = 64;
    context->pix_fmt = AV_PIX_FMT_YUV420P;
    context->time_base = {1, 25};
    writer::OpenEncoder(*context, FourCC("AV01"), "these pictures");
    int threads = 0;
    for (const auto& thread : std::filesystem::directory_iterator("/proc/self/task")) {
        EXPECT_EQ(sched_getscheduler(std::stoi(thread.path().filename())), SCHED_OTHER) << thread.path();
        ++threads;
    }
    EXPECT_GT(threads, 1);
    // This encoder cannot be closed without having had a picture.
    const av::Frame picture(av_frame_alloc());
    picture->format = context->pix_fmt;
    picture->width = context->width;
    picture->height = context->height;
    ASSERT_EQ(av_frame_get_buffer(picture.get(), 0), 0);
    const av::Packet packet = av::NewPacket();
    writer::Encode(*context, picture.get(), *packet, [](AVPacket&) {});
    writer::Encode(*context, nullptr, *packet, [](AVPacket&) {});
}

TEST(Encoders, EndWithoutAPicture) {
    for (const uint32_t code : {FourCC("AV01"), FourCC("HEVC"), FourCC("H264"), FourCC("VP90")}) {
        SCOPED_TRACE(CodeText(code));
        TestMovie movie;
        movie.pictures = 0;
        movie.soundSeconds = 0.5;
        movie.param.fccFileFormat = FourCC("MKV ");
        movie.param.fccVideo = code;
        const ReadMovie read = WriteAndRead(movie);
        EXPECT_TRUE(read.pictures.empty());
        EXPECT_GT(read.samples, 0);
    }
}

} // namespace
