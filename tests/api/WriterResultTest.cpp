// MCGetResult over the real media writer: its word, and what is in the files.
#include "tests/api/TableSource.h"
#include "tests/support/Folder.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <csignal>
#include <filesystem>
#include <functional>
#include <ostream>
#include <string>

#include <sys/resource.h>

namespace {

std::wstring Wide(const std::string& text) {
    return {text.begin(), text.end()};
}

/// The converter of a movie for `path`, H.264 unless `change` says otherwise.
MCHandle Make(TableSource& source, const std::string& path, bool sound = true,
              const std::function<void(EncodeParam&)>& change = {}) {
    const MCVideoSource video = source.Video();
    const MCAudioSource audio = source.Audio();
    const MCHandle handle = MCCreateFromSources(&video, sound ? &audio : nullptr);
    EncodeParam param;
    EXPECT_EQ(MCEncodeParamForFile(Wide(path).c_str(), &param), 1);
    if (change)
        change(param);
    MCSetEncodeParam(handle, &param);
    MCSetOutputFile(handle, Wide(path).c_str());
    MCEnableEvents(handle, 0);
    return handle;
}

MCResult Convert(MCHandle handle) {
    MCStart(handle, 0.0, 0.0, nullptr, nullptr, nullptr);
    MCWait(handle, MC_INFINITE);
    return ResultOf(handle);
}

struct Case {
    const char* name;
    int category;
    int64_t refused = 0;
    bool complete = true;
    const char* what = "";
    std::function<int(int, VideoImage&)> onPicture = {};
    std::function<int(int, AudioFrame&)> onBlock = {};
    std::function<void(EncodeParam&)> change = {};
};

void PrintTo(const Case& test, std::ostream* out) {
    *out << test.name;
}

std::vector<Case> Cases() {
    const auto third = [](int number) { return number == 3; };
    return {
        {"Fine", MC_RESULT_DONE},
        {"EveryPictureOfAnotherFormat", MC_RESULT_REFUSED, 10, false, "nFormat",
         [](int, VideoImage& image) {
             image.nFormat = 1;
             return 1;
         }},
        {"OnePictureWithANullPlane", MC_RESULT_REFUSED, 1, true, "null",
         [=](int number, VideoImage& image) {
             if (third(number))
                 image.pV = nullptr;
             return 1;
         }},
        {"ASizeThatChanges", MC_RESULT_DONE, 0, true, "",
         [=](int number, VideoImage& image) {
             if (third(number))
                 image.nWidth = 16;
             return 1;
         }},
        {"ARateThatChanges",
         MC_RESULT_DONE,
         0,
         true,
         "",
         {},
         [](int number, AudioFrame& block) {
             if (number > 9)
                 block.nSampleRate = 16000;
             return 1;
         }},
        {"SoundWithoutData",
         MC_RESULT_REFUSED,
         0,
         false,
         "sound",
         {},
         [](int, AudioFrame& block) {
             block.pData = nullptr;
             return 1;
         }},
        {"ACodecThatTheFormatCannotCarry",
         MC_RESULT_FORMAT,
         0,
         false,
         "",
         {},
         {},
         [](EncodeParam& param) { param.fccVideo = FourCC("VP80"); }},
        {"AFormatThatThereIsNot",
         MC_RESULT_FORMAT,
         0,
         false,
         "",
         {},
         {},
         [](EncodeParam& param) { param.fccFileFormat = FourCC("NONE"); }},
    };
}

class WriterResultOf : public testing::TestWithParam<Case> {};

TEST_P(WriterResultOf, IsTold) {
    const Case& test = GetParam();
    const Folder folder;
    TableSource source;
    source.onPicture = test.onPicture;
    source.onBlock = test.onBlock;
    const MCHandle handle = Make(source, folder / "out.mp4", true, test.change);
    const MCResult result = Convert(handle);
    EXPECT_EQ(result.nCategory, test.category) << result.szWhat;
    EXPECT_EQ(result.bDone, test.category == MC_RESULT_DONE);
    EXPECT_NE(std::string(result.szWhat).find(test.what), std::string::npos) << result.szWhat;
    EXPECT_EQ(result.szWhat[0] == '\0', test.category == MC_RESULT_DONE);
    EXPECT_EQ(result.llPicturesRefused, test.refused);
    EXPECT_EQ(result.nFilesComplete, test.complete ? 1 : 0);
    EXPECT_EQ(std::filesystem::exists(folder / "out.mp4"), test.complete);
    if (test.complete) {
        EXPECT_EQ(result.llPicturesWritten, 10 - test.refused);
    }
    MCDestroy(handle);
}

INSTANTIATE_TEST_SUITE_P(Faults, WriterResultOf, testing::ValuesIn(Cases()),
                         [](const auto& info) { return std::string(info.param.name); });

// A limit of the file size, which writes meet as they do a full disk.
TEST(WriterResult, AFailingWriteStopsTheConversionAndSaysWhy) {
    std::signal(SIGXFSZ, SIG_IGN);
    rlimit before{};
    getrlimit(RLIMIT_FSIZE, &before);
    const rlimit little{300000, before.rlim_max};
    const Folder folder;
    for (const bool stops : {true, false}) {
        TableSource source;
        source.pictures = 3000;
        unsigned noise = 1;
        source.onPicture = [&](int, VideoImage&) {
            for (unsigned char& value : source.plane)
                value = static_cast<unsigned char>((noise = noise * 1664525 + 1013904223) >> 24);
            return 1;
        };
        const MCHandle handle = Make(source, folder / "out.mp4", false);
        MCEnableStopOnFailure(handle, stops);
        setrlimit(RLIMIT_FSIZE, &little);
        const MCResult result = Convert(handle);
        setrlimit(RLIMIT_FSIZE, &before);
        EXPECT_EQ(result.nCategory, MC_RESULT_WRITE) << result.szWhat;
        EXPECT_EQ(result.nSystemError, EFBIG);
        EXPECT_EQ(result.nOutcome, stops ? kOutcomeStopped : kOutcomeCompleted);
        EXPECT_EQ(result.llPicturesSent < 3000, stops);
        EXPECT_GT(result.llPicturesRefused, 0);
        EXPECT_STREQ(result.szPath, (folder / "out.mp4").c_str());
        EXPECT_FALSE(std::filesystem::exists(folder / "out.mp4"));
        MCDestroy(handle);
        TableSource next; // the failure was that conversion's alone
        const MCHandle second = Make(next, folder / "out.mp4");
        EXPECT_EQ(Convert(second).bDone, 1);
        MCDestroy(second);
        std::filesystem::remove(folder / "out.mp4");
    }
}

TEST(WriterResult, TwoConvertersDoNotWriteOneName) {
    const Folder folder;
    std::filesystem::create_directory(folder / "sub");
    TableSource firstSource;
    TableSource secondSource;
    MCResult other{};
    const MCHandle second = Make(secondSource, folder / "sub/../out.mp4");
    firstSource.onPicture = [&](int number, VideoImage&) {
        if (number == 5)
            other = Convert(second);
        return 1;
    };
    const MCHandle first = Make(firstSource, folder / "out.mp4");
    EXPECT_EQ(Convert(first).bDone, 1);
    EXPECT_EQ(other.nCategory, MC_RESULT_EXISTS) << other.szWhat;
    EXPECT_EQ(other.nOutcome, static_cast<int>(kOutcomeFailed));
    MCDestroy(second);
    MCDestroy(first);
    TableSource source;
    const MCHandle third = Make(source, folder / "out.mp4");
    EXPECT_EQ(Convert(third).bDone, 1) << "the name is free again";
    MCDestroy(third);
}

TEST(WriterResult, ClipsAreCountedTogether) {
    const Folder folder;
    TableSource source;
    source.pictures = 30;
    source.blocks = 60;
    const MCHandle handle = Make(source, folder / "out.mp4");
    MCSetSplitParam(handle, 1, 1000);
    const MCResult result = Convert(handle);
    EXPECT_EQ(result.bDone, 1) << result.szWhat;
    EXPECT_EQ(result.nFilesComplete, static_cast<int>(folder.Names().size()));
    EXPECT_GE(result.nFilesComplete, 3);
    EXPECT_EQ(result.llPicturesWritten, 30);
    EXPECT_EQ(result.llPicturesRestamped, 0);
    EXPECT_EQ(result.llSamplesSent, 60 * TableSource::kBlock);
    MCDestroy(handle);
}

} // namespace
