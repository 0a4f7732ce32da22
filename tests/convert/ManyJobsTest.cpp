// Eight conversions at once in one process do not know of each other.
#include "media/FourCC.h"
#include "tests/convert/Listener.h"
#include "tests/support/SmallDisk.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <array>
#include <filesystem>
#include <memory>

namespace {

namespace fs = std::filesystem;
using namespace movieconv;
using namespace test_movies;

Args Encoded(double seconds, const std::string& rate) {
    return Join(CountedPictures(seconds, rate), Beeps(seconds), Args{"-c:v", "mpeg4", "-c:a", "pcm_s16le"});
}

/// Different sources and options; what each writes depends on nothing else.
std::array<Request, 8> Requests(const std::string& folder) {
    std::array<Request, 8> requests;
    const std::array<const char*, 8> names{"plain.mp4", "large.mkv",   "clips.mov",   "sound.mp3",
                                           "paused.ts", "stopped.mp4", "full/up.mkv", "gone/away.mkv"};
    for (std::size_t i = 0; i < requests.size(); ++i) {
        requests[i].input =
            i < 5 ? Make("many-25.mkv", Encoded(4, "25")) : Make("many-30.mkv", Encoded(30, "30"));
        requests[i].output = folder + "/" + names[i];
        requests[i].encoderThreads = 1;
        requests[i].bitExact = true;
    }
    requests[1].size = Size{320, 240};
    requests[1].videoCodec = FourCC("H264");
    requests[2].split = 1.5;
    requests[2].begin = 0.5;
    requests[3].noVideo = true;
    requests[4].frameRate = 12.5;
    requests[4].preview = std::chrono::milliseconds(20);
    return requests;
}

struct Conversion {
    Listener listener;
    std::unique_ptr<Job> job;
};

/// Pauses the fifth for as long as another runs, stops the sixth, lets the eighth's folder vanish.
void Steer(std::array<Conversion, 8>& all, std::size_t i, const std::string& folder) {
    Job& job = *all[i].job;
    if (i == 4) {
        all[i].listener.onProgress = [&job](const Progress& news) {
            if (news.phase == Phase::kPaused)
                job.Resume();
            else if (news.position < 2)
                job.Pause();
        };
    } else if (i == 5) {
        all[i].listener.onProgress = [&job](const Progress& news) {
            if (news.position > 0)
                job.Stop();
        };
    } else if (i == 7) {
        all[i].listener.onOpened = [folder](const OpenedFile&) { fs::remove_all(folder + "/gone"); };
    }
}

TEST(Jobs, EightAtOnceAreWhatTheyAreAlone) {
    const Folder together;
    const Folder alone;
    const SmallDisk disk(together / "full", "100k");
    fs::create_directory(together / "gone");
    const std::array<Request, 8> requests = Requests(together.Path());
    std::array<Conversion, 8> all;
    for (std::size_t i = 0; i < all.size(); ++i) {
        all[i].job = std::make_unique<Job>(requests[i], all[i].listener);
        Steer(all, i, together.Path());
    }
    for (Conversion& conversion : all)
        conversion.job->Start();
    for (Conversion& conversion : all)
        conversion.job->Wait();

    const std::array<Request, 8> same = Requests(alone.Path());
    for (std::size_t i = 0; i < 5; ++i) {
        SCOPED_TRACE(requests[i].output);
        EXPECT_EQ(all[i].job->Result()->outcome, Outcome::kDone);
        Listener listener;
        EXPECT_EQ(Convert(same[i], listener).outcome, Outcome::kDone);
        ASSERT_EQ(all[i].listener.closed.size(), listener.closed.size());
        EXPECT_EQ(listener.closed.size(), i == 2 ? 3u : 1u);
        for (std::size_t file = 0; file < listener.closed.size(); ++file)
            EXPECT_EQ(ReadFile(all[i].listener.closed[file]), ReadFile(listener.closed[file]));
    }
    EXPECT_FALSE(all[4].listener.pictures.empty());
    EXPECT_TRUE(all[3].listener.pictures.empty());
    EXPECT_EQ(all[5].job->Result()->outcome, Outcome::kStopped);
    EXPECT_EQ(all[7].job->Result()->outcome, Outcome::kFailed);
    EXPECT_EQ(all[7].job->Result()->failure->Kind(), Category::kOutput);
    if (disk.IsThere()) {
        ASSERT_EQ(all[6].job->Result()->outcome, Outcome::kFailed);
        EXPECT_EQ(all[6].job->Result()->failure->Kind(), Category::kNoSpace);
    }
}

} // namespace
