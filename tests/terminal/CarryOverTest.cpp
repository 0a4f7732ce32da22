// What a movie holds beside its pictures and sound is in the output, or told.
#include "tests/support/Folder.h"
#include "tests/support/Program.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <string>
#include <tuple>

namespace {

using program::Call;
using program::Result;
using test_movies::Args;
using test_movies::Beeps;
using test_movies::CountedPictures;
using test_movies::Ffmpeg;
using test_movies::Join;
using test_movies::Words;

/// Two seconds with texts, two chapters, subtitles, a cover and a font.
std::string MakeWhole(const Folder& folder) {
    WriteFile(folder / "words.srt", "1\n00:00:00,500 --> 00:00:01,000\nWords\n");
    WriteFile(folder / "font.ttf", std::string(1000, 'f'));
    WriteFile(folder / "notes.txt", ";FFMETADATA1\ntitle=The whole\nartist=Nobody\n"
                                    "[CHAPTER]\nTIMEBASE=1/1000\nSTART=0\nEND=1000\ntitle=First\n"
                                    "[CHAPTER]\nTIMEBASE=1/1000\nSTART=1000\nEND=2000\ntitle=Second\n");
    Ffmpeg(Join(CountedPictures(2), Args{"-frames:v", "1", folder / "cover.png"}));
    std::string path = folder / "whole.mkv";
    Ffmpeg(Join(CountedPictures(2), Beeps(2), Args{"-i", folder / "words.srt", "-i", folder / "notes.txt"},
                Words("-map 0 -map 1 -map 2 -map_metadata 3 -c:s srt -metadata:s language=ger"),
                Args{"-attach", folder / "cover.png", "-attach", folder / "font.ttf"},
                Words("-metadata:s:3 mimetype=image/png -metadata:s:4 mimetype=font/ttf"), Args{path}));
    return path;
}

std::string Probe(const std::string& path) {
    return test_movies::Ffprobe(path,
                                Words("-show_chapters -show_entries "
                                      "format_tags:chapter=start_time,end_time:stream=codec_name,codec_type:"
                                      "stream_tags=language -of compact"));
}

TEST(CarryOver, PutsIntoTheFileWhatItsFormatHoldsAndTellsTheRest) {
    const Folder folder;
    const std::string whole = MakeWhole(folder);
    const Result mp4 = Call({whole, folder / "out.mp4", "--progress", "json"});
    ASSERT_EQ(mp4.code, 0) << mp4.err;
    EXPECT_FALSE(Has(mp4.out, R"("kind":"subtitles")"));
    EXPECT_TRUE(Has(mp4.out, R"("event":"not_carried","kind":"attachment")"));
    EXPECT_FALSE(Has(mp4.out, R"("kind":"cover")"));
    EXPECT_FALSE(Has(mp4.out, R"("kind":"chapters")"));
    const std::string inMp4 = Probe(folder / "out.mp4");
    for (const char* part : {"tag:title=The whole", "tag:artist=Nobody", "tag:language=ger", "codec_name=png",
                             "start_time=1.000000|end_time=2.000000|tag:title=Second"})
        EXPECT_TRUE(Has(inMp4, part)) << part << " in " << inMp4;

    const Result avi = Call({whole, folder / "out.avi", "--progress", "none"});
    ASSERT_EQ(avi.code, 0) << avi.err;
    for (const char* kind : {"chapters", "cover", "subtitles", "attachment"})
        EXPECT_TRUE(Has(avi.err, std::string("movieconv: not carried: ") + kind)) << avi.err;
    EXPECT_TRUE(Has(Probe(folder / "out.avi"), "tag:title=The whole"));
    EXPECT_EQ(Call({whole, folder / "quiet.avi", "-q"}).err, "");
}

TEST(CarryOver, TellsPicturesAndSoundThatCannotBeDecoded) {
    const Folder folder;
    const std::string known = ReadFile(test_movies::CountedMovie());
    for (const auto& [codec, unknown, kind, without] :
         {std::tuple{"V_MPEG4/ISO/ASP", "V_MPEG9/ISO/ASP", "pictures 0", "--no-video"},
          {"A_PCM/INT/LIT", "A_PCM/INT/TIL", "sound 1", "--no-audio"}}) {
        std::string content = known;
        ASSERT_NE(content.find(codec), std::string::npos);
        WriteFile(folder / "in.mkv",
                  content.replace(content.find(codec), std::string(codec).size(), unknown));
        const std::string told = std::string("not carried: ") + kind + ": it cannot be decoded";
        const Result result = Call({"-y", folder / "in.mkv", folder / "out.mkv"});
        EXPECT_EQ(result.code, 0) << result.err;
        EXPECT_TRUE(Has(result.err, told)) << result.err;
        EXPECT_FALSE(Has(Call({"-y", without, folder / "in.mkv", folder / "out.mkv"}).err, told));
    }
}

TEST(CarryOver, KeepsCoversWithTheirNamesAndTitles) {
    const Folder folder;
    for (const char* name : {"front.png", "back.png"})
        Ffmpeg(Join(CountedPictures(1), Args{"-frames:v", "1", folder / name}));
    const std::string source = folder / "covers.mkv";
    Ffmpeg(
        Join(Beeps(1), Args{"-attach", folder / "front.png", "-attach", folder / "back.png"},
             Words("-metadata:s:t mimetype=image/png -metadata:s:t:0 title=Face -metadata:s:t:1 title=Rear"),
             Args{source}));
    const auto covers = [](const std::string& path) {
        return test_movies::Ffprobe(path,
                                    Words("-select_streams v -show_entries "
                                          "stream=codec_name:stream_tags=filename,title -of compact=p=0"));
    };
    const Result mka = Call({source, folder / "out.mka", "-q"});
    ASSERT_EQ(mka.code, 0) << mka.err;
    EXPECT_EQ(covers(folder / "out.mka"), "codec_name=png|tag:filename=front.png|tag:title=Face\n"
                                          "codec_name=png|tag:filename=back.png|tag:title=Rear\n");
    const Result flac = Call({source, folder / "out.flac", "--progress", "none"});
    ASSERT_EQ(flac.code, 0) << flac.err;
    EXPECT_TRUE(Has(flac.err, "only one cover is carried")) << flac.err;
    EXPECT_TRUE(Has(covers(folder / "out.flac"), "tag:title=Face"));
    const Result m4a = Call({source, folder / "out.m4a", "--progress", "none"});
    ASSERT_EQ(m4a.code, 0) << m4a.err;
    EXPECT_TRUE(Has(m4a.err, "cannot hold its title")) << m4a.err;
    ASSERT_EQ(Call({source, folder / "bare.mka", "--no-metadata", "-q"}).code, 0);
    EXPECT_FALSE(Has(covers(folder / "bare.mka"), "title"));
    ASSERT_EQ(Call({folder / "out.m4a", folder / "again.mka", "-q"}).code, 0);
    EXPECT_EQ(covers(folder / "again.mka"), "codec_name=png|tag:filename=cover.png\n");
}

TEST(CarryOver, TakesACoverOfAnotherKindForAFile) {
    const Folder folder;
    Ffmpeg(Join(CountedPictures(1), Args{"-frames:v", "1", folder / "front.gif"}));
    Ffmpeg(Join(Beeps(1), Args{"-attach", folder / "front.gif"}, Words("-metadata:s:t mimetype=image/gif"),
                Args{folder / "in.mka"}));
    EXPECT_EQ(Call({folder / "in.mka", folder / "out.mka", "--progress", "none"}).err, "");
    EXPECT_TRUE(Has(Probe(folder / "out.mka"), "codec_name=gif"));
    EXPECT_TRUE(Has(Call({folder / "in.mka", folder / "out.mp3", "--progress", "none"}).err,
                    "it is neither JPEG nor PNG"));
}

TEST(CarryOver, KeepsWhatIsSaidOfTracksAndTellsWhatIsSaidOfChapters) {
    const Folder folder;
    WriteFile(folder / "notes.txt", ";FFMETADATA1\n[CHAPTER]\nTIMEBASE=1/1000\nSTART=0\nEND=900\n"
                                    "title=First\nMOOD=calm\n");
    Ffmpeg(Join(CountedPictures(1), Beeps(1), Args{"-i", folder / "notes.txt"},
                Words("-map 0 -map 1 -map 1 -map_chapters 2 -c:v mpeg4 -metadata:s:a:0 MIC=left "
                      "-metadata:s:a:1 MIC=right -metadata:s:a:1 SOURCE_ID=7"),
                Args{folder / "in.mkv"}));
    const std::string ofChapters = "movieconv: not carried: chapters: of their texts only the titles are "
                                   "carried, not MOOD\n";
    const auto told = [&](const char* name, const Args& options) {
        return Call(Join(Args{folder / "in.mkv", folder / name, "-y", "--progress", "none"}, options)).err;
    };
    const auto tracks = [&](const char* name) {
        return test_movies::Ffprobe(
            folder / name, Words("-show_entries stream_tags=MIC,SOURCE_ID -of csv=p=0 -select_streams a"));
    };
    for (const char* name : {"out.mkv", "out.webm"}) {
        EXPECT_EQ(told(name, {}), ofChapters);
        EXPECT_EQ(tracks(name), "left\nright\n");
    }
    EXPECT_EQ(told("out.mp4", {}), "movieconv: not carried: label 1 (vorbis): MP4 cannot hold its MIC\n" +
                                       ofChapters +
                                       "movieconv: not carried: label 2 (vorbis): MP4 cannot hold its MIC\n");
    EXPECT_EQ(told("out.mkv", {"--no-metadata"}), "");
    EXPECT_EQ(tracks("out.mkv"), "\n\n");
}

TEST(CarryOver, MovesChaptersWithTheRange) {
    const Folder folder;
    const std::string whole = MakeWhole(folder);
    const Result result = Call({whole, folder / "out.mkv", "--begin", "0.4", "--length", "1.2", "-q"});
    ASSERT_EQ(result.code, 0) << result.err;
    const std::string read = Probe(folder / "out.mkv");
    EXPECT_TRUE(Has(read, "start_time=0.000000|end_time=0.600000|tag:title=First")) << read;
    EXPECT_TRUE(Has(read, "start_time=0.600000|end_time=1.2")) << read;
    for (const char* name : {"out.ogg", "out.flac", "out.mp3"}) {
        ASSERT_EQ(Call({whole, folder / name, "--begin", "0.4", "--length", "1.2", "-q"}).code, 0);
        const std::string texts = Probe(folder / name);
        EXPECT_TRUE(Has(texts, "start_time=0.000000|end_time=0.600000|tag:title=First")) << texts;
        EXPECT_TRUE(Has(texts, "start_time=0.600000|")) << texts;
    }
    const std::string more = folder / "more.mkv"; // the second chapter lies behind its end
    test_movies::Ffmpeg({"-i", whole, "-map", "0:v", "-map", "0:a", "-t", "0.8", "-map_chapters", "-1",
                         folder / "short.mkv"});
    test_movies::Ffmpeg(
        {"-i", folder / "short.mkv", "-i", whole, "-map", "0", "-map_chapters", "1", "-c", "copy", more});
    for (const char* name : {"more.ogg", "more.mp3"}) {
        const Result made = Call({more, folder / name, "--progress", "none"});
        EXPECT_TRUE(Has(made.err, "not carried: chapters")) << made.err;
        EXPECT_FALSE(Has(Probe(folder / name), "Second")) << name;
    }
    // What was carried is carried again, and MP4's own track of chapters is not told.
    const Result again = Call({folder / "out.mkv", folder / "again.mp4", "--progress", "none"});
    const Result third = Call({folder / "again.mp4", folder / "third.mp4", "--progress", "none"});
    EXPECT_FALSE(Has(third.err, "not carried")) << third.err;
    EXPECT_TRUE(Has(Probe(folder / "third.mp4"), "start_time=0.000000|end_time=0.600000|tag:title=First"));
}

} // namespace
