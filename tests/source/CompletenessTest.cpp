// Sources that hold less than they promise, and those that only seem to.
#include "host/source/Completeness.h"
#include "tests/support/Inspect.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

namespace {

using namespace test_movies;
using movieconv::FindShortfall;
using movieconv::Movie;
using movieconv::Promise;
using movieconv::Reached;
using movieconv::Shortfall;
using movieconv::SourceChoice;

constexpr std::optional<double> kUntold;

TEST(Completeness, ComparesWhatWasReadWithWhatWasAnnounced) {
    const struct {
        Promise promise;
        Reached reached;
        std::optional<double> missing; // 0 for a mere cut
    } cases[] = {
        {{}, {10, 10}, kUntold},
        {{false, 10, 10, kUntold}, {9.1, 9.1}, kUntold},
        {{false, 10, kUntold, kUntold}, {8.9, 10}, 1.1},
        {{false, 10, 10, kUntold}, {10, 8.5}, 1.5},
        {{false, 10, 10, kUntold}, {10, kUntold}, kUntold}, // nobody wanted the sound to its end
        {{false, 1000, kUntold, kUntold}, {990.5, kUntold}, kUntold},
        {{false, 1000, kUntold, kUntold}, {989, kUntold}, 11},
        {{false, kUntold, kUntold, 10}, {4, 9.5}, kUntold},
        {{false, kUntold, kUntold, 10}, {4, 8}, 2},
        {{true, kUntold, kUntold, kUntold}, {10, 10}, 0},
        {{true, 10, 10, kUntold}, {kUntold, kUntold}, kUntold},
    };
    for (const auto& test : cases) {
        SCOPED_TRACE(&test - cases);
        const std::optional<Shortfall> found = FindShortfall(test.promise, test.reached);
        ASSERT_EQ(found.has_value(), test.missing.has_value());
        EXPECT_TRUE(!found || found->cutOff == test.promise.cutOff);
        EXPECT_NEAR(found ? found->announced - found->reached : 0, test.missing.value_or(0), 1e-9);
    }
}

std::optional<Shortfall> MissingIn(const std::string& path, const SourceChoice& choice = {}) {
    Movie movie(path, choice);
    inspect::TakeAll(movie);
    return movie.Missing();
}

TEST(Sources, ThatAreCutOffSaySo) {
    const Args streams = Join(CountedPictures(8), Beeps(8));
    const struct {
        const char* name;
        Args encoding;
        bool structure; // tells where it should end
    } cases[] = {
        {"cut.mkv", {"-c:v", "mpeg4", "-c:a", "pcm_s16le"}, true},
        {"cut.mp4", {"-c:v", "mpeg4", "-c:a", "aac", "-movflags", "+faststart"}, true},
        {"cut-fragmented.mp4",
         {"-c:v", "mpeg4", "-c:a", "aac", "-movflags", "empty_moov+frag_keyframe"},
         true},
        {"cut.avi", {"-c:v", "mpeg4", "-c:a", "pcm_s16le"}, true},
        {"cut.asf", {"-c:v", "mpeg4", "-c:a", "pcm_s16le"}, true},
        {"cut.wav", {"-vn", "-c:a", "pcm_s16le"}, true},
        {"cut.flv", {"-c:v", "flv", "-c:a", "aac"}, false},
        {"cut.flac", {"-vn"}, false},
    };
    for (const auto& test : cases) {
        SCOPED_TRACE(test.name);
        const Folder folder;
        const std::string whole = Make(std::string("whole-") + test.name, Join(streams, test.encoding));
        EXPECT_FALSE(MissingIn(whole));
        const std::string bytes = ReadFile(whole);
        WriteFile(folder / test.name, bytes.substr(0, bytes.size() * 6 / 10));
        const std::optional<Shortfall> missing = MissingIn(folder / test.name);
        ASSERT_TRUE(missing);
        EXPECT_EQ(missing->cutOff, test.structure);
        EXPECT_TRUE(test.structure || missing->announced - missing->reached > 2);
    }
}

TEST(Sources, AreWholeWhenOnlyAnotherStreamPromisesMore) {
    const std::string late = Part("late.srt", "1\n00:00:01,000 --> 00:00:30,000\nWords\n");
    const Args inputs = Join(CountedPictures(2), Beeps(6), Args{"-i", late});
    const Args codecs = Words("-map 0 -map 1 -map 2 -c:v mpeg4 -c:a aac");
    for (const auto& [name, subtitles] :
         {std::pair{"more-subtitles.mkv", "srt"}, {"more-subtitles.mp4", "mov_text"}}) {
        const std::string path = Make(name, Join(inputs, codecs, Args{"-c:s", subtitles}));
        EXPECT_FALSE(MissingIn(path)) << name;
        EXPECT_FALSE(MissingIn(path, {.sound = false})) << name;
    }
    // Every stream is told to be as long as the file.
    EXPECT_FALSE(MissingIn(
        Make("shorter-sound.asf", Join(CountedPictures(4), Beeps(2), Words("-c:v wmv2 -c:a wmav2")))));
    // The last picture stays for long, and says so.
    EXPECT_FALSE(
        MissingIn(Make("staying.mp4", Join(CountedPictures(14), Beeps(14),
                                           Args{"-vf", "select='lt(n,1)+lt(n,20)'", "-fps_mode", "vfr"}))));
}

/// Two seconds in Matroska that are told to last ten, as the last picture does in the file that they come
/// from. `isTagged`: so are the pictures, and not the movie alone.
std::string Staying(bool isTagged) {
    const std::string inMp4 = Make(
        "long-last.mp4", Join(CountedPictures(12), Words("-an -c:v mpeg4 -vf select='lt(n,50)+eq(n,250)' "
                                                         "-fps_mode vfr")));
    std::string movie = ReadFile(Make("long-last.mkv", {"-i", inMp4, "-frames:v", "50", "-c", "copy"}));
    const std::size_t tag = movie.find("DURATION");
    EXPECT_NE(tag, std::string::npos);
    return isTagged ? movie : movie.replace(tag, 8, "ANYTHING");
}

TEST(Sources, AreWholeWhenTheLastPictureOfMatroskaIsTold) {
    const Folder folder;
    const std::string path = folder / "told.mkv";
    for (const bool isTagged : {true, false}) {
        SCOPED_TRACE(isTagged);
        const std::string movie = Staying(isTagged);
        WriteFile(path, movie);
        EXPECT_FALSE(MissingIn(path));
        WriteFile(path, movie.substr(0, movie.size() - 1));
        const std::optional<Shortfall> cut = MissingIn(path);
        ASSERT_TRUE(cut);
        EXPECT_TRUE(cut->cutOff);
        // A download that has all its room and not all its bytes.
        const std::size_t there = movie.size() * 6 / 10;
        WriteFile(path, movie.substr(0, there) + std::string(movie.size() - there, '\0'));
        const std::optional<Shortfall> missing = MissingIn(path);
        ASSERT_TRUE(missing);
        EXPECT_FALSE(missing->cutOff);
        EXPECT_NEAR(missing->announced, 10, 0.1);
    }
}

} // namespace
