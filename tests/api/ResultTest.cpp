// What MCGetResult tells of conversions whose parts do something wrong, with a media writer that has the five
// functions only.
#include "tests/api/TableSource.h"
#include "tests/recorder/RecordingWriter.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <functional>
#include <ostream>
#include <stdexcept>
#include <string>

namespace {

constexpr unsigned kGoOn = 1;

struct Case {
    const char* name;
    int category;
    unsigned outcome;
    int64_t pictures = 10; // sent
    const char* what = ""; // in the sentence
    recorder::Behaviour writer = {};
    std::function<void(TableSource&)> change = [](TableSource&) {};
    std::function<unsigned(MCHandle)> onProgress = [](MCHandle) { return kGoOn; };
    bool stopOnFailure = false;
};

void PrintTo(const Case& test, std::ostream* out) {
    *out << test.name;
}

std::function<void(TableSource&)> PictureFive(const std::function<int(VideoImage&)>& change) {
    return [change](TableSource& source) {
        source.onPicture = [change](int number, VideoImage& image) {
            return number == 5 ? change(image) : 1;
        };
    };
}

std::vector<Case> Cases() {
    std::vector<Case> cases;
    cases.push_back({"Fine", MC_RESULT_DONE, kOutcomeCompleted});
    cases.push_back(
        {"AWriteIsRefused", MC_RESULT_REFUSED, kOutcomeCompleted, 10, "not taken", {.takenWrites = 7}});
    cases.push_back({.name = "AWriteIsRefusedAndThatStops",
                     .category = MC_RESULT_REFUSED,
                     .outcome = kOutcomeStopped,
                     .pictures = 2,
                     .what = "not taken",
                     .writer = {.takenWrites = 4},
                     .stopOnFailure = true});
    cases.push_back({"ACloseFails",
                     MC_RESULT_WRITE,
                     kOutcomeCompleted,
                     10,
                     "complete the file",
                     {.failingCloses = true}});
    cases.push_back({"ACreateFails",
                     MC_RESULT_CANNOT_OPEN,
                     kOutcomeFailed,
                     0,
                     "create the file",
                     {.failingCreates = {1}}});
    cases.push_back({.name = "ThePictureSourceReportsAnError",
                     .category = MC_RESULT_SOURCE,
                     .outcome = kOutcomeCompleted,
                     .pictures = 5,
                     .what = "picture source reported an error (-17) after 5",
                     .change = PictureFive([](VideoImage&) { return -17; })});
    cases.push_back({.name = "TheSoundSourceReportsAnError",
                     .category = MC_RESULT_SOURCE,
                     .outcome = kOutcomeCompleted,
                     .what = "sound source reported an error (-3) after 4",
                     .change = [](TableSource& source) {
                         source.onBlock = [](int number, AudioFrame&) { return number == 4 ? -3 : 1; };
                     }});
    cases.push_back(
        {.name = "NoPictureEverComes",
         .category = MC_RESULT_SOURCE,
         .outcome = kOutcomeCompleted,
         .pictures = 0,
         .what = "gave none",
         .change = [](TableSource& source) { source.onPicture = [](int, VideoImage&) { return 0; }; }});
    cases.push_back(
        {.name = "APictureFunctionThrows",
         .category = MC_RESULT_SOURCE,
         .outcome = kOutcomeFailed,
         .pictures = 5,
         .what = "the camera is gone",
         .change = PictureFive([](VideoImage&) -> int { throw std::runtime_error("the camera is gone"); })});
    cases.push_back({.name = "ASoundFunctionThrowsNoException",
                     .category = MC_RESULT_SOURCE,
                     .outcome = kOutcomeFailed,
                     .pictures = 2,
                     .what = "threw",
                     .change = [](TableSource& source) {
                         source.onBlock = [](int number, AudioFrame&) { return number == 4 ? throw 7 : 1; };
                     }});
    cases.push_back({.name = "TheCallbackThrows",
                     .category = MC_RESULT_CALLBACK,
                     .outcome = kOutcomeCancelled,
                     .pictures = 2,
                     .what = "callback threw",
                     .onProgress = [](MCHandle) -> unsigned { throw std::runtime_error(""); }});
    cases.push_back({.name = "TheCallbackCancels",
                     .category = MC_RESULT_CANCELLED,
                     .outcome = kOutcomeCancelled,
                     .pictures = 2,
                     .onProgress = [](MCHandle) { return 0U; }});
    cases.push_back({.name = "TheCallbackStops",
                     .category = MC_RESULT_STOPPED,
                     .outcome = kOutcomeStopped,
                     .pictures = 2,
                     .onProgress = [](MCHandle handle) { return static_cast<unsigned>(MCAbort(handle)); }});
    cases.push_back({.name = "TheCallbackCallsMCStopWhichIsRefused",
                     .category = MC_RESULT_DONE,
                     .outcome = kOutcomeCompleted,
                     .onProgress = [](MCHandle handle) {
                         EXPECT_EQ(MCStop(handle), 0);
                         return kGoOn;
                     }});
    return cases;
}

class ResultOfAFault : public testing::TestWithParam<Case> {
protected:
    /// Comes on the worker; the results that a host sees meanwhile.
    static unsigned Report(void* context, unsigned kind, unsigned value, uintptr_t) {
        auto& self = *static_cast<ResultOfAFault*>(context);
        const MCResult result = ResultOf(self.handle);
        if (kind == 1) {
            self.outcome = value;
            EXPECT_EQ(result.nOutcome, static_cast<int32_t>(value));
            return kGoOn;
        }
        EXPECT_EQ(result.bDone, 0);
        EXPECT_EQ(result.nOutcome, -1);
        return GetParam().onProgress(self.handle);
    }

