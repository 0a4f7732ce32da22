// Pictures that come faster than the engine believes, that one can look through, whose colours are finer,
// and what else an output cannot hold.
#include "tests/support/Inspect.h"
#include "tests/support/Program.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <array>
#include <cstdlib>
#include <string>

namespace {

using namespace test_movies;
using program::Call;
using program::Result;

TEST(UnusualPictures, SlowMotionKeepsEveryPictureWithItsTime) {
    const std::string source =
        Make("240-a-second.mp4", Join(CountedPictures(1, "240"), Args{"-c:v", "mpeg4"}));
    const inspect::Seen before = inspect::LookAt(source);
    ASSERT_EQ(before.pictures.size(), 240u);
    for (const char* const name : {"o.mp4", "o.mkv", "o.ts"}) {
        SCOPED_TRACE(name);
        const Folder folder;
        const Result result = Call({"--preset", "classic", source, folder / name});
        ASSERT_EQ(result.code, 0) << result.err;
        const inspect::Seen after = inspect::LookAt(folder / name);
        ASSERT_EQ(after.pictures.size(), before.pictures.size());
        for (std::size_t i = 0; i < before.pictures.size(); ++i)
            EXPECT_NEAR(after.pictures[i].time - after.pictures[0].time, i / 240.0, 0.0011) << i;
    }
}

/// In the file's head, and in the bits that each picture gets.
TEST(UnusualPictures, SlowMotionIsToldAndCodedByItsOwnRate) {
    constexpr int kBitRate = 100'000;
    const std::string source =
        Make("480-a-second.mp4", Join(CountedPictures(3, "480"), Args{"-c:v", "mpeg4"}));
    for (const char* const codec : {"H264", "HEVC", "AV1", "VP9"}) {
        SCOPED_TRACE(codec);
        const Folder folder;
        const Result result = Call({"--preset", "classic", "--video-codec", codec, "--video-rate",
                                    std::to_string(kBitRate), source, folder / "o.mkv"});
        ASSERT_EQ(result.code, 0) << result.err;
        EXPECT_EQ(Ffprobe(folder / "o.mkv", Words("-show_entries stream=avg_frame_rate -of csv=p=0")),
                  "480/1\n");
        EXPECT_LT(ReadFile(folder / "o.mkv").size() * 8, 3 * kBitRate * 2);
        EXPECT_EQ(inspect::LookAt(folder / "o.mkv").pictures.size(), 3 * 480U);
    }
}

TEST(UnusualPictures, FillTheirFrameWhereTheContainerAloneTellsTheirShape) {
    const Folder folder;
    for (const auto& [codec, name] :
         {std::pair{"prores_ks", "shape.mov"}, {"libvpx-vp9", "shape.webm"}, {"ffv1", "shape.mkv"}}) {
        const std::string square =
            Make(std::string("square-") + name, Join(Lavfi("color=white:s=96x72:r=25:d=0.4"),
                                                     Args{"-c:v", codec, "-pix_fmt", "yuv422p10le"}));
        const std::string wide = Make(name, {"-i", square, "-c", "copy", "-aspect", "16:9"});
        ASSERT_EQ(Call({"-q", "-y", wide, folder / "out.mkv"}).code, 0);
        const Result corner =
            program::Run(Join(Words("ffmpeg -v error -i"), Args{folder / "out.mkv"},
                              Words("-vframes 1 -vf crop=2:2:0:0,format=gray -f rawvideo -")));
        ASSERT_EQ(corner.out.size(), 4U);
        EXPECT_GT(static_cast<unsigned char>(corner.out[0]), 200) << name;
        EXPECT_EQ(Ffprobe(folder / "out.mkv", Words("-show_entries stream=display_aspect_ratio -of csv=p=0")),
                  "16:9\n");
    }
}

TEST(UnusualPictures, WhatTheyLoseIsTold) {
    const struct {
        const char* name;
        Args encoding;
        bool transparent;
        const char* colours; // finer than those that are written; null when they are not
    } cases[] = {
        {"see-through.mkv", {"-c:v", "ffv1", "-pix_fmt", "yuva420p"}, true, nullptr},
        {"see-through.webm", {"-c:v", "libvpx-vp9", "-cpu-used", "8", "-pix_fmt", "yuva420p"}, true, nullptr},
        {"palette.gif", {}, false, "RGB"},
        {"fine.mkv", {"-c:v", "ffv1", "-pix_fmt", "yuv444p"}, false, "4:4:4"},
        {"fine.mov", {"-c:v", "prores_ks"}, false, "4:2:2"},
        {"old.mkv", {"-c:v", "ffv1", "-pix_fmt", "yuv411p"}, false, "4:1:1"},
        {"coarse.mkv", {"-c:v", "ffv1", "-pix_fmt", "yuv410p"}, false, nullptr},
        {"grey.mkv", {"-c:v", "ffv1", "-pix_fmt", "gray"}, false, nullptr},
        {"plain.mkv", {"-c:v", "ffv1", "-pix_fmt", "yuv420p"}, false, nullptr},
    };
    for (const auto& test : cases) {
        SCOPED_TRACE(test.name);
        const Folder folder;
        const std::string source = Make(test.name, Join(CountedPictures(0.2), test.encoding));
        const Result result = Call({"--preset", "classic", source, folder / "o.mp4"});
        ASSERT_EQ(result.code, 0) << result.err;
        const auto tells = [&](const std::string& text) {
            return result.err.find(text) != std::string::npos;
        };
        EXPECT_EQ(tells("transparency"), test.transparent) << result.err;
        EXPECT_EQ(tells("(4:2:0)"), test.colours != nullptr) << result.err;
        if (test.colours) {
            EXPECT_TRUE(tells(std::string("its ") + test.colours + " pictures")) << result.err;
        }
    }
}

TEST(UnusualPictures, AFileThatNoneCameIntoIsTold) {
    const Folder folder;
    const std::string late = Make("late.mkv", Join(Join(Words("-itsoffset 2"), CountedPictures(1)),
                                                   Join(Lavfi("sine=d=3"), Words("-c:v ffv1 -c:a flac"))));
    for (const std::string end : {"1", "3"}) {
        const Result result = Call({late, folder / "o.mp4", "-y", "--length", end});
        EXPECT_EQ(result.code, 0);
        EXPECT_EQ(result.err.find("o.mp4\" has no pictures") != std::string::npos, end == "1") << result.err;
    }
}

/// A movie whose first picture comes with three bytes of closed captions.
std::string Captioned(const std::string& captions) {
    std::string movie = ReadFile(Make("captioned.h264", Join(CountedPictures(0.2), Args{"-c:v", "libx264"})));
    const std::string message =
        "\x04\x0e\xb5" + std::string(1, '\0') + "\x31GA94\x03\x41\xff" + captions + "\xff";
    const std::string start("\0\0\1", 3);
    movie.insert(movie.find(start + "\x65"), start + "\x06" + message + "\x80");
    return movie;
}

std::string Box(const std::string& name, const std::string& content) {
    return std::string(3, '\0') + static_cast<char>(content.size() + 8) + name + content;
}

/// A movie in whose index such a box describes the pictures.
std::string Described(const std::string& box) {
    std::string movie =
        ReadFile(Make("described.mp4", Join(CountedPictures(0.2), Args{"-an", "-c:v", "libx264"})));
    const auto sizeAt = [&](std::size_t place) {
        std::size_t size = 0;
        for (std::size_t i = 0; i < 4; ++i)
            size = size << 8 | static_cast<unsigned char>(movie[place + i]);
        return size;
    };
    std::size_t place = 0;
    for (const char* const parent : {"moov", "trak", "mdia", "minf", "stbl", "stsd", "avc1"}) {
        place = movie.find(parent, place) - 4;
        const std::size_t size = sizeAt(place) + box.size();
        for (std::size_t i = 0; i < 4; ++i)
            movie[place + i] = static_cast<char>(size >> (24 - 8 * i));
    }
    movie.insert(place + sizeAt(place) - box.size(), box);
    return movie;
}

TEST(UnusualPictures, WhatIsToldBesideThemIsMissed) {
    const std::string plain(4, '\0'); // version and flags of a box
    const std::string dolby = {1, 0, 0x10, 0x0d};
    const std::string sphere =
        Box("svhd", plain + '\0') +
        Box("proj", Box("prhd", plain + std::string(12, '\0')) + Box("equi", plain + std::string(16, '\0')));
    const std::string captions = "closed captions";
    const std::string eyes = "both eyes";
    const std::string all = "spherical pictures";
    const std::string added = "what Dolby Vision adds";
    const std::string alone = "for Dolby Vision alone";
    const Args packing{"-c:v", "libx264", "-x264-params", "frame-packing=3"}; // told by the pictures alone
    const struct {
        const char* name;
        std::string movie;
        std::string told;
    } cases[] = {
        {"captions", Captioned("\xfc\x94\x20"), captions},
        {"room for captions", Captioned("\xfc\x80\x80"), ""},
        {"one eye", Described(Box("st3d", plain + '\0')), ""},
        {"both eyes", Described(Box("st3d", plain + '\2')), eyes},
        {"both eyes by the pictures", ReadFile(Make("packed.h264", Join(CountedPictures(0.2), packing))),
         eyes},
        {"sphere", Described(Box("sv3d", sphere)), all},
        {"Dolby Vision", Described(Box("dvcC", dolby + '\x10' + std::string(19, '\0'))), added},
        {"alone", Described(Box("dvcC", dolby + std::string(20, '\0'))), alone},
    };
    for (const auto& test : cases) {
        SCOPED_TRACE(test.name);
        const Folder folder;
        WriteFile(folder / "source", test.movie);
        const Result result = Call({"--preset", "classic", folder / "source", folder / "o.mp4"});
        ASSERT_EQ(result.code, 0) << result.err;
        for (const std::string& text : {captions, eyes, all, added, alone})
            EXPECT_EQ(result.err.find(text) != std::string::npos, text == test.told) << text << result.err;
    }
}

/// Labelled as RGB or not, in sizes for which players take different matrices.
TEST(UnusualPictures, RgbIsShownInItsColoursByWhatTheOutputSays) {
    const struct {
        const char* name;
        Args encoding;
        const char* size;
        const char* output;
        const char* matrix;
    } cases[] = {
        {"rgb-labelled.mkv", {"-c:v", "libx264rgb", "-qp", "0"}, "320x240", "o.mp4", "smpte170m"},
        {"rgb-labelled-hd.mkv", {"-c:v", "libx264rgb", "-qp", "0"}, "1280x720", "o.mp4", "bt709"},
        {"rgb-qt.mov", {"-c:v", "qtrle"}, "320x240", "o.mkv", "smpte170m"},
        {"rgb-ffv1-hd.mkv", {"-c:v", "ffv1", "-pix_fmt", "bgr0"}, "1280x720", "o.mp4", "bt709"},
        {"rgb-palette-hd.gif", {}, "1280x720", "o.mp4", "bt709"},
        {"rgb-png-hd.mkv", {"-c:v", "png"}, "1280x720", "o.gif", nullptr},
    };
    constexpr std::array kRed{0xC0, 0x30, 0x20};
    for (const auto& test : cases) {
        SCOPED_TRACE(test.name);
        const Folder folder;
        const std::string source = Make(
            test.name, Join(Lavfi(std::string("color=0xC03020:r=5:d=0.4:s=") + test.size + ",format=gbrp"),
                            test.encoding));
        const Result result = Call({"--preset", "standard", source, folder / test.output});
        ASSERT_EQ(result.code, 0) << result.err;
        const std::string made = folder / test.output;
        if (test.matrix) {
            EXPECT_EQ(Ffprobe(made, Words("-show_entries stream=color_space -of csv=p=0")),
                      std::string(test.matrix) + "\n");
        }
        const std::string picture = FfmpegReads(made, Words("-frames:v 1 -f rawvideo -pix_fmt rgb24"));
        ASSERT_GT(picture.size(), 3u);
        for (size_t i = 0; i < kRed.size(); ++i)
            EXPECT_NEAR(static_cast<unsigned char>(picture[i]), kRed[i], 5) << i;
    }
}

/// From 720 lines on players take BT.709, also where an output of another size or codec has another usual
/// one.
TEST(UnusualPictures, ColoursOfAnHdMovieThatTellsNothingAreKeptInEveryOutput) {
    const std::string source =
        Make("untold-hd.mp4",
             Words("-f lavfi -i color=red:s=1280x720:r=5:d=0.4 -vf "
                   "scale=out_color_matrix=bt709,format=yuv420p -c:v libx264 -qp 1 -color_primaries "
                   "unknown -color_trc unknown -colorspace unknown"));
    ASSERT_EQ(Ffprobe(source, Words("-show_entries stream=color_space -of csv=p=0")), "unknown\n");
    const struct {
        const char* output;
        Args options;
    } cases[] = {
        {"o.gif", {}},
        {"o.gif", {"--size", "320x180"}},
        {"o.avi", {"--video-codec", "MJPG"}},
        {"o.avi", {"--video-codec", "XVID"}},
        {"o.mp4", {"--size", "640x360"}},
        {"o.mp4", {"--crop", "100:100:0:0"}},
        {"o.mkv", {"--size", "640x360", "--jobs", "2", "--pieces", "1"}},
        {"o.webm", {"--video-codec", "VP80"}},
    };
    for (const auto& test : cases) {
        SCOPED_TRACE(test.output + std::to_string(&test - cases));
        const Folder folder;
        const std::string made = folder / test.output;
        const Result result = Call(Join(Args{"--preset", "standard", source, made}, test.options));
        ASSERT_EQ(result.code, 0) << result.err;
        const std::string picture = FfmpegReads(made, Words("-frames:v 1 -f rawvideo -pix_fmt rgb24"));
        ASSERT_GT(picture.size(), 3U);
        EXPECT_GT(static_cast<unsigned char>(picture[0]), 244);
        EXPECT_LT(static_cast<unsigned char>(picture[1]), 12);
        EXPECT_LT(static_cast<unsigned char>(picture[2]), 12);
    }
}

TEST(UnusualPictures, WhatTheOutputCannotHoldIsTold) {
    const Args tones = Words("-f lavfi -i anullsrc=cl=7.1:r=192000:d=0.2 -c:a flac");
    const Args interlaced = Words("-vf setfield=tff -c:v libx264 -flags +ilme+ildct");
    const std::string deep =
        Make("12-bits.mkv", Join(CountedPictures(0.2), Words("-c:v ffv1 -pix_fmt yuv420p12")));
    const std::string fields = Make("fields.mkv", Join(CountedPictures(0.2), interlaced));
    const std::string wide = Make("wide-sound.mka", tones);
    const std::string twelve =
        Make("twelve-channels.wav", Words("-f s16le -ac 12 -ar 48000 -t 0.5 -i /dev/zero -c:a pcm_s16le"));
    const struct {
        std::string source;
        Args options;
        const char* output;
        std::string told; // all of it
    } cases[] = {
        {deep, {"--preset", "archive"}, "o.mkv", "its pictures of 12 bits got 10"},
        {deep, {"--preset", "standard"}, "o.mkv", "its pictures of 12 bits got 8"},
        {fields,
         {"--deinterlace", "off"},
         "o.mkv",
         "interlaced pictures stayed as they are, in files that do not tell it"},
        {wide, {}, "o.mp3", "its 7.1 sound became stereo, its sound of 192000 Hz got 48000"},
        {wide, {"--channels", "2", "--sample-rate", "48000"}, "o.mp3", ""},
        {wide, {"--audio-codec", "PCM"}, "o.wav", ""},
        {twelve, {}, "o.wav", "its sound of 12 channels got 2"},
        {twelve, {"--channels", "2"}, "o.wav", ""},
    };
    for (const auto& test : cases) {
        SCOPED_TRACE(testing::Message() << test.output << ' ' << test.told);
        const Folder folder;
        const Result result = Call(Join(test.options, Args{test.source, folder / test.output}));
        ASSERT_EQ(result.code, 0) << result.err;
        std::string told;
        const std::string mark = "\"" + test.source + "\": ";
        for (std::size_t at = 0; (at = result.err.find(mark, at)) != std::string::npos;) {
            at += mark.size();
            told += (told.empty() ? "" : ", ") + result.err.substr(at, result.err.find('\n', at) - at);
        }
        EXPECT_EQ(told, test.told) << result.err;
    }
}

/// The middle pixel of the first picture, as "1bbd3a".
std::string ColourOf(const std::string& path) {
    const Result pixel = program::Run({"ffmpeg", "-v", "error", "-nostdin", "-i", path, "-frames:v", "1",
                                       "-vf", "crop=2:2", "-f", "rawvideo", "-pix_fmt", "rgb24", "-"});
    std::string text;
    for (const char byte : pixel.out.substr(0, 3)) {
        constexpr char kDigits[] = "0123456789abcdef";
        text += kDigits[static_cast<unsigned char>(byte) >> 4];
        text += kDigits[static_cast<unsigned char>(byte) & 15];
    }
    return text;
}

TEST(UnusualPictures, ColoursOfBt709StayWhatTheyWere) {
    const std::string source = Make(
        "green-709.mp4",
        Words(
            "-f lavfi -i color=0x20C040:s=320x240:d=0.4 -vf scale=out_color_matrix=bt709,format=yuv420p -c:v "
            "libx264 -qp 1 -color_primaries bt709 -color_trc bt709 -colorspace bt709"));
    const auto near = [](const std::string& one, const std::string& other) {
        constexpr int kMost = 6;
        for (std::size_t at = 0; at < 6; at += 2)
            if (std::abs(std::stoi(one.substr(at, 2), nullptr, 16) -
                         std::stoi(other.substr(at, 2), nullptr, 16)) > kMost)
                return false;
        return true;
    };
    const std::string colour = ColourOf(source);
    ASSERT_EQ(colour.size(), 6u);
    const struct {
        const char* codec;
        const char* output;
    } cases[] = {{"MJPG", "o.mkv"},  {"MJPG", "o.mp4"}, {"MJPG", "o.mov"}, {"MJPG", "o.avi"},
                 {"VP80", "o.webm"}, {"FLV1", "o.flv"}, {"XVID", "o.avi"}, {"XVID", "o.ts"},
                 {"XVID", "o.mp4"},  {"H264", "o.ts"},  {"MPG2", "o.mpg"}, {"GIF", "o.gif"}};
    for (const auto& [codec, output] : cases) {
        SCOPED_TRACE(testing::Message() << codec << ' ' << output);
        const Folder folder;
        const Result result = Call({"--preset", "classic", "--video-codec", codec, "--video-rate", "4M",
                                    source, folder / output, "--preview", folder / "now.png"});
        ASSERT_EQ(result.code, 0) << result.err;
        for (const std::string& path : {folder / output, folder / "now.png"}) {
            const std::string seen = ColourOf(path);
            EXPECT_TRUE(seen.size() == 6 && near(seen, colour)) << path << ' ' << seen << ", not " << colour;
        }
    }
}

} // namespace
