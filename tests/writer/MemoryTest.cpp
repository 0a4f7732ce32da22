// A lack of memory: allocations of the media writer and of the libraries under it fail, once or from one on,
// each time in a process of its own. There is a whole file or none, and who asked is told.
#include "MovieReader.h"
#include "TestSource.h"
#include "tests/engine/CountingAllocator.h"
#include "tests/faults/CrashReport.h"
#include "tests/support/Folder.h"
#include "tests/support/Process.h"
#include "text/Utf8.h"
#include "writer/WriterStatus.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <mutex>
#include <string>
#include <tuple>
#include <vector>

#include <unistd.h>

#ifdef MOVIECONV_SANITIZED
// The libraries keep no frame pointers: a stack that is walked by them ends at once, or goes astray. Only
// with whole stacks are the libraries' leaks told from ours, by tests/lsan.supp.
extern "C" __attribute__((visibility("default"))) const char* __asan_default_options() {
    return "fast_unwind_on_malloc=0";
}
#endif

namespace {

enum class Phase { kCreate, kWrite, kClose };

struct File {
    const char* name;
    uint32_t format, video, audio;
    int steps; // of 40 ms
    bool hasSound = true;
};

using Case = std::tuple<File, Phase, Lack>;

/// The allocation that is tried after `number`: the next one at first and in the long form, then ever later
/// ones.
int64_t After(int64_t number) {
#ifdef MOVIECONV_SANITIZED
    constexpr int64_t kDensity = 2;
#else
    constexpr int64_t kDensity = 32;
#endif
    return std::getenv("MOVIECONV_ENDURANCE") != nullptr ? number + 1 : number + 1 + number / kDensity;
}

constexpr int64_t kMost = 10000; // allocations of any phase

enum Ending { kFailed = 10, kNothingFailed = 11 };

struct News {
    int event;
    WriterStatus status;
};

std::mutex g_mutex; // a failure is told by a thread of the writer's
News g_news;        // the last that was told

void Listen(void* /*context*/, int event, const WriterStatus* status) {
    const std::lock_guard lock(g_mutex);
    g_news = {event, *status};
}

class Writing {
public:
    explicit Writing(const Case& what)
        : file_(std::get<File>(what)), phase_(std::get<Phase>(what)), lack_(std::get<Lack>(what)) {
        sound_.Next(kSamples, 0); // its memory
        WriterOptions options{};
        options.pfnListener = Listen;
        MWSetOptions(kWriterDefaultSet, &options);
        param_.fccFileFormat = file_.format;
        param_.fccVideo = file_.video;
        param_.fccAudio = file_.audio;
    }

    /// Creates, writes and closes the file while the allocation fails. Whether it has.
    bool Run(int64_t number) {
        const VideoFormat video{64, 48, 25.0, 1.0};
        const AudioFormat audio{44100, 2, 16, 44100 * 4, 1.0};
        void* handle = nullptr;
        Do(Phase::kCreate, number,
           [&] { handle = MWCreateMediaFile(wide_.c_str(), &param_, &video, &audio); });
        created = handle != nullptr;
        Do(Phase::kWrite, number, [&] {
            for (int step = 0; step < file_.steps; ++step) {
                if (file_.hasSound)
                    MWWriteAudioData(handle, &sound_.Next(kSamples, step * kStep));
                MWWriteVideoFrame(handle, &picture_.Paint(step, step * kStep));
            }
        });
        Do(Phase::kClose, number, [&] { complete = MWCloseMediaFile(handle, nullptr, nullptr) != 0; });
        FailAllocation(0);
        return failed_;
    }

    bool created = false;
    bool complete = false;
    Folder folder;
    const std::string path = folder / "movie";

private:
    static constexpr int kSamples = 1764;
    static constexpr int64_t kStep = 400'000;

