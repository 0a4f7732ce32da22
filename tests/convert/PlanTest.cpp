// What becomes of a request: formats, codecs, rates and sizes. Nothing is opened.
#include "host/convert/CodecPlan.h"
#include "host/convert/EncodePlan.h"
#include "host/convert/Failure.h"
#include "host/convert/Formats.h"
#include "host/convert/SizePlan.h"
#include "media/FourCC.h"
#include "tests/convert/Wanted.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <string>

namespace {

using namespace movieconv;

SourceInfo Source(double seconds = 60) {
    PictureStreamInfo pictures;
    pictures.index = 0;
    pictures.width = 1920;
    pictures.height = 1080;
    pictures.frameRate = pictures.peakRate = 25;
    pictures.duration = seconds;
    SoundStreamInfo sound;
    sound.index = 1;
    sound.sampleRate = 48000;
    sound.channels = 6;
    sound.duration = seconds;
    SourceInfo source;
    source.path = "source";
    source.duration = seconds;
    source.pictures = pictures;
    source.sound = sound;
    return source;
}

/// What is refused, by category and reason; nothing when it is not.
template <class Plan>
std::optional<std::pair<Category, Reason>> Refused(Plan plan) {
    try {
        plan();
        return std::nullopt;
    } catch (const Failure& failure) {
        EXPECT_NE(failure.Text(), "");
        return std::pair(failure.Kind(), failure.Why());
    }
}

TEST(Formats, AreFoundByCodeExtensionAndName) {
    const struct {
        const char* name;
        uint32_t code;
    } names[] = {{"mp4", FourCC("MP4 ")},
                 {"MP4", FourCC("MP4 ")},
                 {"mkv", FourCC("MKV ")},
                 {"m2ts", FourCC("M2TS")},
                 {"xyz", 0},
                 {"", 0},
                 {"mp4 movie", 0}};
    for (const auto& [name, code] : names) {
        const FileFormatInfo* format = FindFormat(name);
        EXPECT_EQ(format != nullptr ? format->fccFormat : 0, code) << name;
    }
    const struct {
        const char* path;
        uint32_t code;
    } paths[] = {{"a.mkv", FourCC("MKV ")},
                 {"b.mp4/c.MKV", FourCC("MKV ")},
                 {"b.mp4/c", 0},
                 {"mkv", 0},
                 {"a.mkv.part", 0},
                 {"a.", 0}};
    for (const auto& [path, code] : paths) {
        const FileFormatInfo* format = FindFormatOfFile(path);
        EXPECT_EQ(format != nullptr ? format->fccFormat : 0, code) << path;
    }
    EXPECT_EQ(ParseCode("h264"), FourCC("H264"));
    EXPECT_EQ(ParseCode("aac"), FourCC("AAC "));
    EXPECT_EQ(ParseCode("theora"), std::nullopt);
    EXPECT_EQ(CodeName(FourCC("AAC ")), "AAC");
}

TEST(CodecPlan, WhatIsAskedForWinsOverWhatIsPreferred) {
    const FileFormatInfo& mkv = *FindFormat("mkv");
    const SourceInfo source = Source();
    Request request = To("o.mkv");
    request.preferences.videoCodecs = {FourCC("H264"), FourCC("XVID")};
    request.preferences.quality[FourCC("H264")].from = {{0, 20}, {720, 23}};
    request.preferences.quality[0].from = {{0, 5}};
    request.preferences.videoRate = 1'000'000;
    request.preferences.fitWithin = Size{1280, 1280};
    request.preferences.maxFrameRate = 30;
    request.preferences.maxChannels = 2;
    request.preferences.audioRate.from = {{1, 64'000}, {2, 128'000}, {6, 384'000}};
    const PictureCoding preferred = PlanPictures(request, mkv, *source.pictures);
    EXPECT_EQ(preferred.codec, FourCC("H264"));
    EXPECT_EQ(preferred.quality, 23); // by the height of the source's pictures as they are made
    EXPECT_EQ(preferred.rate, std::nullopt);
    ASSERT_TRUE(preferred.size);
    EXPECT_EQ(preferred.size->width, 1280);
    EXPECT_EQ(preferred.size->height, 720);
    EXPECT_EQ(preferred.frameRate, std::nullopt); // the source has fewer
    const SoundCoding sound = PlanSound(request, mkv, *source.sound);
    EXPECT_EQ(sound.channels, 2);
    EXPECT_EQ(sound.rate, 128'000);

    request.videoCodec = FourCC("XVID");
    request.videoRate = 2'000'000;
    request.size = Size{640, 640};
    request.frameRate = 50;
    request.channels = 6;
    const PictureCoding asked = PlanPictures(request, mkv, *source.pictures);
    EXPECT_EQ(asked.codec, FourCC("XVID"));
    EXPECT_EQ(asked.quality, std::nullopt);
    EXPECT_EQ(asked.rate, 2'000'000);
    EXPECT_EQ(asked.size->height, 640);
    EXPECT_EQ(asked.frameRate, 50);
    EXPECT_EQ(PlanSound(request, mkv, *source.sound).rate, 384'000);
}

// A codec that nobody chose counts as one that somebody did: its scale of quality, and whether it has rates.
TEST(CodecPlan, KnowsTheCodecThatNobodyChose) {
    const struct {
        const char* name;
        uint32_t codec;
        uint32_t soundCodec;
        std::optional<double> quality; // of the 5 that is for all codecs
        bool hasRates;
    } formats[] = {{"mp4", FourCC("XVID"), FourCC("AAC "), 5, true},
                   {"webm", FourCC("VP80"), FourCC("VORB"), 5, true},
                   {"gif", FourCC("GIF "), 0, std::nullopt, false},
                   {"mp3", 0, FourCC("MP3 "), std::nullopt, true}};
    const SourceInfo source = Source();
    for (const auto& [name, codec, soundCodec, quality, hasRates] : formats) {
        SCOPED_TRACE(name);
        const FileFormatInfo& format = *FindFormat(name);
        Request request = To("o");
        EXPECT_EQ(PictureCodecFor(request, format), codec);
        EXPECT_EQ(SoundCodecFor(request, format), soundCodec);
        EXPECT_EQ(HasRates(request, format, source), hasRates);
        request.preferences.quality[Preferences::kAnyCodec].from = {{0, 5}};
        EXPECT_EQ(PlanPictures(request, format, *source.pictures).quality, quality);
    }
}

TEST(NeededBytes, CountAllTracksAndAreNotKnownWhereSoundDecides) {
    SourceInfo source = Source(10);
    source.pictures.reset();
    for (int index = 0; index < 2; ++index) {
        StreamInfo track;
        track.index = index;
        track.kind = StreamKind::kSound;
        track.codec = "ac3";
        track.decodable = true;
        track.bitRate = index == 0 ? 448'000 : 64'000;
        track.sound = source.sound;
        track.sound->index = index;
        source.streams.push_back(track);
    }
    source.sound = source.streams[0].sound;
    const struct {
        const char* output;
        bool copies;
        std::optional<int64_t> bytes; // of ten seconds
    } cases[] = {{"o.mp3", false, 160'000},
                 {"o.m4a", false, 320'000},
                 {"o.wav", false, 10 * 48'000 * 6 * 2},
                 {"o.flac", false, std::nullopt},
                 {"o.mka", true, 640'000}};
    for (const auto& test : cases) {
        SCOPED_TRACE(test.output);
        Request request = To(test.output);
        request.copySound = test.copies;
        EncodeParam param{};
        param.bNoVideo = 1;
        param.nAudioBitrate = 128'000;
        EXPECT_EQ(NeededBytes(param, request, source, 10), test.bytes);
    }
}

TEST(NeededBytes, CountWhatIsStoredWhereItIsCarried) {
    constexpr int64_t kMega = 1'000'000;
    SourceInfo source = Source(10);
    source.sound.reset();
    for (const auto& [kind, bytes] : {std::pair{StreamKind::kPictures, int64_t{0}},
                                      {StreamKind::kAttachment, 5 * kMega},
                                      {StreamKind::kCover, kMega},
                                      {StreamKind::kCover, 2 * kMega}}) {
        StreamInfo stream;
        stream.index = static_cast<int>(source.streams.size());
        stream.kind = kind;
        stream.bytes = bytes;
        source.streams.push_back(stream);
    }
    EncodeParam param{};
    param.bNoAudio = 1;
    param.nVideoBitrate = 800'000;
    for (const auto& [output, stored] :
         {std::pair{"o.mkv", 8 * kMega}, {"o.mp4", kMega}, {"o.avi", int64_t{0}}}) {
        SCOPED_TRACE(output);
        Request request = To(output);
        EXPECT_EQ(NeededBytes(param, request, source, 10), kMega + stored);
        request.maxSize = 10 * kMega;
        const Request fitted = FitIntoSize(request, source);
        EXPECT_LT(fitted.videoRate.value_or(0) / 8.0 * 10, static_cast<double>(10 * kMega - stored));
    }
}

TEST(CodecPlan, RefusesWhatFormatOrCodecDoesNotHave) {
    const std::pair codec{Category::kRequest, Reason::kCodec};
    const std::pair other{Category::kRequest, Reason::kOther};
    const SourceInfo source = Source();
    Request webm = To("o.webm");
    webm.videoCodec = FourCC("XVID");
    EXPECT_EQ(Refused([&] { ChooseFormat(webm); }), codec);
    webm.videoCodec.reset();
    webm.preferences.videoCodecs = {FourCC("XVID"), FourCC("H264")}; // none of them
    EXPECT_EQ(Refused([&] { ChooseFormat(webm); }), codec);
    webm.preferences.videoCodecs.push_back(FourCC("VP90"));
    EXPECT_EQ(Refused([&] { ChooseFormat(webm); }), std::nullopt);
    EXPECT_EQ(Refused([&] { ChooseFormat(To("o.xyz")); }), std::pair(Category::kRequest, Reason::kNoFormat));
    Request named = To("folder.mp4/o");
    EXPECT_EQ(Refused([&] { ChooseFormat(named); }), std::pair(Category::kRequest, Reason::kNoFormat));
    named.preferences.format = FourCC("MKV ");
    EXPECT_EQ(ChooseFormat(named).fccFormat, FourCC("MKV "));
    named.output = "o.xyz";
    EXPECT_EQ(Refused([&] { ChooseFormat(named); }), std::pair(Category::kRequest, Reason::kNoFormat));

    Request quality = To("o.mkv");
    quality.videoCodec = FourCC("H264");
    for (const double outside : {-1.0, 52.0, std::nan("")}) {
        quality.quality = outside;
        EXPECT_EQ(Refused([&] { PlanPictures(quality, *FindFormat("mkv"), *source.pictures); }), other);
    }
    quality.quality = 51;
    EXPECT_EQ(Refused([&] { PlanPictures(quality, *FindFormat("mkv"), *source.pictures); }), std::nullopt);
    quality.videoCodec = FourCC("FFV1"); // without loss
    EXPECT_EQ(Refused([&] { PlanPictures(quality, *FindFormat("mkv"), *source.pictures); }), other);
}

TEST(EncodePlan, FillsTheEnginesRecord) {
    EncodeParam defaults{};
    defaults.fccVideo = FourCC("XVID");
    defaults.fccAudio = FourCC("AAC ");
    defaults.nVideoBitrate = 512'000;
    defaults.nChannels = 2;
    const auto plan = [&](const Request& request, const SourceInfo& source) {
        return PlanEncoding(defaults, ChooseFormat(request), request, source);
    };
    const EncodeParam usual = plan(To("o.mp4"), Source());
    EXPECT_EQ(+usual.fccVideo, FourCC("XVID"));
    EXPECT_EQ(+usual.nVideoBitrate, 512'000);
    EXPECT_EQ(double{usual.dFrameRate}, 0); // the pictures keep their own times
    EXPECT_EQ(+usual.bNoVideo, 0);
    EXPECT_EQ(+usual.bNoAudio, 0);
    // A format that does not carry the engine's codec gets its own first; one of a steady rate is told it.
    EXPECT_EQ(+plan(To("o.webm"), Source()).fccVideo, ChooseFormat(To("o.webm")).fccVideoCodecs[0]);
    EXPECT_EQ(double{plan(To("o.avi"), Source()).dFrameRate}, 25);
    Request sound = To("o.mp3");
    sound.quality = 20; // of pictures, which are left out
    EXPECT_EQ(+plan(sound, Source()).bNoVideo, 1);
    SourceInfo silent = Source();
    silent.sound.reset();
    EXPECT_EQ(+plan(To("o.mp4"), silent).bNoAudio, 1);
    EXPECT_EQ(Refused([&] { plan(To("o.mp3"), silent); }), std::pair(Category::kRequest, Reason::kOther));
    Request target = To("o.mp4");
    target.videoRate = 1'000'000;
    target.videoMaxRate = 2'000'000;
    EXPECT_EQ(+plan(target, Source()).nVideoRateMode, 1);
    // An upper rate alone limits the usual one; one that is only preferred gives way to what is asked for.
    Request limited = To("o.mp4");
    limited.videoMaxRate = 300'000;
    limited.audioMaxRate = 48'000;
    limited.preferences.audioRate.from[1] = 160'000;
    EXPECT_EQ(+plan(limited, Source()).nVideoBitrate, 300'000);
    EXPECT_EQ(+plan(limited, Source()).nAudioBitrate, 48'000);
    target.videoMaxRate.reset();
    target.preferences.videoMaxRate = 700'000;
    EXPECT_EQ(+plan(target, Source()).nVideoBitrate, 1'000'000);
    EXPECT_EQ(+plan(target, Source()).nVideoMaxBitrate, 1'000'000);
}

TEST(EncodePlan, ReckonsTheLength) {
    const struct {
        double begin;
        std::optional<double> length;
        Certainty certainty;
        double expected;
    } cases[] = {{0, {}, Certainty::kKnown, 60},      {20, {}, Certainty::kKnown, 40},
                 {50, 20, Certainty::kKnown, 10},     {50, 5, Certainty::kKnown, 5},
                 {50, 20, Certainty::kEstimated, 20}, {70, {}, Certainty::kEstimated, 0}};
    for (const auto& test : cases) {
        Request request = To("o.mp4");
        request.begin = test.begin;
        request.length = test.length;
        SourceInfo source = Source();
        source.certainty = test.certainty;
        EXPECT_EQ(LengthToConvert(request, source), test.expected) << test.begin;
    }
    Request late = To("o.mp4");
    late.begin = 60;
    EXPECT_EQ(Refused([&] { LengthToConvert(late, Source()); }),
              std::pair(Category::kRequest, Reason::kBeginTooLate));
}

TEST(SizePlan, ChoosesRatesThatFit) {
    for (const std::string output : {"o.mp4", "o.ts", "o.mp3"}) {
        for (const int64_t size : {2'000'000, 20'000'000, 400'000'000}) {
            Request request = To(output);
            request.maxSize = size;
            const Request fitted = FitIntoSize(request, Source());
            const double bits = 60.0 * (fitted.videoRate.value_or(0) + fitted.audioRate.value_or(0));
            EXPECT_LT(bits, static_cast<double>(size) * 8) << output;
            EXPECT_EQ(fitted.videoRate.has_value(), output != "o.mp3");
            EXPECT_EQ(fitted.videoMaxRate, fitted.videoRate);
            // Where there is little for each pixel, there are fewer of them.
            EXPECT_EQ(fitted.size.has_value(), output != "o.mp3" && size < 400'000'000) << output << size;
            EXPECT_NE(TellSize(fitted).Text(), "");
        }
    }
    Request little = To("o.mp4");
    little.maxSize = 100'000;
    EXPECT_TRUE(Refused([&] { FitIntoSize(little, Source()); }));
    Request still = To("o.gif"); // has no rate
    still.maxSize = 400'000'000;
    EXPECT_TRUE(Refused([&] { FitIntoSize(still, Source()); }));
    Request unknown = To("o.mp4");
    unknown.maxSize = 20'000'000;
    SourceInfo pipe = Source();
    pipe.certainty = Certainty::kGuessed;
    EXPECT_EQ(Refused([&] { FitIntoSize(unknown, pipe); }),
              std::pair(Category::kRequest, Reason::kUnknownLength));
    EXPECT_EQ(FitIntoSize(To("o.mp4"), Source()).videoRate, std::nullopt);
}

} // namespace