    MCHandle handle = nullptr;
    unsigned outcome = 99;
};

TEST_P(ResultOfAFault, IsTold) {
    const Case& test = GetParam();
    recorder::Reset(test.writer);
    TableSource source;
    test.change(source);
    const MCVideoSource video = source.Video();
    const MCAudioSource audio = source.Audio();
    handle = MCCreateFromSources(&video, &audio);
    ASSERT_NE(handle, nullptr);
    EXPECT_EQ(ResultOf(handle).nCategory, MC_RESULT_NONE);
    MCSetOutputFile(handle, L"/tmp/m\u00fcsli.mp4");
    EXPECT_EQ(MCEnableStopOnFailure(handle, test.stopOnFailure), unsigned{test.stopOnFailure});
    ASSERT_EQ(MCStart(handle, 0.0, 0.0, nullptr, Report, this), 0);
    ASSERT_EQ(MCWait(handle, MC_INFINITE), 0);

    const MCResult result = ResultOf(handle);
    EXPECT_EQ(outcome, test.outcome);
    EXPECT_EQ(result.nCategory, test.category) << result.szWhat;
    EXPECT_EQ(result.bDone, test.category == MC_RESULT_DONE);
    EXPECT_EQ(result.llPicturesSent, test.pictures);
    EXPECT_NE(std::string(result.szWhat).find(test.what), std::string::npos) << result.szWhat;
    const bool ofTheFile = test.category == MC_RESULT_REFUSED || test.category == MC_RESULT_WRITE ||
                           test.category == MC_RESULT_CANNOT_OPEN;
    EXPECT_STREQ(result.szPath, ofTheFile ? "/tmp/m\u00fcsli.mp4" : "");

    const recorder::Recording recording = recorder::Recorded();
    EXPECT_EQ(result.llPicturesSent, static_cast<int64_t>(recording.pictures.size()));
    EXPECT_EQ(result.llPicturesWritten + result.llPicturesRefused, result.llPicturesSent);
    int64_t samples = 0; // the sound's and the silence's that follows it
    for (const AudioFrame& block : recording.sounds)
        samples += block.nLength / 2;
    EXPECT_EQ(result.llSamplesSent, samples);
    EXPECT_EQ(result.llSamplesWritten + result.llSamplesRefused, result.llSamplesSent);
    EXPECT_EQ(result.nFilesCreated, test.category == MC_RESULT_CANNOT_OPEN ? 0 : 1);
    EXPECT_EQ(result.nFilesComplete, result.nFilesCreated == 1 && !test.writer.failingCloses ? 1 : 0);
    EXPECT_EQ(source.releases, 0);
    MCDestroy(handle);
    EXPECT_EQ(source.releases, 2);
}

INSTANTIATE_TEST_SUITE_P(Faults, ResultOfAFault, testing::ValuesIn(Cases()),
                         [](const auto& info) { return std::string(info.param.name); });

// Pictures follow the sound, whose clock counts its bytes.
TEST(ResultTest, PicturesThatTheSoundMovesAreTold) {
    const struct {
        const char* name;
        std::function<int(int, AudioFrame&)> onBlock;
        int64_t restamped;
        double shift; // seconds
    } cases[] = {
        {"stamps as described", [](int, AudioFrame&) { return 1; }, 0, 0.0},
        {"jitter of 9 ms",
         [](int n, AudioFrame& b) {
             b.llTime = n * 500000 + (n % 2) * 90000;
             return 1;
         },
         0, 0.0},
        {"a gap of 1 s after half of it",
         [](int n, AudioFrame& b) {
             b.llTime = n * 500000 + (n < 10 ? 0 : 10000000);
             return 1;
         },
         5, -1.0},
        {"blocks twice as long as their stamps say",
         [](int n, AudioFrame& b) {
             b.llTime = n * 500000;
             b.nLength *= 2;
             return 1;
         },
         9, 0.9},
    };
    for (const auto& row : cases) {
        SCOPED_TRACE(row.name);
        recorder::Reset();
        TableSource source;
        source.onBlock = row.onBlock;
        const MCVideoSource video = source.Video();
        const MCAudioSource audio = source.Audio();
        const MCHandle handle = MCCreateFromSources(&video, &audio);
        MCStart(handle, 0.0, 0.0, nullptr, nullptr, nullptr);
        MCWait(handle, MC_INFINITE);
        const MCResult result = ResultOf(handle);
        EXPECT_EQ(result.llPicturesRestamped, row.restamped);
        EXPECT_NEAR(static_cast<double>(result.llLargestShift) / kTicksPerSecond, row.shift, 1e-6);
        int told = 0;
        for (const std::string& line : recorder::Recorded().trace)
            told += line.find("Sound is the clock") != std::string::npos;
        EXPECT_EQ(told, row.restamped > 0 ? 1 : 0);
        MCDestroy(handle);
    }
}

TEST(ResultTest, LaterConversionsBeginAtTheStartOfTables) {
    TableSource source;
    const MCVideoSource video = source.Video();
    const MCAudioSource audio = source.Audio();
    for (const bool withSound : {false, true}) {
        SCOPED_TRACE(withSound);
        source.picture = source.block = source.seeks = 0;
        const MCHandle handle = MCCreateFromSources(&video, withSound ? &audio : nullptr);
        for (const int seeks : {0, withSound ? 2 : 1}) {
            recorder::Reset();
            MCStart(handle, 0.0, 0.0, nullptr, nullptr, nullptr);
            MCWait(handle, MC_INFINITE);
            EXPECT_EQ(ResultOf(handle).nCategory, MC_RESULT_DONE) << ResultOf(handle).szWhat;
            const recorder::Recording recording = recorder::Recorded();
            ASSERT_EQ(recording.pictures.size(), 10U);
            EXPECT_EQ(int64_t{recording.pictures.front().llTime}, 0); // a packed record
            EXPECT_EQ(source.seeks, seeks);
        }
        MCDestroy(handle);
    }
}

// Every picture once over both, whatever of them the first one has left.
TEST(ResultTest, LaterConversionsGoOnWithTablesThatCannotBeSought) {
    TableSource source;
    MCVideoSource video = source.Video();
    video.pfnSeek = nullptr;
    const MCHandle handle = MCCreateFromSources(&video, nullptr);
    std::vector<int64_t> times;
    for (const double length : {0.5, 0.0}) {
        recorder::Reset();
        MCStart(handle, 0.0, length, nullptr, nullptr, nullptr);
        MCWait(handle, MC_INFINITE);
        EXPECT_EQ(ResultOf(handle).nCategory, MC_RESULT_DONE) << ResultOf(handle).szWhat;
        const recorder::Recording recording = recorder::Recorded();
        for (const VideoImage& picture : recording.pictures)
            times.push_back(int64_t{picture.llTime2}); // a packed record
    }
    MCDestroy(handle);
    EXPECT_EQ(source.picture, 10);
    ASSERT_EQ(times.size(), 10U);
    for (std::size_t i = 0; i < times.size(); ++i)
        EXPECT_EQ(times[i], static_cast<int64_t>(i) * 1'000'000);
}

TEST(ResultTest, RecordsOfOtherSizes) {
    TableSource source;
    const MCVideoSource video = source.Video();
    const MCHandle handle = MCCreateFromSources(&video, nullptr);
    struct {
        MCResult result;
        unsigned char behind[16];
    } record;
    for (const uint32_t size : {0U, static_cast<uint32_t>(sizeof(MCResult)) - 1}) {
        std::memset(&record, 0xEE, sizeof record);
        record.result.nSize = size;
        EXPECT_EQ(MCGetResult(handle, &record.result), 0);
        EXPECT_EQ(record.result.nCategory, static_cast<int32_t>(0xEEEEEEEE));
    }
    record.result.nSize = sizeof record; // of a newer program
    EXPECT_EQ(MCGetResult(handle, &record.result), 1);
    EXPECT_EQ(record.result.nSize, sizeof(MCResult));
    EXPECT_EQ(record.behind[0], 0xEE);
    EXPECT_EQ(MCGetResult(handle, nullptr), 0);
    EXPECT_EQ(MCGetResult(nullptr, &record.result), 0);
    MCDestroy(handle);
}

TEST(ParamForFile, IsChosenByTheExtension) {
    FileFormatInfo formats[4] = {};
    const auto fill = [](FileFormatInfo& format, const char* code, const char* extensions) {
        std::memcpy(&format.fccFormat, code, 4);
        std::snprintf(format.szExtensions, sizeof format.szExtensions, "%s", extensions);
        format.bHasAudio = 1;
    };
    fill(formats[0], "MP4 ", "mp4,m4v");
    formats[0].bHasVideo = 1;
    formats[0].fccVideoCodecs[0] = FourCC("XVID");
    formats[0].fccVideoCodecs[1] = FourCC("H264");
    formats[0].fccAudioCodecs[0] = FourCC("AAC ");
    fill(formats[1], "WEBM", "webm");
    formats[1].bHasVideo = 1;
    formats[1].fccVideoCodecs[0] = FourCC("VP80");
    formats[1].fccAudioCodecs[0] = FourCC("VORB");
    fill(formats[2], "MP3 ", "mp3");
    formats[2].fccAudioCodecs[0] = FourCC("MP3 ");
    recorder::Reset({.formats = formats});
    const struct {
        const wchar_t* name;
        uint32_t format, video, audio;
        int noVideo;
    } cases[] = {{L"/a.b/out.MP4", FourCC("MP4 "), FourCC("H264"), FourCC("AAC "), 0},
                 {L"x.m4v", FourCC("MP4 "), FourCC("H264"), FourCC("AAC "), 0},
                 {L".webm", FourCC("WEBM"), FourCC("VP80"), FourCC("VORB"), 0},
                 {L"x.mp4.mp3", FourCC("MP3 "), 0, FourCC("MP3 "), 1}};
    for (const auto& row : cases) {
        EncodeParam param;
        std::memset(static_cast<void*>(&param), 0xEE, sizeof param);
        ASSERT_EQ(MCEncodeParamForFile(row.name, &param), 1);
        EXPECT_EQ(param.fccFileFormat, row.format);
        EXPECT_EQ(param.fccVideo, row.video);
        EXPECT_EQ(param.fccAudio, row.audio);
        EXPECT_EQ(param.bNoVideo, row.noVideo);
        EXPECT_EQ(param.nWidth | param.nHeight | param.nSampleRate | param.nChannels, 0);
        EXPECT_GT(param.nVideoBitrate, 0);
        EXPECT_EQ(param.nReserved[0], 0U);
    }
    for (const wchar_t* name : {L"mp4", L"x.mp", L"x.mp4 ", L"x.", L"x.mp4/y", L"", L"x.mp4,m4v"}) {
        EncodeParam param;
        std::memset(static_cast<void*>(&param), 0xEE, sizeof param);
        EXPECT_EQ(MCEncodeParamForFile(name, &param), 0);
        EXPECT_EQ(param.fccFileFormat, 0xEEEEEEEE);
    }
    EncodeParam param;
    EXPECT_EQ(MCEncodeParamForFile(nullptr, &param), 0);
    EXPECT_EQ(MCEncodeParamForFile(L"x.mp4", nullptr), 0);
    recorder::Reset();
    EXPECT_EQ(MCEncodeParamForFile(L"x.mp4", &param), 0);
}

} // namespace
