// Encoding parameters, the estimate, and clip names.
#include "tests/engine/ScriptedHost.h"

#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <utility>

namespace {

class ParamTest : public testing::Test {
protected:
    ParamTest() {
        host.video.Format() = {640, 480, 29.97, 12.5};
        host.audio.Format() = {44100, 6, 8, 176400, 0.125};
    }

    EncodeParam Get() {
        EncodeParam param;
        EXPECT_EQ(MCGetEncodeParam(host.handle, &param), 1);
        return param;
    }

    EncodeParam Set(const EncodeParam& param) {
        EXPECT_EQ(MCSetEncodeParam(host.handle, &param), 1);
        return Get();
    }

    ScriptedHost host;
};

TEST_F(ParamTest, DefaultsComeFromTheSourcesThatOpen) {
    constexpr uint32_t kXvid = FourCC("XVID");
    constexpr uint32_t kYv12 = FourCC("YV12");
    constexpr uint32_t kAac = FourCC("AAC ");
    constexpr uint32_t kMp4 = FourCC("MP4 ");
    for (const auto& [video, audio] : {std::pair{true, true}, {true, false}, {false, true}}) {
        host.video.descriptions = video ? INT_MAX : 0;
        host.audio.descriptions = audio ? INT_MAX : 0;
        host.Create();
        const int width = video ? 640 : 320;
        const int height = video ? 480 : 240;
        const double fps = video ? 29.97 : 24.0;
        const int rate = audio ? 44100 : 22050;
        const int channels = audio ? 6 : 2;
        const EncodeParam expected{kXvid, kYv12, 12,       width, height, fps,    0, 512000, 0, 0,   {},
                                   kAac,  rate,  channels, 16,    0,      128000, 0, 0,      0, kMp4};
        EXPECT_TRUE(SameBytes(Get(), expected)) << video << audio;
        EXPECT_EQ(MCGetEncodeParam(host.handle, nullptr), 1);
        MCDestroy(std::exchange(host.handle, nullptr));
    }
}

TEST_F(ParamTest, ZerosAreCompletedAndLoggedAsTheyCame) {
    host.Create();
    EncodeParam param{};
    param.nReserved[4] = 9;
    const EncodeParam expected{0, 0,     0, 640, 480, 29.97, 0, 512000, 0, 0, {0, 0, 0, 0, 9}, // pictures
                               0, 44100, 6, 8,   0,   64000, 0,                                // sound
                               0, 0,     0};
    EXPECT_TRUE(SameBytes(Set(param), expected));
    EXPECT_EQ(Trace(Part::kLog),
              "log Halvane::SetEncodeParam: Flie format[], Video[] (0x0) 0.000000fps, 0bps 0 0bps "
              "Resize:0\\t\\tAudio[]0channels 0Hz , 0bps 0 0bps\n"
              "log Halvane::Source Video Info: (640x480) 29.970000fps, 12.500000 seconds.\n"
              "log Halvane::Source Audio Info: 44100Hz 6channels, 176400bps 8bits 1.250000e-01second.\n");

    recorder::Reset();
    EXPECT_EQ(MCSetEncodeParam(host.handle, nullptr), 1); // completes what is set
    EXPECT_EQ(Get().nWidth, 640);
    EXPECT_NE(Trace(Part::kLog).find("Flie format[], Video[] (640x480)"), std::string::npos)
        << Trace(Part::kLog);
}

TEST_F(ParamTest, LogsEveryValueInItsPlace) {
    host.hasVideo = false;
    host.audio.descriptions = 0;
    host.Create();
    const EncodeParam param{
        FourCC("H264"), 0, 0, 1, -2, 250.0, 5, 4, 6, 7, {}, FourCC("MP3 "), 9, 8, 0, 11, 10, 12, 0, 0,
        FourCC("AVI ")};
    EXPECT_TRUE(SameBytes(Set(param), param)) << "there is nothing to complete it from";
    EXPECT_EQ(Trace(Part::kLog),
              "log Halvane::SetEncodeParam: Flie format[AVI ], Video[H264] (1x-2) 250.000000fps, 4bps 5 6bps "
              "Resize:7\\t\\tAudio[MP3 ]8channels 9Hz , 10bps 11 12bps\n");
}

TEST_F(ParamTest, FrameRatesAbove200AreNotBelieved) {
    host.Create();
    EncodeParam param = Get();
    param.dFrameRate = 200.0;
    EXPECT_EQ(+Set(param).dFrameRate, 200.0);
    param.dFrameRate = 200.5;
    EXPECT_EQ(+Set(param).dFrameRate, 30.0);
    param.dFrameRate = -1.0;
    host.video.Format().dFrameRate = 1000.0;
    EXPECT_EQ(+Set(param).dFrameRate, 30.0);
    host.video.descriptions = 0;
    param.dFrameRate = 500.0;
    EXPECT_EQ(+Set(param).dFrameRate, 30.0);
}

TEST_F(ParamTest, FormatsSwitchOffWhatTheyCannotCarry) {
    const auto format = [](uint32_t code, int hasAudio, int hasVideo) {
        return FileFormatInfo{code, "", "", {}, {}, {}, hasAudio, hasVideo, {}};
    };
    const FileFormatInfo table[] = {format(FourCC("MP3 "), 1, 0), format(FourCC("GIF "), 0, 1),
                                    format(FourCC("MP4 "), 1, 1), FileFormatInfo{},
                                    format(FourCC("WAV "), 0, 0)}; // behind the end
    const struct {
        uint32_t format;
        int asked, noVideo, noAudio;
    } cases[] = {{FourCC("MP3 "), 0, 1, 0},
                 {FourCC("GIF "), 0, 0, 1},
                 {FourCC("WAV "), 0, 0, 0},
                 {FourCC("MP4 "), 7, 7, 0}}; // the table never switches on
    recorder::Reset({.formats = table});
    host.Create();
    EncodeParam param = Get();
    for (const auto& test : cases) {
        param.fccFileFormat = test.format;
        param.bNoVideo = test.asked;
        const EncodeParam set = Set(param);
        EXPECT_EQ(set.bNoVideo, test.noVideo) << &test - cases;
        EXPECT_EQ(set.bNoAudio, test.noAudio) << &test - cases;
    }
}

TEST(EstimateTest, FollowsTheRates) {
    struct Rate {
        int32_t mode, target, maximum, off;
    };
    constexpr Rate kVideo{0, 512000, 0, 0};
    constexpr Rate kAudio{0, 128000, 0, 0};
    constexpr Rate kNone{0, 0, 0, 0};
    const struct {
        Rate video, audio;
        double seconds;
        long long bytes;
    } cases[] = {
        {kVideo, kAudio, 60.0, 4800000},
        {{0, 512000, 0, 1}, kAudio, 10.0, 160000},
        {kVideo, {0, 128000, 0, 1}, 10.0, 640000},
        {{1, 512000, 1000000, 0}, kNone, 8.0, 804800},
        {kNone, {-1, 24, 24, 0}, 8.0, 23 / 8 * 8},            // 9 + 14: each quotient is cut by itself
        {{1, 600000000, 0, 0}, kNone, 1.0, -23687091},        // 4 * 600000000 wraps to -1894967296
        {{1, 0, 400000000, 0}, kNone, 1.0, -23687091},        // 6 * 400000000 wraps as well
        {{0, INT_MAX, 0, 0}, {0, 1, 0, 0}, 1.0, INT_MIN / 8}, // and so does the sum
        {{0, 800000000, 0, 0}, kNone, 0.0000099, 0},          // so short a time counts as none
        {{0, 800000000, 0, 0}, kNone, 0.00001, 1000},
        {kVideo, kAudio, -5.0, 0},
        {kVideo, kAudio, 1e30, LLONG_MAX},
        {kVideo, kAudio, NAN, 0},
    };
    for (const auto& [video, audio, seconds, bytes] : cases) {
        const EncodeParam param{
            0,         0,         0, 0, 0,          0.0,          video.mode,    video.target, video.maximum,
            0,         {},                                                       // pictures
            0,         0,         0, 0, audio.mode, audio.target, audio.maximum, // sound
            video.off, audio.off, 0};
        EXPECT_EQ(MCGetEstimateDiskSpaceEx(&param, seconds), bytes) << video.target << " " << seconds;
    }
}

/// The names of the clips of one conversion of `pictures` pictures, each a clip of its own.
std::vector<std::wstring> ClipNames(ScriptedHost& host, const std::wstring& output, size_t pictures) {
    host.SetMovie(pictures, 0);
    host.Split(0);
    MCSetOutputFile(host.handle, output.c_str());
    host.Convert();
    std::vector<std::wstring> names;
    for (int i = 0; i < MCGetTargetCount(host.handle); ++i) {
        wchar_t name[MC_MAX_TARGET_NAME];
        EXPECT_EQ(MCGetTargetFileName(host.handle, name, i), 1);
        names.emplace_back(name);
    }
    return names;
}

TEST(ClipTest, NumberComesBeforeTheExtension) {
    const wchar_t* cases[][2] = {{L"/Users/me/out.mp4", L"/Users/me/out_00.mp4"},
                                 {L"/tmp/a.b/movie", L"/tmp/a_00.b/movie"},
                                 {L"movie", L"movie_00"},
                                 {L".mp4", L"_00.mp4"},
                                 {L"a.", L"a_00."},
                                 {L"%d%n%ls.%02d", L"%d%n%ls_00.%02d"},
                                 {L"\u4e2d\u00fc\U0001F3AC.mp4", L"\u4e2d\u00fc\U0001F3AC_00.mp4"},
                                 {L"", L"_00"}};
    for (const auto& test : cases) {
        ScriptedHost host;
        EXPECT_EQ(ClipNames(host, test[0], 1), std::vector<std::wstring>{test[1]});
    }
}

TEST(ClipTest, NumbersGoOn) {
    ScriptedHost host;
    const std::vector<std::wstring> names = ClipNames(host, L"out.mp4", 101);
    ASSERT_EQ(names.size(), 101U);
    EXPECT_EQ(names[9], L"out_09.mp4");
    EXPECT_EQ(names[100], L"out_100.mp4");

    EXPECT_EQ(ClipNames(host, L"out.mp4", 101).back(), L"out_101.mp4") << "the second conversion's";

    wchar_t name[MC_MAX_TARGET_NAME] = L"untouched";
    for (const int index : {-1, 102})
        EXPECT_EQ(MCGetTargetFileName(host.handle, name, index), 0);
    EXPECT_STREQ(name, L"untouched");
}

TEST(ClipTest, WithoutSplittingThereAreNone) {
    for (const int mode : {0, 2, -1}) {
        ScriptedHost host;
        host.SetMovie(3, 0);
        host.Create();
        MCSetSplitParam(host.handle, mode, 0);
        EXPECT_EQ(host.Convert().rfind("create out.mp4 ", 0), 0U) << mode;
        EXPECT_EQ(MCGetTargetCount(host.handle), 0);
    }
}

// A name that does not fit whole is not used: cut names would be the same for all clips. The number of the
// hundredth clip takes one more character; the files before it are complete.
TEST(ClipTest, NamesAreNeverCut) {
    constexpr size_t kAll = 102;
    const std::wstring extension19 = L"." + std::wstring(18, L'e');
    const std::pair<std::wstring, size_t> cases[] = {
        {std::wstring(503, L'x') + L".mp4", kAll},
        {std::wstring(504, L'x') + L".mp4", 100},
        {std::wstring(505, L'x') + L".mp4", 0},
        {std::wstring(508, L'x'), 100},
        {std::wstring(600, L'x'), 0},
        {L"x" + extension19, kAll},
        {L"x" + extension19 + L"e", 0},
    };
    for (const auto& [output, clips] : cases) {
        SCOPED_TRACE(testing::Message() << output.size() << " characters");
        ScriptedHost host;
        EXPECT_EQ(ClipNames(host, output, kAll).size(), clips);
        const std::string trace = Trace(Part::kWithoutLog);
        EXPECT_EQ(trace.find("event finished 3\nfinished 3 without record\n") != std::string::npos,
                  clips < kAll);
        EXPECT_EQ(trace.find("close #0 with callback and context\n") != std::string::npos, clips == 100);
        EXPECT_EQ(Trace(Part::kLog).find("output name too long") != std::string::npos, clips < kAll);
    }
}

} // namespace
