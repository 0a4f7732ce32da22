// Encoding parameters, the estimate, and clip names.
#include "tests/engine/ScriptedHost.h"

#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <cstring>
#include <cwchar>
#include <utility>

namespace {

/// The record's fields as text, in their order.
std::string Describe(const EncodeParam& p) {
    char text[400];
    snprintf(text, sizeof text,
             "%.4s %.4s %d %d %d %g %d %d %d %d %u%u%u%u%u %.4s %d %d %d %d %d %d %d %d %.4s",
             reinterpret_cast<const char*>(&p.fccVideo), reinterpret_cast<const char*>(&p.fccColorFormat),
             p.nBitCount, p.nWidth, p.nHeight, p.dFrameRate, p.nVideoRateMode, p.nVideoBitrate,
             p.nVideoMaxBitrate, p.bResize, p.nReserved[0], p.nReserved[1], p.nReserved[2], p.nReserved[3],
             p.nReserved[4], reinterpret_cast<const char*>(&p.fccAudio), p.nSampleRate, p.nChannels,
             p.nBitsPerSample, p.nAudioRateMode, p.nAudioBitrate, p.nAudioMaxBitrate, p.bNoVideo, p.bNoAudio,
             reinterpret_cast<const char*>(&p.fccFileFormat));
    return text;
}

class ParamTest : public testing::Test {
protected:
    ParamTest() {
        host.video.Format() = {640, 480, 29.97, 12.5};
        host.audio.Format() = {44100, 2, 8, 176400, 0.125};
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

TEST_F(ParamTest, DefaultsComeFromTheSourcesThatThereAre) {
    struct {
        bool hasVideo, videoOpens, audioOpens;
        const char *pictures, *sound;
    } const cases[] = {
        {true, true, true, "640 480 29.97", "44100"},
        {true, false, false, "320 240 24", "22050"},
        {false, true, true, "320 240 24", "44100"},
    };
    for (const auto& test : cases) {
        host.hasVideo = test.hasVideo;
        host.video.opens = test.videoOpens;
        host.audio.opens = test.audioOpens;
        host.Create();
        EXPECT_EQ(Describe(Get()), std::string("XVID YV12 12 ") + test.pictures +
                                       " 0 512000 0 0 00000 AAC  " + test.sound +
                                       " 2 16 0 128000 0 0 0 MP4 ");
        EXPECT_EQ(MCGetEncodeParam(host.handle, nullptr), 1);
        MCDestroy(std::exchange(host.handle, nullptr));
    }
}

TEST_F(ParamTest, ZerosAreCompletedAndLoggedAsTheyCame) {
    host.Create();
    EncodeParam param{};
    param.nReserved[4] = 9;
    const EncodeParam set = Set(param);
    param.nWidth = 640;
    param.nHeight = 480;
    param.dFrameRate = 29.97;
    param.nVideoBitrate = 512000;
    param.nSampleRate = 44100;
    param.nChannels = 2;
    param.nBitsPerSample = 8;
    param.nAudioBitrate = 64000;
    EXPECT_EQ(std::memcmp(&set, &param, sizeof set), 0);
    EXPECT_EQ(LogLines(),
              "Halvane::SetEncodeParam: Flie format[], Video[] (0x0) 0.000000fps, 0bps 0 0bps "
              "Resize:0\\t\\tAudio[]0channels 0Hz , 0bps 0 0bps\n"
              "Halvane::Source Video Info: (640x480) 29.970000fps, 12.500000 seconds.\n"
              "Halvane::Source Audio Info: 44100Hz 2channels, 176400bps 8bits 1.250000e-01second.\n");

    recorder::Reset();
    EXPECT_EQ(MCSetEncodeParam(host.handle, nullptr), 1); // completes what is set
    EXPECT_EQ(Get().nWidth, 640);
    EXPECT_NE(LogLines().find("Flie format[], Video[] (640x480)"), std::string::npos) << LogLines();
}

TEST_F(ParamTest, LogsEveryValueInItsPlace) {
    host.hasVideo = false;
    host.audio.opens = false;
    host.Create();
    EncodeParam param{};
    param.fccFileFormat = FourCC("AVI ");
    param.fccVideo = FourCC("H264");
    param.fccAudio = FourCC("MP3 ");
    param.nWidth = 1;
    param.nHeight = -2;
    param.dFrameRate = 250.0;
    param.nVideoBitrate = 4;
    param.nVideoRateMode = 5;
    param.nVideoMaxBitrate = 6;
    param.bResize = 7;
    param.nChannels = 8;
    param.nSampleRate = 9;
    param.nAudioBitrate = 10;
    param.nAudioRateMode = 11;
    param.nAudioMaxBitrate = 12;
    const EncodeParam set = Set(param);
    EXPECT_EQ(std::memcmp(&set, &param, sizeof set), 0) << "there is nothing to complete it from";
    EXPECT_EQ(LogLines(),
              "Halvane::SetEncodeParam: Flie format[AVI ], Video[H264] (1x-2) 250.000000fps, 4bps 5 6bps "
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
    host.video.opens = false;
    param.dFrameRate = 500.0;
    param.nVideoBitrate = 0;
    EXPECT_EQ(+Set(param).dFrameRate, 30.0);
    EXPECT_EQ(Get().nVideoBitrate, 0);
}

TEST_F(ParamTest, FormatsSwitchOffWhatTheyCannotCarry) {
    const auto format = [](uint32_t code, int hasAudio, int hasVideo) {
        FileFormatInfo info{};
        info.fccFormat = code;
        info.bHasAudio = hasAudio;
        info.bHasVideo = hasVideo;
        return info;
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
    recorder::SetFormatTable(table);
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

TEST_F(ParamTest, WriterGetsTheParametersInForce) {
    host.video.stamps = {0};
    host.hasAudio = false;
    host.Create();
    EncodeParam param = Get();
    param.nWidth = 99;
    Set(param);
    host.Convert();
    ASSERT_EQ(recorder::Params().size(), 1U);
    EXPECT_EQ(recorder::Params()[0].nWidth, 99);
    EXPECT_EQ(recorder::Params()[0].bNoAudio, 1);
    EXPECT_EQ(recorder::Params()[0].bNoVideo, 0);
}

struct Estimate {
    int32_t videoMode, video, videoMax, noVideo;
    int32_t audioMode, audio, audioMax, noAudio;
    double seconds;
    long long bytes;
};

TEST(EstimateTest, FollowsTheRates) {
    const Estimate cases[] = {
        {0, 512000, 0, 0, 0, 128000, 0, 0, 60.0, 4800000},   {0, 512000, 0, 1, 0, 128000, 0, 0, 10.0, 160000},
        {0, 512000, 0, 0, 0, 128000, 0, 1, 10.0, 640000},    {1, 512000, 1000000, 0, 0, 0, 0, 0, 8.0, 804800},
        {0, 0, 0, 0, -1, 19, 19, 0, 8.0, 18 / 8 * 8},     // 7 + 11: each quotient is cut by itself
        {1, 600000000, 0, 0, 0, 0, 0, 0, 1.0, -23687091}, // 4 * 600000000 wraps to -1894967296
        {1, 0, 400000000, 0, 0, 0, 0, 0, 1.0, -23687091}, // 6 * 400000000 wraps as well
        {0, INT_MAX, 0, 0, 0, 1, 0, 0, 1.0, INT_MIN / 8}, // and so does the sum
        {0, 512000, 0, 0, 0, 128000, 0, 0, 0.000001, 0},     {0, 512000, 0, 0, 0, 128000, 0, 0, 0.00001, 0},
        {0, 512000, 0, 0, 0, 128000, 0, 0, 0.00002, 1},      {0, 512000, 0, 0, 0, 128000, 0, 0, -5.0, 0},
        {0, 512000, 0, 0, 0, 128000, 0, 0, 1e30, LLONG_MAX}, {0, 512000, 0, 0, 0, 128000, 0, 0, NAN, 0},
    };
    for (const Estimate& test : cases) {
        EncodeParam param{};
        param.nVideoRateMode = test.videoMode;
        param.nVideoBitrate = test.video;
        param.nVideoMaxBitrate = test.videoMax;
        param.bNoVideo = test.noVideo;
        param.nAudioRateMode = test.audioMode;
        param.nAudioBitrate = test.audio;
        param.nAudioMaxBitrate = test.audioMax;
        param.bNoAudio = test.noAudio;
        EXPECT_EQ(MCGetEstimateDiskSpaceEx(&param, test.seconds), test.bytes) << &test - cases;
    }
    EXPECT_EQ(MCGetEstimateDiskSpaceEx(nullptr, 10.0), 0);
}

TEST(EstimateTest, FreeSpaceIsNotAsked) {
    EXPECT_EQ(MCGetDiskFreeSpace(nullptr), 0);
    EXPECT_EQ(MCGetDiskFreeSpace(L""), 0);
    EXPECT_EQ(MCGetDiskFreeSpace(L"/no/such/place"), 4294967295LL);
}

/// The names of the clips of one conversion of `pictures` pictures, each a clip of its own.
std::vector<std::wstring> ClipNames(ScriptedHost& host, const std::wstring& output, size_t pictures) {
    host.hasAudio = false;
    host.video.stamps = Stamps(0, kSecond / 10, pictures);
    host.video.Format().dDuration = 1.0;
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

    recorder::Reset();
    host.video.staysAtLast = true;
    host.Convert();
    EXPECT_EQ(MCGetTargetCount(host.handle), 102);

    wchar_t name[MC_MAX_TARGET_NAME] = L"untouched";
    EXPECT_EQ(MCGetTargetFileName(host.handle, name, -1), 0);
    EXPECT_EQ(MCGetTargetFileName(host.handle, name, 102), 0);
    EXPECT_STREQ(name, L"untouched");
    EXPECT_EQ(MCGetTargetFileName(host.handle, name, 101), 1);
    EXPECT_STREQ(name, L"out_101.mp4");
}

TEST(ClipTest, WithoutSplittingThereAreNone) {
    for (const int mode : {0, 2, -1}) {
        ScriptedHost host;
        host.hasAudio = false;
        host.video.stamps = Stamps(0, kSecond / 10, 3);
        host.Create();
        MCSetSplitParam(host.handle, mode, 0);
        EXPECT_EQ(host.Convert().rfind("create out.mp4 ", 0), 0U);
        EXPECT_EQ(MCGetTargetCount(host.handle), 0);
    }
}

// A name that does not fit whole is not used: cut names would be the same for all clips.
TEST(ClipTest, NamesAreNeverCut) {
    const std::wstring extension19 = L"." + std::wstring(18, L'e');
    const auto named = [](const std::wstring& output) {
        ScriptedHost host;
        return ClipNames(host, output, 1).size();
    };
    EXPECT_EQ(named(std::wstring(504, L'x') + L".mp4"), 1U);
    EXPECT_EQ(named(std::wstring(505, L'x') + L".mp4"), 0U);
    EXPECT_EQ(named(std::wstring(508, L'x')), 1U);
    EXPECT_EQ(named(std::wstring(600, L'x')), 0U);
    EXPECT_EQ(named(L"x" + extension19), 1U);
    EXPECT_EQ(named(L"x" + extension19 + L"e"), 0U);

    ScriptedHost host;
    ClipNames(host, std::wstring(600, L'x'), 1);
    EXPECT_EQ(TraceWithoutLog(), "event finished 3\nfinished 3 without record\n");
    EXPECT_NE(LogLines().find("output name too long"), std::string::npos);
}

// The hundredth clip's number takes one more character than there is room for. The file before it is
// complete.
TEST(ClipTest, NameMayOutgrowItsRoomLater) {
    ScriptedHost host;
    const std::vector<std::wstring> names = ClipNames(host, std::wstring(508, L'x'), 102);
    EXPECT_EQ(names.size(), 100U);
    const std::string trace = TraceWithoutLog();
    const std::string end =
        "close #100\nimage 100000000\nclose #0 with callback and context\nevent finished 3\n"
        "finished 3 without record\n";
    ASSERT_GT(trace.size(), end.size());
    EXPECT_EQ(trace.substr(trace.size() - end.size()), end);
}

} // namespace
