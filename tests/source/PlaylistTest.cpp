// What a source may make the program read besides itself.
#include "host/source/Source.h"
#include "tests/support/Inspect.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <filesystem>

namespace {

namespace fs = std::filesystem;
using namespace test_movies;
using movieconv::Movie;
using movieconv::SourceError;

std::string Hls(const std::string& names) {
    return "#EXTM3U\n#EXT-X-TARGETDURATION:2\n#EXTINF:2,\n" + names + "\n#EXT-X-ENDLIST\n";
}
std::string Master(const std::string& name) {
    return "#EXTM3U\n#EXT-X-STREAM-INF:BANDWIDTH=1000\n" + name + "\n";
}
std::string Concat(const std::string& rest) {
    return "ffconcat version 1.0\n" + rest + "\n";
}
std::string Dash(const std::string& name) {
    return "<?xml version=\"1.0\"?><MPD xmlns=\"urn:mpeg:dash:schema:mpd:2011\" "
           "profiles=\"urn:mpeg:dash:profile:isoff-live:2011\" type=\"static\" "
           "mediaPresentationDuration=\"PT2S\"><Period><AdaptationSet mimeType=\"video/mp4\">"
           "<Representation id=\"0\" bandwidth=\"1000\"><BaseURL>" +
           name + "</BaseURL></Representation></AdaptationSet></Period></MPD>";
}

struct Listed {
    const char* name;
    std::string content;  // OUTSIDE stands for the path of another folder
    std::size_t pictures; // 0: refused, with the word
    const char* word = "";
};

void PrintTo(const Listed& listed, std::ostream* out) {
    *out << listed.name;
}

class Playlists : public testing::TestWithParam<Listed> {
protected:
    void SetUp() override {
        const std::string movie =
            Make("listed.ts", Join(CountedPictures(2), Args{"-c:v", "mpeg2video", "-g", "5"}));
        fs::create_directory(inside_ / "below");
        for (const std::string& copy :
             {inside_ / "a.ts", inside_ / "two words.ts", inside_ / "below/b.ts", outside_ / "private.ts"})
            fs::copy_file(movie, copy);
        fs::create_symlink(outside_ / "private.ts", inside_ / "link.ts");
        fs::create_symlink(outside_.Path(), inside_ / "away");
        fs::create_symlink("below", inside_ / "near");
        WriteFile(inside_ / "words.txt", "Words that nobody else shall read.\n");
        WriteFile(inside_ / "words.ts", "Words that nobody else shall read.\n");
        WriteFile(inside_ / "nested.ts", Concat("file a.ts"));
        std::string content = GetParam().content;
        for (std::size_t at; (at = content.find("OUTSIDE")) != std::string::npos;)
            content.replace(at, 7, outside_.Path());
        list_ = inside_ / "holiday.mkv";
        WriteFile(list_, content);
    }

    Folder inside_;
    Folder outside_;
    std::string list_;
};

TEST_P(Playlists, AreRefusedOrNameMoviesInTheirFolder) {
    EXPECT_THROW(Movie(list_, {}), SourceError);
    const Listed& listed = GetParam();
    try {
        Movie movie(list_, {.playlists = true});
        EXPECT_EQ(inspect::TakeAll(movie).pictures.size(), listed.pictures);
    } catch (const SourceError& refusal) {
        EXPECT_EQ(listed.pictures, 0u) << refusal.what();
        EXPECT_NE(std::string(refusal.what()).find(listed.word), std::string::npos) << refusal.what();
    }
}

const Listed kLists[] = {
    {"HlsBeside", Hls("a.ts"), 50},
    {"HlsBelow", Hls("below/b.ts"), 50},
    {"HlsLinkWithin", Hls("near/b.ts"), 50},
    {"HlsByWayOfItsFolder", Hls("below/../a.ts"), 50},
    {"HlsOutside", Hls("OUTSIDE/private.ts"), 0, "outside its folder"},
    {"HlsAbove", Hls("../private.ts"), 0, "does not exist"},
    {"HlsLink", Hls("link.ts"), 0, "outside its folder"},
    {"HlsLinkedFolder", Hls("away/private.ts"), 0, "outside its folder"},
    {"HlsNetwork", Hls("http://127.0.0.1:9/a.ts"), 0, "not a file's name"},
    {"HlsText", Hls("words.ts"), 0, "not a movie"},
    {"HlsOfItself", Master("holiday.mkv"), 0, "over and over"},
    {"HlsOfScripts", Hls("nested.ts"), 0, ""},
    {"ScriptBeside", Concat("file a.ts\nfile 'two words.ts'\nduration 2\n# end"), 100},
    {"ScriptBelow", Concat("file below/b.ts"), 50},
    {"ScriptOutside", Concat("file OUTSIDE/private.ts"), 0, "outside its folder"},
    {"ScriptSecondOutside", Concat("file a.ts\n  file 'OUTSIDE/private.ts'"), 0, "outside its folder"},
    {"ScriptLink", Concat("file link.ts"), 0, "outside its folder"},
    {"ScriptText", Concat("file words.txt"), 0, "not a movie"},
    {"ScriptOfScripts", Concat("file nested.ts"), 0, "not a movie"},
    {"ScriptNetwork", Concat("file tcp://127.0.0.1:9"), 0, "not a plain name"},
    {"ScriptProtocol", Concat("file subfile,,start,0,end,9,,:a.ts"), 0, "not a plain name"},
    {"ScriptOption", Concat("file a.ts\noption protocol_whitelist file,tcp"), 0, "is not understood"},
    {"Dash", Dash("a.ts"), 0, "not a movie"},
};
INSTANTIATE_TEST_SUITE_P(Lists, Playlists, testing::ValuesIn(kLists),
                         [](const auto& test) { return test.param.name; });

TEST(Playlist, OfFragmentsIsReadFromAnyTimeOn) { // which its demultiplexer cannot seek in
    const Folder folder;
    Ffmpeg(Join(CountedPictures(4), Beeps(4),
                Words("-c:v mpeg4 -g 10 -f hls -hls_time 1 -hls_segment_type fmp4 -hls_list_size 0"),
                Args{folder / "list.m3u8"}));
    Movie movie(folder / "list.m3u8", {.playlists = true});
    const inspect::Seen seen = inspect::TakeAll(movie, 2);
    ASSERT_NEAR(static_cast<double>(seen.pictures.size()), 50, 1); // its clock begins with the sound
    EXPECT_NEAR(seen.pictures.back().luma, LumaOf(99), 2);
    EXPECT_EQ(movie.ReadError().Text(), "");
}

} // namespace
