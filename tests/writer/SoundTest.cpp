// Sound on its way into the file: formats, rates, channels, lengths, places.
#include "MovieReader.h"
#include "tests/support/Folder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <bit>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <map>
#include <utility>
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

/// How loud each loudspeaker of the file is when one of the source's sounds; the others are silent.
std::map<uint64_t, float> HeardOf(TestMovie movie, uint64_t layout, uint64_t speaker) {
    constexpr int kSamples = 12'000;
    WriterOptions options{};
    options.nChannelMask = layout;
    const RegisteredOptions registered(options);
    movie.Use(registered);
    movie.hasVideo = false;
    movie.sampleRate = 48'000;
    movie.channels = std::popcount(layout);
    movie.param.nAudioBitrate = 96'000 * movie.channels;
    const Folder folder;
    void* file = movie.Create(folder / "movie");
    TestSound sound(movie.sampleRate, movie.channels, 16);
    AudioFrame block = sound.Next(kSamples, 0);
    auto* samples = reinterpret_cast<int16_t*>(block.pData);
    const int sounding = std::popcount(layout & (speaker - 1));
    for (int i = 0; i < kSamples * movie.channels; ++i)
        if (i % movie.channels != sounding)
            samples[i] = 0;
    MWWriteAudioData(file, &block);
    EXPECT_EQ(MWCloseMediaFile(file, nullptr, nullptr), 1) << Latest(registered.Set()).szWhat;
    return ReadMovieFile(folder / "movie").loudest;
}

TEST(Sound, ComesFromWhereItCame) {
    constexpr uint64_t kRight =
        AV_CH_FRONT_RIGHT | AV_CH_BACK_RIGHT | AV_CH_SIDE_RIGHT | AV_CH_FRONT_RIGHT_OF_CENTER;
    constexpr uint64_t kLeft = AV_CH_BACK_LEFT | AV_CH_SIDE_LEFT | AV_CH_FRONT_LEFT_OF_CENTER;
    const struct {
        uint64_t speaker;
        uint64_t silent; // loudspeakers that may not sound instead
    } kSpeakers[] = {{AV_CH_FRONT_LEFT, kRight | AV_CH_FRONT_CENTER | AV_CH_BACK_CENTER},
                     {AV_CH_FRONT_CENTER, AV_CH_BACK_CENTER | kLeft | (kRight & ~AV_CH_FRONT_RIGHT)},
                     {AV_CH_BACK_LEFT, kRight | AV_CH_FRONT_CENTER},
                     {AV_CH_BACK_CENTER, AV_CH_FRONT_CENTER},
                     {AV_CH_SIDE_LEFT, kRight | AV_CH_FRONT_CENTER},
                     {AV_CH_FRONT_LEFT_OF_CENTER, kRight | AV_CH_BACK_CENTER}};
    constexpr std::pair<uint32_t, uint32_t> kFormats[] = {
        {FourCC("MP4 "), FourCC("AAC ")}, {FourCC("MKV "), FourCC("AC3 ")},
#ifndef MOVIECONV_SANITIZED // the arithmetic of the others is the libraries'
        {FourCC("FLAC"), FourCC("FLAC")}, {FourCC("OGG "), FourCC("FLAC")}, {FourCC("M4A "), FourCC("ALAC")},
        {FourCC("OGG "), FourCC("VORB")}, {FourCC("MKV "), FourCC("OPUS")}, {FourCC("MKV "), FourCC("PCM ")},
        {FourCC("WAV "), FourCC("PCM ")}, {FourCC("MOV "), FourCC("PCM ")}, {FourCC("MP3 "), FourCC("MP3 ")},
#endif
    };
    for (const auto& [format, codec] : kFormats)
        for (const uint64_t layout :
             {AV_CH_LAYOUT_SURROUND, AV_CH_LAYOUT_2_1, AV_CH_LAYOUT_QUAD, AV_CH_LAYOUT_3POINT1,
              AV_CH_LAYOUT_5POINT1, AV_CH_LAYOUT_6POINT0, AV_CH_LAYOUT_7POINT0, AV_CH_LAYOUT_7POINT1_WIDE})
            for (const auto& [speaker, silent] : kSpeakers) {
                if ((layout & speaker) == 0)
                    continue;
                SCOPED_TRACE(testing::Message() << std::hex << format << ' ' << codec << ", layout " << layout
                                                << ", from " << speaker);
                TestMovie movie;
                movie.param.fccFileFormat = format;
                movie.param.fccAudio = codec;
                const std::map<uint64_t, float> heard = HeardOf(movie, layout, speaker);
                float loudest = 0;
                for (const auto& [at, loud] : heard) {
                    loudest = std::max(loudest, loud);
                    EXPECT_TRUE(loud < 0.05F || (at & (silent | AV_CH_LOW_FREQUENCY)) == 0)
                        << "from " << at << " comes " << loud;
                    if (at == speaker) {
                        EXPECT_GT(loud, 0.1F);
                    }
                }
                EXPECT_GT(loudest, 0.07F);
            }
}

