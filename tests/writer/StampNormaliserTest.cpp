// The normaliser on the stamps that the engine really sends.
#include "writer/StampNormaliser.h"
#include "tests/engine/ScriptedHost.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <optional>
#include <random>
#include <string>

namespace {

using writer::StampNormaliser;

/// One source; times in 100 ns units unless they say otherwise.
struct Source {
    double fps = 25.0;
    int pictures = 250;
    std::vector<int64_t> pictureTimes = {}; ///< Instead of a steady rate, when not empty.
    int sampleRate = 44100;
    int blockSamples = 512;
    int64_t soundOffset = 0; ///< Stamp of the first sample.
    double soundSeconds = 10.0;
    int64_t stampRounding = 1; ///< Stamps of the source are rounded to this.
    int splitMilliseconds = 0; ///< 0: one file.

    int64_t PictureLength() const { return std::llround(1e7 / fps); }

    std::vector<int64_t> PictureTimes() const {
        std::vector<int64_t> times = pictureTimes;
        for (int picture = 0; pictureTimes.empty() && picture < pictures; ++picture)
            times.push_back(std::llround(picture * 1e7 / fps));
        return times;
    }

    std::vector<int64_t> BlockTimes() const {
        const auto blocks = static_cast<int64_t>(soundSeconds * sampleRate) / blockSamples;
        std::vector<int64_t> times;
        for (int64_t block = 0; block < blocks; ++block)
            times.push_back(soundOffset + block * blockSamples * kSecond / sampleRate);
        return times;
    }

