// Sound on its way into the file: formats, rates, channels, lengths, places.
#include "MovieReader.h"
#include "tests/support/Folder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <vector>

namespace {

struct Tone {
    double frequency; ///< Hz, by the rising zero crossings.
    double loudness;  ///< Root of the mean square.
};

/// The tone without its first and its last tenth.
Tone Heard(const ReadMovie& movie) {
    const std::vector<float>& sound = movie.firstChannel;
    const size_t from = sound.size() / 10;
    const size_t to = sound.size() - from;
    int crossings = 0;
    double squares = 0;
    for (size_t i = from + 1; i < to; ++i) {
        crossings += sound[i - 1] < 0 && sound[i] >= 0 ? 1 : 0;
        squares += static_cast<double>(sound[i]) * sound[i];
    }
    const auto samples = static_cast<double>(to - from);
    return {crossings * movie.sampleRate / samples, std::sqrt(squares / samples)};
}

TEST(Sound, OfAnyFormatIsHeardAsItWas) {
    constexpr struct {
        int rate, channels, bits;
    } kFormats[] = {{44100, 2, 16}, {8000, 1, 8},   {22050, 1, 16},  {48000, 6, 16},
                    {37800, 2, 16}, {96000, 2, 24}, {192000, 2, 32}, {44100, 1, 32},
                    {11025, 4, 8},  {48000, 8, 24}, {44100, 11, 16}};
    for (const auto& [rate, channels, bits] : kFormats) {
        SCOPED_TRACE(testing::Message() << rate << " Hz, " << channels << " x " << bits);
        TestMovie movie;
        movie.hasVideo = false;
        movie.sampleRate = rate;
        movie.channels = channels;
        movie.bits = bits;
        movie.param.fccFileFormat = FourCC("M4A ");
        const ReadMovie read = WriteAndRead(movie);
        EXPECT_TRUE(read.readable);
        EXPECT_GE(read.sampleRate, std::min(rate, 96000));
        EXPECT_LE(read.channels, channels);
        EXPECT_NEAR(Heard(read).frequency, 440.0, 3.0);
        EXPECT_NEAR(Heard(read).loudness, 0.5 / M_SQRT2, 0.03);
        EXPECT_NEAR(Latest().dAudioWritten, 2.0, 0.0002);
        EXPECT_LE(static_cast<double>(read.samples), 2.0 * read.sampleRate + 1024);
    }
}

/// Uncompressed sound alone.
TestMovie PcmMovie() {
    TestMovie movie;
    movie.hasVideo = false;
    movie.param.fccFileFormat = FourCC("WAV ");
    movie.param.fccAudio = FourCC("PCM ");
    return movie;
}

TEST(Sound, PcmIsKeptToTheSample) {
    for (const int bits : {8, 16, 24, 32}) {
        TestMovie movie = PcmMovie();
        movie.bits = movie.param.nBitsPerSample = bits;
        movie.soundSeconds = 1.2345;
        const ReadMovie read = WriteAndRead(movie);
        ASSERT_EQ(read.samples, 54441);
        for (size_t i = 0; i < read.firstChannel.size(); ++i)
            ASSERT_NEAR(read.firstChannel[i], 0.5 * std::sin(2 * M_PI * 440.0 * i / 44100),
                        bits == 8 ? 0.01 : 0.0001)
                << bits << ' ' << i;
    }
}

TEST(Sound, AFormatThatChangesOnTheWayLosesNothing) {
    const ReadMovie read = WriteAndRead(PcmMovie(), [](void* file) {
        TestSound first(44100, 2, 16);
        TestSound second(22050, 1, 8);
        for (int i = 0; i < 10; ++i) {
            EXPECT_EQ(MWWriteAudioData(file, &first.Next(4410, 0)), 1);
            EXPECT_EQ(MWWriteAudioData(file, &second.Next(2205, 0)), 1);
        }
        TestSound slow(100, 1, 8); // a block that is long in the file's samples
        EXPECT_EQ(MWWriteAudioData(file, &slow.Next(500, 0)), 1);
    });
    EXPECT_NEAR(static_cast<double>(read.samples), 88200 + 5 * 44100, 441);
}

TEST(Sound, ShorterThanTheResamplersFilterIsKept) {
    for (const int rate : {1, 8000, 192'000}) {
        constexpr int kSamples = 20;
        const ReadMovie read = WriteAndRead(PcmMovie(), [&](void* file) {
            TestSound usual(44100, 2, 16);
            MWWriteAudioData(file, &usual.Next(4410, 0));
            TestSound other(rate, 1, 16);
            AudioFrame piece = other.Next(kSamples, 0);
            std::fill_n(reinterpret_cast<int16_t*>(piece.pData), kSamples, int16_t{0x4000});
            MWWriteAudioData(file, &piece);
        });
        const int expected = (kSamples * 44100 + rate - 1) / rate;
        ASSERT_NEAR(static_cast<double>(read.samples), 4410 + expected, 1) << rate;
        EXPECT_NEAR(read.firstChannel[4410 + static_cast<size_t>(expected) / 2], 0.5 * M_SQRT1_2, 0.05)
            << rate;
    }
}

TEST(Sound, BlocksThatSplitASampleAreJoined) {
    const ReadMovie read = WriteAndRead(PcmMovie(), [](void* file) {
        TestSound sound(44100, 2, 16);
        AudioFrame piece = sound.Next(10'000, 0);
        for (int position = 0; position < 40'000; position += piece.nLength, piece.pData += piece.nLength) {
            piece.nLength = std::min(1001, 40'000 - position);
            MWWriteAudioData(file, &piece);
        }
    });
    ASSERT_EQ(read.samples, 10'000);
    EXPECT_NEAR(Heard(read).frequency, 440.0, 6.0);
}

TEST(Sound, LateSoundBeginsLate) {
    for (const uint32_t format : {FourCC("MP4 "), FourCC("MKV "), FourCC("AVI ")}) {
        TestMovie movie;
        movie.param.fccFileFormat = format;
        movie.param.fccAudio = FourCC("MP3 ");
        const ReadMovie read = WriteAndRead(movie, [](void* file) {
            TestPicture picture(160, 120);
            TestSound sound(44100, 2, 16);
            // As the engine sends it: the first block, 400 ms after the first picture, comes before all.
            MWWriteAudioData(file, &sound.Next(44100, 4'000'000));
            for (int number = 0; number < 40; ++number)
                MWWriteVideoFrame(file, &picture.Paint(number, number * 400'000));
        });
        EXPECT_NEAR(read.ToneBegins(), 0.4, 0.03) << format;
        EXPECT_NEAR(read.pictures.front().time, 0.0, 0.03) << format;
    }
}

TEST(Sound, RatesAreKeptWithinTheCodecsLimits) {
    const Folder folder;
    TestMovie movie;
    movie.hasVideo = false;
    movie.channels = 1;
    for (const auto& [format, codec] : {std::pair{FourCC("M4A "), FourCC("AAC ")},
                                        {FourCC("M4A "), FourCC("mp4a")}, // another name of AAC
                                        {FourCC("MP3 "), FourCC("MP3 ")},
                                        {FourCC("OGG "), FourCC("VORB")},
                                        {FourCC("OGG "), FourCC("OPUS")}}) {
        for (const auto& [sampleRate, rate] : {std::pair{8000, 1},
                                               {8000, 128'000},
                                               {8000, 10'000'000},
                                               {96'000, 128'000},
                                               {192'000, 128'000}}) {
            movie.sampleRate = movie.param.nSampleRate = sampleRate;
            movie.param.fccFileFormat = format;
            movie.param.fccAudio = codec;
            movie.param.nAudioBitrate = rate;
            EXPECT_TRUE(movie.Write(folder / "movie"))
                << codec << ' ' << sampleRate << ' ' << rate << ' ' << Latest().szWhat;
            const int kept = Latest().nAudioBitrate;
            if (sampleRate > 8000)
                EXPECT_EQ(kept, rate) << codec;
            else
                EXPECT_TRUE(kept >= 1000 && kept <= 64'000) << codec << ' ' << rate << ' ' << kept;
        }
    }
}

} // namespace
