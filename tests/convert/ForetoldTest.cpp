// What is foretold to stay behind is what does.
#include "host/convert/CarryPlan.h"
#include "host/convert/EncodePlan.h"
#include "host/convert/Failure.h"
#include "host/convert/Sources.h"
#include "tests/convert/Listener.h"
#include "tests/support/Folder.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <string>
#include <vector>

namespace {

using namespace movieconv;
using test_movies::Args;
using test_movies::Beeps;
using test_movies::CountedPictures;
using test_movies::Join;

using Lines = std::vector<std::string>;

std::string LineOf(const NotCarried& what) {
    return what.kind + " " + (what.number ? std::to_string(*what.number) : "") + " (" + what.codec + ", " +
           what.language + "): " + what.reason.Text();
}

/// A second with two sounds, subtitles, chapters, texts and a font, all of them with labels.
std::string Rich(const Folder& folder) {
    WriteFile(folder / "words.srt", "1\n00:00:00,200 --> 00:00:00,800\nWords\n");
    WriteFile(folder / "font.ttf", std::string(1000, 'f'));
    WriteFile(folder / "notes.txt", ";FFMETADATA1\ntitle=The whole\nartist=Nobody\nMOOD=calm\n"
                                    "[CHAPTER]\nTIMEBASE=1/1000\nSTART=0\nEND=600\ntitle=First\n");
    const Args parts{"-i",
                     folder / "words.srt",
                     "-i",
                     folder / "notes.txt",
                     "-t",
                     "1",
                     "-map",
                     "0",
                     "-map",
                     "1",
                     "-map",
                     "1",
                     "-map",
                     "2",
                     "-map_metadata",
                     "3",
                     "-map_chapters",
                     "3"};
    const Args labels{"-metadata:s:a:0",  "language=ger",   "-metadata:s:a:1",  "language=eng",
                      "-metadata:s:a:1",  "title=Comments", "-disposition:a:1", "comment",
                      "-metadata:s:s:0",  "language=fre",   "-metadata:s:s:0",  "title=Songs",
                      "-disposition:s:0", "forced"};
    const Args coded{"-c:v",
                     "mpeg4",
                     "-c:a",
                     "flac",
                     "-c:s",
                     "srt",
                     "-attach",
                     folder / "font.ttf",
                     "-metadata:s:t:0",
                     "mimetype=font/ttf"};
    return test_movies::Make("foretold.mkv", Join(CountedPictures(1), Beeps(1), Join(parts, labels, coded)));
}

Lines Foretold(const Request& request) {
    Request looking;
    looking.input = request.input;
    const SourceInfo source = AsAskedFor(LookAtSource(looking), request);
    Lines lines;
    for (const NotCarried& what : ForetellLeftBehind(source, request, ChooseFormat(request)))
        lines.push_back(LineOf(what));
    std::sort(lines.begin(), lines.end());
    return lines;
}

Lines Told(const Request& request) {
    Listener listener;
    const Verdict verdict = Convert(request, listener);
    EXPECT_EQ(verdict.outcome, Outcome::kDone) << (verdict.failure ? verdict.failure->Text() : "");
    Lines lines;
    for (const NotCarried& what : listener.left)
        lines.push_back(LineOf(what));
    std::sort(lines.begin(), lines.end());
    return lines;
}

TEST(Foretold, IsWhatStaysBehind) {
    const Folder folder;
    const std::string rich = Rich(folder);
    const struct {
        const char* output;
        std::function<void(Request&)> wish;
        const char* among; ///< The beginning of one of the lines; empty: nothing stays behind.
    } cases[] = {
        {"o.mkv", [](Request&) {}, ""},
        {"o.mp4", [](Request&) {}, "attachment "},
        {"o.mp4",
         [](Request& request) {
             request.metadata = {{"KEY", "value"}};
         },
         "tags  (, ): MP4"},
        {"o.mov", [](Request&) {}, "label 3"},
        {"o.ogg", [](Request& request) { request.copySound = true; }, "subtitles 3"},
        {"o.webm", [](Request&) {}, "attachment "},
        {"o.avi", [](Request&) {}, "subtitles 3 (subrip, fre): AVI"},
        {"o.avi",
         [&](Request& request) {
             request.subtitleFiles = {{folder / "words.srt", "de"}};
         },
         "subtitles  (subrip, ger): AVI"},
        {"o.ts", [](Request&) {}, "tags "},
        {"o.ts", [](Request& request) { request.noMetadata = request.noChapters = true; }, "label 2"},
        {"o.flv", [](Request& request) { request.audioTracks = {{"eng"}}; }, "label 2"},
        {"o.flac", [](Request& request) { request.audioTracks = {{"2"}}; }, "label 2"},
        {"o.wav", [](Request& request) { request.noVideo = true; }, "sound 2"},
        {"o.mkv",
         [](Request& request) {
             request.burnSubtitles = "3";
             request.copySound = true;
         },
         ""},
    };
    for (const auto& test : cases) {
        SCOPED_TRACE(std::string(test.output) + " " + test.among);
        Request request;
        request.input = rich;
        request.output = folder / test.output;
        request.overwrite = true;
        test.wish(request);
        const Lines foretold = Foretold(request);
        EXPECT_EQ(foretold, Told(request));
        const bool isThere = std::any_of(foretold.begin(), foretold.end(), [&](const std::string& line) {
            return line.rfind(test.among, 0) == 0;
        });
        EXPECT_EQ(isThere, *test.among != 0) << testing::PrintToString(foretold);
    }
}

TEST(Foretold, IsWhatWillBeRefused) {
    const Folder folder;
    const std::string rich = Rich(folder);
    const struct {
        const char* output;
        std::function<void(Request&)> wish;
        const char* words;
    } cases[] = {
        {"o.webm", [](Request& request) { request.copySound = true; }, "sound as it is"},
        {"o.mkv", [](Request& request) { request.audioTracks = {{"17"}}; }, "no sound \"17\""},
        {"o.mkv", [](Request& request) { request.subtitles = {{"jpn"}}; }, "no subtitles \"jpn\""},
        {"o.mkv", [](Request& request) { request.burnSubtitles = "17"; }, "no subtitles \"17\""},
        {"o.mp3", [](Request& request) { request.noAudio = true; }, "carries nothing"},
    };
    for (const auto& test : cases) {
        Request request;
        request.input = rich;
        request.output = folder / test.output;
        test.wish(request);
        Request looking;
        looking.input = rich;
        try {
            const SourceInfo source = AsAskedFor(LookAtSource(looking), request);
            PlanEncoding(EncodeParam{}, ChooseFormat(request), request, source);
            ADD_FAILURE() << test.words;
        } catch (const Failure& failure) {
            EXPECT_NE(failure.Text().find(test.words), std::string::npos) << failure.Text();
        }
        Listener listener;
        EXPECT_EQ(Convert(request, listener).outcome, Outcome::kFailed) << test.words;
    }
}

} // namespace
