// Movies as other programs make them: what they hold in ways of their own is carried over, or told.
#include "tests/support/Folder.h"
#include "tests/support/Program.h"
#include "tests/support/TestMovies.h"
#include "tests/terminal/WholeMovie.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <utility>

namespace {

using program::Call;
using program::Result;
using test_movies::Args;
using test_movies::CountedPictures;
using test_movies::Join;
using test_movies::Words;
using whole_movie::Json;

/// One second with subtitles in Latin letters of one byte each.
void MakeLatin(const std::string& path, const Folder& folder) {
    WriteFile(folder / "latin.srt", "1\n00:00:00,200 --> 00:00:00,600\nGr\xFC\xDF"
                                    "e\n\n2\n00:00:00,700 --> 00:00:00,900\nplain\n");
    EXPECT_EQ(program::Run(Join(Args{"ffmpeg", "-v", "error"}, CountedPictures(1),
                                Args{"-i", folder / "latin.srt", "-c:v", "mpeg4", "-c:s", "copy", path}))
                  .code,
              0);
}

TEST(OtherMakers, SubtitlesInOtherCharacterSetsComeInUtf8) {
    const Folder folder;
    MakeLatin(folder / "latin.mkv", folder);
    for (const char* name : {"out.mp4", "out.mkv"}) {
        SCOPED_TRACE(name);
        const Result made = Call({folder / "latin.mkv", folder / name, "--progress", "none"});
        EXPECT_EQ(made.code, 0);
        EXPECT_TRUE(Has(made.err, "1 of its subtitles was not in UTF-8 and taken for Windows-1252"))
            << made.err;
        const std::vector<whole_movie::Cue> cues = whole_movie::CuesOf(folder / name, 0);
        ASSERT_EQ(cues.size(), 2);
        EXPECT_EQ(cues[0].text, "Gr\xC3\xBC\xC3\x9F"
                                "e");
    }
}

TEST(OtherMakers, CuesThatCannotBeConvertedAreCounted) {
    const Folder folder;
    WriteFile(folder / "a.srt",
              "1\n00:00:00,200 --> 00:00:00,600\nGrxxe\n\n2\n00:00:00,700 --> 00:00:00,900\nplain\n");
    ASSERT_EQ(program::Run(Join(Args{"ffmpeg", "-v", "error"}, CountedPictures(1),
                                Args{"-i", folder / "a.srt", "-c:v", "mpeg4", "-c:s", "mov_text",
                                     "-metadata:s:s", "language=ger", folder / "a.mp4"}))
                  .code,
              0);
    std::string movie = ReadFile(folder / "a.mp4");
    const size_t word = movie.find("Grxxe");
    ASSERT_NE(word, std::string::npos);
    WriteFile(folder / "a.mp4", movie.replace(word, 5,
                                              "Gr\xFC\xDF"
                                              "e"));
    for (const Args& options : {Args{}, Args{"--split", "0.5"}, Args{"--jobs", "2", "--pieces", "2"}}) {
        const Result made =
            Call(Join(Args{folder / "a.mp4", folder / "out.mkv", "-y", "--progress", "none"}, options));
        EXPECT_EQ(made.code, 0);
        EXPECT_TRUE(Has(made.err, "not carried: subtitles 1 (mov_text, German): ")) << made.err;
        EXPECT_TRUE(Has(made.err, "of their texts could not be converted")) << made.err;
    }
}

/// Regions and scripts of languages, as an independent program writes and reads them.
TEST(OtherMakers, LanguagesKeepTheirRegions) {
    if (program::Run({"sh", "-c", "command -v mkvmerge"}).code != 0)
        GTEST_SKIP() << "without mkvmerge";
    const Folder folder;
    Args inputs = CountedPictures(1);
    for (int i = 0; i < 4; ++i)
        inputs = Join(inputs, Args{"-f", "lavfi", "-i", "sine=d=1"});
    ASSERT_EQ(program::Run(Join(Args{"ffmpeg", "-v", "error"}, inputs,
                                Args{"-map", "0", "-map", "1", "-map", "2", "-map", "3", "-map", "4", "-c:v",
                                     "mpeg4", "-c:a", "flac", folder / "plain.mkv"}))
                  .code,
              0);
    ASSERT_EQ(program::Run({"mkvmerge", "-q", "-o", folder / "in.mkv", "--language", "0:und", "--language",
                            "1:pt-BR", "--language", "2:zh-Hans", "--language", "3:de", "--language", "4:yue",
                            folder / "plain.mkv"})
                  .code,
              0);
    const struct {
        const char* language;
        const char* tag; // empty where it says no more
    } expected[] = {{"por", "pt-BR"}, {"chi", "zh-Hans"}, {"ger", ""}, {"chi", "yue"}};
    std::string from = "in.mkv";
    for (const std::string name : {"a.mkv", "b.mp4", "c.mov", "d.mkv"}) { // each of the one before
        SCOPED_TRACE(name);
        const Result made = Call({folder / from, folder / name, "--progress", "none"});
        EXPECT_EQ(made.code, 0);
        EXPECT_EQ(made.err, "");
        const Json info = Json::parse(Call({"--info", folder / name, "--progress", "json"}).out);
        const Json probe = whole_movie::Probe(folder / name);
        for (size_t i = 1; i < 5; ++i) {
            EXPECT_EQ(probe["streams"][i]["tags"]["language"], expected[i - 1].language);
            EXPECT_EQ(info["streams"][i]["language_tag"], expected[i - 1].tag);
            EXPECT_EQ(program::Run({"ffmpeg", "-v", "error", "-i", folder / name, "-f", "null", "-"}).err,
                      "");
        }
        from = name;
    }
    for (const char* name : {"a.mkv", "d.mkv"}) {
        const Json read = whole_movie::Identify(folder / name);
        EXPECT_TRUE(read["warnings"].empty() && read["errors"].empty()) << read;
        for (size_t i = 1; i < 5; ++i)
            EXPECT_EQ(read["tracks"][i]["properties"].value("language_ietf", ""), expected[i - 1].tag);
    }
    EXPECT_TRUE(Has(
        Call({folder / "in.mkv", folder / "out.ts", "--progress", "none"}).err,
        "not carried: label 1 (flac, Portuguese): MPEG transport stream cannot hold its language as pt-BR"));
}

TEST(OtherMakers, ABroadcastServiceIsATitle) {
    const Folder folder;
    ASSERT_EQ(program::Run(Join(Args{"ffmpeg", "-v", "error"}, CountedPictures(1),
                                Args{"-c:v", "mpeg2video", "-metadata", "service_name=Das Programm",
                                     folder / "in.ts"}))
                  .code,
              0);
    ASSERT_EQ(Call({folder / "in.ts", folder / "a.mkv", "-q"}).code, 0);
    EXPECT_EQ(whole_movie::Probe(folder / "a.mkv")["format"]["tags"]["title"], "Das Programm");
    ASSERT_EQ(Call({folder / "in.ts", folder / "a.ts", "-q"}).code, 0);
    EXPECT_EQ(whole_movie::Probe(folder / "a.ts")["programs"][0]["tags"]["service_name"], "Das Programm");
    const Result made = Call({whole_movie::Make(), folder / "b.ts", "--progress", "none"});
    EXPECT_TRUE(Has(made.err,
                    "not carried: label 0 (mpeg4, English): MPEG transport stream cannot hold its language"))
        << made.err;
}

/// Titles of tracks in MP4, and long names of texts, as telephones write them.
TEST(OtherMakers, TextsOfMp4AreFoundWhereverTheyAre) {
    const Folder folder;
    ASSERT_EQ(Call({whole_movie::Make(), folder / "a.mp4", "-q"}).code, 0);
    ASSERT_EQ(Call({folder / "a.mp4", folder / "b.mkv", "-q"}).code, 0);
    const Json streams = whole_movie::Probe(folder / "b.mkv")["streams"];
    const char* titles[] = {"View", "Deutsch", "Comments", "", "Texte", "Signs"};
    for (size_t i = 0; i < std::size(titles); ++i)
        EXPECT_EQ(streams[i]["tags"].value("title", ""), titles[i]);
    ASSERT_EQ(
        program::Run(Join(Args{"ffmpeg", "-v", "error"}, CountedPictures(1),
                          Args{"-c:v", "mpeg4", "-movflags", "use_metadata_tags", "-metadata",
                               "com.apple.quicktime.location.ISO6709=+48.1+011.6/", folder / "phone.mov"}))
            .code,
        0);
    EXPECT_EQ(Call({folder / "phone.mov", folder / "phone.mp4", "--progress", "none"}).err, "");
    EXPECT_EQ(whole_movie::Probe(folder / "phone.mp4")["format"]["tags"].value("location", ""),
              "+48.1000+011.6000/");
}

/// Which FFmpeg reads with the streams.
TEST(OtherMakers, TextsOfOggAreTheMovies) {
    const Folder folder;
    const auto make = [&](const char* name, const Args& options) {
        ASSERT_EQ(program::Run(Join(Args{"ffmpeg", "-v", "error", "-f", "lavfi", "-i", "sine=d=1"}, options,
                                    Args{"-metadata", "title=T", "-metadata", "MOOD=calm", folder / name}))
                      .code,
                  0);
    };
    make("a.ogg", {"-c:a", "libvorbis"});
    make("a.opus", {"-c:a", "libopus", "-metadata", "CHAPTER001URL=none"});
    make("a.ogv", Join(CountedPictures(1), Args{"-map", "0", "-map", "1", "-c:v", "libtheora", "-c:a",
                                                "libvorbis", "-metadata:s:1", "title=Noises"}));
    const struct {
        const char* from;
        const char* to;
        const char* title; ///< Of a track.
    } cases[] = {{"a.ogg", "a.mp3", ""},
                 {"a.ogg", "a.flac", ""},
                 {"a.ogg", "b.ogg", ""},
                 {"a.opus", "a.mka", ""},
                 {"a.ogv", "a.mkv", "Noises"}};
    for (const auto& test : cases) {
        SCOPED_TRACE(test.to);
        EXPECT_EQ(Call({folder / test.from, folder / test.to, "--progress", "none"}).err, "");
        const Json probe = whole_movie::Probe(folder / test.to);
        const auto tags = whole_movie::TagsOf(probe);
        for (const auto& tag : {std::pair<std::string, std::string>("title", "T"), {"mood", "calm"}})
            EXPECT_EQ(std::count(tags.begin(), tags.end(), tag), 1) << tag.first;
        const Json& track = probe["streams"].front();
        if (track.contains("tags") && std::string(test.to) != "b.ogg") {
            EXPECT_EQ(track["tags"].value("title", ""), test.title);
        }
    }
}

/// A text that FFmpeg reads twice, and names of AVI's own.
TEST(OtherMakers, TextsComeOnceAndUnderTheirUsualNames) {
    const Folder folder;
    const struct {
        const char* name;
        const char* key;
        const char* value;
        const char* other; ///< What is not there.
    } cases[] = {{"a.mp4", "location", "+48.1000+011.5000/", "location-eng"},
                 {"a.avi", "album", "Songs", "product"}};
    for (const auto& test : cases) {
        SCOPED_TRACE(test.name);
        ASSERT_EQ(program::Run(Join(Args{"ffmpeg", "-v", "error"}, CountedPictures(1),
                                    Args{"-c:v", "mpeg4", "-metadata",
                                         std::string(test.key) + "=" + test.value, folder / test.name}))
                      .code,
                  0);
        const std::string same = folder / (std::string("same-") + test.name);
        for (const std::string& to : {same, folder / "out.mkv"}) {
            EXPECT_EQ(Call({folder / test.name, to, "-y", "--progress", "none"}).err, "");
            const Json info = Json::parse(Call({"--info", to, "--progress", "json"}).out);
            std::string told = info["tags"].dump();
            std::transform(told.begin(), told.end(), told.begin(), ::tolower);
            EXPECT_TRUE(Has(told, std::string("\"") + test.key + "\"")) << told;
            EXPECT_FALSE(Has(told, test.other) || Has(told, "software")) << told;
        }
    }
}

/// Beside chapters in a track of texts, which is data for FFmpeg as well.
TEST(OtherMakers, DataBesideChaptersAreTold) {
    const Folder folder;
    WriteFile(folder / "a.srt", "1\n00:00:00,200 --> 00:00:00,600\nA\n");
    WriteFile(folder / "notes.txt", ";FFMETADATA1\n[CHAPTER]\nTIMEBASE=1/1000\nSTART=0\nEND=900\ntitle=A\n");
    ASSERT_EQ(program::Run(Join(Args{"ffmpeg", "-v", "error"}, CountedPictures(1),
                                Args{"-i", folder / "a.srt", "-i", folder / "notes.txt", "-c:v", "mpeg4",
                                     "-c:s", "mov_text", folder / "a.mp4"}))
                  .code,
              0);
    std::string movie = ReadFile(folder / "a.mp4");
    for (const auto& [from, to] : {std::pair("sbtl", "meta"), std::pair("tx3g", "gpmd")}) {
        ASSERT_NE(movie.find(from), std::string::npos);
        movie.replace(movie.find(from), 4, to);
    }
    WriteFile(folder / "a.mp4", movie);
    EXPECT_EQ(Call({folder / "a.mp4", folder / "out.mkv", "--progress", "none"}).err,
              "movieconv: not carried: data 1 (bin_data): data streams are not converted\n");
}

TEST(OtherMakers, ChaptersOutOfOrderAndOutsideAreTold) {
    const Folder folder;
    const auto chapter = [](const char* begin, const char* end) {
        return std::string("[CHAPTER]\nTIMEBASE=1/1000\nSTART=") + begin + "\nEND=" + end + "\ntitle=A\n";
    };
    WriteFile(folder / "notes.txt", ";FFMETADATA1\n" + chapter("0", "400") + chapter("600", "2000") +
                                        chapter("300", "500") + chapter("3000", "4000"));
    ASSERT_EQ(program::Run(Join(Args{"ffmpeg", "-v", "error"}, CountedPictures(1),
                                Args{"-i", folder / "notes.txt", "-c:v", "mpeg4", folder / "a.mkv"}))
                  .code,
              0);
    EXPECT_EQ(Call({folder / "a.mkv", folder / "out.mkv", "--progress", "none"}).err,
              "movieconv: not carried: chapters: 1 of them are out of their order in time\n"
              "movieconv: not carried: chapters: 1 of them lie outside the movie\n");
    EXPECT_EQ(Call({folder / "a.mkv", folder / "out.mkv", "-y", "--progress", "none", "--no-chapters"}).err,
              "");
}

/// Chapters, texts and an attached file, as mkvmerge writes them from what people give it.
void MakeNoted(const Folder& folder) {
    constexpr char kXml[] = "<?xml version=\"1.0\"?>";
    const auto title = [](const char* text, const char* language) {
        return std::string("<ChapterDisplay><ChapterString>") + text + "</ChapterString><ChapterLanguage>" +
               language + "</ChapterLanguage></ChapterDisplay>";
    };
    const auto chapter = [](const char* begin, const char* end, const std::string& within) {
        return std::string("<ChapterAtom><ChapterTimeStart>00:00:00.") + begin +
               "</ChapterTimeStart><ChapterTimeEnd>00:00:00." + end + "</ChapterTimeEnd>" + within +
               "</ChapterAtom>";
    };
    const auto tag = [](const char* level, const char* name, const char* text) {
        return std::string("<Tag><Targets><TargetTypeValue>") + level +
               "</TargetTypeValue></Targets><Simple><Name>" + name + "</Name><String>" + text +
               "</String></Simple></Tag>";
    };
    const std::string plain = title("A", "eng");
    WriteFile(folder / "chapters.xml", std::string(kXml) + "<Chapters><EditionEntry>" +
                                           chapter("000", "500", plain + chapter("100", "200", plain)) +
                                           chapter("500", "900", title("B", "eng") + title("Be", "ger")) +
                                           "</EditionEntry><EditionEntry>" + chapter("300", "400", plain) +
                                           "</EditionEntry></Chapters>");
    WriteFile(folder / "tags.xml", std::string(kXml) + "<Tags>" + tag("70", "TITLE", "The series") +
                                       tag("50", "ARTIST", "Anna") + tag("50", "ARTIST", "Ben") +
                                       tag("30", "ARTIST", "Anna") + tag("50", "GENRE", "Test") + "</Tags>");
    WriteFile(folder / "notes.txt", "words");
    ASSERT_EQ(program::Run(Join(Args{"ffmpeg", "-v", "error"}, CountedPictures(1),
                                Args{"-c:v", "mpeg4", folder / "plain.mkv"}))
                  .code,
              0);
    ASSERT_EQ(program::Run({"mkvmerge", "-q", "-o", folder / "in.mkv", "--title", "The movie",
                            "--global-tags", folder / "tags.xml", "--chapters", folder / "chapters.xml",
                            "--attachment-description", "What I thought", "--attachment-mime-type",
                            "text/plain", "--attach-file", folder / "notes.txt", folder / "plain.mkv"})
                  .code,
              0);
}

/// What Matroska says and FFmpeg does not read: a title that a tag hides, texts that come several times, what
/// an attached file is, chapters within chapters.
TEST(OtherMakers, MatroskaIsReadToItsEnd) {
    if (program::Run({"sh", "-c", "command -v mkvmerge"}).code != 0)
        GTEST_SKIP() << "without mkvmerge";
    const Folder folder;
    MakeNoted(folder);
    std::string from = "in.mkv";
    for (const std::string name : {"a.mkv", "b.mkv"}) { // the second one of what was carried
        SCOPED_TRACE(name);
        EXPECT_EQ(Call({folder / from, folder / name, "--progress", "none"}).err,
                  from != "in.mkv"
                      ? ""
                      : "movieconv: not carried: chapters: 2 of them are in other editions or within others\n"
                        "movieconv: not carried: chapters: 1 of them have titles in further languages\n");
        const Json probe = whole_movie::Probe(folder / name);
        EXPECT_EQ(probe["format"]["tags"].value("title", ""), "The movie");
        EXPECT_EQ(probe["format"]["tags"].value("ARTIST", ""), "Anna;Ben");
        EXPECT_EQ(probe["format"]["tags"].value("GENRE", ""), "Test");
        ASSERT_EQ(probe["chapters"].size(), 2);
        EXPECT_EQ(probe["chapters"][1]["tags"].value("title", ""), "B") << "the first of its titles";
        EXPECT_EQ(whole_movie::Identify(folder / name)["attachments"][0]["description"], "What I thought");
        from = name;
    }
    ASSERT_EQ(Call({folder / "in.mkv", folder / "c.mp4", "-q"}).code, 0);
    EXPECT_EQ(whole_movie::Probe(folder / "c.mp4")["format"]["tags"].value("artist", ""), "Anna;Ben");
}

/// An edition whose chapters play the movie's second half first, and then a part of another file.
TEST(OtherMakers, ChaptersThatPlayPartsInAnOrderAreTold) {
    if (program::Run({"sh", "-c", "command -v mkvmerge"}).code != 0)
        GTEST_SKIP() << "without mkvmerge";
    const Folder folder;
    const auto chapter = [](const char* begin, const char* end, const std::string& more) {
        return std::string("<ChapterAtom><ChapterTimeStart>00:00:00.") + begin +
               "</ChapterTimeStart><ChapterTimeEnd>00:00:00." + end + "</ChapterTimeEnd>" + more +
               "<ChapterDisplay><ChapterString>C</ChapterString><ChapterLanguage>eng</ChapterLanguage>"
               "</ChapterDisplay></ChapterAtom>";
    };
    const std::string foreign =
        "<ChapterSegmentUID format=\"hex\">" + std::string(32, 'a') + "</ChapterSegmentUID>";
    const auto edition = [&](const char* flags) {
        return std::string("<EditionEntry>") + flags + chapter("000", "400", "") +
               chapter("400", "500", foreign) + chapter("500", "900", "") + "</EditionEntry>";
    };
    const std::string order =
        "movieconv: not carried: chapters: the order in which they play parts of the movie is not followed\n";
    const std::string file =
        "movieconv: not carried: chapters: 1 of them stand for parts of other files, which are not played\n";
    const std::string others =
        "movieconv: not carried: chapters: 3 of them are in other editions or within others\n";
    constexpr char kOrdered[] = "<EditionFlagOrdered>1</EditionFlagOrdered>";
    const std::string plain = edition("<EditionFlagDefault>1</EditionFlagDefault>");
    const struct {
        std::string editions;
        Args options;
        std::string told;
    } cases[] = {{edition(kOrdered), {}, order + file},
                 {edition(kOrdered), {"--no-chapters"}, order + file},
                 {edition(kOrdered) + plain, {}, file + others}};
    ASSERT_EQ(program::Run(Join(Args{"ffmpeg", "-v", "error"}, CountedPictures(1),
                                Args{"-c:v", "mpeg4", folder / "plain.mkv"}))
                  .code,
              0);
    for (const auto& test : cases) {
        WriteFile(folder / "chapters.xml",
                  "<?xml version=\"1.0\"?><Chapters>" + test.editions + "</Chapters>");
        ASSERT_EQ(program::Run({"mkvmerge", "-q", "-o", folder / "in.mkv", "--chapters",
                                folder / "chapters.xml", folder / "plain.mkv"})
                      .code,
                  0);
        EXPECT_EQ(
            Call(Join(Args{folder / "in.mkv", folder / "out.mkv", "-y", "--progress", "none"}, test.options))
                .err,
            test.told);
        EXPECT_EQ(whole_movie::Probe(folder / "out.mkv")["chapters"].size(), test.options.empty() ? 2 : 0);
        EXPECT_TRUE(Has(Call({folder / "in.mkv", folder / "out.avi", "-y"}).err,
                        test.told.substr(0, test.told.find('\n'))));
    }
}

/// One second with WebVTT beside the pictures, as Matroska's own programs write it: what tells a cue's place
/// and its name stand beside it.
void MakeWebVtt(const Folder& folder) {
    test_movies::Ffmpeg(Join(CountedPictures(1), Args{folder / "pictures.mkv"}));
    WriteFile(folder / "a.vtt", "WEBVTT\n\nfirst\n00:00.200 --> 00:00.600 line:10% align:start\n"
                                "Good <b>morning</b> &amp; all\n\n00:00.700 --> 00:00.900\nplain\n");
    ASSERT_EQ(
        program::Run({"mkvmerge", "-q", "-o", folder / "in.mkv", folder / "pictures.mkv", folder / "a.vtt"})
            .code,
        0);
}

/// FFmpeg does not know WebVTT as it is in Matroska.
TEST(OtherMakers, WebVttOfMatroskaIsCarriedAndDrawn) {
    if (program::Run({"sh", "-c", "command -v mkvmerge"}).code != 0)
        GTEST_SKIP() << "without mkvmerge";
    const Folder folder;
    MakeWebVtt(folder);
    const std::string told = Call({"--info", folder / "in.mkv"}).out;
    EXPECT_NE(told.find("subtitles  webvtt, text, default\n"), std::string::npos) << told;
    struct Case {
        const char* name;
        const char* codec;
        bool hasPlaces;
    };
    for (const auto& [name, codec, hasPlaces] :
         {Case{"a.mkv", "webvtt", true}, Case{"a.mp4", "mov_text", false}, Case{"a.webm", "webvtt", true}}) {
        SCOPED_TRACE(name);
        const Result made = Call({folder / "in.mkv", folder / name, "--progress", "none"});
        EXPECT_EQ(made.code, 0);
        EXPECT_EQ(made.err, "");
        EXPECT_EQ(whole_movie::Probe(folder / name)["streams"][1].value("codec_name", ""), codec);
        const std::vector<whole_movie::Cue> cues = whole_movie::CuesOf(folder / name, 0);
        ASSERT_EQ(cues.size(), 2);
        EXPECT_NEAR(cues[0].begin, 200, 1);
        EXPECT_NEAR(cues[0].end, 600, 1);
        EXPECT_EQ(cues[0].text, "Good morning & all");
        EXPECT_EQ(cues[1].text, "plain");
        EXPECT_EQ(Has(ReadFile(folder / name), "first\nline:10% align:start\nGood"), hasPlaces);
    }
    const auto pictures = [&](const Args& options) {
        const Result made = Call(Join(Args{folder / "in.mkv", folder / "drawn.mkv", "--video-codec", "FFV1",
                                           "--overwrite", "--progress", "none"},
                                      options));
        EXPECT_EQ(made.code, 0) << made.err;
        return test_movies::FfmpegReads(folder / "drawn.mkv", Words("-map 0:v -f rawvideo"));
    };
    EXPECT_NE(pictures({"--burn-subtitles", "1"}), pictures({}));
}

TEST(OtherMakers, SubtitlesOfAnUnknownCodecAreCalledSoAndLeftBehind) {
    if (program::Run({"sh", "-c", "command -v mkvmerge"}).code != 0)
        GTEST_SKIP() << "without mkvmerge";
    const Folder folder;
    MakeWebVtt(folder);
    const std::string codec = "S_TEXT/WEBVTT";
    std::string movie = ReadFile(folder / "in.mkv");
    ASSERT_NE(movie.find(codec), std::string::npos);
    WriteFile(folder / "in.mkv", movie.replace(movie.find(codec), codec.size(), "S_TEXT/NEWEST"));
    const std::string told = Call({"--info", folder / "in.mkv"}).out;
    EXPECT_NE(told.find("subtitles  unknown, default, no decoder\n"), std::string::npos) << told;
    const Result made = Call({folder / "in.mkv", folder / "out.mkv", "--progress", "none"});
    EXPECT_EQ(made.code, 0);
    EXPECT_NE(made.err.find("not carried: subtitles"), std::string::npos) << made.err;
}

} // namespace
