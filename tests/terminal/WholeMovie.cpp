#include "tests/terminal/WholeMovie.h"

#include "tests/support/Program.h"
#include "tests/support/TestMovies.h"

#include <algorithm>
#include <cctype>
#include <cmath>
#include <cstdint>
#include <gtest/gtest.h>
#include <regex>
#include <sstream>

namespace whole_movie {
namespace {

using test_movies::Args;
using test_movies::FfmpegReads;
using test_movies::Ffprobe;
using test_movies::Join;
using test_movies::Lavfi;
using test_movies::Part;
using test_movies::Words;

constexpr int kWidth = 60;
constexpr int kHeight = 16;

std::string Big(uint32_t value, int bytes) {
    std::string text;
    for (int shift = 8 * (bytes - 1); shift >= 0; shift -= 8)
        text += static_cast<char>(value >> shift & 0xFF);
    return text;
}

std::string Segment(double time, uint32_t type, const std::string& data) {
    return "PG" + Big(static_cast<uint32_t>(std::lround(time * 90000)), 4) + Big(0, 4) + Big(type, 1) +
           Big(static_cast<uint32_t>(data.size()), 2) + data;
}

std::string Composition(uint32_t number, bool shows) {
    std::string data = Big(160, 2) + Big(120, 2) + Big(0x10, 1) + Big(number, 2) + Big(shows ? 0x80 : 0, 1) +
                       Big(0, 2) + Big(shows ? 1 : 0, 1);
    if (shows)
        data += Big(0, 2) + Big(0, 2) + Big(50, 2) + Big(90, 2);
    return data;
}

constexpr const char* kWordsFile = "1\n00:00:00,500 --> 00:00:01,200\nPlain <i>words</i>\n\n"
                                   "2\n00:00:01,400 --> 00:00:02,400\nGr\xC3\xBC\xC3\x9F"
                                   "e, \xD0\xB4\xD0\xB2\xD0\xB0\n";
constexpr const char* kSignsFile =
    "[Script Info]\nScriptType: v4.00+\nPlayResX: 160\nPlayResY: 120\n\n[V4+ Styles]\n"
    "Format: Name, Fontname, Fontsize, PrimaryColour, SecondaryColour, OutlineColour, BackColour, "
    "Bold, Italic, Underline, StrikeOut, ScaleX, ScaleY, Spacing, Angle, BorderStyle, Outline, "
    "Shadow, Alignment, MarginL, MarginR, MarginV, Encoding\n"
    "Style: Default,DejaVu Sans,20,&H00FFFFFF,&H0,&H0,&H0,0,0,0,0,100,100,0,0,1,1,0,2,5,5,5,1\n\n"
    "[Events]\nFormat: Layer, Start, End, Style, Name, MarginL, MarginR, MarginV, Effect, Text\n"
    "Dialogue: 0,0:00:00.30,0:00:01.50,Default,,0,0,0,,{\\pos(20,20)}A &lt; sign\n"
    "Dialogue: 1,0:00:01.00,0:00:02.00,Default,Anna,0,0,0,,{\\b1}Bold{\\b0} and plain\n";
constexpr const char* kNotesFile =
    ";FFMETADATA1\ntitle=The whole\nartist=Nobody & S\xC3\xB6hne\nalbum=Collected\n"
    "album_artist=All\ndate=2021-05-04\ncomment=Said \\= so\\; it\\#s\ndescription=Long text\n"
    "genre=Test\ncomposer=One\ncopyright=Free\ncreation_time=2021-05-04T10:11:12.000000Z\n"
    "location=+48.1000+011.6000/\nshow=Series\nperformer=Some\n"
    "[CHAPTER]\nTIMEBASE=1/1000\nSTART=0\nEND=500\ntitle=First\n"
    "[CHAPTER]\nTIMEBASE=1/1000\nSTART=500\nEND=2000\ntitle=Zweites St\xC3\xBC"
    "ck\n"
    "[CHAPTER]\nTIMEBASE=1/1000\nSTART=2000\nEND=3000\ntitle=Last\n";

/// Subtitles of five kinds, and the texts about the movie.
Args Texts() {
    const Args bits{"-copyts", "-i", Part("bits.sup", BitmapSubtitles({{0.2, 0.8}, {1.5, 2.5}}))};
    const std::string dvd = test_movies::Make("dvd.mkv", Join(bits, Words("-c:s dvdsub")));
    const std::string dvb =
        test_movies::Make("dvb.ts", Join(bits, Words("-c:s dvbsub -muxdelay 0 -muxpreload 0")));
    return {"-i", Part("words.srt", kWordsFile),
            "-i", Part("signs.ass", kSignsFile),
            "-i", bits.back(),
            "-i", dvd,
            "-i", dvb,
            "-i", Part("notes.txt", kNotesFile)};
}

/// -OPTION:KIND:NUMBER VALUE for each of `values` that is not empty.
Args ForEach(const std::string& option, const std::string& kind, const std::string& before,
             const Args& values) {
    Args options;
    for (size_t i = 0; i < values.size(); ++i)
        if (!values[i].empty()) {
            options.push_back(std::string(option).append(":").append(kind).append(std::to_string(i)));
            options.push_back(before + values[i]);
        }
    return options;
}

} // namespace

std::string BitmapSubtitles(const std::vector<std::pair<double, double>>& cues) {
    std::string rows;
    for (int row = 0; row < kHeight; ++row)
        rows += Big(0, 1) + Big(0x80 | kWidth, 1) + Big(1, 1) + Big(0, 2);
    const std::string window =
        Big(1, 1) + Big(0, 1) + Big(50, 2) + Big(90, 2) + Big(kWidth, 2) + Big(kHeight, 2);
    std::string text;
    uint32_t number = 0;
    for (const auto& [begin, end] : cues) {
        text +=
            Segment(begin, 0x16, Composition(number, true)) + Segment(begin, 0x17, window) +
            Segment(begin, 0x14, Big(0, 2) + Big(1, 1) + Big(0xEB8080FF, 4)) +
            Segment(begin, 0x15,
                    Big(0, 2) + Big(0, 1) + Big(0xC0, 1) + Big(static_cast<uint32_t>(rows.size()) + 4, 3) +
                        Big(kWidth, 2) + Big(kHeight, 2) + rows) +
            Segment(begin, 0x80, "") + Segment(end, 0x16, Composition(number + 1, false)) +
            Segment(end, 0x17, window) + Segment(end, 0x80, "");
        number += 2;
    }
    return text;
}

std::string Make(bool black) {
    const std::string pictures = std::string(black ? "color=black:" : "testsrc=") + "s=160x120:r=10:d=3";
    const Args inputs =
        Join(Args{"-copyts"},
             Lavfi(pictures, "sine=300:d=3:r=48000", "aevalsrc=0.3*sin(4000*t)|0.2*sin(2000*t):d=3:s=44100",
                   "sine=700:d=3:r=48000"),
             Texts());
    const std::string cover =
        test_movies::Make("cover.png", Join(Lavfi("testsrc=s=48x32"), Words("-frames:v 1")));
    const std::string font = Part("font.ttf", std::string(30000, 'f'));
    return test_movies::Make(
        black ? "black.mkv" : "everything.mkv",
        Join(inputs,
             Words("-map 0 -map 1 -map 2 -map 3 -map 4 -map 5 -map 6 -map 7 -map 8 -map_metadata 9 "
                   "-c:v mpeg4 -c:a flac -c:s copy"),
             ForEach("-metadata:s", "v:", "language=", {"eng"}),
             ForEach("-metadata:s", "v:", "title=", {"View"}),
             ForEach("-metadata:s", "a:", "language=", {"ger", "swe", "fre"}),
             ForEach("-metadata:s", "a:", "title=", {"Deutsch", "Comments", ""}),
             ForEach("-disposition", "a:", "", {"default+original", "comment", "visual_impaired"}),
             ForEach("-metadata:s", "s:", "language=", {"ger", "jpn", "spa", "ita", "swe"}),
             ForEach("-metadata:s", "s:", "title=", {"Texte", "Signs", "", "", ""}),
             ForEach("-disposition", "s:", "", {"forced", "0", "hearing_impaired", "0", "0"}),
             Args{"-attach", cover, "-attach", font},
             ForEach("-metadata:s", "t:", "mimetype=", {"image/png", "font/ttf"})));
}

Json Probe(const std::string& path) {
    return Json::parse(
        Ffprobe(path, Words("-of json -show_format -show_streams -show_chapters -show_programs")));
}

Json Identify(const std::string& path) {
    return Json::parse(program::Run({"mkvmerge", "-J", path}).out);
}

std::vector<std::pair<std::string, std::string>> TagsOf(const Json& probe) {
    std::vector<std::pair<std::string, std::string>> tags;
    const auto add = [&](const Json& holder) {
        if (!holder.contains("tags"))
            return;
        for (const auto& [key, value] : holder["tags"].items()) {
            std::string small = key;
            std::transform(small.begin(), small.end(), small.begin(),
                           [](unsigned char letter) { return static_cast<char>(std::tolower(letter)); });
            // Two readers' names of two containers' fields.
            if (small == "product" || small == "service_name")
                small = small == "product" ? "album" : "title";
            tags.emplace_back(small, value.get<std::string>());
        }
    };
    add(probe["format"]);
    for (const Json& program : probe["programs"])
        add(program);
    if (probe["streams"].size() == 1) // Ogg
        add(probe["streams"][0]);
    return tags;
}

std::vector<Cue> CuesOf(const std::string& path, int number) {
    const std::string first =
        Ffprobe(path, Words("-select_streams v:0 -show_entries stream=start_time -of default=nk=1:nw=1"));
    const int start = static_cast<int>(std::lround(std::strtod(first.c_str(), nullptr) * 1000));
    const std::string texts = FfmpegReads(path, Words("-copyts -f srt -map 0:s:" + std::to_string(number)));
    static const std::regex kTimes(R"((\d+):(\d+):(\d+),(\d+) --> (\d+):(\d+):(\d+),(\d+)\s*)");
    static const std::regex kMarks("<[^>]*>|\r");
    std::vector<Cue> cues;
    std::istringstream lines(std::regex_replace(texts, kMarks, ""));
    std::string line;
    while (std::getline(lines, line)) {
        std::smatch match;
        const auto time = [&](size_t from) {
            return ((std::stoi(match[from]) * 60 + std::stoi(match[from + 1])) * 60 +
                    std::stoi(match[from + 2])) *
                       1000 +
                   std::stoi(match[from + 3]) - start;
        };
        if (std::regex_match(line, match, kTimes)) {
            cues.push_back({time(1), time(5), ""});
            while (std::getline(lines, line) && !line.empty())
                cues.back().text += (cues.back().text.empty() ? "" : " ") + line;
        }
    }
    return cues;
}

std::vector<int> PacketsOf(const std::string& path, int number) {
    std::istringstream lines(
        Ffprobe(path, Words("-show_entries packet=size -of default=nk=1:nw=1 -select_streams s:" +
                            std::to_string(number))));
    std::vector<int> sizes;
    for (int size = 0; lines >> size;)
        sizes.push_back(size);
    return sizes;
}

} // namespace whole_movie