    /// Calls with the allocation failing if this is the phase. A lasting lack outlives it.
    template <class Call>
    void Do(Phase phase, int64_t number, Call call) {
        if (phase == phase_)
            FailAllocation(number, lack_, TellPlace);
        call();
        if (phase == phase_ && (failed_ = FailAllocation(0)) && lack_ == Lack::kLasting)
            FailAllocation(1, lack_);
    }

    const File file_;
    const Phase phase_;
    const Lack lack_;
    const std::wstring wide_ = text::FromUtf8(path);
    TestPicture picture_{64, 48};
    TestSound sound_{44100, 2, 16};
    EncodeParam param_ = TestMovie::Param();
    bool failed_ = false;
};

/// The child's life.
int Attempt(const Case& what, int64_t number, const ReadMovie& whole) {
    alarm(120);
    ReportCrashes();
    Writing writing(what);
    const bool failed = writing.Run(number);
    const WriterStatus& status = g_news.status;
    EXPECT_EQ(g_news.event, writing.created ? kWriterEventClosed : kWriterEventRefused);
    EXPECT_EQ(status.nState, writing.complete ? kWriterFileComplete : kWriterFileFailed);
    EXPECT_EQ(std::filesystem::exists(writing.path), writing.complete);
    const std::vector<std::string> names = writing.folder.Names();
    if (writing.complete) {
        EXPECT_EQ(names.size(), 1U);
        ExpectSame(ReadMovieFile(writing.path), whole);
    } else {
        EXPECT_NE(status.nError, kWriterErrorNone);
        EXPECT_STRNE(status.szWhat, "");
        EXPECT_EQ(names, writing.created && status.llBytesWritten > 0 ? std::vector<std::string>{"movie.part"}
                                                                      : std::vector<std::string>{});
        const ReadMovie part = ReadMovieFile(writing.folder / "movie.part");
        EXPECT_TRUE(part.readable || part.pictures.empty());
    }
    if (testing::Test::HasFailure())
        return EXIT_FAILURE;
    return failed ? kFailed : kNothingFailed;
}

class MemoryTest : public testing::TestWithParam<Case> {};

TEST_P(MemoryTest, ALackOfItIsToldAndLeavesAWholeFileOrNone) {
    Writing unharmed(GetParam());
    unharmed.Run(0);
    ASSERT_TRUE(unharmed.complete);
    const ReadMovie whole = ReadMovieFile(unharmed.path);
    std::string faults;
    int64_t number = 1;
    for (ProcessResult ended{kFailed, "", ""}; ended.code != kNothingFailed && number < kMost;
         number = After(number)) {
        ended = InChild([&] {
            setenv("TMPDIR", unharmed.folder.Path().c_str(), 1); // so that a crash leaves nothing behind
            return Attempt(GetParam(), number, whole);
        });
        if (ended.code != kFailed && ended.code != kNothingFailed && !IsKnownCrash(ended.err))
            faults += "allocation " + std::to_string(number) + ": " + std::to_string(ended.code) + ended.out +
                      ended.err;
    }
    EXPECT_EQ(faults, "");
    EXPECT_LT(number, kMost);
}

constexpr File kFiles[] = {{"Mp4", FourCC("MP4 "), FourCC("XVID"), FourCC("AAC "), 12},
                           {"Mkv", FourCC("MKV "), FourCC("H264"), FourCC("AC3 "), 12},
                           {"Ac3WithoutSound", FourCC("MP4 "), FourCC("XVID"), FourCC("AC3 "), 2, false}};

std::string NameOf(const testing::TestParamInfo<Case>& info) {
    const auto& [file, phase, lack] = info.param;
    const char* const phases[] = {"Create", "Write", "Close"};
    return std::string(file.name) + phases[static_cast<int>(phase)] +
           (lack == Lack::kOnce ? "Once" : "Lasting");
}

INSTANTIATE_TEST_SUITE_P(Files, MemoryTest,
                         testing::Combine(testing::ValuesIn(kFiles),
                                          testing::Values(Phase::kCreate, Phase::kWrite, Phase::kClose),
                                          testing::Values(Lack::kOnce, Lack::kLasting)),
                         NameOf);

} // namespace
