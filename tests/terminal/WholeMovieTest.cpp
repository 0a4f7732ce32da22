// Everything that a movie holds is in the output exactly, or told: for every format, as other programs read
// it.
#include "tests/terminal/WholeMovie.h"
#include "tests/support/Folder.h"
#include "tests/support/Program.h"
#include "tests/support/TestMovies.h"

#include <algorithm>
#include <cmath>
#include <gtest/gtest.h>
#include <regex>
#include <sstream>

namespace {

using program::Call;
using program::Result;
using test_movies::Args;
using test_movies::Join;
using whole_movie::Cue;
using whole_movie::CuesOf;
using whole_movie::Json;

/// What a format has room for; the rest has to be told.
struct Room {
    const char* extension;
    Args options;
    const char* texts;   // codecs of subtitles of text: of SRT and of ASS
    const char* bitmaps; // codecs of bitmap subtitles
    bool chapters;
    bool tracks;
    bool cover;
    bool font;
};

const Room kRooms[] = {
    {"mp4", {}, "mov_text mov_text", "", true, true, true, false},
    {"mov", {}, "mov_text mov_text", "", true, true, false, false},
    {"m4a", {}, "mov_text mov_text", "", true, true, true, false},
    {"mkv",
     {"--audio-codec", "FLAC"},
     "subrip ass",
     "hdmv_pgs_subtitle dvd_subtitle dvb_subtitle",
     true,
     true,
     true,
     true},
    {"mka",
     {"--audio-codec", "FLAC"},
     "subrip ass",
     "hdmv_pgs_subtitle dvd_subtitle dvb_subtitle",
     true,
     true,
     true,
     true},
    {"webm", {}, "webvtt webvtt", "", true, true, false, false},
    {"avi", {}, "", "", false, true, false, false},
    {"ts", {}, "", "dvb_subtitle", false, true, false, false},
    {"flv", {}, "", "", false, false, false, false},
    {"mp3", {}, "", "", true, false, true, false},
    {"flac", {}, "", "", true, false, true, false},
    {"ogg", {}, "", "", true, false, false, false},
    {"wav", {}, "", "", false, false, false, false},
    {"mpg", {}, "", "", false, false, false, false},
};

void PrintTo(const Room& room, std::ostream* out) {
    *out << room.extension;
}

/// The events of that kind in the output of --progress json.
std::vector<Json> Told(const Result& made, const std::string& kind) {
    std::vector<Json> told;
    std::istringstream lines(made.out);
    for (std::string line; std::getline(lines, line);)
        if (Json event = Json::parse(line); event["event"] == "not_carried" && event["kind"] == kind)
            told.push_back(std::move(event));
    return told;
}

bool IsToldOf(const Result& made, const std::string& kind, int number, const std::string& part = "") {
    const std::vector<Json> told = Told(made, kind);
    return std::any_of(told.begin(), told.end(), [&](const Json& event) {
        return event["number"] == number &&
               event["reason"].get<std::string>().find(part) != std::string::npos;
    });
}

std::vector<Json> StreamsOf(const Json& probe, const std::string& kind) {
    std::vector<Json> streams;
    for (const Json& stream : probe["streams"])
        if (stream["codec_type"] == kind && stream["disposition"]["attached_pic"] == 0)
            streams.push_back(stream);
    return streams;
}

std::string Text(const Json& holder, const char* key) {
    return holder.contains("tags") ? holder["tags"].value(key, "") : "";
}

std::string CodecsOf(const std::vector<Json>& streams) {
    std::string names;
    for (const Json& stream : streams)
        names += (names.empty() ? "" : " ") + stream["codec_name"].get<std::string>();
    return names;
}

void ExpectTags(const Json& probe, const Result& made) {
    const auto written = whole_movie::TagsOf(probe);
    std::string told;
    for (const Json& event : Told(made, "tags"))
        told += event["reason"].get<std::string>();
    for (const auto& [key, value] : whole_movie::TagsOf(whole_movie::Probe(whole_movie::Make()))) {
        if (key == "encoder")
            continue;
        SCOPED_TRACE(key);
        const std::string& name = key; // a binding is not captured
        const std::string& expected = value;
        const bool isThere = std::any_of(written.begin(), written.end(), [&](const auto& tag) {
            // Vorbis comments have one field for comment and description.
            const bool isSame = tag.first == name || (name == "description" && tag.first == "comment");
            return isSame && (tag.second == expected || tag.second == "Long text\nSaid = so; it#s");
        });
        const std::regex word("(^|[^a-z_])" + key + "($|[^a-z_])", std::regex::icase);
        EXPECT_NE(isThere, std::regex_search(told, word)) << told;
    }
}

void ExpectChapters(const Json& probe, double length) {
    const struct {
        double begin;
        double end;
        const char* title;
    } expected[] = {{0, 0.5, "First"},
                    {0.5, 2,
                     "Zweites St\xC3\xBC"
                     "ck"},
                    {2, 3, "Last"}};
    size_t count = 0;
    for (const auto& chapter : expected) {
        if (chapter.begin >= length)
            continue;
        ASSERT_LT(count, probe["chapters"].size());
        const Json& read = probe["chapters"][count++];
        EXPECT_NEAR(std::stod(read["start_time"].get<std::string>()), chapter.begin, 0.001);
        EXPECT_NEAR(std::stod(read["end_time"].get<std::string>()), std::min(chapter.end, length), 0.002);
        EXPECT_EQ(Text(read, "title"), chapter.title);
    }
    EXPECT_EQ(probe["chapters"].size(), count);
}

/// Language, title and flags, or what is told of them.
void ExpectLabel(const Json& stream, const Result& made, int number, const std::string& language,
                 const std::string& title, const std::string& flag) {
    SCOPED_TRACE(number);
    const std::string written = Text(stream, "language");
    EXPECT_NE(written == language, IsToldOf(made, "label", number, "language")) << stream;
    const bool hasTitle = Text(stream, "title") == title || Text(stream, "name") == title;
    if (!title.empty() && stream.value("codec_tag_string", "").find("mp4a") == std::string::npos &&
        stream["codec_name"] != "mov_text") { // whose titles ffprobe does not read
        EXPECT_NE(hasTitle, IsToldOf(made, "label", number, "title")) << stream;
    }
    if (!flag.empty()) {
        EXPECT_NE(stream["disposition"][flag] == 1, IsToldOf(made, "label", number, "flags")) << stream;
    }
}

void ExpectSounds(const Room& room, const Json& probe, const Result& made) {
    const std::vector<Json> sounds = StreamsOf(probe, "audio");
    ASSERT_EQ(sounds.size(), room.tracks ? 3 : 1);
    const struct {
        const char* language;
        const char* title;
        const char* flag;
        int channels;
    } expected[] = {{"ger", "Deutsch", "original", 1},
                    {"swe", "Comments", "comment", 2},
                    {"fre", "", "visual_impaired", 1}};
    for (int i = 0; i < 3; ++i) {
        if (!room.tracks && i > 0) {
            EXPECT_TRUE(IsToldOf(made, "sound", i + 1));
            continue;
        }
        const Json& sound = sounds[static_cast<size_t>(i)];
        EXPECT_EQ(sound["channels"], expected[i].channels);
        ExpectLabel(sound, made, i + 1, expected[i].language, expected[i].title, expected[i].flag);
    }
}

bool IsNear(const std::vector<Cue>& cues, const std::vector<Cue>& expected) {
    return std::equal(cues.begin(), cues.end(), expected.begin(), expected.end(),
                      [](const Cue& one, const Cue& other) {
                          return std::abs(one.begin - other.begin) <= 2 &&
                                 std::abs(one.end - other.end) <= 2 && one.text == other.text;
                      });
}

std::string Show(const std::vector<Cue>& cues) {
    std::string text;
    for (const Cue& cue : cues)
        text += std::to_string(cue.begin) + "-" + std::to_string(cue.end) + " " + cue.text + "; ";
    return text;
}

const std::vector<Cue> kWords{{500, 1200, "Plain words"},
                              {1400, 2400,
                               "Gr\xC3\xBC\xC3\x9F"
                               "e, \xD0\xB4\xD0\xB2\xD0\xB0"}};
const std::vector<Cue> kSigns{{300, 1500, "A &lt; sign"}, {1000, 2000, "Bold and plain"}};
const std::vector<Cue> kSignsInARow{
    {300, 1000, "A &lt; sign"}, {1000, 1500, "A &lt; sign Bold and plain"}, {1500, 2000, "Bold and plain"}};

void ExpectSubtitles(const Room& room, const Json& probe, const Result& made, const std::string& path) {
    const std::vector<Json> subtitles = StreamsOf(probe, "subtitle");
    const std::string both =
        std::string(room.texts) + (*room.texts != 0 && *room.bitmaps != 0 ? " " : "") + room.bitmaps;
    EXPECT_EQ(CodecsOf(subtitles), both);
    int at = 0;
    const bool hasTexts = *room.texts != 0;
    for (const int number : {4, 5})
        EXPECT_NE(hasTexts, IsToldOf(made, "subtitles", number));
    if (hasTexts && subtitles.size() >= 2) {
        const bool inARow = std::string(room.texts).find("mov_text") != std::string::npos;
        const std::vector<Cue> words = CuesOf(path, at);
        EXPECT_TRUE(IsNear(words, kWords)) << Show(words);
        const std::vector<Cue> signs = CuesOf(path, at + 1);
        EXPECT_TRUE(IsNear(signs, inARow ? kSignsInARow : kSigns)) << Show(signs);
        for (const Json& subtitle : subtitles)
            EXPECT_EQ(subtitle["disposition"]["default"], 0) << subtitle;
        ExpectLabel(subtitles[0], made, 4, "ger", "Texte", "forced");
        ExpectLabel(subtitles[1], made, 5, "jpn", "Signs", "");
        at = 2;
    }
    const char* names[] = {"hdmv_pgs_subtitle", "dvd_subtitle", "dvb_subtitle"};
    const char* languages[] = {"spa", "ita", "swe"};
    for (int i = 0; i < 3; ++i) {
        const bool isThere = both.find(names[i]) != std::string::npos;
        EXPECT_NE(isThere, IsToldOf(made, "subtitles", 6 + i)) << names[i];
        if (!isThere || at >= static_cast<int>(subtitles.size()))
            continue;
        EXPECT_EQ(whole_movie::PacketsOf(path, at), whole_movie::PacketsOf(whole_movie::Make(), 2 + i));
        ExpectLabel(subtitles[static_cast<size_t>(at++)], made, 6 + i, languages[i], "", "");
    }
}

void ExpectFiles(const Room& room, const Json& probe, const Result& made) {
    const auto count = [&](auto isMeant) {
        return std::count_if(probe["streams"].begin(), probe["streams"].end(), isMeant);
    };
    const auto covers = count([](const Json& stream) { return stream["disposition"]["attached_pic"] == 1; });
    const auto fonts = count([](const Json& stream) { return stream["codec_type"] == "attachment"; });
    EXPECT_EQ(covers, room.cover ? 1 : 0);
    EXPECT_EQ(fonts, room.font ? 1 : 0);
    EXPECT_NE(room.cover, IsToldOf(made, "cover", 9));
    EXPECT_NE(room.font, IsToldOf(made, "attachment", 10));
}

class EveryFormat : public testing::TestWithParam<Room> {};

TEST_P(EveryFormat, HoldsTheWholeMovieOrTellsWhatIsLeft) {
    const Folder folder;
    const Room& room = GetParam();
    const std::string path = folder / (std::string("out.") + room.extension);
    const Result made = Call(Join(Args{whole_movie::Make(), path, "--progress", "json"}, room.options));
    ASSERT_EQ(made.code, 0) << made.err;
    const Json probe = whole_movie::Probe(path);
    EXPECT_NEAR(std::stod(probe["format"]["duration"].get<std::string>()), 3, 0.25);
    ExpectTags(probe, made);
    if (room.chapters)
        ExpectChapters(probe, 3);
    EXPECT_NE(room.chapters, Told(made, "chapters").size() == 1);
    ExpectSounds(room, probe, made);
    ExpectSubtitles(room, probe, made, path);
    ExpectFiles(room, probe, made);
}

std::string NameOf(const testing::TestParamInfo<Room>& room) {
    return room.param.extension;
}
INSTANTIATE_TEST_SUITE_P(WholeMovie, EveryFormat, testing::ValuesIn(kRooms), NameOf);

/// What mkvmerge, which shares no code with the writer, makes of it.
TEST(WholeMovie, IsReadTheSameByAnIndependentProgram) {
    if (program::Run({"sh", "-c", "command -v mkvmerge"}).code != 0)
        GTEST_SKIP() << "without mkvmerge";
    const Folder folder;
    ASSERT_EQ(Call({whole_movie::Make(), folder / "out.mkv", "-q"}).code, 0);
    const Json read = whole_movie::Identify(folder / "out.mkv");
    const Json source = whole_movie::Identify(whole_movie::Make());
    EXPECT_TRUE(read["warnings"].empty() && read["errors"].empty()) << read;
    EXPECT_EQ(read["chapters"], source["chapters"]);
    EXPECT_EQ(read["global_tags"], source["global_tags"]);
    for (const char* key : {"title", "date_utc"})
        EXPECT_EQ(read["container"]["properties"][key], source["container"]["properties"][key]);
    ASSERT_EQ(read["tracks"].size(), source["tracks"].size());
    for (size_t i = 0; i < read["tracks"].size(); ++i)
        for (const char* key : {"language", "track_name", "forced_track", "flag_commentary", "flag_original",
                                "flag_hearing_impaired", "flag_visual_impaired", "codec_private"}) {
            const Json none;
            const Json& one = read["tracks"][i]["properties"];
            const Json& other = source["tracks"][i]["properties"];
            const bool isEncoded = std::string(key) == "codec_private" && i < 4;
            EXPECT_EQ(one.value(key, none), isEncoded ? one.value(key, none) : other.value(key, none))
                << i << key;
        }
    ASSERT_EQ(read["attachments"].size(), 2);
    for (size_t i = 0; i < 2; ++i)
        for (const char* key : {"file_name", "content_type", "size"})
            EXPECT_EQ(read["attachments"][i][key], source["attachments"][i][key]);

    ASSERT_EQ(Call({whole_movie::Make(), folder / "out.mp4", "-q"}).code, 0);
    const Json inMp4 = whole_movie::Identify(folder / "out.mp4");
    EXPECT_EQ(inMp4["chapters"][0]["num_entries"], 3);
    EXPECT_EQ(inMp4["attachments"].size(), 1);
    ASSERT_GE(inMp4["tracks"].size(), 4);
    for (size_t i = 1; i < 4; ++i)
        EXPECT_EQ(inMp4["tracks"][i]["properties"]["language"],
                  source["tracks"][i]["properties"]["language"]);
}

/// Parts of it, on their own timelines: what lies over a cut is in both.
TEST(WholeMovie, IsCutWithItsPictures) {
    const Folder folder;
    for (const char* extension : {"mkv", "mp4"}) {
        SCOPED_TRACE(extension);
        const bool inARow = std::string(extension) == "mp4";
        const auto path = [&](const char* name) { return folder / (std::string(name) + "." + extension); };
        ASSERT_EQ(Call({whole_movie::Make(), path("range"), "--begin", "1", "--length", "1", "-q"}).code, 0);
        const std::vector<Cue> words = CuesOf(path("range"), 0);
        EXPECT_TRUE(IsNear(words, {{0, 200, kWords[0].text}, {400, 1000, kWords[1].text}})) << Show(words);
        const std::vector<Cue> signs = CuesOf(path("range"), 1);
        EXPECT_TRUE(IsNear(
            signs, inARow ? std::vector<Cue>{{0, 500, kSignsInARow[1].text}, {500, 1000, "Bold and plain"}}
                          : std::vector<Cue>{{0, 500, "A &lt; sign"}, {0, 1000, "Bold and plain"}}))
            << Show(signs);
        const Json range = whole_movie::Probe(path("range"));
        ASSERT_EQ(range["chapters"].size(), 1);
        EXPECT_EQ(Text(range["chapters"][0], "title"), "Zweites St\xC3\xBC"
                                                       "ck");

        ASSERT_EQ(Call({whole_movie::Make(), path("clip"), "--split", "1.5", "-q"}).code, 0);
        std::vector<Cue> joined;
        for (const char* name : {"clip_00", "clip_01"}) {
            const Json probe = whole_movie::Probe(path(name));
            EXPECT_EQ(StreamsOf(probe, "audio").size(), 3);
            EXPECT_EQ(Text(probe["format"], "title"), "The whole");
            EXPECT_EQ(
                std::count_if(probe["streams"].begin(), probe["streams"].end(),
                              [](const Json& stream) { return stream["disposition"]["attached_pic"] == 1; }),
                1);
            EXPECT_EQ(probe["chapters"].size(), 2);
            const std::vector<Cue> cues = CuesOf(path(name), 0);
            joined.insert(joined.end(), cues.begin(), cues.end());
        }
        EXPECT_TRUE(IsNear(joined, {kWords[0], {1400, 1500, kWords[1].text}, {0, 900, kWords[1].text}}))
            << Show(joined);
    }
}

} // namespace