TEST(Sound, OfAnyLayoutGetsTheNearestThatTheCodecHas) {
    const struct {
        uint32_t format, codec;
        uint64_t layout;
        int channels; // that are asked for; 0: as they are
        uint64_t made;
    } cases[] = {
        {FourCC("MP4 "), FourCC("AAC "), AV_CH_LAYOUT_QUAD, 0, AV_CH_LAYOUT_QUAD},
        {FourCC("MP4 "), FourCC("AAC "), AV_CH_LAYOUT_5POINT1, 0, AV_CH_LAYOUT_5POINT1_BACK},
        {FourCC("MP4 "), FourCC("AAC "), AV_CH_LAYOUT_QUAD, 6, AV_CH_LAYOUT_5POINT1_BACK},
        {FourCC("MP4 "), FourCC("AAC "), AV_CH_LAYOUT_6POINT0, 2, AV_CH_LAYOUT_STEREO},
        {FourCC("MP4 "), FourCC("AAC "), AV_CH_LAYOUT_STEREO_DOWNMIX, 0, AV_CH_LAYOUT_STEREO},
        {FourCC("MP4 "), FourCC("AAC "), AV_CH_FRONT_LEFT, 0, AV_CH_LAYOUT_MONO},
        {FourCC("MKV "), FourCC("FLAC"), AV_CH_LAYOUT_5POINT1, 0, AV_CH_LAYOUT_5POINT1},
        {FourCC("MKV "), FourCC("OPUS"), AV_CH_LAYOUT_3POINT1, 0, AV_CH_LAYOUT_5POINT1_BACK},
        {FourCC("MKV "), FourCC("OPUS"), AV_CH_LAYOUT_5POINT0, 0, AV_CH_LAYOUT_5POINT1_BACK},
        {FourCC("MKV "), FourCC("PCM "), AV_CH_LAYOUT_QUAD, 0, AV_CH_LAYOUT_5POINT0_BACK},
        {FourCC("MKV "), FourCC("OPUS"), 0, 4, AV_CH_LAYOUT_SURROUND},
        {FourCC("M4A "), FourCC("ALAC"), AV_CH_LAYOUT_QUAD, 0, AV_CH_LAYOUT_5POINT0_BACK},
        {FourCC("M4A "), FourCC("ALAC"), AV_CH_LAYOUT_7POINT1, 0, AV_CH_LAYOUT_5POINT1_BACK},
        {FourCC("MKV "), FourCC("AC3 "), AV_CH_LAYOUT_7POINT1, 0, AV_CH_LAYOUT_5POINT1_BACK},
        {FourCC("WAV "), FourCC("PCM "), AV_CH_LAYOUT_7POINT1_WIDE, 0, AV_CH_LAYOUT_7POINT1_WIDE},
        {FourCC("MP3 "), FourCC("MP3 "), AV_CH_LAYOUT_7POINT1, 0, AV_CH_LAYOUT_STEREO},
    };
    for (const auto& test : cases) {
        SCOPED_TRACE(&test - cases);
        EncodeParam param = TestMovie::Param();
        param.fccFileFormat = test.format;
        param.fccAudio = test.codec;
        param.nChannels = test.channels;
        const int channels = test.layout != 0 ? std::popcount(test.layout) : test.channels;
        const AudioFormat format{48'000, channels, 16, 0, 1.0};
        WriterSound sound{};
        sound.nChannelMask = test.layout;
        ASSERT_EQ(MWPlanSound(&param, &format, &sound), 1);
        EXPECT_EQ(sound.nChannelMask, test.made);
        EXPECT_EQ(sound.nChannels, std::popcount(test.made));
        EXPECT_EQ(sound.nSampleRate, 48'000);
        sound.nSize -= 1;
        EXPECT_EQ(MWPlanSound(&param, &format, &sound), 0);
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
