// Further tracks of a movie come into the output beside its pictures and its first sound.
#include "host/source/Movie.h"
#include "tests/support/Folder.h"
#include "tests/support/Program.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <fmt/format.h>
#include <string>

namespace {

using program::Call;
using program::Result;

using test_movies::Args;
using test_movies::CountedPictures;
using test_movies::FfmpegReads;
using test_movies::Ffprobe;
using test_movies::Join;
using test_movies::Lavfi;
using test_movies::Words;

/// Six seconds: German sound of one channel, English comments of two at another rate, which begin late.
std::string TwoSounds() {
    const Args sounds = Join(Lavfi("aevalsrc=0.4*sin(500*t*t):s=48000:d=6"), Words("-itsoffset 0.5"),
                             Lavfi("aevalsrc=0.4*sin(700*t*t)|0.3*sin(400*t*t):s=44100:d=5"));
    const Args outputs =
        Words("-map 0 -map 1 -map 2 -c:v mpeg4 -c:a flac -metadata:s:a:0 language=ger "
              "-metadata:s:a:1 language=eng -metadata:s:a:1 title=Comments -disposition:a:1 comment");
    return test_movies::Make("two_sounds.mkv", Join(CountedPictures(6), sounds, outputs));
}

std::string SoundOf(const std::string& path, int track) {
    return FfmpegReads(path, Words("-f s16le -map 0:a:" + std::to_string(track)));
}

TEST(Tracks, FurtherSoundComesIntoEveryFormatThatHoldsSeveral) {
    const Folder folder;
    for (const char* name : {"out.mp4", "out.mov", "out.mkv", "out.webm", "out.avi", "out.ts", "out.m4a"}) {
        SCOPED_TRACE(name);
        const Result made = Call({TwoSounds(), folder / name, "--length", "1", "--progress", "none"});
        ASSERT_EQ(made.code, 0) << made.err;
        EXPECT_EQ(made.err.find("not carried: sound"), std::string::npos) << made.err;
        const std::string read =
            Ffprobe(folder / name, Words("-select_streams a -of compact -show_entries "
                                         "stream=channels,sample_rate:stream_tags=language:"
                                         "stream_disposition=comment"));
        EXPECT_NE(read.find("channels=1"), std::string::npos) << read;
        EXPECT_GT(read.find("channels=2"), read.find("channels=1")) << read;
        EXPECT_NE(read.find("channels=2"), std::string::npos) << read;
        if (std::string(name) != "out.avi") {
            EXPECT_GT(read.find("language=eng"), read.find("language=ger")) << read;
            EXPECT_NE(read.find("language=eng"), std::string::npos) << read;
        }
        if (std::string(name) == "out.mkv") {
            EXPECT_GT(read.find("comment=1"), read.find("comment=0")) << read;
        }
    }
    const Result flash = Call({TwoSounds(), folder / "out.flv", "--length", "1", "--progress", "json"});
    EXPECT_NE(
        flash.out.find(R"("event":"not_carried","kind":"sound","number":2,"codec":"flac","language":"eng")"),
        std::string::npos)
        << flash.out;
}

TEST(Tracks, OfSoundKeepTheirLoudspeakers) {
    const std::string source = test_movies::Make(
        "loudspeakers.mkv", Words("-f lavfi -i anullsrc=cl=3.0:r=48000:d=0.3 -f lavfi -i "
                                  "anullsrc=cl=quad:r=48000:d=0.3 -map 0 -map 1 -c:a flac"));
    for (const char* const name : {"o.mp4", "o.mkv"}) {
        const Folder folder;
        const Result result = Call({source, folder / name});
        ASSERT_EQ(result.code, 0) << result.err;
        const movieconv::SourceInfo made = movieconv::Movie(folder / name, {}).Info();
        ASSERT_EQ(made.streams.size(), 2u);
        EXPECT_EQ(made.streams[0].sound->layout, "3.0") << name;
        EXPECT_EQ(made.streams[1].sound->layout, "quad") << name;
    }
}

TEST(Tracks, ClipsJoinToTheSample) {
    const Folder folder;
    ASSERT_EQ(Call({TwoSounds(), folder / "out.mkv", "--audio-codec", "FLAC", "--split", "1.7", "-q"}).code,
              0);
    for (const int track : {0, 1}) {
        SCOPED_TRACE(track);
        std::string joined;
        for (const char* name : {"out_00.mkv", "out_01.mkv", "out_02.mkv", "out_03.mkv"})
            joined += SoundOf(folder / name, track);
        const std::string whole = SoundOf(TwoSounds(), track);
        // The second track is preceded by the silence up to its begin, which the container rounds.
        ASSERT_GE(joined.size(), whole.size());
        const std::size_t silence = joined.size() - whole.size();
        EXPECT_NEAR(static_cast<double>(silence), track == 0 ? 0 : 0.5 * 44100 * 4, 100);
        EXPECT_EQ(joined.find_first_not_of('\0'), silence + whole.find_first_not_of('\0'));
        EXPECT_TRUE(joined.substr(silence) == whole);
    }
}

/// Six seconds with texts of which two overlap and one lies over 4 s.
std::string WithTexts() {
    const std::string words =
        test_movies::Part("words.srt", "1\n00:00:00,500 --> 00:00:01,500\nFirst\n\n"
                                       "2\n00:00:01,200 --> 00:00:02,800\nMore <i>words</i>\n\n"
                                       "3\n00:00:03,500 --> 00:00:04,600\nOver the cut\n");
    return test_movies::Make("with_texts.mkv",
                             Join(CountedPictures(6), Args{"-i", words},
                                  Words("-c:v mpeg4 -c:s srt -map 0 -map 1 -metadata:s:s:0 language=fre")));
}

/// The texts of a movie's first track of subtitles as FFmpeg reads them, from the begin of its pictures.
std::string TextsOf(const std::string& path) {
    const std::string cues = FfmpegReads(path, Words("-map 0:s:0 -f srt"));
    std::string text;
    for (const char letter : cues)
        text += letter == '\n' ? " " : letter == '\r' ? "" : std::string(1, letter);
    return text;
}

TEST(Tracks, TextsComeInTheFormatsOwnFormAndAreCutWithTheMovie) {
    const Folder folder;
    const struct {
        const char* name;
        Args options;
        const char* file;
        const char* texts;
    } cases[] = {
        {"a.mkv",
         {},
         "a.mkv",
         "1 00:00:00,500 --> 00:00:01,500 First  2 00:00:01,200 --> 00:00:02,800 More <i>words</i>  "
         "3 00:00:03,500 --> 00:00:04,600 Over the cut  "},
        {"a.webm",
         {},
         "a.webm",
         "1 00:00:00,500 --> 00:00:01,500 First  2 00:00:01,200 --> 00:00:02,800 More <i>words</i>  "
         "3 00:00:03,500 --> 00:00:04,600 Over the cut  "},
        // One text at a time.
        {"a.mp4",
         {},
         "a.mp4",
         "1 00:00:00,500 --> 00:00:01,200 First  2 00:00:01,200 --> 00:00:01,500 First More <i>words</i>  "
         "3 00:00:01,500 --> 00:00:02,800 More <i>words</i>  4 00:00:03,500 --> 00:00:04,600 Over the cut  "},
        {"b.mp4",
         {"--split", "4"},
         "b_00.mp4",
         "1 00:00:00,500 --> 00:00:01,200 First  2 00:00:01,200 --> 00:00:01,500 First More <i>words</i>  "
         "3 00:00:01,500 --> 00:00:02,800 More <i>words</i>  4 00:00:03,500 --> 00:00:04,000 Over the cut  "},
        {"b.mp4",
         {"--split", "4", "--overwrite"},
         "b_01.mp4",
         "1 00:00:00,000 --> 00:00:00,600 Over the cut  "},
        {"c.mkv",
         {"--begin", "1", "--length", "3"},
         "c.mkv",
         "1 00:00:00,000 --> 00:00:00,500 First  2 00:00:00,200 --> 00:00:01,800 More <i>words</i>  "
         "3 00:00:02,500 --> 00:00:03,000 Over the cut  "},
    };
    for (const auto& test : cases) {
        SCOPED_TRACE(test.file);
        const Result made =
            Call(Join(Args{WithTexts(), folder / test.name, "--progress", "none"}, test.options));
        ASSERT_EQ(made.code, 0) << made.err;
        EXPECT_EQ(made.err, "");
        EXPECT_EQ(TextsOf(folder / test.file), test.texts);
        EXPECT_NE(
            Ffprobe(folder / test.file, Words("-show_entries stream_tags=language")).find("language=fre"),
            std::string::npos);
        FfmpegReads(folder / test.file, Words("-f null"));
    }
    const Result other = Call({WithTexts(), folder / "a.avi", "--progress", "none"});
    EXPECT_EQ(other.err,
              "movieconv: not carried: subtitles 1 (SRT, French): AVI cannot hold them, MKV can\n");
}

TEST(Tracks, CarriedOnceMoreTheyStayAsTheyAre) {
    const Folder folder;
    ASSERT_EQ(Call({WithTexts(), folder / "first.mp4", "-q"}).code, 0);
    ASSERT_EQ(Call({folder / "first.mp4", folder / "second.mp4", "-q"}).code, 0);
    ASSERT_EQ(Call({folder / "second.mp4", folder / "third.mkv", "-q"}).code, 0);
    EXPECT_EQ(TextsOf(folder / "second.mp4"), TextsOf(folder / "first.mp4"));
    EXPECT_EQ(TextsOf(folder / "third.mkv"), TextsOf(folder / "first.mp4"));
}

TEST(Tracks, OfDamagedSoundAreTold) {
    const Folder folder;
    const std::string damaged = test_movies::Make(
        "damaged-second.mkv", Join(CountedPictures(2), test_movies::Beeps(2), test_movies::Beeps(2),
                                   Words("-map 0 -map 1 -map 2 -c:v mpeg4 -c:a mp3 -bsf:a:1 noise=20")));
    const Result made = Call({damaged, folder / "out.mkv"});
    EXPECT_EQ(made.code, 0) << made.err;
    EXPECT_NE(made.err.find("damaged pieces of sound data were skipped in stream 2"), std::string::npos)
        << made.err;
}

TEST(Tracks, AreChosenByNumberOrLanguage) {
    const Folder folder;
    const auto sounds = [&](const Args& options) {
        const Result made =
            Call(Join(Args{TwoSounds(), folder / "out.mkv", "--length", "0.5", "-y", "-q"}, options));
        EXPECT_EQ(made.code, 0) << made.err;
        std::string languages;
        const std::string read = Ffprobe(
            folder / "out.mkv", Words("-select_streams a -show_entries stream_tags=language -of csv=p=0"));
        for (const char letter : read)
            languages += letter == '\n' ? ' ' : letter;
        return languages;
    };
    EXPECT_EQ(sounds({}), "ger eng ");
    EXPECT_EQ(sounds({"--audio-tracks", "2"}), "eng ");
    EXPECT_EQ(sounds({"--audio-tracks", "deu"}), "ger ");
    EXPECT_EQ(sounds({"--audio-tracks", "en,1"}), "ger eng ");
    EXPECT_EQ(sounds({"--audio-tracks", "none"}), "");
    const Result none = Call({TwoSounds(), folder / "no.mkv", "--audio-tracks", "fr"});
    EXPECT_EQ(none.code, 2);
    EXPECT_NE(none.err.find("there is no sound \"fr\"; there is: 1 (ger), 2 (eng)"), std::string::npos)
        << none.err;
    EXPECT_EQ(Call({WithTexts(), folder / "no.mkv", "--subtitles", "0"}).code, 2);
    ASSERT_EQ(Call({WithTexts(), folder / "no.mkv", "--subtitles", "none", "-q"}).code, 0);
    EXPECT_EQ(Ffprobe(folder / "no.mkv", Words("-select_streams s -show_entries stream=index")), "");
}

TEST(Tracks, TextsComeFromFilesInAnyCharacterSet) {
    const Folder folder;
    const std::string cue = "1\n00:00:00,500 --> 00:00:01,000\n";
    WriteFile(folder / "utf8.srt", cue + "Gr\xC3\xBC\xC3\x9F"
                                         "e\n");
    WriteFile(folder / "western.srt", cue + "Gr\xFC\xDF"
                                            "e\n");
    WriteFile(folder / "greek.srt", cue + "\xE1\n"); // ISO 8859-7
    WriteFile(folder / "none.srt", "\x01\x02\x03");
    const auto texts = [&](const Args& options) {
        const Result made = Call(Join(
            Args{TwoSounds(), folder / "out.mp4", "--length", "2", "-y", "--progress", "none"}, options));
        EXPECT_EQ(made.code, 0) << made.err;
        return TextsOf(folder / "out.mp4");
    };
    const std::string expected = "1 00:00:00,500 --> 00:00:01,000 Gr\xC3\xBC\xC3\x9F"
                                 "e  ";
    EXPECT_EQ(texts({"--subtitle-file", folder / "utf8.srt"}), expected);
    EXPECT_EQ(texts({"--subtitle-file", folder / "western.srt:de"}), expected);
    EXPECT_NE(Ffprobe(folder / "out.mp4", Words("-show_entries stream_tags=language -select_streams s"))
                  .find("language=ger"),
              std::string::npos);
    EXPECT_EQ(texts({"--subtitle-file", folder / "greek.srt", "--subtitle-charset", "ISO-8859-7"}),
              "1 00:00:00,500 --> 00:00:01,000 \xCE\xB1  ");
    for (const char* bad : {"none.srt", "missing.srt"})
        EXPECT_EQ(Call({TwoSounds(), folder / "no.mp4", "--subtitle-file", folder / bad}).code, 2);
    EXPECT_EQ(Call({TwoSounds(), folder / "no.mp4", "--subtitle-file", folder / "utf8.srt",
                    "--subtitle-charset", "?"})
                  .code,
              2);
}

// MP4 has 31 bits for the length of a text, and of the pause before it.
TEST(Tracks, TextsMayBeFarApartAndLongButNotWithoutEnd) {
    const Folder folder;
    WriteFile(folder / "far.srt", "1\n00:00:00,500 --> 00:00:01,000\nA\n\n"
                                  "2\n04:00:00,000 --> 08:00:00,000\nB\n\n"
                                  "3\n08:00:01,000 --> 08:00:02,000\n" +
                                      std::string(1 << 20, 'C') +
                                      "\n\n"
                                      "4\n900000:00:00,000 --> 900000:00:01,000\nD\n");
    for (const char* name : {"out.mp4", "out.webm"}) {
        const Result made = Call({TwoSounds(), folder / name, "--subtitle-file", folder / "far.srt"});
        ASSERT_EQ(made.code, 0) << made.err;
        EXPECT_TRUE(Has(made.err, "2 of their texts could not be converted")) << made.err;
        const std::string texts = TextsOf(folder / name);
        EXPECT_TRUE(Has(texts, " 04:00:00,00") && Has(texts, "--> 08:00:00,00")) << texts;
        EXPECT_FALSE(Has(texts, "C") || Has(texts, "D")) << texts.size();
    }
    std::string crowd;
    for (const char* time : {"1,000", "1,040", "1,080"})
        for (int text = 0; text < 40; ++text)
            crowd += fmt::format("{}\n00:00:0{} --> 00:00:03,000\n{} {}\n\n", text, time, time, text);
    WriteFile(folder / "crowd.srt", crowd);
    ASSERT_EQ(Call({TwoSounds(), folder / "crowd.mkv", "--subtitle-file", folder / "crowd.srt"}).code, 0);
    const Args lines = Words(
        Ffprobe(folder / "crowd.mkv", Words("-select_streams s -show_entries packet=pts_time -of csv=p=0")));
    for (const int text : {0, 40, 80}) // each time the first of its forty
        EXPECT_EQ(std::count(lines.begin(), lines.end(), lines.at(text)), 40) << lines.at(text);
    const std::string title(256, 't'); // one more than broadcasts have
    const Result made =
        Call({TwoSounds(), folder / "out.ts", "--length", "1", "--metadata", "title=" + title});
    EXPECT_EQ(made.code, 0) << made.err;
    EXPECT_TRUE(Has(made.err, "cannot hold title")) << made.err;
}

TEST(Tracks, TextsAboutTheMovieAreReplacedOrLeftOut) {
    const Folder folder;
    ASSERT_EQ(Call({TwoSounds(), folder / "a.mkv", "--length", "0.5", "--metadata", "title=Old", "--metadata",
                    "artist=Nobody", "-q"})
                  .code,
              0);
    const auto tags = [&](const Args& options) {
        EXPECT_EQ(Call(Join(options, Args{folder / "a.mkv", folder / "b.mkv", "-y", "-q"})).code, 0);
        return Ffprobe(folder / "b.mkv", Words("-show_entries format_tags=title,artist -of compact"));
    };
    EXPECT_EQ(tags({}), "format|tag:title=Old|tag:ARTIST=Nobody\n");
    EXPECT_EQ(tags({"--metadata", "Artist=", "--metadata", "title=New=Newer"}),
              "format|tag:title=New=Newer\n");
    EXPECT_EQ(tags({"--no-metadata", "--metadata", "title=New"}), "format|tag:title=New\n");
    EXPECT_EQ(tags({"--no-metadata", "--metadata", "title=Gr\xFC\xDF"}),
              "format|tag:title=Gr\xC3\xBC\xC3\x9F\n");
    EXPECT_EQ(Call({TwoSounds(), folder / "c.mkv", "--metadata", "title"}).code, 2);
}

} // namespace
