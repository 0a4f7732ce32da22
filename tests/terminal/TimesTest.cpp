// Pictures and sound at their times, where source, format or options make that hard.
#include "tests/support/Inspect.h"
#include "tests/support/Program.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <string>
#include <utility>
#include <vector>

namespace {

using namespace test_movies;
using inspect::Seen;
using program::Call;
using program::Result;

Seen Convert(const std::string& source, const Args& options, const char* format) {
    const Folder folder;
    const std::string output = folder / (std::string("out.") + format);
    const Result result = Call(Join(Args{"-q", "--speed", "fastest", source, output}, options));
    EXPECT_EQ(result.code, 0) << result.err;
    return result.code == 0 ? inspect::LookAt(output) : Seen{};
}

TEST(Times, OfARangeBehindTheSoundAreThoseOfItsPictures) {
    const std::string source =
        Make("short-sound.mp4", Join(CountedPictures(6), Beeps(2), NearLossless(), Args{"-c:a", "aac"}));
    for (const Args& options : {Args{}, Args{"--jobs", "2", "--piece-length", "0.5"}}) {
        const Seen seen = Convert(source, Join(Args{"--begin", "4", "--length", "1"}, options), "mkv");
        ASSERT_EQ(seen.pictures.size(), 25U);
        for (int i = 0; i < 25; ++i)
            EXPECT_NEAR(seen.pictures[static_cast<std::size_t>(i)].luma, LumaOf(100 + i), 1);
        EXPECT_NEAR(static_cast<double>(seen.sound.size()) / 44100, 1, 0.08);
    }
}

// The last one is what a player shows there.
TEST(Times, OfARangeBehindThePicturesBeginWithTheLastOne) {
    const std::string source =
        Make("short-pictures.mp4", Join(CountedPictures(1), Beeps(3), NearLossless(), Args{"-c:a", "aac"}));
    const Seen seen = Convert(source, {"--begin", "2"}, "mp4");
    ASSERT_EQ(seen.pictures.size(), 1U);
    EXPECT_NEAR(seen.pictures[0].luma, LumaOf(24), 1);
    EXPECT_NEAR(static_cast<double>(seen.sound.size()) / 44100, 1, 0.08);
}

TEST(Times, OfAMovieThatWasCutByAnEditListAreTheSameInPieces) {
    for (const char* codec : {"libx264", "mjpeg"}) {
        SCOPED_TRACE(codec);
        const std::string whole = Make(
            std::string("uncut-") + codec + ".mov",
            Join(CountedPictures(3), Beeps(3), Args{"-c:v", codec, "-q:v", "2", "-g", "50", "-c:a", "aac"}));
        const std::string cut =
            Make(std::string("cut-") + codec + ".mov", {"-ss", "0.5", "-i", whole, "-c", "copy"});
        for (const Args& options : {Args{}, Args{"--jobs", "2", "--piece-length", "1"}}) {
            const Seen seen = Convert(cut, options, "mkv");
            ASSERT_NEAR(static_cast<double>(seen.pictures.size()), 62, 1);
            EXPECT_NEAR(seen.pictures[1].luma, LumaOf(75 - static_cast<int>(seen.pictures.size()) + 1), 2);
            EXPECT_NEAR(seen.pictures.back().luma, LumaOf(74), 2);
        }
    }
}

TEST(Times, OfFewPicturesAreKeptByRepeatingThem) {
    const std::string source =
        Make("few.mkv", Join(FlashPictures(6), Beeps(6), NearLossless(),
                             Args{"-vf", "select='not(mod(n,25))+not(mod(n-2,25))+not(mod(n-13,50))'",
                                  "-fps_mode", "passthrough"}));
    const struct {
        const char* format;
        Args options;
        double pictures; // the last one's end is not told
    } cases[] = {{"mp4", {}, 15}, {"mp4", {"--frame-rate", "25"}, 128}, {"mpg", {}, 128}};
    for (const auto& test : cases) {
        SCOPED_TRACE(std::string(test.format) + (test.options.empty() ? "" : " steady"));
        for (const Args& pieces : {Args{}, Args{"--jobs", "2", "--pieces", "3"}}) {
            const Seen seen = Convert(source, Join(test.options, pieces), test.format);
            EXPECT_NEAR(static_cast<double>(seen.pictures.size()), test.pictures, 2);
            const std::vector<double> flashes = inspect::Flashes(seen);
            const std::vector<double> beeps = inspect::Beginnings(seen, 44100);
            ASSERT_EQ(flashes.size(), beeps.size());
            for (std::size_t i = 0; i < flashes.size(); ++i)
                EXPECT_NEAR(flashes[i], beeps[i], 0.05);
        }
    }
}

// A stream of a broadcast that begins late, or pauses for long, is neither lost nor out of step.
TEST(Times, OfStreamsThatBeginLateOrPause) {
    const Args source =
        Join(FlashPictures(20), Beeps(20), Args{"-c:v", "mpeg2video", "-q:v", "2", "-c:a", "mp2"});
    const Args lateSound{"-af", "aselect='gt(t,11.5)'"};
    const Args latePictures{"-vf", "select='gt(t,11.5)'", "-fps_mode", "passthrough"};
    const Args soundPauses{"-af", "aselect='lt(t,3.5)+gt(t,15.5)'"};
    const Args picturesPause{"-vf", "select='lt(t,3.5)+gt(t,15.5)'", "-fps_mode", "passthrough"};
    const struct {
        const char* name;
        const Args& filter;
        std::size_t flashes, beeps;
    } cases[] = {{"late-sound.ts", lateSound, 20, 8},        {"late-sound.mpg", lateSound, 20, 8},
                 {"late-pictures.ts", latePictures, 8, 20},  {"late-pictures.mpg", latePictures, 8, 20},
                 {"sound-pauses.ts", soundPauses, 20, 8},    {"sound-pauses.mpg", soundPauses, 20, 8},
                 {"pictures-pause.ts", picturesPause, 8, 20}};
    for (const auto& [name, filter, flashes, beeps] : cases) {
        SCOPED_TRACE(name);
        const Seen seen = Convert(Make(name, Join(source, filter)), {}, "mkv");
        for (const auto& [times, count] :
             {std::pair{inspect::Flashes(seen), flashes}, {inspect::Beginnings(seen, 44100), beeps}}) {
            ASSERT_EQ(times.size(), count);
            for (std::size_t last = 1; last <= 4; ++last)
                EXPECT_NEAR(times[count - last], 20 - static_cast<double>(last), 0.1);
        }
    }
}

double EndOf(const Seen& seen) {
    return seen.pictures.empty() ? 0 : seen.pictures.back().time + seen.pictures.back().duration;
}

TEST(Times, OfTheLastPictureLastAsLongAsItsSourceTells) {
    const Args picks{"-fps_mode", "passthrough", "-vf"};
    const std::string held =
        Make("held.gif", Join(CountedPictures(1, "10"), Args{"-final_delay", "300"})); // of 100 a second
    const std::string slides =
        Make("slides.mkv", Join(Join(CountedPictures(4.24), NearLossless()),
                                Join(picks, Args{"select='not(n)+eq(n,25)+eq(n,100)+eq(n,105)'"})));
    const std::string few = // it tells how many there are in a second
        Make("slides.mp4", Join(Join(CountedPictures(4.24), NearLossless()),
                                Join(picks, Args{"select='not(n)+eq(n,25)+eq(n,100)+eq(n,105)'",
                                                 "-video_track_timescale", "25"})));
    const struct {
        std::string source;
        Args options;
        double end;
    } cases[] = {
        {few, {}, 4.24},
        {few, {"--frame-rate", "25"}, 4.24},
        {held, {}, 3.9},
        {held, {"--frame-rate", "25"}, 3.9},
        {held, {"--begin", "0.5", "--length", "2"}, 2},
        {held, {"--begin", "2"}, 1.9},
        {held, {"--jobs", "2", "--pieces", "2"}, 3.9},
        {slides, {}, 4.24},
        {slides, {"--length", "3"}, 3},
        {slides, {"--jobs", "2", "--pieces", "2"}, 4.24},
    };
    for (const auto& test : cases) {
        for (const char* format : {"mp4", "mkv", "avi", "gif"}) {
            const bool inPieces =
                std::find(test.options.begin(), test.options.end(), "--jobs") != test.options.end();
            if (inPieces && format == std::string("gif"))
                continue; // which is not made of any
            if (test.source == few && test.options.empty() && format == std::string("mkv"))
                continue; // whose reader takes a usual length for each
            SCOPED_TRACE(test.source + " " + format + " " + std::to_string(&test - cases));
            EXPECT_NEAR(EndOf(Convert(test.source, test.options, format)), test.end, 0.11);
        }
    }
    const Folder folder;
    ASSERT_EQ(Call({"-q", "--split", "1", slides, folder / "clip.mp4"}).code, 0);
    EXPECT_NEAR(EndOf(inspect::LookAt(folder / "clip_01.mp4")), 3, 0.05);
}

TEST(Times, OfThePartAskedForAreExact) {
    const std::string source = Make("plain.mkv", Join(CountedPictures(2), Beeps(2), NearLossless()));
    const struct {
        const char* begin;
        const char* length;
        double seconds;
        std::size_t pictures;
    } cases[] = {{"0.5", "1", 1, 26}, {"0.3", "0.123", 0.123, 4}, {"0", "0.001", 0.001, 1}};
    for (const auto& [begin, length, seconds, pictures] : cases) {
        SCOPED_TRACE(length);
        const Seen seen =
            Convert(source, {"--begin", begin, "--length", length, "--audio-codec", "PCM"}, "mov");
        EXPECT_EQ(static_cast<long>(seen.sound.size()), std::lround(seconds * 44100));
        ASSERT_EQ(seen.pictures.size(), pictures);
        EXPECT_NEAR(EndOf(seen), seconds, 0.001);
    }
}

// MPEG-2 has few rates; one that nobody asked for is brought to the next one.
TEST(Times, OfAviAreKeptWhereFewPicturesCome) {
    const std::string source =
        Make("seldom.mp4",
             Join(Join(CountedPictures(20), NearLossless()),
                  Args{"-fps_mode", "passthrough", "-vf", "select='not(n)+eq(n,60)+eq(n,330)+eq(n,405)'"}));
    const Seen seen = Convert(source, {}, "avi");
    std::vector<double> times; // when another picture is seen
    for (std::size_t i = 0; i < seen.pictures.size(); ++i)
        if (i == 0 || std::abs(seen.pictures[i].luma - seen.pictures[i - 1].luma) > 1)
            times.push_back(seen.pictures[i].time);
    const std::vector<double> wanted{0, 2.4, 13.2, 16.2};
    ASSERT_EQ(times.size(), wanted.size());
    for (std::size_t i = 0; i < wanted.size(); ++i)
        EXPECT_NEAR(times[i], wanted[i], 0.06);
}

// Players take a picture of less than 20 ms for one of 100.
TEST(Times, OfGifAreThoseThatPlayersKeep) {
    const std::string source = Make("fast.mkv", Join(CountedPictures(2, "100"), NearLossless()));
    const Seen seen = Convert(source, {}, "gif");
    EXPECT_NEAR(EndOf(seen), 2, 0.1);
    const Folder folder;
    EXPECT_EQ(Call({"-q", "--frame-rate", "60", source, folder / "out.gif"}).code, 2);
}

TEST(Times, OfSilenceBehindTheSoundAreThoseOfLongPictures) {
    const std::string source =
        Make("stills.mkv", Join(Lavfi("testsrc2=s=64x48:r=1/250:d=1000"),
                                Join(Lavfi("aevalsrc=0.4*sin(500*t):s=8000:d=5"), Words("-c:a pcm_s16le"))));
    const Folder folder;
    ASSERT_EQ(Call({"-q", source, folder / "out.mp4"}).code, 0);
    const std::string told =
        Ffprobe(folder / "out.mp4", Words("-select_streams a -show_entries stream=duration -of csv=p=0"));
    EXPECT_GE(std::stod(told), 850);
}

// A header may announce less than there is.
TEST(Times, OfALengthBeyondTheEndAreAllThereAre) {
    std::string content = ReadFile(
        Make("announces.flv", Join(CountedPictures(4), Join(Beeps(4), Words("-c:v flv1 -c:a libmp3lame")))));
    const std::string name = "duration";
    const std::size_t value = content.find(name) + name.size() + 1;
    ASSERT_LT(value, content.size());
    content.replace(value, 8, std::string("\x40\0\0\0\0\0\0\0", 8)); // two seconds
    const Folder folder;
    const std::string source = folder / "announces-two.flv";
    WriteFile(source, content);
    for (const Args& options : {Args{}, Args{"--length", "99"}})
        EXPECT_EQ(Convert(source, options, "mkv").pictures.size(), 100U);
}

TEST(Times, OfMpeg2AreThoseOfOneOfItsRates) {
    const std::string source =
        Make("mean-rate.mp4",
             Join(FlashPictures(4), Beeps(4), NearLossless(),
                  Args{"-vf", "select='lt(t,2.5)+gt(t,2.9)'", "-fps_mode", "passthrough", "-c:a", "aac"}));
    for (const char* format : {"mpg", "mkv"}) {
        SCOPED_TRACE(format);
        const Seen seen = Convert(source, {"--video-codec", "MPG2"}, format);
        EXPECT_GE(seen.pictures.size(), 90U);
        const std::vector<double> flashes = inspect::Flashes(seen);
        const std::vector<double> beeps = inspect::Beginnings(seen, 44100);
        ASSERT_EQ(flashes.size(), beeps.size());
        for (std::size_t i = 0; i < flashes.size(); ++i)
            EXPECT_NEAR(flashes[i], beeps[i], 0.05);
    }
    const Folder folder;
    EXPECT_EQ(Call({"-q", "--frame-rate", "21.3", source, folder / "out.mpg"}).code, 2);
}

// What formats hold of a codec at low sampling rates.
TEST(Times, OfSoundOfLowRates) {
    const std::string source = Make("beeps.mkv", Join(CountedPictures(4), Beeps(4), NearLossless()));
    for (const auto& [codec, format] : {std::pair{"MP3", "mp4"}, {"AAC", "avi"}, {"AAC", "mp4"}}) {
        SCOPED_TRACE(std::string(codec) + " in " + format);
        const Folder folder;
        const std::string output = folder / (std::string("out.") + format);
        const Result result = Call({"-q", "--audio-codec", codec, "--sample-rate", "8000", "--channels", "1",
                                    "--video-codec", "XVID", source, output});
        ASSERT_EQ(result.code, 0) << result.err;
        movieconv::Movie movie(output, {});
        const int rate = movie.Sound()->GetAudioInfo()->format.nSampleRate;
        EXPECT_EQ(rate, std::string(codec) == "MP3" ? 16000 : 8000);
        const Seen seen = inspect::TakeAll(movie);
        EXPECT_NEAR(static_cast<double>(seen.sound.size()) / rate, 4, 0.2);
        const std::vector<double> beeps = inspect::Beginnings(seen, rate);
        ASSERT_EQ(beeps.size(), 4U);
        for (std::size_t i = 0; i < 4; ++i)
            EXPECT_NEAR(beeps[i], static_cast<double>(i), 0.08);
    }
}

} // namespace
