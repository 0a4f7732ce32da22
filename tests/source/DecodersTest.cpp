// The decoders against real movies, whole, damaged and odd, called as the engine calls them.
#include "host/source/Movie.h"
#include "host/source/PacketReader.h"
#include "host/source/StreamDecoder.h"
#include "tests/support/Inspect.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <fcntl.h>
#include <memory>
#include <unistd.h>

namespace {

using namespace test_movies;
using namespace inspect;
using movieconv::Movie;

Args H264Aac() {
    return {"-c:v", "libx264", "-preset", "veryfast", "-bf", "2", "-g", "30", "-c:a", "aac"};
}

std::string Counted4s() {
    return Make("counted.mp4", Join(CountedPictures(4), Beeps(4), H264Aac()));
}

struct Begin {
    const char* name;
    std::string (*movie)();
    double begin;
    int firstPicture;
};

std::string CountedTs() {
    return Make("counted.ts", Join(CountedPictures(4), Beeps(4), H264Aac(), Args{"-c:a", "mp2"}));
}
/// What comes behind it is not seen when it is opened.
std::string PaddedTs() {
    return Make("padded.ts", Join(CountedPictures(4), Beeps(4), H264Aac(), Words("-c:a mp2 -muxrate 16M")));
}
std::string CountedMkv() {
    return Make("counted.mkv", Join(CountedPictures(4), Beeps(4), NearLossless(), Words("-g 30")));
}
std::string CountedMpeg4Ts() {
    return Make("counted-mpeg4.ts",
                Join(CountedPictures(4), Beeps(4),
                     Args{"-c:v", "mpeg4", "-q:v", "2", "-bf", "1", "-g", "51", "-c:a", "mp2"}));
}
std::string CountedFromTen() {
    return Make("from-ten.mkv", {"-i", CountedMkv(), "-c", "copy", "-output_ts_offset", "10"});
}
std::string CountedAsfFromTen() {
    return Make("from-ten.asf", {"-i", CountedMkv(), "-c", "copy", "-output_ts_offset", "10"});
}
std::string CountedOneKeyPicture() {
    return Make("onekey.mp4", Join(CountedPictures(4), Beeps(4), H264Aac(), Args{"-g", "1000"}));
}

const Begin kBegins[] = {
    {"AtTheStart", Counted4s, 0, 0},
    {"OnAPicture", Counted4s, 2.0, 50},
    {"BetweenPictures", Counted4s, 1.23, 30},
    {"JustAfterAKeyPicture", Counted4s, 1.25, 31},
    {"NearTheStart", Counted4s, 0.05, 1},
    {"TransportStream", CountedTs, 2.5, 62},
    {"TransportStreamBeforeItsSecondKeyPicture", CountedTs, 0.83, 20},
    {"TransportStreamThatIsSoughtBetweenKeyPictures", CountedMpeg4Ts, 2.27, 56},
    {"Matroska", CountedMkv, 2.41, 60},
    {"ClockThatStartsAtTenSeconds", CountedFromTen, 2.41, 60},
    {"AsfThatAnnouncesItsLastStamp", CountedAsfFromTen, 2.41, 60},
    {"FarFromAKeyPicture", CountedOneKeyPicture, 3.0, 75},
};
class DecodersFrom : public testing::TestWithParam<Begin> {};

TEST_P(DecodersFrom, GiveEveryPictureOnceWithItsTimeAndAllSound) {
    const auto& [name, source, begin, first] = GetParam();
    Movie movie(source(), {});
    const VideoFormat& video = movie.Pictures()->GetVideoInfo()->format;
    EXPECT_EQ(video.nWidth, 160);
    EXPECT_EQ(video.nHeight, 120);
    EXPECT_DOUBLE_EQ(video.dFrameRate, 25);
    EXPECT_NEAR(video.dDuration, 4, 0.06);

    const Seen seen = TakeAll(movie, begin);
    ASSERT_EQ(seen.pictures.size(), static_cast<size_t>(100 - first));
    EXPECT_NEAR(seen.pictures[0].time, begin, 1e-6);
    for (int i = 0; i < 100 - first; ++i) {
        EXPECT_NEAR(seen.pictures[i].luma, LumaOf(first + i), 1) << "picture " << i;
        EXPECT_TRUE(i == 0 || std::abs(seen.pictures[i].time - (first + i) / 25.0) < 0.012)
            << "picture " << i;
    }
    EXPECT_NEAR(seen.soundBegin, begin, 1e-6);
    EXPECT_TRUE(seen.soundContinuous);
    EXPECT_NEAR(static_cast<double>(seen.sound.size()), (4 - begin) * 44100, 1200);
    EXPECT_LT(seen.largestBlock, 44100 / 25 / 2);
    const std::vector<double> beeps = Beginnings(seen, 44100);
    ASSERT_FALSE(beeps.empty());
    EXPECT_NEAR(beeps.back(), 3, 0.012);
    EXPECT_TRUE(movie.Complaints().empty()) << movie.Complaints()[0].Text();
    EXPECT_TRUE(movie.Losses().empty()) << movie.Losses()[0].Text();

    // At the end they give nothing and stay there.
    EXPECT_LT(movie.Pictures()->DecodeNext(1), 1);
    EXPECT_EQ(movie.Pictures()->GetCurrentImage(), nullptr);
    EXPECT_EQ(movie.Sound()->GetNextFrame(), nullptr);
}

INSTANTIATE_TEST_SUITE_P(Begins, DecodersFrom, testing::ValuesIn(kBegins),
                         [](const auto& test) { return test.param.name; });

TEST(Decoders, DoNotCountTheFrameThatASeekCutsAsDamaged) {
    Movie movie(Make("counted.mpg", Join(CountedPictures(4), Beeps(4), Args{"-c:v", "mpeg2video"})), {});
    TakeAll(movie, 1.23);
    for (const auto& complaint : movie.Complaints())
        EXPECT_EQ(complaint.Text().find("damaged"), std::string::npos) << complaint.Text();
}

TEST(Decoders, KeepTheStampsOfAVariableRate) {
    // Pictures 0, 1, 2, 6, 7, 8, 12 ... of a steady sequence.
    const Args kept{"-vf", "select='lt(mod(n,6),3)'", "-fps_mode", "vfr", "-c:v", "libx264", "-bf", "2"};
    const Seen seen = LookAt(Make("variable.mkv", Join(CountedPictures(4), kept)));
    ASSERT_EQ(seen.pictures.size(), 51u);
    for (size_t i = 0; i < seen.pictures.size(); ++i) {
        const int original = static_cast<int>(i / 3 * 6 + i % 3);
        EXPECT_NEAR(seen.pictures[i].time, original / 25.0, 0.0011) << i;
        EXPECT_NEAR(seen.pictures[i].luma, LumaOf(original), 1) << i;
    }
    EXPECT_NEAR(seen.pictures[2].duration, 4 / 25.0, 0.0011);
}

TEST(Decoders, TurnPicturesUpright) {
    const std::string stored = ReadFile(
        Make("corners.mp4", {"-f", "lavfi", "-i",
                             ("color=black:s=160x120:r=25:d=0.2,format=yuv420p,drawbox=w=80:c=gray:t=fill,"
                              "drawbox=w=80:h=60:c=white:t=fill"), // white over grey in the left half
                             "-c:v", "libx264", "-qp", "10"}));
    struct {
        int a, b, c, d; // (x, y) is shown at (a x + c y, b x + d y)
    } const turns[] = {{1, 0, 0, 1},  {0, 1, -1, 0}, {-1, 0, 0, -1}, {0, -1, 1, 0},
                       {-1, 0, 0, 1}, {1, 0, 0, -1}, {0, 1, 1, 0},   {0, -1, -1, 0}};
    for (const auto& turn : turns) {
        SCOPED_TRACE(&turn - turns);
        std::string bytes = stored;
        const std::size_t matrix = bytes.find("tkhd") + 44; // rows of three numbers of 16.16 bits
        const std::pair<int, int> places[] = {{0, turn.a}, {4, turn.b}, {12, turn.c}, {16, turn.d}};
        for (const auto& [place, value] : places) {
            bytes[matrix + place] = static_cast<char>(value < 0 ? -1 : 0);
            bytes[matrix + place + 1] = static_cast<char>(value);
        }
        const Folder folder;
        WriteFile(folder / "turned.mp4", bytes);
        Movie movie(folder / "turned.mp4", {});
        const VideoImage* image = movie.Pictures()->GetCurrentImage();
        ASSERT_NE(image, nullptr);
        ASSERT_EQ(image->nWidth, turn.a != 0 ? 160 : 120);
        ASSERT_EQ(image->nHeight, turn.a != 0 ? 120 : 160);
        const auto corner = [&](int x, int y) { // of the stored picture, -1 left and top
            const int column = image->nWidth * (2 + turn.a * x + turn.c * y) / 4;
            const int row = image->nHeight * (2 + turn.b * x + turn.d * y) / 4;
            return image->pY[row * image->nPitchY + column];
        };
        EXPECT_GT(corner(-1, -1), 200);
        EXPECT_NEAR(corner(-1, 1), 126, 20);
        EXPECT_LT(corner(1, -1), 40);
        EXPECT_LT(corner(1, 1), 40);
    }
}

TEST(Decoders, BringOtherFormatsToVideoRange) {
    for (const char* format : {"yuvj420p", "yuv444p", "yuv420p10le", "bgr0"}) {
        const bool lossless = std::string(format) != "yuvj420p";
        const Seen seen = LookAt(
            Make(std::string("format-") + format + ".mkv",
                 Join(Args{"-f", "lavfi", "-i", "color=white:s=160x120:r=25:d=0.2", "-vf", "scale=161:121"},
                      Args{"-pix_fmt", format, "-c:v", lossless ? "ffv1" : "mjpeg"})));
        ASSERT_EQ(seen.pictures.size(), 5u) << format;
        EXPECT_EQ(seen.pictures[0].width, 161) << format;
        EXPECT_EQ(seen.pictures[0].height, 121) << format;
        EXPECT_NEAR(seen.pictures[0].luma, 235, 2) << format;
    }
}

TEST(Decoders, GiveWhatATruncatedMovieHolds) {
    const Folder folder;
    const std::string whole = ReadFile(CountedTs());
    WriteFile(folder / "cut.ts", whole.substr(0, whole.size() * 6 / 10));
    Movie movie(folder / "cut.ts", {});
    const Seen seen = TakeAll(movie);
    EXPECT_GT(seen.pictures.size(), 40u);
    EXPECT_LT(seen.pictures.size(), 80u);
    for (size_t i = 0; i + 1 < seen.pictures.size(); ++i)
        EXPECT_NEAR(seen.pictures[i].luma, LumaOf(static_cast<int>(i)), 2) << i;
    EXPECT_NEAR(movie.Info().duration, static_cast<double>(seen.pictures.size()) / 25, 0.3);
}

TEST(Decoders, SkipDamagedDataAndKeepTime) {
    const Folder folder;
    std::string bytes = ReadFile(CountedTs());
    for (std::size_t at = bytes.size() / 3; at < bytes.size() / 3 + 6000; at += 40)
        bytes[at] = '\x55';
    WriteFile(folder / "damaged.ts", bytes);
    Movie movie(folder / "damaged.ts", {});
    const Seen seen = TakeAll(movie);
    EXPECT_GT(seen.pictures.size(), 60u);
    for (size_t i = 1; i < seen.pictures.size(); ++i)
        EXPECT_GT(seen.pictures[i].time, seen.pictures[i - 1].time) << i;
    EXPECT_NEAR(seen.pictures.back().time, 3.96, 0.05);
    const std::vector<double> beeps = Beginnings(seen, 44100);
    ASSERT_FALSE(beeps.empty());
    EXPECT_NEAR(beeps.back(), 3, 0.03);
    EXPECT_FALSE(movie.Complaints().empty());
}

// What a decoder keeps back when the packets end comes out behind an error as well.
TEST(Decoders, DoNotCountAnEmptyPacketAsDamaged) {
    const movieconv::Source source(CountedMkv(), {});
    const AVStream& stream = *source.PictureStream();
    movieconv::StreamDecoder decoder(*stream.codecpar, stream.time_base, 1);
    const av::Packet empty = av::NewPacket();
    ASSERT_EQ(av_new_packet(empty.get(), 0), 0);
    EXPECT_TRUE(decoder.Decode(empty.get(), [](AVFrame&) { return true; }));
    EXPECT_EQ(decoder.Damaged(), 0);
}

TEST(Decoders, GiveWhatIsWholeBehindDamageAtTheEnd) {
    const std::string path = Make("noise-end.mp4", {"-f", "lavfi", "-i", "testsrc2=s=320x240:r=25:d=1", "-vf",
                                                    "noise=alls=60:allf=t", "-c:v", "libx264", "-qp", "10",
                                                    "-bf", "0", "-g", "1000", "-x264-params", "slices=1"});
    movieconv::PacketReader reader(path, false, movieconv::Growth::kRead,
                                   std::make_shared<movieconv::Interruption>());
    const AVStream& stream = *reader.Context()->streams[0];
    movieconv::StreamDecoder decoder(*stream.codecpar, stream.time_base, 4);
    int pictures = 0;
    const auto count = [&](AVFrame&) { return ++pictures > 0; };
    const av::Packet packet = av::NewPacket();
    for (int number = 0; av_read_frame(reader.Context(), packet.get()) >= 0; ++number) {
        if (number == 23) // of 25
            std::fill(packet->data + 5, packet->data + packet->size, uint8_t{0});
        decoder.Decode(packet.get(), count);
        av_packet_unref(packet.get());
    }
    EXPECT_FALSE(decoder.Decode(nullptr, count));
    EXPECT_EQ(pictures, 24);
    EXPECT_EQ(decoder.Damaged(), 1);
}

/// Two transport streams end to end; `mixed`, the second's first pictures come before the last sound of the
/// first.
std::string Joined(const std::string& first, const std::string& second, bool mixed) {
    constexpr std::size_t kPacket = 188;
    const std::size_t border = mixed ? 60 * kPacket : 0;
    const std::string middle = first.substr(first.size() - border) + second.substr(0, border);
    std::string pictures;
    std::string sound;
    for (std::size_t at = 0; at < middle.size(); at += kPacket) {
        const bool isSound = (middle[at + 1] & 0x1F) == 1 && middle[at + 2] == 1; // stream 0x101
        (isSound ? sound : pictures) += middle.substr(at, kPacket);
    }
    return first.substr(0, first.size() - border) + pictures + sound + second.substr(border);
}

TEST(Decoders, JoinRecordingsThatStartANewClock) {
    const Folder folder;
    const std::string late = Make("late-clock.ts", Join(CountedPictures(4), Beeps(4), H264Aac(),
                                                        Args{"-c:a", "mp2", "-output_ts_offset", "5000"}));
    const std::string renumbered =
        Make("renumbered.ts", {"-i", CountedTs(), "-map", "0", "-c", "copy", "-mpegts_start_pid", "0x200"});
    const struct {
        std::string first, second;
        bool mixed;
    } cases[] = {{PaddedTs(), renumbered, false},
                 {late, CountedTs(), false},
                 {CountedTs(), CountedTs(), false},
                 {CountedTs(), late, false},
                 {late, CountedTs(), true}};
    for (const auto& [first, second, mixed] : cases) {
        WriteFile(folder / "joined.ts", Joined(ReadFile(first), ReadFile(second), mixed));
        Movie movie(folder / "joined.ts", {});
        EXPECT_LT(movie.Info().duration, 9);
        const Seen seen = TakeAll(movie);
        EXPECT_EQ(seen.pictures.size(), 200u) << first;
        EXPECT_NEAR(seen.pictures.back().time, 7.96, 0.2) << first;
        EXPECT_NEAR(static_cast<double>(seen.sound.size()) / 44100, 8, 0.2) << first;
        EXPECT_EQ(Beginnings(seen, 44100).size(), 8u) << first;
        ASSERT_FALSE(movie.Complaints().empty()) << first;
        EXPECT_NE(movie.Complaints()[0].Text().find("jumped once"), std::string::npos)
            << movie.Complaints()[0].Text();
        Movie again(folder / "joined.ts", {});
        EXPECT_NEAR(static_cast<double>(TakeAll(again, 6).pictures.size()), 50, 5) << first;
    }
}

TEST(Decoders, TellWhatABroadcastAnnouncesLateAndTheyLeaveOut) {
    const std::string other =
        Make("other-codec.ts", Join(CountedPictures(4), Beeps(4), Words("-c:v mpeg2video -c:a mp2"),
                                    Words("-mpegts_start_pid 0x200 -output_ts_offset 4")));
    const Folder folder;
    WriteFile(folder / "joined.ts", ReadFile(PaddedTs()) + ReadFile(other));
    Movie movie(folder / "joined.ts", {});
    const Seen seen = TakeAll(movie);
    EXPECT_EQ(seen.pictures.size(), 100u);
    EXPECT_EQ(Beginnings(seen, 44100).size(), 8u);
    ASSERT_FALSE(movie.Complaints().empty());
    EXPECT_EQ(movie.Complaints()[0].Text(),
              "pictures of 4 s, which the source announces only at 4 s, were left out");
    ASSERT_TRUE(movie.Missing());
    EXPECT_NEAR(movie.Missing()->reached, 4, 0.2);
    EXPECT_NEAR(movie.Missing()->announced, 8, 0.2);
}

TEST(Decoders, TellWhatDoesNotFitIntoWhatBeganSmaller) {
    const auto part = [](const char* pictures, const char* form) {
        return ReadFile(Make("part.ts", Join(Lavfi(std::string("color=white:r=25:d=1:s=") + pictures),
                                             Beeps(1), Words(std::string("-c:v mpeg2video ") + form))));
    };
    const Folder folder;
    WriteFile(folder / "joined.ts", part("160x120,setsar=4/3", "-c:a ac3 -ac 2 -ar 48000") +
                                        part("160x120,setsar=1", "-c:a ac3 -ac 2 -ar 48000") +
                                        part("320x240,setsar=1", "-c:a ac3 -ac 6 -ar 48000"));
    Movie movie(folder / "joined.ts", {});
    const Seen seen = TakeAll(movie);
    ASSERT_GT(seen.pictures.size(), 70u); // of 75: where recordings meet, packets do not follow each other
    for (const int square : {40, 60}) { // between black bars, as the first ones are wider than they are high
        EXPECT_EQ(seen.pictures[square].width, 160);
        EXPECT_NEAR(seen.pictures[square].luma, 235 * 0.75 + 16 * 0.25, 3);
    }
    EXPECT_NEAR(seen.pictures[10].luma, 235, 2);
    std::vector<std::string> told;
    for (const auto& texts : {movie.Losses(), movie.Complaints()})
        for (const auto& text : texts)
            told.push_back(text.Text());
    for (const char* text : {"some of its pictures have 320x240 and were fitted into those of 160x120",
                             "some of its sound has 6 channels and got 2"})
        EXPECT_EQ(std::count(told.begin(), told.end(), text), 1) << text;
}

TEST(Decoders, GiveAPictureThatStaysForLongSeveralTimes) {
    const std::string movie = Make(
        "stays.mp4", Join(Lavfi("testsrc=s=64x48:r=1/300:d=900"), Words("-c:v libx264 -preset ultrafast")));
    for (const bool stampsOnly : {false, true}) {
        Movie decoded(movie, {.stampsOnly = stampsOnly});
        VideoDecoder& pictures = *decoded.Pictures();
        int count = 0;
        int64_t end = 0;
        do {
            const VideoImage* image = pictures.GetCurrentImage();
            ASSERT_NE(image, nullptr);
            EXPECT_EQ(int64_t{image->llTime}, end); // which lies at no multiple of 8
            end = image->llTime + image->nDuration;
            ++count;
        } while (pictures.DecodeNext(1) > 0);
        EXPECT_EQ(count, 9);
        EXPECT_EQ(end, 900 * int64_t{kTicksPerSecond});
    }
}

/// The name of a pipe that the file has been written into.
std::string Piped(const std::string& path) {
    const std::string bytes = ReadFile(path);
    int ends[2];
    EXPECT_EQ(pipe2(ends, O_CLOEXEC), 0);
    EXPECT_GE(fcntl(ends[1], F_SETPIPE_SZ, 1 << 20), static_cast<int>(bytes.size()));
    EXPECT_EQ(write(ends[1], bytes.data(), bytes.size()), static_cast<ssize_t>(bytes.size()));
    close(ends[1]);
    return "/dev/fd/" + std::to_string(ends[0]);
}

TEST(Decoders, EstimateTheLengthOfAStreamThatTellsNone) {
    Movie movie(Make("raw.h264", Join(CountedPictures(4), Args{"-c:v", "libx264", "-preset", "veryfast"})),
                {});
    EXPECT_NEAR(movie.Info().duration, 4, 0.1);
    const Seen seen = TakeAll(movie);
    EXPECT_EQ(seen.pictures.size(), 100u);
    EXPECT_NEAR(seen.pictures.back().time, 3.96, 0.05);

    for (const std::string& path : {movie.Info().path, Piped(movie.Info().path)}) {
        EXPECT_EQ(LookAt(path, 0.4).pictures.size(), 90u) << path;
    }

    for (const double begin : {0.0, 20.5}) { // longer than what is read to find its length
        Movie sound(Make("long.ac3", Join(Beeps(30), Args{"-c:a", "ac3", "-b:a", "640k"})), {});
        EXPECT_NEAR(sound.Info().duration, 30, 0.1);
        EXPECT_EQ(Beginnings(TakeAll(sound, begin), 44100).size(), begin > 0 ? 9u : 30u);
    }
}

} // namespace
