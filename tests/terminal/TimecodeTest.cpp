// The timecode of a movie is in its output, from the picture on with which the output begins.
#include "tests/support/Folder.h"
#include "tests/support/Program.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <string>

namespace {

using program::Call;
using program::Result;
using test_movies::Args;
using test_movies::CountedPictures;
using test_movies::Join;

/// Three seconds of which the first ends a minute: where numbers are left out, two are there.
std::string WithTimecode() {
    return test_movies::Make("counted.mov", Join(CountedPictures(3, "30000/1001"),
                                                 Args{"-c:v", "mpeg4", "-timecode", "01:00:59;00"}));
}

/// As it is read of a track of its own, or of the pictures.
std::string TimecodeOf(const std::string& path) {
    const std::string read = program::Run({"ffprobe", "-v", "error", "-select_streams", "v", "-show_entries",
                                           "stream_tags=timecode,TIMECODE", "-of", "csv=p=0", path})
                                 .out;
    return read.substr(0, read.find('\n'));
}

TEST(Timecode, IsMovedWithRangesAndClips) {
    const Folder folder;
    const struct {
        Args options;
        const char* file;
        const char* timecode;
    } cases[] = {
        {{}, "out", "01:00:59;00"},
        {{"--begin", "0.5005", "--length", "1"}, "out", "01:00:59;15"},
        {{"--split", "1.001"}, "out_01", "01:01:00;02"},
        {{"--split", "1.001"}, "out_02", "01:01:01;02"},
        {{"--jobs", "2", "--pieces", "2", "--begin", "1.001"}, "out", "01:01:00;02"},
        {{"--frame-rate", "15"}, "out", "01:00:59:00"},
        {{"--begin", "0.5005", "--frame-rate", "60000/1001"}, "out", "01:00:59;30"},
        {{"--metadata", "timecode=10:00:00:00", "--begin", "0.1001"}, "out", "10:00:00:03"},
        {{"--metadata", "timecode="}, "out", ""},
        {{"--no-metadata"}, "out", ""},
    };
    for (const std::string format : {"mp4", "mov", "mkv"})
        for (const auto& test : cases) {
            const bool isAboutTheFormat = &test - cases < 4;
            if (format != "mp4" && !isAboutTheFormat)
                continue;
            SCOPED_TRACE(format + " " + test.timecode);
            const Result made = Call(Join(
                Args{WithTimecode(), folder / ("out." + format), "-y", "--progress", "none"}, test.options));
            EXPECT_EQ(made.code, 0);
            EXPECT_FALSE(Has(made.err, "not carried")) << made.err;
            const std::string file = folder / (test.file + ("." + format));
            EXPECT_EQ(TimecodeOf(file), test.timecode);
            EXPECT_EQ(program::Run({"ffmpeg", "-v", "error", "-i", file, "-f", "null", "-"}).err, "");
            if (!isAboutTheFormat)
                continue;
            // What was carried is carried again.
            ASSERT_EQ(Call({file, folder / "again.mp4", "-y", "-q"}).code, 0);
            EXPECT_EQ(TimecodeOf(folder / "again.mp4"), test.timecode);
        }
}

TEST(Timecode, IsToldWhereItCannotBe) {
    const Folder folder;
    const struct {
        const char* name;
        Args options;
        const char* text;
    } cases[] = {
        {"out.avi", {}, "AVI cannot hold it"},
        {"out.mp4", {"--metadata", "timecode=noon"}, "\"noon\" makes no sense"},
    };
    for (const auto& test : cases)
        EXPECT_EQ(
            Call(Join(Args{WithTimecode(), folder / test.name, "--progress", "none"}, test.options)).err,
            std::string("movieconv: not carried: timecode: ") + test.text + "\n");
}

} // namespace
