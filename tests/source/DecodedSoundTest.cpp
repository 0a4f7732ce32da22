// In which form sound comes out of its decoder, and where on the movie's clock.
#include "host/source/Movie.h"
#include "tests/support/Inspect.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdlib>
#include <string>
#include <vector>

namespace {

using namespace test_movies;
using namespace inspect;
using movieconv::Movie;

TEST(DecodedSound, MakeInterleavedPcmOfAnySound) {
    const struct {
        const char* name;
        int channels, rate, bits;
        Args encoding;
    } cases[] = {
        {"8-bit.wav", 1, 8000, 16, {"-c:a", "pcm_u8", "-ar", "8000"}},
        {"5.1.ac3", 6, 48000, 16, {"-c:a", "ac3", "-ar", "48000", "-af", "pan=5.1|c0=c0"}},
        {"deep.wav", 1, 44100, 32, {"-c:a", "pcm_s24le"}},
        {"stereo.mp3", 2, 44100, 16, {"-c:a", "libmp3lame", "-ac", "2"}},
        {"vorbis.ogg", 2, 44100, 16, {"-c:a", "libvorbis", "-ac", "2"}},
    };
    for (const auto& test : cases) {
        SCOPED_TRACE(test.name);
        Movie movie(Make(std::string("sound-") + test.name, Join(Beeps(2), test.encoding)), {});
        EXPECT_EQ(movie.Pictures(), nullptr);
        const AudioFormat format = movie.Sound()->GetAudioInfo()->format;
        EXPECT_EQ(format.nChannels, test.channels);
        EXPECT_EQ(format.nSampleRate, test.rate);
        EXPECT_EQ(format.nBitsPerSample, test.bits);
        EXPECT_EQ(format.nBytesPerSecond, test.rate * test.channels * test.bits / 8);
        const Seen seen = TakeAll(movie);
        EXPECT_NEAR(static_cast<double>(seen.sound.size()) / test.rate, 2, 0.05);
        const std::vector<double> beeps = Beginnings(seen, test.rate);
        ASSERT_EQ(beeps.size(), 2u);
        EXPECT_NEAR(beeps[1], 1, 0.006);
    }
}

TEST(DecodedSound, KeepTheFormOfSoundThatChangesOnTheWay) {
    const Folder folder;
    std::string bytes;
    for (const char* channels : {"1", "2"}) {
        bytes += ReadFile(Make(std::string("form-") + channels + ".mp2",
                               Join(Beeps(2), Args{"-c:a", "mp2", "-ac", channels})));
    }
    WriteFile(folder / "changing.mp2", bytes);
    Movie movie(folder / "changing.mp2", {});
    EXPECT_EQ(movie.Sound()->GetAudioInfo()->format.nChannels, 1);
    const Seen seen = TakeAll(movie);
    EXPECT_NEAR(static_cast<double>(seen.sound.size()) / 44100, 4, 0.1);
    EXPECT_EQ(Beginnings(seen, 44100).size(), 4u);
}

TEST(DecodedSound, BringSoundToTheLoudspeakersThatItBeganWith) {
    const auto tone = [](const char* layout, const char* channels, const char* seconds) {
        return Make(std::string("centre-") + layout + "-" + seconds + ".ac3",
                    {"-f", "lavfi", "-i",
                     std::string("aevalsrc=") + channels + ":c=" + layout + ":s=48000:d=" + seconds, "-c:a",
                     "ac3"});
    };
    // The centre sounds in the second half, which is the third channel there, and none in the first half.
    const std::string first = ReadFile(tone("3.0(back)", "0|0|0", "4"));
    const Folder folder;
    WriteFile(folder / "changes.ac3", first + ReadFile(tone("3.0", "0|0|sin(880*PI*t)/2", "1")));
    Movie movie(folder / "changes.ac3", {});
    ASSERT_EQ(movie.Info().sound->channels, 3);
    std::array<int, 3> loudest{};
    while (const AudioFrame* block = movie.Sound()->GetNextFrame()) {
        if (block->nLength == 0)
            break;
        const auto* samples = reinterpret_cast<const int16_t*>(block->pData);
        for (int i = 0; i < block->nLength / 2; ++i)
            loudest[static_cast<std::size_t>(i) % 3] =
                std::max(loudest[static_cast<std::size_t>(i) % 3], std::abs(int{samples[i]}));
    }
    EXPECT_GT(loudest[0], 5000);
    EXPECT_GT(loudest[1], 5000);
    EXPECT_LT(loudest[2], 1000) << "the centre comes from behind";
}

TEST(DecodedSound, FillTheTimeBeforeLateSound) {
    const std::string path =
        Make("late.mov", Join(CountedPictures(4), Args{"-itsoffset", "1.3"}, Beeps(2), NearLossless()));
    Movie movie(path, {});
    EXPECT_NEAR(movie.Info().sound->duration, 3.3, 0.01);
    const Seen seen = TakeAll(movie);
    EXPECT_EQ(seen.soundBegin, 0);
    EXPECT_NEAR(static_cast<double>(seen.sound.size()), 3.3 * 44100, 60);
    const std::vector<double> beeps = Beginnings(seen, 44100);
    ASSERT_EQ(beeps.size(), 2u);
    EXPECT_NEAR(beeps[0], 1.3, 0.002);
    EXPECT_NEAR(beeps[1], 2.3, 0.002);
}

// All of it, from its first packet on.
TEST(DecodedSound, KeepSoundBehindAGapInItsPlace) {
    const std::string path = Make("gap.mkv", Join(CountedPictures(8), Beeps(8), NearLossless(),
                                                  Args{"-af", "aselect='lt(t,2.6)+gt(t,4.99)'"}));
    Movie movie(path, {});
    const std::vector<double> beeps = Beginnings(TakeAll(movie), 44100);
    ASSERT_EQ(beeps.size(), 6U); // those of seconds 3 and 4 are missing
    EXPECT_NEAR(beeps[2], 2, 0.03);
    EXPECT_NEAR(beeps[3], 5, 0.03);
    EXPECT_NEAR(beeps[5], 7, 0.03);
}

TEST(DecodedSound, HoldTheFirstPictureWhenSoundBeginsFirst) {
    const std::string path =
        Make("early.mkv", Join(Args{"-itsoffset", "0.72"}, CountedPictures(2), Beeps(3), NearLossless()));
    const Seen seen = LookAt(path);
    ASSERT_EQ(seen.pictures.size(), 50u);
    EXPECT_EQ(seen.pictures[0].time, 0);
    EXPECT_NEAR(seen.pictures[1].time, 0.76, 0.001);
    EXPECT_EQ(seen.soundBegin, 0);
    EXPECT_EQ(Beginnings(LookAt(path, 0.04), 44100).size(), 3u);
}

// Where FFmpeg's own seeking leads astray.
TEST(DecodedSound, FindATimeInSoundAlone) {
    const struct {
        const char* name;
        Args encoding;
    } cases[] = {{"beeps-flac.ogg", Words("-c:a flac -ar 48000")},
                 {"beeps-speex.ogg", Words("-c:a libspeex -ar 16000")},
                 {"beeps-vorbis.ogg", Words("-c:a libvorbis -ar 48000")}};
    for (const auto& test : cases)
        for (const double begin : {2.5, 8.75}) {
            SCOPED_TRACE(std::string(test.name) + " from " + std::to_string(begin));
            Movie movie(Make(test.name, Join(Beeps(12), test.encoding)), {});
            const int rate = movie.Sound()->GetAudioInfo()->format.nSampleRate;
            const std::vector<double> beeps = Beginnings(TakeAll(movie, begin), rate);
            ASSERT_FALSE(beeps.empty());
            EXPECT_NEAR(beeps.front(), std::ceil(begin), 0.02);
            EXPECT_NEAR(beeps.back(), 11, 0.02);
        }
}

} // namespace
