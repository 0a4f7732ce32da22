// Subtitles drawn into pictures: where they are seen, and when.
#include "tests/support/Folder.h"
#include "tests/support/Program.h"
#include "tests/support/TestMovies.h"
#include "tests/terminal/WholeMovie.h"

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <fmt/format.h>
#include <gtest/gtest.h>

namespace {

using program::Call;
using program::Result;
using test_movies::Args;
using test_movies::Ffmpeg;
using test_movies::FfmpegReads;
using test_movies::Join;
using test_movies::Lavfi;
using test_movies::Words;

/// What is bright in a picture; empty where nothing is.
struct Box {
    int left = 0;
    int top = 0;
    int right = 0;
    int bottom = 0;

    bool Empty() const { return right <= left; }
};

Box BrightPart(const unsigned char* picture, int width, int height) {
    constexpr int kBright = 100;
    Box box{width, height, 0, 0};
    for (int y = 0; y < height; ++y)
        for (int x = 0; x < width; ++x)
            if (picture[y * width + x] > kBright)
                box = {std::min(box.left, x), std::min(box.top, y), std::max(box.right, x + 1), y + 1};
    return box;
}

/// Of every picture of a movie of that size, filtered so.
std::vector<Box> BoxesOf(const std::string& path, int width, int height, const char* filter = "null") {
    const std::string rows =
        FfmpegReads(path, Join(Words("-map 0:v:0 -f rawvideo -pix_fmt gray -vf"), Args{filter}));
    const auto size = static_cast<size_t>(width) * static_cast<size_t>(height);
    EXPECT_EQ(rows.size() % size, 0);
    std::vector<Box> boxes;
    for (size_t at = 0; at + size <= rows.size(); at += size)
        boxes.push_back(BrightPart(reinterpret_cast<const unsigned char*>(rows.data()) + at, width, height));
    return boxes;
}

/// "..##" for pictures without and with something bright.
std::string Timeline(const std::vector<Box>& boxes) {
    std::string line;
    for (const Box& box : boxes)
        line += box.Empty() ? '.' : '#';
    return line;
}

Box All(const std::vector<Box>& boxes) {
    Box all;
    for (const Box& box : boxes)
        if (!box.Empty())
            all = all.Empty() ? box
                              : Box{std::min(all.left, box.left), std::min(all.top, box.top),
                                    std::max(all.right, box.right), std::max(all.bottom, box.bottom)};
    return all;
}

/// The black movie converted without loss, with these options.
std::vector<Box> Burn(const Args& options, int width = 160, int height = 120,
                      const std::string& name = "out.mkv") {
    const Folder folder;
    const Result made = Call(Join(Args{whole_movie::Make(true), folder / name, "--video-codec", "FFV1",
                                       "--no-audio", "--progress", "none"},
                                  options));
    EXPECT_EQ(made.code, 0) << made.err;
    std::vector<Box> boxes;
    for (const std::string& file : folder.Names()) {
        const std::vector<Box> part = BoxesOf(folder / file, width, height);
        boxes.insert(boxes.end(), part.begin(), part.end());
    }
    return boxes;
}

constexpr char kWordsLine[] = ".....#######..##########......";
constexpr char kSignsLine[] = "...#################..........";

TEST(Burn, DrawsEveryKindAtItsTimeAndPlace) {
    // Texts at the bottom in the middle, a sign at its place, bitmaps to the pixel.
    const std::vector<Box> words = Burn({"--burn-subtitles", "4"});
    EXPECT_EQ(Timeline(words), kWordsLine);
    EXPECT_GT(All(words).top, 90);
    EXPECT_NEAR(All(words).left + All(words).right, 160, 6);
    const std::vector<Box> signs = Burn({"--burn-subtitles", "5"});
    EXPECT_EQ(Timeline(signs), kSignsLine);
    EXPECT_LT(signs[5].bottom, 40);
    EXPECT_NEAR(signs[5].left + signs[5].right, 40, 40);
    EXPECT_EQ(Timeline(Burn({"--burn-subtitles", "6"})), "..######.......##########.....");
    for (const char* number : {"6", "7", "8"}) {
        SCOPED_TRACE(number);
        const std::vector<Box> bits = Burn({"--burn-subtitles", number});
        EXPECT_EQ(Timeline(bits).substr(0, 8), "..######"); // some copies do not tell where a cue ends
        EXPECT_NEAR(All(bits).left, 50, 1);
        EXPECT_NEAR(All(bits).top, 90, 1);
        EXPECT_NEAR(All(bits).right, 110, 1);
        EXPECT_NEAR(All(bits).bottom, 106, 1);
    }
}

TEST(Burn, FollowsRangesClipsCroppingAndScaling) {
    EXPECT_EQ(Timeline(Burn({"--burn-subtitles", "4", "--begin", "1", "--length", "1"})), "##..######");
    EXPECT_EQ(Timeline(Burn({"--burn-subtitles", "5", "--begin", "1.2"})),
              std::string(kSignsLine).substr(12));
    EXPECT_EQ(Timeline(Burn({"--burn-subtitles", "6", "--begin", "0.5", "--length", "0.5"})), "###..");
    EXPECT_EQ(Timeline(Burn({"--burn-subtitles", "4", "--split", "0.9"})), kWordsLine);
    EXPECT_EQ(Timeline(Burn({"--burn-subtitles", "4", "--jobs", "2", "--pieces", "3"})), kWordsLine);
    // What would be cut off is moved into the picture.
    const Box cropped = All(Burn({"--burn-subtitles", "6", "--crop", "20:30:0:0"}, 160, 70));
    EXPECT_NEAR(cropped.bottom, 70, 1);
    EXPECT_NEAR(cropped.bottom - cropped.top, 16, 1);
    const Box text = All(Burn({"--burn-subtitles", "4", "--crop", "20:30:0:0"}, 160, 70));
    EXPECT_GT(text.top, 45);
    EXPECT_LT(text.bottom, 70);
    const Box scaled = All(Burn({"--burn-subtitles", "6", "--size", "320x240"}, 320, 240));
    EXPECT_NEAR(scaled.left, 100, 3);
    EXPECT_NEAR(scaled.bottom, 212, 3);
}

/// A stream of small pictures goes on with larger ones, wider ones, and those of pixels that are wider
/// instead.
TEST(Burn, GoesOnBehindJumpsOfTheClock) {
    const Folder folder;
    WriteFile(folder / "bits.sup", whole_movie::BitmapSubtitles({{1.2, 2}}));
    Ffmpeg(Join(Lavfi("color=black:r=10:d=3:s=160x120"),
                Args{"-copyts", "-i", folder / "bits.sup", "-map", "0", "-map", "1", "-c:v", "mpeg2video",
                     "-c:s", "dvbsub", folder / "part.mkv"}));
    Ffmpeg(
        {"-i", folder / "part.mkv", "-map", "0", "-c", "copy", folder / "part.ts"}); // in the order of time
    const std::string part = ReadFile(folder / "part.ts");
    WriteFile(folder / "joined.ts", part + part + part);
    std::vector<std::string> lines;
    for (const char* begin : {"0", "3"}) {
        const Result made = Call({"-q", folder / "joined.ts", folder / "o.mkv", "-y", "--begin", begin,
                                  "--burn-subtitles", "1", "--video-codec", "FFV1"});
        ASSERT_EQ(made.code, 0) << made.err;
        lines.push_back(Timeline(BoxesOf(folder / "o.mkv", 160, 120)));
    }
    const std::string first = lines[0].substr(0, 30);
    EXPECT_NEAR(static_cast<double>(std::count(first.begin(), first.end(), '#')), 9, 1) << first;
    EXPECT_EQ(lines[0], first + first + first);
    EXPECT_EQ(lines[1], first + first);
}

/// Whether it is drawn or carried; and where looking for it would take long, that it was not looked for.
TEST(Burn, IsThereHoweverLongBeforeTheBeginItAppeared) {
    const Folder folder;
    std::string texts =
        "1\n00:00:05,000 --> 00:02:55,000\nLONG\n\n"; // and others, lest it is the last one before
    for (int second = 5; second < 175; second += 4)
        texts += fmt::format("2\n{0}:{1:02},000 --> {0}:{2:02},000\nSHORT\n\n",
                             fmt::format("00:{:02}", second / 60), second % 60, second % 60 + 1);
    WriteFile(folder / "a.srt", texts);
    Ffmpeg(Join(Lavfi("color=black:s=160x120:r=1:d=180"),
                Args{"-i", folder / "a.srt", "-c:v", "ffv1", "-c:s", "srt", folder / "in.mkv"}));
    const std::string whole = std::string(5, '.') + std::string(170, '#') + std::string(5, '.');
    const struct {
        Args options;
        std::string line;
    } cases[] = {{{"--begin", "2:00"}, whole.substr(120)},
                 {{"--jobs", "2", "--pieces", "3"}, whole},
                 {{"--begin", "2:00", "--jobs", "2", "--pieces", "3"}, whole.substr(120)}};
    const Args burn{
        folder / "in.mkv", folder / "out.mkv", "-y", "-q", "--burn-subtitles", "1", "--video-codec", "FFV1"};
    for (const auto& test : cases) {
        const Result made = Call(Join(burn, test.options));
        EXPECT_EQ(made.code, 0) << made.err;
        EXPECT_EQ(Timeline(BoxesOf(folder / "out.mkv", 160, 120)), test.line) << test.options.front();
    }
    const Args carry{folder / "in.mkv", folder / "out.mkv", "-y", "--begin", "2:00", "--length", "20"};
    const auto told = [](const Result& made) {
        return made.err.find("subtitles that appeared more than 90 s before the begin") != std::string::npos;
    };
    Result made = Call(carry);
    EXPECT_EQ(made.code, 0) << made.err;
    EXPECT_FALSE(told(made)) << made.err;
    const std::vector<whole_movie::Cue> cues = whole_movie::CuesOf(folder / "out.mkv", 0);
    ASSERT_FALSE(cues.empty());
    EXPECT_EQ(cues[0].text, "LONG");
    EXPECT_EQ(cues[0].begin, 0);
    std::filesystem::resize_file(folder / "in.mkv", uintmax_t{1} << 31);
    made = Call(carry);
    EXPECT_EQ(made.code, 0) << made.err;
    EXPECT_TRUE(told(made)) << made.err;
}

/// A text stays in the line where it found room, and the next one takes the line below when that is free: a
/// part of the movie shows them as the whole does, wherever it begins.
TEST(Burn, LeavesTextsInTheirLinesWhereverAPartBegins) {
    const Folder folder;
    WriteFile(folder / "lines.srt", "1\n00:00:00,000 --> 00:00:01,000\nfirst\n\n"
                                    "2\n00:00:00,500 --> 00:00:02,000\nsecond and longer\n\n"
                                    "3\n00:00:01,200 --> 00:00:03,000\n3\n\n"
                                    "4\n00:00:01,500 --> 00:00:02,500\nthe fourth\n\n");
    const auto pictures = [&](const Args& options) {
        EXPECT_EQ(Call(Join(Args{whole_movie::Make(true), folder / "out.mkv", "-y", "-q", "--video-codec",
                                 "FFV1", "--no-audio", "--burn-subtitles", folder / "lines.srt"},
                            options))
                      .code,
                  0);
        return FfmpegReads(folder / "out.mkv", Words("-map 0:v:0 -f rawvideo -pix_fmt gray"));
    };
    constexpr std::size_t kPicture = 160 * 120;
    const std::string whole = pictures({});
    ASSERT_EQ(whole.size(), 30 * kPicture);
    for (const std::size_t first : {7, 14, 17, 22})
        EXPECT_TRUE(pictures({"--begin", fmt::format("{}.{}", first / 10, first % 10)}) ==
                    whole.substr(first * kPicture))
            << first;
}

/// Slides of 10 s, and a recording whose pictures come only when something happens: texts do not wait for the
/// next picture.
TEST(Burn, ComesAndGoesWhileOnePictureStays) {
    const Folder folder;
    Ffmpeg(Join(Lavfi("color=black:s=160x120:r=0.1:d=40"), Words("-c:v ffv1"), Args{folder / "slides.mkv"}));
    Ffmpeg(Join(Lavfi("color=black:s=160x120:r=25:d=40"),
                Args{"-vf", "select='lt(t,4.5)+not(mod(n,375))'", "-fps_mode", "vfr", "-c:v", "ffv1",
                     folder / "screen.mkv"}));
    WriteFile(folder / "a.srt", "1\n00:00:03,000 --> 00:00:06,000\nWORDS\n\n"
                                "2\n00:00:12,000 --> 00:00:18,000\n{\\fad(100,100)}OTHERS\n");
    WriteFile(folder / "a.sup", whole_movie::BitmapSubtitles({{3, 6}, {12, 18}}));
    const std::string seconds = "...###......######............";
    for (const char* movie : {"slides", "screen"}) {
        for (const char* texts : {"a.srt", "a.sup"}) {
            Ffmpeg({"-copyts", "-i", folder / movie + ".mkv", "-i", folder / texts, "-map", "0", "-map", "1",
                    "-c", "copy", folder / "in.mkv"});
            for (const Args& options :
                 {Args{}, Args{"--frame-rate", "25"}, Args{"--jobs", "2", "--pieces", "5"}}) {
                SCOPED_TRACE(std::string(movie) + " " + texts + " " + (options.empty() ? "" : options[0]));
                const Result made = Call(Join(Args{folder / "in.mkv", folder / "out.mkv", "-y", "-q",
                                                   "--video-codec", "FFV1", "--burn-subtitles", "1"},
                                              options));
                ASSERT_EQ(made.code, 0) << made.err;
                EXPECT_EQ(Timeline(BoxesOf(folder / "out.mkv", 160, 120, "fps=1")).substr(0, seconds.size()),
                          seconds);
            }
        }
    }
}

TEST(Burn, StaysInItsPlaceWhenThePicturesChangeTheirSize) {
    const Folder folder;
    const struct {
        const char* size;
        const char* aspect; // of a pixel
        int lit;            // columns of the first size that its pictures fill
    } parts[] = {{"160x120", "1", 160}, {"320x240", "1", 160}, {"120x120", "4/3", 160}, {"120x240", "1", 60}};
    std::string joined;
    for (const auto& part : parts) {
        Ffmpeg(Join(Lavfi(std::string("color=0x404040:r=10:d=0.5:s=") + part.size + ",setsar=" + part.aspect),
                    Words("-c:v mpeg2video -q:v 2 -f mpegts -output_ts_offset " +
                          std::to_string(1 + 0.5 * static_cast<double>(&part - parts))),
                    Args{folder / "part.ts"}));
        joined += ReadFile(folder / "part.ts");
    }
    WriteFile(folder / "a.ts", joined);
    WriteFile(folder / "words.srt", "1\n00:00:00,000 --> 00:00:09,000\nWORDS\n");
    const Result made = Call({folder / "a.ts", folder / "o.mkv", "--burn-subtitles", folder / "words.srt",
                              "--crop", "20:0:0:0", "--video-codec", "FFV1", "-q"});
    ASSERT_EQ(made.code, 0) << made.err;
    const std::vector<Box> words = BoxesOf(folder / "o.mkv", 160, 100);
    const std::string rows = FfmpegReads(folder / "o.mkv", Words("-map 0:v:0 -f rawvideo -pix_fmt gray"));
    ASSERT_EQ(words.size(), 20u);
    for (size_t i = 2; i < words.size(); i += 5) { // in the middle of each part
        SCOPED_TRACE(i);
        EXPECT_NEAR(words[i].left, words[2].left, 1);
        EXPECT_NEAR(words[i].top, words[2].top, 1);
        EXPECT_NEAR(words[i].right, words[2].right, 1);
        EXPECT_NEAR(words[i].bottom, words[2].bottom, 1);
        const auto row = rows.begin() + static_cast<std::ptrdiff_t>(i * 160 * 100);
        EXPECT_NEAR(std::count_if(row, row + 160, [](char luma) { return luma > 40; }), parts[i / 5].lit, 2);
    }
}

TEST(Burn, TakesFilesAndTheFontsOfTheSource) {
    const Folder folder;
    WriteFile(folder / "latin.srt", "1\n00:00:01,000 --> 00:00:02,000\nGr\xFC\xDF"
                                    "e\n");
    EXPECT_EQ(Timeline(Burn({"--burn-subtitles", folder / "latin.srt"})), "..........##########..........");
    // A typeface that only the movie has: all letters as wide as each other, under a new name.
    std::string font = ReadFile("/usr/share/fonts/truetype/dejavu/DejaVuSansMono.ttf");
    if (font.empty())
        GTEST_SKIP() << "without the typeface";
    for (const std::string& name : {std::string("DejaVu Sans Mono"), std::string("DejaVuSansMono")}) {
        std::string wide;
        for (const char letter : name)
            wide += std::string(1, '\0') + letter;
        for (const std::string& form : {name, wide})
            for (size_t at = 0; (at = font.find(form, at)) != std::string::npos; at += form.size())
                font[at + form.size() - 1] = 'X';
    }
    WriteFile(folder / "own.ttf", font);
    WriteFile(
        folder / "own.ass",
        "[Script Info]\nScriptType: v4.00+\nPlayResX: 160\nPlayResY: 120\n\n[V4+ Styles]\n"
        "Format: Name, Fontname, Fontsize, PrimaryColour, SecondaryColour, OutlineColour, BackColour, "
        "Bold, Italic, Underline, StrikeOut, ScaleX, ScaleY, Spacing, Angle, BorderStyle, Outline, "
        "Shadow, Alignment, MarginL, MarginR, MarginV, Encoding\n"
        "Style: Default,DejaVu Sans MonX,20,&H00FFFFFF,&H0,&H0,&H0,0,0,0,0,100,100,0,0,1,0,0,5,5,5,5,1\n"
        "\n[Events]\n"
        "Format: Layer, Start, End, Style, Name, MarginL, MarginR, MarginV, Effect, Text\n"
        "Dialogue: 0,0:00:00.00,0:00:01.00,Default,,0,0,0,,iiiiii\n");
    const auto width = [&](bool attached) {
        const Args font{"-attach", folder / "own.ttf", "-metadata:s:t", "mimetype=font/ttf"};
        Ffmpeg(Join(Lavfi("color=black:s=160x120:r=10:d=1"), Args{"-i", folder / "own.ass"},
                    Words("-c:s copy -c:v ffv1"), attached ? font : Args{}, Args{folder / "font.mkv"}));
        const Result made = Call({folder / "font.mkv", folder / "out.mkv", "--burn-subtitles", "1",
                                  "--video-codec", "FFV1", "-y", "-q"});
        EXPECT_EQ(made.code, 0) << made.err;
        const Box box = All(BoxesOf(folder / "out.mkv", 160, 120));
        return box.right - box.left;
    };
    EXPECT_GT(width(true), width(false) * 3 / 2);
}

/// Text in HDR pictures is as bright as a white page, and leaves the rest as it is.
TEST(Burn, WhiteIsThatOfAPageInHdr) {
    const Folder folder;
    WriteFile(folder / "words.srt", "1\n00:00:00,000 --> 00:00:01,000\nWORDS\n");
    constexpr int kWidth = 640;
    constexpr int kHeight = 480;
    constexpr int kBackground = 200;
    const struct {
        const char* transfer;
        int white; // of 10 bits
    } cases[] = {{"smpte2084", 64 + 876 * 58 / 100}, {"arib-std-b67", 64 + 876 * 75 / 100}};
    for (const auto& test : cases) {
        SCOPED_TRACE(test.transfer);
        ASSERT_EQ(program::Run({"ffmpeg", "-v", "error", "-y", "-f", "lavfi", "-i",
                                "color=black:s=640x480:r=5:d=0.4,format=yuv420p10,geq=lum=" +
                                    std::to_string(kBackground) + ":cb=512:cr=512",
                                "-c:v", "ffv1", "-color_primaries", "bt2020", "-color_trc", test.transfer,
                                "-colorspace", "bt2020nc", folder / "hdr.mkv"})
                      .code,
                  0);
        const Result made = Call({folder / "hdr.mkv", folder / "out.mkv", "--burn-subtitles",
                                  folder / "words.srt", "--video-codec", "FFV1", "-y", "-q"});
        ASSERT_EQ(made.code, 0) << made.err;
        EXPECT_TRUE(Has(program::Run({"ffprobe", "-v", "error", "-show_entries", "stream=color_transfer",
                                      folder / "out.mkv"})
                            .out,
                        test.transfer));
        const std::string picture =
            program::Run({"ffmpeg", "-v", "error", "-i", folder / "out.mkv", "-frames:v", "1", "-f",
                          "rawvideo", "-pix_fmt", "yuv420p10le", "-"})
                .out;
        ASSERT_EQ(picture.size(), kWidth * kHeight * 3);
        const auto luma = [&](size_t pixel) {
            return static_cast<unsigned char>(picture[2 * pixel]) |
                   static_cast<unsigned char>(picture[2 * pixel + 1]) << 8;
        };
        int brightest = 0;
        for (size_t pixel = 0; pixel < size_t{kWidth} * kHeight; ++pixel) {
            brightest = std::max(brightest, luma(pixel));
            if (pixel < size_t{kWidth} * kHeight * 2 / 3) {
                ASSERT_EQ(luma(pixel), kBackground);
            }
        }
        EXPECT_NEAR(brightest, test.white, 6);
    }
}

TEST(Burn, LeavesTheTrackOutUnlessItIsAskedFor) {
    const Folder folder;
    const auto texts = [&](const Args& options) {
        const Result made = Call(Join(
            Args{whole_movie::Make(true), folder / "out.mp4", "--burn-subtitles", "4", "-y", "-q"}, options));
        EXPECT_EQ(made.code, 0) << made.err;
        std::string titles;
        const whole_movie::Json probe = whole_movie::Probe(folder / "out.mp4");
        for (const whole_movie::Json& stream : probe["streams"])
            if (stream["codec_name"] == "mov_text")
                titles += stream["tags"].value("language", "") + " ";
        return titles;
    };
    EXPECT_EQ(texts({}), "jpn ");
    EXPECT_EQ(texts({"--subtitles", "ger,5"}), "ger jpn ");
    EXPECT_EQ(texts({"--subtitles", "none"}), "");
}

TEST(Burn, RefusesWhatIsNotThere) {
    const Folder folder;
    const struct {
        Args arguments;
        const char* text;
    } cases[] = {
        {{"out.mp4", "--burn-subtitles", "99"}, "there are no subtitles \"99\"; there are: 4 (ger), 5 (jpn)"},
        {{"out.mp4", "--burn-subtitles", "1"}, "there are no subtitles \"1\""},
        {{"out.mp4", "--burn-subtitles", "/nowhere.srt"}, "cannot open \"/nowhere.srt\""},
        {{"out.mp3", "--burn-subtitles", "4"}, "there are no pictures"},
        {{"out.mp4", "--burn-subtitles", "4", "--no-video"}, "there are no pictures"},
    };
    for (const auto& test : cases) {
        Args arguments = test.arguments;
        arguments[0] = folder / arguments[0];
        const Result made = Call(Join(Args{whole_movie::Make(true)}, arguments));
        EXPECT_EQ(made.code, 2) << made.err;
        EXPECT_NE(made.err.find(test.text), std::string::npos) << made.err;
    }
    const std::string nowhere = "TMPDIR=" + folder / "none";
    const Result made = program::Run({"env", nowhere, MOVIECONV_PROGRAM, whole_movie::Make(true),
                                      folder / "out.mp4", "--burn-subtitles", "4"});
    EXPECT_EQ(made.code, 4);
    EXPECT_EQ(made.err,
              "movieconv: error: cannot make a folder for the subtitles: No such file or directory\n");
    EXPECT_TRUE(folder.Names().empty());
}

} // namespace
