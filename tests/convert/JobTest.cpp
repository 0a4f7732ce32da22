// One conversion as a library: its news, its control, what befalls its files.
#include "host/convert/LogTap.h"
#include "host/convert/StillPicture.h"
#include "media/FourCC.h"
#include "tests/convert/Listener.h"
#include "tests/support/Inspect.h"
#include "tests/support/SmallDisk.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <condition_variable>
#include <deque>
#include <fcntl.h>
#include <filesystem>
#include <mutex>
#include <sys/stat.h>
#include <unistd.h>

namespace {

namespace fs = std::filesystem;
using namespace movieconv;
using namespace test_movies;
using namespace inspect;

Request Converting(const std::string& input, const std::string& output) {
    Request request;
    request.input = input;
    request.output = output;
    return request;
}

std::string TextOf(const Verdict& verdict) {
    return verdict.failure ? verdict.failure->Text() : "";
}

/// A movie whose pictures are damaged from the second one on.
void MakeDamaged(const std::string& path) {
    std::string movie =
        ReadFile(Make("to-be-damaged.mkv", Join(CountedPictures(4), Words("-c:v libx264 -g 10 -bf 2"))));
    for (std::size_t at = movie.size() / 4; at < movie.size() * 3 / 4; at += 50)
        movie[at] = static_cast<char>(movie[at] ^ 0x55);
    WriteFile(path, movie);
}

TEST(LogTap, HearsOfConversionsAndNotOfSinglePictures) {
    const Folder folder;
    const std::string path = folder / "damaged.mkv";
    MakeDamaged(path);
    std::mutex mutex;
    std::string lines;
    const LogTap tap([&](LogWeight weight, const std::string& line) {
        const std::lock_guard lock(mutex);
        lines += weight != LogWeight::kOther ? line + "\n" : "";
    });
    for (const double seconds : {0.0, 1.0, 1.9, 2.5, 3.9})
        PictureAt(path, seconds);
    {
        const std::lock_guard lock(mutex);
        EXPECT_EQ(lines, "");
    }
    Listener listener;
    Job job(Converting(path, folder / "out.mkv"), listener, {});
    job.Start();
    job.Wait();
    const std::lock_guard lock(mutex);
    EXPECT_NE(lines, "");
}

TEST(Job, TellsEverythingOnTheObserversThread) {
    const Folder folder;
    std::mutex mutex;
    std::condition_variable posted;
    std::deque<std::function<void()>> work;
    const Loop loop = [&](std::function<void()> one) {
        const std::lock_guard lock(mutex);
        work.push_back(std::move(one));
        posted.notify_one();
    };
    Listener listener;
    Request request = Converting(CountedMovie(), folder / "out.mp4");
    request.preview = std::chrono::milliseconds(0);
    Job job(request, listener, loop);
    job.Start();
    while (listener.ends == 0) {
        std::unique_lock lock(mutex);
        posted.wait(lock, [&] { return !work.empty(); });
        const std::function<void()> one = std::move(work.front());
        work.pop_front();
        lock.unlock();
        one();
    }
    EXPECT_EQ(job.Result()->outcome, Outcome::kDone) << TextOf(*job.Result());
    EXPECT_EQ(job.Result()->files, 1);
    EXPECT_EQ(job.Result()->bytes, static_cast<int64_t>(fs::file_size(folder / "out.mp4")));
    EXPECT_NEAR(job.Result()->position, 4, 0.05);
    EXPECT_EQ(listener.starts, 1);
    EXPECT_EQ(listener.closed, Args{folder / "out.mp4"});
    ASSERT_FALSE(listener.pictures.empty());
    const ShownPicture& last = *listener.pictures.back();
    ASSERT_EQ(last.bgra.size(), 160u * 120 * 4);
    const int grey = (LumaOf(99) - 16) * 255 / 219; // luma from 16 to 235
    EXPECT_NEAR(last.bgra[0], grey, 4);
    EXPECT_EQ(last.bgra[3], 255);
    for (const std::thread::id thread : listener.threads)
        EXPECT_EQ(thread, std::this_thread::get_id());
}

TEST(Job, RefusesWithACategory) {
    const Folder folder;
    WriteFile(folder / "there.mp4", "precious");
    WriteFile(folder / "text.mkv", "words");
    Request begin = Converting(CountedMovie(), folder / "o.mp4");
    begin.begin = 9;
    Request codec = Converting(CountedMovie(), folder / "o.webm");
    codec.videoCodec = FourCC("XVID");
    Request split = Converting(CountedMovie(), folder / "o.mp3");
    split.split = 1;
    const struct {
        Request request;
        Category category;
        Reason reason;
    } cases[] = {
        {Converting(CountedMovie(), folder / "there.mp4"), Category::kOutput, Reason::kExists},
        {Converting(CountedMovie(), folder / "nowhere/o.mp4"), Category::kOutput, Reason::kOther},
        {Converting(CountedMovie(), folder / "o.xyz"), Category::kRequest, Reason::kNoFormat},
        {Converting(folder / "text.mkv", folder / "o.mp4"), Category::kSource, Reason::kOther},
        {Converting(folder / "none.mkv", folder / "o.mp4"), Category::kSource, Reason::kOther},
        {begin, Category::kRequest, Reason::kBeginTooLate},
        {codec, Category::kRequest, Reason::kCodec},
        {split, Category::kRequest, Reason::kOther},
    };
    for (const auto& test : cases) {
        Listener listener;
        const Verdict verdict = Convert(test.request, listener);
        EXPECT_EQ(verdict.outcome, Outcome::kFailed);
        ASSERT_TRUE(verdict.failure);
        EXPECT_EQ(verdict.failure->Kind(), test.category) << TextOf(verdict);
        EXPECT_EQ(verdict.failure->Why(), test.reason) << TextOf(verdict);
        EXPECT_EQ(verdict.failure->Text().find("--"), std::string::npos) << TextOf(verdict);
        EXPECT_EQ(listener.starts, 0);
        EXPECT_EQ(listener.ends, 1);
    }
    EXPECT_EQ(folder.Names(), (Args{"text.mkv", "there.mp4"}));
}

TEST(Job, PausesAndStops) {
    const Folder folder;
    Listener listener;
    Request request = Converting(CountedMovie(60), folder / "out.mp4");
    Job job(request, listener);
    bool pausedOnce = false;
    listener.onProgress = [&](const Progress& news) {
        if (news.phase == Phase::kPaused)
            job.Resume();
        else if (pausedOnce && news.position > 0)
            job.Stop();
        else if (news.position > 0)
            job.Pause();
        pausedOnce = pausedOnce || news.phase == Phase::kPaused;
    };
    job.Start();
    job.Wait();
    EXPECT_TRUE(pausedOnce);
    EXPECT_EQ(job.Result()->outcome, Outcome::kStopped) << TextOf(*job.Result());
    const std::size_t pictures = LookAt(folder / "out.mp4").pictures.size();
    EXPECT_GT(pictures, 0u);
    EXPECT_LT(pictures, 1500u);
}

// A pipe that brings too little to tell what it holds.
TEST(Job, StopsWhileItsSourceIsOpened) {
    const Folder folder;
    const std::string pipe = folder / "pipe";
    ASSERT_EQ(mkfifo(pipe.c_str(), 0600), 0);
    for (const bool written : {false, true}) {
        Listener listener;
        auto job = std::make_unique<Job>(Converting(pipe, folder / "out.mp4"), listener);
        job->Start();
        int end = -1;
        while ((end = open(pipe.c_str(), O_WRONLY | O_NONBLOCK | O_CLOEXEC)) < 0)
            std::this_thread::yield(); // until it is opened for reading
        if (written) {
            EXPECT_EQ(write(end, "G", 1), 1);
        }
        job->Stop();
        job->Wait();
        close(end);
        EXPECT_EQ(job->Result()->outcome, Outcome::kStopped) << TextOf(*job->Result());
        job.reset(); // after all news
        EXPECT_EQ(listener.starts, 0);
        EXPECT_EQ(listener.ends, 1);
    }
    EXPECT_EQ(folder.Names(), Args{"pipe"});
}

TEST(Job, LosesNoSoundHoweverShort) {
    const Args oneSample = Lavfi("aevalsrc=0.5,atrim=end_sample=1");
    const Args picture = Join(Lavfi("color=size=64x48:rate=25:duration=0.04"), Words("-c:a pcm_s16le"));
    for (const std::string& source :
         {Make("one-sample.wav", oneSample), Make("one-sample.mov", Join(oneSample, picture))}) {
        const Folder folder;
        Listener listener;
        Request request = Converting(source, folder / "out.mkv");
        request.audioCodec = FourCC("PCM ");
        const Verdict verdict = Convert(request, listener);
        EXPECT_EQ(verdict.outcome, Outcome::kDone) << TextOf(verdict);
        const std::vector<int16_t> sound = LookAt(folder / "out.mkv").sound;
        ASSERT_FALSE(sound.empty());
        EXPECT_NEAR(sound.front(), 16384, 1);
    }
}

// Nobody tells whether what is written still has a name: the conversion has to look, and has to prove at its
// end that all is there.
TEST(Job, IsNoSuccessWhenItsFileVanishes) {
    for (const std::string extension : {"mp4", "mov", "mkv", "ts"}) {
        for (const bool folderToo : {false, true}) {
            SCOPED_TRACE(extension);
            const Folder folder;
            fs::create_directory(folder / "out");
            Listener listener;
            std::string vanished;
            listener.onOpened = [&](const OpenedFile& news) {
                vanished = news.temporaryPath;
                if (folderToo) {
                    fs::rename(folder / "out", folder / "moved");
                    fs::create_directory(folder / "out");
                } else {
                    fs::remove(vanished);
                }
            };
            const Verdict verdict =
                Convert(Converting(CountedMovie(60), folder / "out/movie." + extension), listener);
            EXPECT_EQ(verdict.outcome, Outcome::kFailed);
            ASSERT_TRUE(verdict.failure);
            EXPECT_EQ(verdict.failure->Kind(), Category::kOutput);
            EXPECT_NE(TextOf(verdict).find("\"" + vanished + "\" vanished"), std::string::npos)
                << TextOf(verdict);
        }
    }
}

TEST(Job, IsNoSuccessWhenAClipVanishesOrIsAnother) {
    for (const bool replaced : {false, true}) {
        const Folder folder;
        Listener listener;
        listener.onOpened = [&](const OpenedFile& news) {
            if (news.number != 3)
                return;
            fs::remove(folder / "movie_01.mkv");
            if (replaced)
                WriteFile(folder / "movie_01.mkv", "precious");
        };
        Request request = Converting(CountedMovie(), folder / "movie.mkv");
        request.split = 1;
        const Verdict verdict = Convert(request, listener);
        EXPECT_EQ(listener.closed.size(), 4u);
        EXPECT_EQ(verdict.outcome, Outcome::kFailed);
        EXPECT_NE(TextOf(verdict).find("movie_01.mkv"), std::string::npos) << TextOf(verdict);
    }
}

TEST(Job, TellsClipsOfAnotherDivisionThatStay) {
    const Folder folder;
    Request request = Converting(CountedMovie(), folder / "movie.mkv");
    request.split = 1;
    Listener first;
    ASSERT_EQ(Convert(request, first).outcome, Outcome::kDone);
    request.overwrite = true;
    for (const double length : {1.0, 1.5, 2.0}) {
        SCOPED_TRACE(length);
        request.split = length;
        Listener listener;
        const Verdict verdict = Convert(request, listener);
        EXPECT_EQ(verdict.outcome, Outcome::kDone) << TextOf(verdict);
        const std::size_t left = 4 - listener.closed.size();
        ASSERT_EQ(listener.warnings.size(), left > 0 ? 1u : 0u);
        if (left == 0)
            continue;
        EXPECT_EQ(listener.warnings[0].kind, Warning::Kind::kOlderClips); // which nobody can go on with
        const std::string last = '"' + (folder / "movie_03.mkv") + "\" of an earlier conversion stay";
        EXPECT_EQ(listener.warnings[0].text.Text().find(
                      left == 1 ? last : '"' + (folder / "movie_02.mkv") + "\" to " + last),
                  0u)
            << listener.warnings[0].text.Text();
    }
}

TEST(Job, TellsNoMoreThanItsClipsHoldWhenItIsStoppedBetweenTwo) {
    const Folder folder;
    Request request = Converting(CountedMovie(), folder / "movie.mkv");
    request.split = 1;
    Listener listener;
    movieconv::Job job(request, listener);
    double held = 0;
    listener.onClosed = [&](const movieconv::ClosedFile& news) {
        held += news.videoSeconds;
        job.Stop();
    };
    job.Start();
    job.Wait();
    EXPECT_EQ(job.Result()->outcome, Outcome::kStopped);
    EXPECT_NEAR(job.Result()->position, held, 0.2);
}

// On a disk that is smaller than any reserve one could ask for.
TEST(Job, WaitsForAsMuchRoomAsItNeeds) {
    const Folder folder;
    const SmallDisk disk(folder / "disk", "400k");
    if (!disk.IsThere())
        GTEST_SKIP() << "no small disk can be mounted here";
    WriteFile(folder / "disk/ballast", std::string(300'000, 'x'));
    Listener listener;
    listener.onProgress = [&](const Progress& news) {
        if (news.phase == Phase::kWaitingForRoom)
            fs::remove(folder / "disk/ballast");
    };
    Request request = Converting(CountedMovie(), folder / "disk/out.mkv");
    request.audioCodec = FourCC("PCM ");
    request.length = 3;
    request.onFull = OnFull::kWait;
    const Verdict verdict = Convert(request, listener);
    EXPECT_EQ(verdict.outcome, Outcome::kDone) << TextOf(verdict);
    ASSERT_FALSE(listener.warnings.empty());
    const Warning& warning = listener.warnings.back();
    EXPECT_EQ(warning.kind, Warning::Kind::kWaitsForRoom);
    EXPECT_NE(warning.text.Text().find("room for"), std::string::npos) << warning.text.Text();
    EXPECT_EQ(std::count(listener.phases.begin(), listener.phases.end(), Phase::kWaitingForRoom), 1);
    EXPECT_EQ(LookAt(folder / "disk/out.mkv").pictures.size(), 75u);
}

} // namespace
