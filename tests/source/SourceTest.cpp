// How a movie is described, which of its streams are chosen, and how far it is read ahead.
#include "host/source/Source.h"
#include "host/source/Charset.h"
#include "host/source/CueList.h"
#include "host/source/Demuxer.h"
#include "host/source/Failures.h"
#include "host/source/StreamChoice.h"
#include "tests/support/Inspect.h"
#include "tests/support/Program.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <new>
#include <stdexcept>

namespace {

using namespace test_movies;
using namespace movieconv;

StreamInfo Pictures(int width, bool isDefault = false, std::vector<int> programs = {}) {
    StreamInfo stream;
    stream.kind = StreamKind::kPictures;
    stream.decodable = true;
    stream.flags.isDefault = isDefault;
    stream.programs = std::move(programs);
    PictureStreamInfo& pictures = stream.pictures.emplace();
    pictures.width = pictures.height = width;
    return stream;
}

StreamInfo Sound(int channels, StreamFlags flags = {}, std::vector<int> programs = {}) {
    StreamInfo stream;
    stream.kind = StreamKind::kSound;
    stream.decodable = true;
    stream.flags = flags;
    stream.programs = std::move(programs);
    stream.sound.emplace().channels = channels;
    stream.sound->sampleRate = 48000;
    return stream;
}

template <class Change>
StreamInfo But(StreamInfo stream, Change change) {
    change(stream);
    return stream;
}

TEST(StreamChoice, TakesWhatPeopleExpect) {
    constexpr StreamFlags kDefault{.isDefault = true};
    const auto undecodable = [](StreamInfo& stream) { stream.decodable = false; };
    const auto cover = [](StreamInfo& stream) { stream.kind = StreamKind::kCover; };
    const struct {
        std::vector<StreamInfo> streams;
        int pictures, sound;
    } cases[] = {
        {{}, -1, -1},
        {{Sound(2), Pictures(64)}, 1, 0},
        {{Pictures(64), Pictures(128)}, 1, -1},
        {{Pictures(64, true), Pictures(128)}, 0, -1},
        {{Pictures(64), Pictures(64)}, 0, -1},
        {{But(Pictures(512), cover), Pictures(64)}, 1, -1},
        {{But(Pictures(512), undecodable), Pictures(64)}, 1, -1},
        {{Pictures(0), Sound(0)}, -1, -1},
        {{Sound(2), Sound(6), Sound(6)}, -1, 1},
        {{Sound(2, kDefault), Sound(6)}, -1, 0},
        {{Sound(6, {.isDefault = true, .commentary = true}), Sound(2)}, -1, 1},
        {{Sound(6, {.visualImpaired = true}), Sound(2)}, -1, 1},
        {{Pictures(64, false, {1}), Sound(6, {}, {1}), Pictures(128, false, {2}), Sound(2, {}, {2})}, 2, 3},
    };
    for (const auto& test : cases) {
        SCOPED_TRACE(&test - cases);
        std::vector<StreamInfo> streams = test.streams;
        for (std::size_t i = 0; i < streams.size(); ++i)
            streams[i].index = static_cast<int>(i);
        const ChosenStreams chosen = ChooseStreams(streams, {});
        EXPECT_EQ(chosen.pictures, test.pictures);
        EXPECT_EQ(chosen.sound, test.sound);
        EXPECT_EQ(ChooseStreams(streams, {.pictures = false, .sound = false}).sound, -1);
    }
}

TEST(Source, DescribesEverythingThatItHolds) {
    const Folder folder;
    WriteFile(folder / "words.srt", "1\n00:00:00,500 --> 00:00:01,000\nWords\n");
    WriteFile(folder / "font.ttf", std::string(1000, 'f'));
    WriteFile(folder / "notes.txt",
              ";FFMETADATA1\ntitle=The whole\nartist=Nobody\n[CHAPTER]\nTIMEBASE=1/1000\n"
              "START=0\nEND=1000\ntitle=First\n[CHAPTER]\nTIMEBASE=1/1000\nSTART=1000\n"
              "END=2000\ntitle=Second\n");
    const std::string path = folder / "whole.mkv";
    Ffmpeg(Join(CountedPictures(2), Beeps(2), Args{"-i", folder / "words.srt", "-i", folder / "notes.txt"},
                Words("-map 0 -map 1 -map 1 -map 2 -map_metadata 3 -c:v libx264 -pix_fmt yuv420p10le "
                      "-color_primaries bt2020 -color_trc smpte2084 -c:a pcm_s24le -c:s srt "
                      "-metadata:s:a:0 language=ger -metadata:s:a:1 title=Director "
                      "-disposition:a:0 default -disposition:a:1 comment -disposition:s:0 forced"),
                Args{"-attach", folder / "font.ttf"}, Words("-metadata:s:t mimetype=font/ttf"), Args{path}));
    const SourceInfo info = Source(path, {}).Info();
    ASSERT_EQ(info.streams.size(), 5u);
    const StreamInfo& pictures = info.streams[0];
    EXPECT_EQ(pictures.kind, StreamKind::kPictures);
    EXPECT_EQ(pictures.pictures->depth, 10);
    EXPECT_EQ(pictures.pictures->frameRate, 25);
    EXPECT_EQ(pictures.pictures->colorTransfer, 16);
    EXPECT_EQ(pictures.profile, "High 10");
    EXPECT_EQ(info.streams[1].language, "ger");
    EXPECT_TRUE(info.streams[1].flags.isDefault);
    EXPECT_EQ(info.streams[1].sound->bitsPerSample, 32);
    EXPECT_EQ(info.streams[2].title, "Director");
    EXPECT_TRUE(info.streams[2].flags.commentary);
    EXPECT_EQ(info.streams[3].kind, StreamKind::kSubtitles);
    EXPECT_TRUE(info.streams[3].textual);
    EXPECT_TRUE(info.streams[3].flags.forced);
    EXPECT_EQ(info.streams[4].kind, StreamKind::kAttachment);
    EXPECT_EQ(info.streams[4].fileName, "font.ttf");
    EXPECT_EQ(info.streams[4].mimeType, "font/ttf");
    EXPECT_EQ(info.streams[4].bytes, 1000);
    for (const StreamInfo& stream : info.streams)
        EXPECT_TRUE(stream.tags.empty()) << stream.tags[0].key; // the multiplexer's notes only
    ASSERT_EQ(info.chapters.size(), 2u);
    EXPECT_EQ(info.chapters[1].title, "Second");
    EXPECT_NEAR(info.chapters[1].begin, 1, 1e-6);
    EXPECT_NEAR(info.chapters[1].end, 2, 1e-6);
    ASSERT_EQ(info.tags.size(), 2u);
    EXPECT_EQ(info.tags[0].value, "The whole");
    EXPECT_EQ(info.sound->index, 1);

    const program::Result told = program::Call({"--info", "--progress", "json", path});
    const char* check = "import json, sys\n"
                        "info = json.loads(sys.argv[1])\n"
                        "kinds = [s['kind'] for s in info['streams']]\n"
                        "assert kinds == ['pictures', 'sound', 'sound', 'subtitles', 'attachment'], kinds\n"
                        "assert info['streams'][1]['language'] == 'ger' and info['sound'] == 1\n"
                        "assert info['streams'][2]['flags'] == ['commentary']\n"
                        "assert info['streams'][0]['transfer'] == 16\n"
                        "assert info['chapters'][1]['begin_s'] == 1 and info['tags']['ARTIST'] == 'Nobody'\n";
    EXPECT_EQ(program::Run({"python3", "-c", check, told.out}).code, 0) << told.out;
    const std::string text = program::Call({"--info", path}).out;
    for (const char* part :
         {"h264 (High 10), 160 x 120, 25.000 a second, yuv420p10le (10 bits), HDR (PQ)",
          "1  sound      pcm_s24le, 44100 Hz, mono (1 channel), ger, default", "\"Director\", commentary",
          "subrip, text, forced", "font.ttf, font/ttf, 1.0 kB", "0:00:01.000  Second", "The whole"})
        EXPECT_NE(text.find(part), std::string::npos) << part << " in " << text;
}

TEST(Source, KeepsACountedRateWhenItsLengthIsMeasured) {
    const std::string path = Make(
        "variable.asf", Join(CountedPictures(4), Args{"-c:v", "mpeg4"}, Args{"-output_ts_offset", "10"}));
    EXPECT_NEAR(Source(path, {}).Info().pictures->frameRate, 25, 0.1);
}

TEST(Source, MeasuresTheHighestRateWhereTheContainerTellsItsClock) {
    for (const char* name : {"unsteady.mp4", "unsteady.nut"}) { // with an index of all pictures, and without
        const std::string path =
            Make(name, Join(CountedPictures(4), Words("-vf settb=1/90000,setpts='(N/25+0.02*sin(N*1.7))/TB' "
                                                      "-vsync passthrough -enc_time_base 1/90000 -r 90000 "
                                                      "-video_track_timescale 90000 -c:v libx264")));
        EXPECT_NEAR(Source(path, {}).Info().pictures->peakRate, 100.5, 0.2) << name;
    }
}

TEST(Demuxer, DoesNotReadOnWhereSoundStaysAway) {
    const Args raw = Join(Lavfi("color=gray:s=320x240:r=25:d=24,format=yuv420p", "sine=d=1:r=44100"),
                          Words("-c:v rawvideo -c:a pcm_s16le"));
    Source source(Make("sound-ends.mkv", raw), {});
    Failures failures([] {});
    Demuxer demuxer(source, failures);
    int64_t silentUntil = -1;
    while (silentUntil < 0) {
        auto taken = demuxer.TakeOrSilence(1);
        if (const int64_t* silence = std::get_if<int64_t>(&taken))
            silentUntil = *silence;
        else
            ASSERT_TRUE(std::get<av::Packet>(taken));
    }
    EXPECT_GT(silentUntil, kTicksPerSecond);
    EXPECT_LT(silentUntil, 3 * kTicksPerSecond); // of 24: the rest has not been read
    EXPECT_LT(demuxer.Bytes(), std::size_t{34} << 20);
    int pictures = 0;
    while (demuxer.Take(0))
        ++pictures;
    EXPECT_EQ(pictures, 600);
    for (;;) {
        auto taken = demuxer.TakeOrSilence(1);
        if (const int64_t* silence = std::get_if<int64_t>(&taken)) {
            EXPECT_GT(*silence, silentUntil);
            silentUntil = *silence;
        } else {
            EXPECT_FALSE(std::get<av::Packet>(taken));
            break;
        }
    }
}

TEST(Failures, KeepTheFirstReasonAndStopTheOthers) {
    int stops = 0;
    Failures failures([&] { ++stops; });
    EXPECT_TRUE(failures.Attempt([] {}));
    failures.Note({});
    EXPECT_EQ(failures.First().Text(), "");
    EXPECT_FALSE(failures.Attempt([] { throw std::runtime_error("first"); }));
    EXPECT_FALSE(failures.Attempt([] { throw std::bad_alloc(); }));
    failures.Note(std::string("third"));
    EXPECT_EQ(failures.First().Text(), "first");
    EXPECT_EQ(stops, 2);
}

TEST(Source, ReadingAheadIsInterruptedWithIt) {
    const Folder folder;
    WriteFile(folder / "a.srt", "1\n00:00:00,200 --> 00:00:00,600\nA\n");
    const std::string path =
        Make("with_cue.mkv",
             Join(CountedPictures(1), Args{"-i", folder / "a.srt", "-c:v", "mpeg4", "-c:s", "srt"}));
    const auto interruption = std::make_shared<Interruption>();
    const Source source(path, {}, interruption);
    BurnWish wish;
    wish.what = "1";
    EXPECT_EQ(ReadCues(source, wish, false).cues.size(), 1);
    interruption->Interrupt();
    EXPECT_THROW(ReadCues(source, wish, false), SourceError);
}

TEST(CharacterSets, WithAccentsBehindTheirLettersKeepTheLastLetter) {
    EXPECT_EQ(movieconv::Decoded("ch\xE0o", "CP1258"), "ch\xC3\xA0o");
}

} // namespace