    std::vector<int64_t> Rounded(std::vector<int64_t> times) const {
        for (int64_t& time : times)
            time = (time + stampRounding / 2) / stampRounding * stampRounding;
        return times;
    }
};

/// One call to the writer.
struct Event {
    bool picture;
    bool silence;
    int64_t stamp;  ///< As the writer gets it.
    int64_t source; ///< True time in the source; for silence without meaning.
    int64_t bytes;  ///< Of sound: 16 bits, two channels.
};
using Clip = std::vector<Event>;

/// What the engine calls the writer with, clip by clip.
std::vector<Clip> Convert(const Source& source) {
    ScriptedHost host;
    host.hasCallback = false;
    host.video.Format() = {320, 240, source.fps, 1.0};
    host.video.stamps = source.Rounded(source.PictureTimes());
    host.audio.Format() = {source.sampleRate, 2, 16, source.sampleRate * 4, 1.0};
    host.audio.blockLength = source.blockSamples * 4;
    host.audio.stamps = source.Rounded(source.BlockTimes());
    if (source.splitMilliseconds > 0)
        host.Split(static_cast<unsigned long>(source.splitMilliseconds));
    host.Convert();

    std::vector<Clip> clips;
    const std::vector<int64_t> pictures = source.PictureTimes();
    const std::vector<int64_t> blocks = source.BlockTimes();
    size_t picture = 0;
    size_t block = 0;
    for (const std::string& line : recorder::Recorded().trace) {
        long long stamp = 0;
        long long bytes = 0;
        if (line.rfind("create ", 0) == 0)
            clips.emplace_back();
        else if (std::sscanf(line.c_str(), "picture #%*d %lld", &stamp) == 1)
            clips.back().push_back({true, false, stamp, pictures.at(picture++), 0});
        else if (std::sscanf(line.c_str(), "sound #%*d %lld +%lld", &stamp, &bytes) == 2)
            clips.back().push_back({false, false, stamp, blocks.at(block++), bytes});
        else if (std::sscanf(line.c_str(), "silence #%*d %lld +%lld", &stamp, &bytes) == 2)
            clips.back().push_back({false, true, stamp, 0, bytes});
    }
    EXPECT_EQ(picture, pictures.size());
    EXPECT_EQ(block, blocks.size());
    return clips;
}

/// What the normaliser makes of one clip.
struct Placed {
    std::vector<int64_t> times;   ///< Of the pictures.
    std::vector<int64_t> sources; ///< The pictures' true times.
    int64_t soundStart = 0;
    int64_t soundLength = 0;
    std::optional<int64_t> realSource;   ///< True time of the first real block.
    std::optional<int64_t> realPosition; ///< Its place by the count of samples.
    bool pictureAfterReal = false;       ///< Without one, nothing tells where the sound belongs.
};

Placed Place(const Clip& clip, const Source& source) {
    StampNormaliser stamps(source.PictureLength(), true);
    Placed placed;
    for (const Event& event : clip) {
        if (event.picture) {
            placed.times.push_back(stamps.AddPicture(event.stamp));
            placed.sources.push_back(event.source);
            placed.pictureAfterReal = placed.realSource.has_value();
            continue;
        }
        if (!event.silence && !placed.realSource) {
            placed.realSource = event.source;
            placed.realPosition = stamps.SoundLength();
        }
        stamps.AddSound(event.stamp, event.bytes, int64_t{source.sampleRate} * 4, event.silence);
        const std::optional<int64_t> known = stamps.SoundStart();
        if (known)
            placed.soundStart = *known;
    }
    stamps.Finish();
    EXPECT_TRUE(stamps.SoundStart().has_value());
    placed.soundStart = *stamps.SoundStart();
    placed.soundLength = stamps.SoundLength();
    return placed;
}

/// The properties that hold for every clip of a source whose sound has no holes.
void CheckClip(const Clip& clip, const Source& source, const std::string& what) {
    SCOPED_TRACE(what);
    const Placed placed = Place(clip, source);
    const int64_t picture = source.PictureLength();
    int64_t bytes = 0;
    for (const Event& event : clip)
        bytes += event.bytes;
    EXPECT_NEAR(static_cast<double>(placed.soundLength), bytes * 1e7 / (source.sampleRate * 4.0), 2.0);
    if (placed.times.empty())
        return;
    EXPECT_GE(placed.times.front(), 0);
    EXPECT_GE(placed.soundStart, 0);
    const int64_t begin =
        bytes > 0 ? std::min(placed.times.front(), placed.soundStart) : placed.times.front();
    EXPECT_LE(begin, picture) << "nothing begins near 0";
    for (size_t i = 1; i < placed.times.size(); ++i) {
        ASSERT_GT(placed.times[i], placed.times[i - 1]) << "picture " << i;
        ASSERT_NEAR(placed.times[i] - placed.times[i - 1], placed.sources[i] - placed.sources[i - 1], picture)
            << "picture " << i;
    }
    if (!placed.pictureAfterReal)
        return;
    const int64_t realTime = placed.soundStart + *placed.realPosition;
    for (size_t i = 0; i < placed.times.size(); ++i) {
        const int64_t distance = placed.times[i] - realTime;
        const int64_t truth = placed.sources[i] - *placed.realSource;
        ASSERT_LT(std::abs(distance - truth), picture) << "picture " << i;
    }
}

TEST(StampNormaliser, KeepsPicturesAndSoundTogether) {
    std::mt19937 random(20);
    const auto pick = [&](int from, int to) { return std::uniform_int_distribution<int>(from, to)(random); };
    constexpr double kRates[] = {10, 12.5, 15, 23.976, 24, 25, 29.97, 30, 50, 59.94, 60, 120};
    constexpr int kSampleRates[] = {8000, 11025, 22050, 44100, 48000, 96000};
    for (int round = 0; round < 200; ++round) {
        Source source;
        source.fps = kRates[pick(0, std::size(kRates) - 1)];
        source.sampleRate = kSampleRates[pick(0, std::size(kSampleRates) - 1)];
        source.pictures = pick(1, 400);
        source.blockSamples = pick(source.sampleRate / 1000, source.sampleRate / 2);
        source.soundOffset = pick(-3000, 3000) * kMs;
        source.soundSeconds = pick(0, 20'000) / 1000.0;
        source.stampRounding = pick(0, 2) == 0 ? kMs : 1;
        source.splitMilliseconds = pick(0, 3) == 0 ? 0 : pick(100, 8000);
        SCOPED_TRACE("round " + std::to_string(round));
        const std::vector<Clip> clips = Convert(source);
        for (size_t i = 0; i < clips.size(); ++i)
            CheckClip(clips[i], source, "clip " + std::to_string(i));
        if (testing::Test::HasFailure())
            return;
    }
}

TEST(StampNormaliser, KeepsTheStepsOfAVariableRateForAnHour) {
    std::mt19937 random(21);
    std::uniform_int_distribution<int64_t> step(5 * kMs, 75 * kMs);
    Source source;
    for (int64_t time = 0; time < 3600 * kSecond; time += step(random))
        source.pictureTimes.push_back(time);
    source.blockSamples = 1024;
    source.soundSeconds = 3600;
    const Placed placed = Place(Convert(source).front(), source);
    for (size_t i = 0; i < placed.times.size(); ++i)
        ASSERT_NEAR(placed.times[i] - placed.soundStart, placed.sources[i], 2) << i;
}

TEST(StampNormaliser, CatchesUpAfterAHoleInTheSoundWithoutEverGoingBack) {
    StampNormaliser stamps(400'000, true);
    const int64_t bytesPerSecond = 44100 * 4;
    int64_t last = -1;
    // 40 ms of sound before every picture; after a second the source's sound skips two seconds, so that the
    // pictures step back by as much until they have reached the sound again.
    for (int picture = 0; picture < 400; ++picture) {
        const bool waiting = picture >= 25 && picture < 75;
        const int64_t position = (picture < 25 ? picture : picture < 75 ? 25 : picture - 50) * 400'000;
        if (!waiting)
            stamps.AddSound(position, bytesPerSecond / 25, bytesPerSecond, false);
        const int64_t time = stamps.AddPicture(waiting ? position - (75 - picture) * 400'000 : position);
        ASSERT_GT(time, last) << picture;
        ASSERT_LE(time - last, 400'001) << picture;
        last = time;
    }
    EXPECT_NEAR(last, (400 - 1 - 50) * 400'000, 400'000);
    EXPECT_GT(stamps.Repairs(), 0);
}

TEST(StampNormaliser, PicturesWithoutStampsKeepTheUsualDistance) {
    StampNormaliser stamps(400'000, true);
    for (int picture = 0; picture < 10; ++picture)
        EXPECT_EQ(stamps.AddPicture(-1), picture * 400'000);
}

TEST(StampNormaliser, PicturesAloneBeginAtZeroWhereverTheirStampsBegin) {
    for (const int64_t base : {int64_t{0}, 50 * kSecond, -7 * kSecond, INT64_C(1) << 60}) {
        StampNormaliser stamps(400'000, true);
        for (int picture = 0; picture < 10; ++picture)
            EXPECT_EQ(stamps.AddPicture(base + picture * 500'000), picture * 500'000);
    }
}

TEST(StampNormaliser, StampsThatCannotBeCountAsNone) {
    for (const int64_t stamp : {INT64_MIN, INT64_MAX, 7 * 3600 * kSecond}) {
        StampNormaliser stamps(400'000, true);
        stamps.AddSound(kSecond, 176'400, 176'400, false);
        EXPECT_EQ(stamps.AddPicture(stamp), 0);
        EXPECT_EQ(stamps.AddPicture(INT64_MAX), 400'000);
        EXPECT_EQ(stamps.Repairs(), 2);
    }
}

TEST(StampNormaliser, SoundAloneBeginsAtZero) {
    EXPECT_EQ(StampNormaliser(400'000, false).SoundStart(), 0);
    StampNormaliser waiting(400'000, true);
    waiting.AddSound(0, 1000, 176'400, false);
    EXPECT_FALSE(waiting.SoundStart().has_value());
    waiting.AddSound(0, 10 * 176'400, 176'400, false);
    EXPECT_EQ(waiting.SoundStart(), 0);
    StampNormaliser onePicture(400'000, true);
    onePicture.AddPicture(-1);
    onePicture.AddSound(0, 11 * 176'400, 176'400, false);
    EXPECT_EQ(onePicture.SoundStart(), 0);
}

TEST(StampNormaliser, CountsSoundOfChangingByteRates) {
    StampNormaliser stamps(400'000, true);
    stamps.AddSound(0, 176'400, 176'400, false);
    stamps.AddSound(0, 96'000, 192'000, true);
    stamps.AddSound(0, 176'400 * 2, 176'400, false);
    EXPECT_EQ(stamps.SoundLength(), 35'000'000);
}

} // namespace
