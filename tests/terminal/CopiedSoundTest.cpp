// Sound that goes into the output as it is coded.
#include "tests/support/Folder.h"
#include "tests/support/Program.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <sstream>
#include <string>
#include <vector>

namespace {

using program::Call;
using program::Result;

using test_movies::Args;
using test_movies::Beeps;
using test_movies::CountedPictures;
using test_movies::FfmpegReads;
using test_movies::Ffprobe;
using test_movies::Join;
using test_movies::Lavfi;
using test_movies::Make;
using test_movies::Words;

/// Three seconds of pictures and sound of two channels in that codec.
std::string WithSound(const std::string& name, const std::string& codec) {
    return Make(name,
                Join(CountedPictures(3), Lavfi("aevalsrc=0.4*sin(500*t*t)|0.3*sin(400*t*t):s=48000:d=3"),
                     Words("-c:v mpeg4 -strict -2 " + codec)));
}

/// What a packet of sound holds, and when it is heard.
struct Packet {
    std::string content; ///< Its size and check sum.
    double time;
};

/// Of the first track; headers of broadcasts are taken off, since each packet has one of its own.
std::vector<Packet> PacketsOf(const std::string& path, bool framed = false) {
    const std::string filter = framed ? "-bsf:a aac_adtstoasc " : "";
    std::istringstream lines(
        FfmpegReads(path, Words("-map 0:a:0 -c copy -copyts " + filter + "-f framecrc")));
    std::vector<Packet> packets;
    double unit = 0;
    for (std::string line; std::getline(lines, line);) {
        if (line.rfind("#tb 0: ", 0) == 0)
            unit = std::stod(line.substr(7)) / std::stod(line.substr(line.find('/') + 1));
        if (line.empty() || line[0] == '#')
            continue;
        std::vector<std::string> fields;
        std::istringstream row(line);
        for (std::string field; std::getline(row, field, ',');)
            fields.push_back(field);
        packets.push_back({fields.at(4) + fields.at(5), std::stod(fields.at(2)) * unit});
    }
    EXPECT_FALSE(packets.empty()) << path;
    return packets;
}

std::vector<std::string> ContentsOf(const std::vector<Packet>& packets) {
    std::vector<std::string> contents;
    for (const Packet& packet : packets)
        contents.push_back(packet.content);
    return contents;
}

/// The first one may be shown from the file's begin on.
double SecondPicture(const std::string& path) {
    const std::string times = Ffprobe(
        path, Words("-select_streams v -read_intervals %+#2 -show_entries packet=pts_time -of csv=p=0"));
    return std::stod(times.substr(times.find('\n') + 1));
}

std::string SoundOf(const std::string& path) {
    // It complains about the times that it makes itself of FLAC in Ogg.
    return program::Run(
               Join(Words("ffmpeg -v fatal -nostdin -i"), Args{path}, Words("-map 0:a:0 -f s16le -ac 2 -")))
        .out;
}

TEST(CopiedSound, GoesUnchangedIntoWhatHoldsIt) {
    const Folder folder;
    const struct {
        const char* source;
        const char* codec;
        std::vector<const char*> formats;
        std::vector<const char*> refusing;
        std::string toTheSample; ///< The format in which every sample is where it was.
        bool framed = false;
    } cases[] = {
        {"copied_aac.mp4", "-c:a aac", {"mp4", "mov", "mkv", "m4a", "flv"}, {"webm", "mp3"}, "mp4"},
        {"copied_aac.ts", "-c:a aac", {"mp4", "mkv", "flv"}, {"ogg"}, "", true},
        {"copied_opus.mkv", "-c:a libopus", {"mkv", "mp4", "webm", "ogg"}, {"avi", "flv"}, "mkv"},
        {"copied_vorbis.mkv", "-c:a libvorbis", {"mkv", "webm", "ogg"}, {"ts", "mov"}, "mkv"},
        {"copied_mp3.mp4", "-c:a libmp3lame", {"mp4", "mkv", "avi", "ts", "mp3", "wav"}, {"webm"}, "mp4"},
        {"copied_ac3.ts", "-c:a ac3", {"mp4", "mov", "mkv", "avi", "ts", "m4a"}, {"flac"}, "mp4"},
        {"copied_eac3.mkv", "-c:a eac3", {"mp4", "mov", "mkv", "ts"}, {"avi", "m4a"}, "mkv"},
        {"short_eac3.mkv", "-c:a eac3 -b:a 3000k", {"mkv", "ts"}, {"mp4"}, "mkv"},
        {"copied_flac.mkv", "-c:a flac", {"mkv", "flac", "ogg"}, {"mp4", "m4a"}, "flac"},
        {"copied_dts.mkv", "-c:a dca", {"mkv", "ts", "mp4"}, {"mov", "avi"}, "mkv"},
        {"copied_truehd.mkv", "-c:a truehd", {"mkv", "ts"}, {"mp4"}, "mkv"},
        {"copied_pcm.mov", "-c:a pcm_s24le", {"mov", "mkv", "wav"}, {"mp4"}, "mov"},
    };
    for (const auto& test : cases) {
        const std::string source = WithSound(test.source, test.codec);
        const std::vector<Packet> wanted = PacketsOf(source, test.framed);
        const std::string heard = SoundOf(source);
        for (const char* format : test.formats) {
            SCOPED_TRACE(std::string(test.source) + " into " + format);
            const std::string path = folder / (std::string("out.") + format);
            const Result made = Call({source, path, "--audio-codec", "copy", "-y", "--progress", "none"});
            ASSERT_EQ(made.code, 0) << made.err;
            EXPECT_EQ(made.err, "");
            const bool cutsPcm = std::string(test.source) == "copied_pcm.mov"; // as each container likes
            const bool hasNoEarlier = std::string(format) == "avi" && wanted.front().time < -0.02;
            std::vector<std::string> contents = ContentsOf(wanted);
            if (hasNoEarlier) // its time begins at 0: what is not heard has no place
                contents.erase(contents.begin());
            if (!cutsPcm) {
                EXPECT_EQ(ContentsOf(PacketsOf(path)), contents);
            }
            // What is heard is so too; where a container does not tell what comes before it, a little later.
            const std::string again = SoundOf(path);
            constexpr std::size_t kPlace = 40000;
            const std::size_t found = again.find(heard.substr(kPlace, kPlace));
            ASSERT_NE(found, std::string::npos);
            const auto later = static_cast<int64_t>(found) - static_cast<int64_t>(kPlace);
            EXPECT_LE(std::abs(later), 4 * 1300);
            if (test.toTheSample == format) {
                EXPECT_EQ(later, 0);
            }
        }
        for (const char* format : test.refusing) {
            SCOPED_TRACE(std::string(test.source) + " not into " + format);
            const Result made = Call({source, folder / (std::string("no.") + format), "--audio-codec", "copy",
                                      "--progress", "none"});
            EXPECT_EQ(made.code, 2);
            EXPECT_NE(made.err.find("sound as it is; "), std::string::npos) << made.err;
            EXPECT_NE(made.err.find("MKV"), std::string::npos) << made.err;
        }
    }
}

TEST(CopiedSound, IsInOneClipOrTheOtherAndInStepWithThePictures) {
    const Folder folder;
    constexpr double kClip = 0.92; // 23 pictures
    const struct {
        const char* source;
        const char* codec;
        const char* format;
        double tolerance = 0.0025; ///< Containers round.
    } cases[] = {{"copied_aac.mp4", "-c:a aac", "mp4"},
                 {"copied_aac.mp4", "-c:a aac", "mkv"},
                 // Here the multiplexer moves pictures by the run-up.
                 {"copied_opus.mkv", "-c:a libopus", "mkv", 0.0085},
                 {"copied_opus.mkv", "-c:a libopus", "mp4"},
                 {"copied_ac3.ts", "-c:a ac3", "mp4"},
                 {"copied_mp3.mp4", "-c:a libmp3lame", "mkv"},
                 {"copied_flac.mkv", "-c:a flac", "mkv"},
                 // Its packets are shorter than the container's unit.
                 {"copied_truehd.mkv", "-c:a truehd", "mkv"}};
    for (const auto& test : cases) {
        SCOPED_TRACE(std::string(test.source) + " into " + test.format);
        const std::string source = WithSound(test.source, test.codec);
        const std::vector<Packet> wanted = PacketsOf(source);
        const std::string name = std::string("out.") + test.format;
        const Result made = Call({source, folder / name, "--audio-codec", "copy", "--split",
                                  std::to_string(kClip), "-y", "--progress", "none"});
        ASSERT_EQ(made.code, 0) << made.err;
        const double start = SecondPicture(source);
        std::size_t next = 0;
        for (int clip = 0; clip < 4; ++clip) {
            SCOPED_TRACE(clip);
            const std::string path = folder / ("out_0" + std::to_string(clip) + "." + test.format);
            const double shift = clip * kClip - SecondPicture(path);
            for (const Packet& packet : PacketsOf(path)) {
                ASSERT_LT(next, wanted.size());
                ASSERT_EQ(packet.content, wanted[next].content);
                EXPECT_NEAR(packet.time + shift, wanted[next].time - start, test.tolerance);
                ++next;
            }
        }
        EXPECT_EQ(next, wanted.size());
    }
}

TEST(CopiedSound, OfARangeBeginsWithItsFirstWholePacket) {
    const Folder folder;
    for (const char* format : {"mp4", "mkv"}) {
        SCOPED_TRACE(format);
        const std::string source = WithSound("copied_aac.mp4", "-c:a aac");
        const std::string path = folder / (std::string("out.") + format);
        ASSERT_EQ(Call({source, path, "--audio-codec", "copy", "--begin", "0.8", "--length", "1", "-q"}).code,
                  0);
        const std::vector<Packet> all = PacketsOf(source);
        const std::vector<Packet> part = PacketsOf(path);
        const auto first =
            std::find_if(all.begin(), all.end(), [](const Packet& each) { return each.time >= 0.8; });
        for (std::size_t i = 0; i < part.size(); ++i) {
            EXPECT_EQ(part[i].content, (first + static_cast<std::ptrdiff_t>(i))->content);
            EXPECT_NEAR(part[i].time, (first + static_cast<std::ptrdiff_t>(i))->time - 0.8, 0.0015);
        }
        EXPECT_NEAR(static_cast<double>(part.size()), 1 * 48000 / 1024.0, 2);
    }
}

TEST(CopiedSound, OfSeveralTracksIsCarriedAsFarAsTheFormatHoldsIt) {
    const Folder folder;
    const std::string source = WithSound(
        "copied_two.mkv", "-map 0 -map 1 -map 1 -c:a:0 aac -c:a:1 libvorbis -metadata:s:a:0 language=ger "
                          "-metadata:s:a:1 language=eng");
    const Result both = Call({source, folder / "both.mkv", "--audio-codec", "copy", "--progress", "none"});
    EXPECT_EQ(both.err, "");
    EXPECT_EQ(Ffprobe(folder / "both.mkv", Words("-select_streams a -of csv=p=0 -show_entries "
                                                 "stream=codec_name:stream_tags=language")),
              "aac,ger\nvorbis,eng\n");
    const Result one = Call({source, folder / "one.ts", "--audio-codec", "copy", "--progress", "none"});
    EXPECT_EQ(one.code, 0);
    EXPECT_NE(one.err.find("not carried: sound 2 (vorbis, English)"), std::string::npos) << one.err;
    for (const Args& excluded : {Args{"--channels", "1"}, Args{"--sample-rate", "44100"},
                                 Args{"--audio-rate", "64k"}, Args{"--max-size", "1M"}})
        EXPECT_EQ(Call(Join(Args{source, folder / "no.mkv", "--audio-codec", "copy"}, excluded)).code, 2);
    // In pieces it is the same.
    ASSERT_EQ(
        Call({source, folder / "pieces.mkv", "--audio-codec", "copy", "--jobs", "2", "--pieces", "2", "-q"})
            .code,
        0);
    EXPECT_EQ(ContentsOf(PacketsOf(folder / "pieces.mkv")), ContentsOf(PacketsOf(source)));
}

// Where packets have no times, all that follows would be heard too early.
TEST(CopiedSound, ThatPausesIsRefusedWhereOnlySamplesAreCounted) {
    const Args dropped = Words("-bsf:a noise=drop=gte(n\\,40)*lt(n\\,70)");
    const auto pausing = [&](const std::string& name, const std::string& codec) {
        return Make(name, Join(Join(CountedPictures(4), Beeps(4)), Join(Words("-c:a " + codec), dropped)));
    };
    const std::string late =
        Make("late-track.mkv",
             Join(Join(CountedPictures(4), Beeps(4)),
                  Join(Args{"-itsoffset", "1.5"}, Join(Beeps(2), Words("-map 0 -map 1 -map 2 -c:a ac3")))));
    const std::string ac3 = pausing("pause-ac3.mkv", "ac3");
    const struct {
        std::string source;
        const char* format;
        int code;
    } cases[] = {{ac3, "mkv", 0},
                 {ac3, "mp4", 0},
                 {ac3, "avi", 2},
                 {pausing("pause-mp3.mkv", "libmp3lame"), "mp3", 2},
                 {pausing("pause-pcm.mkv", "pcm_s16le"), "wav", 2},
                 {late, "mkv", 0},
                 {late, "avi", 2}};
    const Folder folder;
    for (const auto& test : cases) {
        const Result made = Call(
            {"-q", "-y", "--audio-codec", "copy", test.source, folder / (std::string("out.") + test.format)});
        EXPECT_EQ(made.code, test.code) << test.source << test.format << made.err;
        EXPECT_EQ(Has(made.err, "that pauses for"), test.code != 0) << made.err;
    }
}

TEST(CopiedSound, IsHeardAsMuchAsPicturesAreSeen) {
    const Folder folder;
    constexpr double kBytes = 48000 * 4; // a second
    // Nothing at the begin is taken for what a decoder leaves out.
    ASSERT_EQ(Call({"-q", "--audio-codec", "copy", "--begin", "1",
                    WithSound("copied_mp3.mp4", "-c:a libmp3lame"), folder / "out.mp3"})
                  .code,
              0);
    EXPECT_NEAR(static_cast<double>(SoundOf(folder / "out.mp3").size()) / kBytes, 2, 0.05);
    // What an edit list cuts off is left out.
    const std::string cut =
        Make("copied_cut.mp4", {"-ss", "1.3", "-i", WithSound("copied_aac.mp4", "-c:a aac"), "-c", "copy"});
    for (const char* name : {"out.mkv", "out.mp4"}) {
        ASSERT_EQ(Call({"-q", "--audio-codec", "copy", cut, folder / name}).code, 0);
        EXPECT_NEAR(static_cast<double>(SoundOf(folder / name).size()) / kBytes, 1.7, 0.07) << name;
    }
}

// What follows would be described wrongly.
TEST(CopiedSound, EndsWhereItsFormChanges) {
    const Folder folder;
    std::string parts;
    for (const char* channels : {"2", "6"})
        parts += ReadFile(Make(std::string("form-") + channels + ".ts",
                               Join(Beeps(2), Words(std::string("-c:a aac -ac ") + channels))));
    WriteFile(folder / "in.ts", parts);
    const Result copied = Call({"--audio-codec", "copy", folder / "in.ts", folder / "out.m4a"});
    EXPECT_EQ(copied.code, 3) << copied.err;
    EXPECT_TRUE(Has(copied.err, "changes its form there and cannot be copied on")) << copied.err;
    EXPECT_EQ(Call({"-q", folder / "in.ts", folder / "converted.m4a"}).code, 0);
}

TEST(CopiedSound, KeepsFramesThatTellTheirFormButForAnotherRate) {
    const struct {
        const char* codec;
        const char* first;
        const char* second;
        int code;
    } cases[] = {
        {"ac3", "-ac 2 -ar 48000", "-ac 6 -ar 48000", 0},
        {"ac3", "-ar 48000", "-ar 32000", 3},
        {"eac3", "-ar 48000", "-ar 44100", 3},
        {"mp2", "-ac 1 -ar 48000", "-ac 2 -ar 48000", 0},
        {"mp2", "-ar 48000", "-ar 44100", 3},
        {"mp3", "-ar 44100", "-ar 22050", 3},
        {"dca -strict -2", "-ar 48000", "-ar 44100", 3},
    };
    const Folder folder;
    for (const auto& test : cases) {
        SCOPED_TRACE(std::string(test.codec) + test.first + test.second);
        std::string parts;
        for (const std::string form : {test.first, test.second})
            parts += ReadFile(Make("rates.ts", Join(Beeps(2), Words("-c:a " + (test.codec + (" " + form))))));
        WriteFile(folder / "in.ts", parts);
        const Result copied = Call({"-y", "--audio-codec", "copy", folder / "in.ts", folder / "out.mkv"});
        EXPECT_EQ(copied.code, test.code) << copied.err;
        EXPECT_NEAR(PacketsOf(folder / "out.mkv").back().time, test.code == 0 ? 4 : 2, 0.2);
    }
}

// A recording that was cut begins amid a frame, of which nothing can be heard.
TEST(CopiedSound, LeavesTheRestOfACutFrameOut) {
    const Folder folder;
    const std::string whole =
        Make("cut-ac3.mpg",
             Join(CountedPictures(4), Beeps(4), Words("-c:v mpeg2video -b:v 900k -c:a ac3 -ar 48000")));
    for (const std::size_t from : {10001U, 20001U}) {
        WriteFile(folder / "in.mpg", ReadFile(whole).substr(from));
        for (const char* name : {"out.mp4", "out.mkv"}) {
            const Result result =
                Call({"-q", "-y", "--audio-codec", "copy", folder / "in.mpg", folder / name});
            EXPECT_EQ(result.code, 0) << from << name << result.err;
            EXPECT_GT(PacketsOf(folder / name).size(), 20U);
        }
    }
}

} // namespace
