// Movies whose texts and tracks are not as they should be.
#include "tests/support/Folder.h"
#include "tests/support/Program.h"
#include "tests/support/TestMovies.h"
#include "tests/terminal/WholeMovie.h"

#include <algorithm>
#include <gtest/gtest.h>

namespace {

using program::Call;
using program::Result;
using test_movies::Args;
using test_movies::Ffmpeg;
using test_movies::Join;
using test_movies::Lavfi;
using test_movies::Words;
using whole_movie::Json;

const Args kMovie = Lavfi("testsrc=s=64x48:r=10:d=2", "sine=d=2:r=8000");
const Args kCodecs = Words("-c:v mpeg4 -c:a flac");

/// Two seconds in Matroska with these texts of FFmpeg's form.
std::string WithNotes(const Folder& folder, const std::string& notes) {
    WriteFile(folder / "notes.txt", ";FFMETADATA1\n" + notes);
    Ffmpeg(Join(kMovie, Args{"-i", folder / "notes.txt"}, Words("-map_metadata 2 -map_chapters 2"), kCodecs,
                Args{folder / "in.mkv"}));
    return folder / "in.mkv";
}

std::string Chapter(int begin, int end, const std::string& title) {
    return "[CHAPTER]\nTIMEBASE=1/1000\nSTART=" + std::to_string(begin) + "\nEND=" + std::to_string(end) +
           "\n" + (title.empty() ? "" : "title=" + title + "\n");
}

std::string Chapters(const std::string& path) {
    std::string text;
    const Json probe = whole_movie::Probe(path);
    for (const Json& chapter : probe["chapters"]) {
        const auto time = [&](const char* key) { return chapter[key].get<std::string>().substr(0, 4); };
        text += time("start_time") + "-" + time("end_time") + " ";
        text += (chapter.contains("tags") ? chapter["tags"].value("title", "") : "") + "; ";
    }
    return text;
}

TEST(BrokenMovie, ChaptersAreCutToTheMovie) {
    std::string many;
    std::string expected;
    for (int i = 0; i < 300; ++i)
        many += Chapter(i * 5, i * 5 + 5, "C" + std::to_string(i));
    const struct {
        std::string notes;
        const char* chapters; // null: any, 300
    } cases[] = {
        {Chapter(0, 1000, "One") + Chapter(1000, 9000, "Two") + Chapter(9000, 10000, "Never"),
         "0.00-1.00 One; 1.00-2.00 Two; "},
        {Chapter(0, 1500, "One") + Chapter(500, 2000, "Two"), "0.00-1.50 One; 0.50-2.00 Two; "},
        {Chapter(0, 500, "") + Chapter(500, 2000, "Two"), "0.00-0.50 ; 0.50-2.00 Two; "},
        {many, nullptr},
    };
    for (const auto& test : cases)
        for (const char* name : {"out.mp4", "out.mkv"}) {
            SCOPED_TRACE(test.notes.substr(0, 100) + name);
            const Folder folder;
            const Result made = Call({WithNotes(folder, test.notes), folder / name, "--audio-codec",
                                      std::string(name) == "out.mkv" ? "FLAC" : "AAC", "--progress", "none"});
            ASSERT_EQ(made.code, 0) << made.err;
            if (test.chapters == nullptr) {
                EXPECT_EQ(whole_movie::Probe(folder / name)["chapters"].size(), 300);
            } else if (std::string(name) == "out.mkv" ||
                       std::string(test.chapters).find("1.50") == std::string::npos) {
                EXPECT_EQ(Chapters(folder / name), test.chapters);
            } else { // MP4's chapters follow each other
                EXPECT_EQ(Chapters(folder / name), "0.00-0.50 One; 0.50-2.00 Two; ");
            }
        }
}

TEST(BrokenMovie, TextsInOldCharacterSetsAndLongOnes) {
    const Folder folder;
    const std::string lengthy(100000, 'x');
    const std::string movie = WithNotes(folder, "title=Gr\xFC\xDF"
                                                "e\nartist=\x80uro\ncomment=" +
                                                    lengthy + "\nempty=\n");
    for (const char* name : {"out.mp4", "out.mkv", "out.webm", "out.mov", "out.avi", "out.flv", "out.mp3",
                             "out.ogg", "out.flac", "out.wav"}) {
        SCOPED_TRACE(name);
        const Result made = Call({movie, folder / name, "--progress", "json"});
        ASSERT_EQ(made.code, 0) << made.err;
        const auto tags = whole_movie::TagsOf(whole_movie::Probe(folder / name));
        const auto value = [&](const std::string& key) {
            const auto found =
                std::find_if(tags.begin(), tags.end(), [&](const auto& tag) { return tag.first == key; });
            return found != tags.end() ? found->second : std::string();
        };
        EXPECT_EQ(value("title"), "Gr\xC3\xBC\xC3\x9F"
                                  "e");
        EXPECT_EQ(value("artist"), "\xE2\x82\xACuro");
        EXPECT_TRUE(value("comment") == lengthy || made.out.find("COMMENT") != std::string::npos)
            << value("comment").size();
    }
    const Result info = Call({"--info", movie, "--progress", "json"});
    EXPECT_TRUE(Json::accept(info.out)) << info.out.substr(0, 200);
}

TEST(BrokenMovie, ALargeCover) {
    const Folder folder;
    Ffmpeg(Join(Lavfi("testsrc=s=64x64"), Args{"-frames:v", "1", folder / "cover.png"}));
    std::string cover = ReadFile(folder / "cover.png");
    cover.resize(cover.size() + 20'000'000, 'x');
    WriteFile(folder / "cover.png", cover);
    Ffmpeg(Join(kMovie, kCodecs, Args{"-attach", folder / "cover.png"},
                Words("-metadata:s:t mimetype=image/png"), Args{folder / "in.mkv"}));
    for (const char* name : {"out.mp4", "out.mkv", "out.m4a", "out.mp3", "out.flac"}) {
        SCOPED_TRACE(name);
        const Result made = Call({folder / "in.mkv", folder / name, "--progress", "json"});
        ASSERT_EQ(made.code, 0) << made.err;
        const Json streams = whole_movie::Probe(folder / name)["streams"];
        const bool isThere = std::any_of(streams.begin(), streams.end(), [](const Json& stream) {
            return stream["disposition"]["attached_pic"] == 1;
        });
        EXPECT_NE(isThere, made.out.find("\"kind\":\"cover\"") != std::string::npos);
        if (isThere) {
            EXPECT_GT(ReadFile(folder / name).size(), cover.size());
        }
    }
}

/// Languages as containers and people write them, and what becomes of them.
TEST(BrokenMovie, LanguagesOfEveryKind) {
    const struct {
        const char* source;
        const char* inMkv;
        const char* inMp4; // and MOV; empty: told
    } cases[] = {
        {"deu", "deu", "deu"},   {"ger", "ger", "ger"},      {"de", "ger", "ger"},  {"GER", "ger", "ger"},
        {"pt-BR", "por", "por"}, {"swe", "swe", "swe"},      {"sve", "swe", "swe"}, {"fre", "fre", "fre"},
        {"hrv", "hrv", "hrv"},   {"nob", "nob", "nob"},      {"fil", "fil", "fil"}, {"und", "", ""},
        {"xx", "xx", ""},        {"english", "english", ""},
    };
    const Folder folder;
    Args make = Join(kMovie, Words("-map 0"));
    int number = 0;
    for (const auto& test : cases)
        make = Join(make, Args{"-map", "1", "-metadata:s:a:" + std::to_string(number++),
                               std::string("language=") + test.source});
    Ffmpeg(Join(make, kCodecs, Args{folder / "in.mkv"}));
    for (const std::string extension : {"mkv", "mp4", "mov"}) {
        SCOPED_TRACE(extension);
        const Result made =
            Call({folder / "in.mkv", folder / ("out." + extension), "--length", "0.3", "--progress", "json"});
        ASSERT_EQ(made.code, 0) << made.err;
        std::vector<std::string> found;
        const Json probe = whole_movie::Probe(folder / ("out." + extension));
        for (const Json& stream : probe["streams"])
            if (stream["codec_type"] == "audio")
                found.push_back(stream.contains("tags") ? stream["tags"].value("language", "") : "");
        ASSERT_EQ(found.size(), std::size(cases));
        for (size_t i = 0; i < found.size(); ++i) {
            SCOPED_TRACE(cases[i].source);
            const std::string expected = extension == "mkv" ? cases[i].inMkv : cases[i].inMp4;
            EXPECT_EQ(found[i] == "und" ? "" : found[i], expected);
            const std::string told = "\"kind\":\"label\",\"number\":" + std::to_string(i + 1) + ",";
            EXPECT_EQ(made.out.find(told) != std::string::npos,
                      expected.empty() && std::string(cases[i].source) != "und");
        }
    }
}

/// A further track that begins late and ends early, and one whose shape changes on the way.
TEST(BrokenMovie, TracksThatChangeOnTheWay) {
    const Folder folder;
    const auto part = [&](const char* name, const std::string& size, const std::string& channels,
                          const std::string& rate) {
        Ffmpeg(Join(
            Lavfi("testsrc=r=25:d=2:s=" + size, "sine=d=2:r=48000", "anoisesrc=d=2:a=0.3:r=" + rate),
            Words("-map 0 -map 1 -map 2 -c:v mpeg2video -c:a mp2 -ac:a:1 " + channels + " -ar:a:1 " + rate),
            Args{folder / name}));
    };
    part("a.ts", "160x120", "1", "48000");
    part("b.ts", "128x96", "2", "32000");
    WriteFile(folder / "both.ts", ReadFile(folder / "a.ts") + ReadFile(folder / "b.ts"));
    Ffmpeg(Join(Lavfi("testsrc=s=64x48:r=10:d=4", "sine=d=4:r=48000"), Words("-itsoffset 1.5"),
                Lavfi("sine=d=1:r=48000"), Words("-map 0 -map 1 -map 2"), kCodecs,
                Args{folder / "short.mkv"}));
    for (const char* source : {"both.ts", "short.mkv"})
        for (const char* name : {"out.mp4", "out.mkv"}) {
            SCOPED_TRACE(std::string(source) + name);
            const Result made = Call({folder / source, folder / name, "-y", "-q"});
            ASSERT_EQ(made.code, 0) << made.err;
            const Json probe = whole_movie::Probe(folder / name);
            EXPECT_NEAR(std::stod(probe["format"]["duration"].get<std::string>()), 4, 0.2);
            const std::string sound =
                test_movies::FfmpegReads(folder / name, Words("-map 0:a:1 -ac 1 -ar 8000 -f s16le"));
            const bool isShort = std::string(source) == "short.mkv";
            EXPECT_NEAR(static_cast<double>(sound.size()) / 16000, isShort ? 2.5 : 4, 0.2);
        }
}

/// Makes the data of a stream's packets from that time on unreadable.
void Wreck(const std::string& path, const std::string& stream, double from) {
    std::string bytes = ReadFile(path);
    const Json packets = Json::parse(test_movies::Ffprobe(
        path, Words("-select_streams " + stream + " -show_entries packet=pts_time,pos,size -of json")));
    for (const Json& packet : packets["packets"]) {
        const auto value = [&](const char* key) { return std::stod(packet[key].get<std::string>()); };
        const auto size = static_cast<std::size_t>(value("size"));
        if (value("pts_time") >= from)
            bytes.replace(static_cast<std::size_t>(value("pos")), size, size, '\xFF');
    }
    WriteFile(path, bytes);
}

/// Everything is read, but it gives no pictures, or no sound, up to its end.
TEST(BrokenMovie, WhatCannotBeDecodedToItsEndIsNoSuccess) {
    const struct {
        const char* stream;
        double from;
        const char* told; // nothing: what is missing is short
        std::vector<std::string> further = {};
    } cases[] = {
        {"v", -1, "none of its pictures from 0:00:00.000 to its end at 0:00:04.000 could be decoded"},
        {"v", 2, "none of its pictures from 0:00:02.000 to its end at 0:00:04.000 could be decoded"},
        {"v", 3.5, nullptr},
        {"v", 2, "none of its pictures from 0:00:02.000 to its end at 0:00:03.500", {"--length", "3.5"}},
        {"v", 2, nullptr, {"--length", "2.5"}},
        {"v", -1, "none of its pictures could be decoded", {"--length", "0.5"}},
        {"a", -1, "none of its sound from 0:00:00.000 to its end at 0:00:04.000 could be decoded"},
    };
    for (const auto& test : cases) {
        SCOPED_TRACE(std::string(test.stream) + std::to_string(test.from));
        const Folder folder;
        Ffmpeg(Join(Lavfi("testsrc=s=64x48:r=10:d=4", "sine=d=4:r=48000"),
                    Words("-c:v libx264 -pix_fmt yuv420p -g 10 -bf 0 -c:a aac"), Args{folder / "in.mp4"}));
        Wreck(folder / "in.mp4", test.stream, test.from);
        const Result made = Call(Join(Args{folder / "in.mp4", folder / "out.mkv", "-q"}, test.further));
        EXPECT_EQ(made.code, test.told ? 3 : 0);
        EXPECT_NE(made.err.find(test.told ? test.told : ""), std::string::npos) << made.err;
    }
}

/// Most of its bytes belong to its first seconds, so that what is left of them does not tell what is missing.
TEST(BrokenMovie, AviThatIsCutOffIsToldByTheLengthInItsHead) {
    const Folder folder;
    Ffmpeg(Join(Lavfi("nullsrc=s=64x48:r=10:d=20,geq=random(1)*255*lt(T\\,10):128:128"),
                Words("-c:v mpeg4 -q:v 2"), Args{folder / "whole.avi"}));
    const std::string whole = ReadFile(folder / "whole.avi");
    WriteFile(folder / "cut.avi", whole.substr(0, whole.size() / 2));
    const Result made = Call({folder / "cut.avi", folder / "out.mkv", "--progress", "none"});
    EXPECT_EQ(made.code, 3);
    EXPECT_NE(made.err.find("although it announces 0:00:20.000"), std::string::npos) << made.err;
    EXPECT_NE(made.err.find(": 1 damaged piece of picture data was skipped"), std::string::npos) << made.err;
}

TEST(BrokenMovie, Mp4InAPipeIsToldToHaveItsIndexAtTheEnd) {
    const Folder folder;
    const struct {
        const char* name;
        Args options;
        int code;
    } cases[] = {{"end.mp4", {}, 0},             // all of it is kept
                 {"long.mp4", {"-q:v", "1"}, 3}, // longer than what is kept of a pipe
                 {"front.mp4", {"-movflags", "faststart"}, 0},
                 {"fragments.mp4", {"-movflags", "frag_keyframe+empty_moov"}, 0}};
    for (const auto& test : cases) {
        SCOPED_TRACE(test.name);
        const bool isLong = std::string(test.name) == "long.mp4";
        Ffmpeg(Join(
            Lavfi(isLong ? "testsrc=s=640x480:r=25:d=10,noise=alls=60:allf=t" : "testsrc=s=64x48:r=10:d=2"),
            Words("-c:v mpeg4"), test.options, Args{folder / test.name}));
        const Result made = program::Run({"sh", "-c", R"(cat "$1" | "$0" -y -q /dev/stdin "$2")",
                                          MOVIECONV_PROGRAM, folder / test.name, folder / "out.mkv"});
        EXPECT_EQ(made.code, test.code) << made.err;
        EXPECT_EQ(made.err, test.code == 0
                                ? ""
                                : "movieconv: error: cannot open \"/dev/stdin\": its index is at its end, "
                                  "and a pipe cannot be sought\n");
    }
}

} // namespace
