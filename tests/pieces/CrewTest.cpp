// Work that consists of conversions: what is begun, and when.
#include "host/pieces/Crew.h"
#include "tests/convert/Listener.h"

#include <gtest/gtest.h>

#include <atomic>
#include <condition_variable>
#include <mutex>
#include <optional>
#include <string>
#include <thread>
#include <vector>

namespace {

using movieconv::Crew;
using movieconv::Outcome;
using movieconv::Phase;
using movieconv::Verdict;

/// Has so many things to do, none of which needs a conversion.
class Idle final : public Crew {
public:
    Idle(int things, movieconv::Observer& observer) : Crew(observer, {}), left_(things) {}
    ~Idle() override { Finish(); }
    int Left() const { return left_; }

private:
    Verdict Perform() override {
        WorkOff(2);
        Verdict verdict;
        verdict.outcome = Stopped() ? Outcome::kStopped : Outcome::kDone;
        return verdict;
    }
    Mood HowToGoOn() const override { return Stopped() ? Mood::kBreaksOff : Mood::kGoesOn; }
    bool HasMore() const override { return left_ > 0; }
    std::optional<Assignment> Next() override {
        --left_;
        return std::nullopt;
    }
    void Take(const std::string&, const Verdict&) override {}
    void Report() override { Tell(UnderWay()); }

    std::atomic<int> left_;
};

/// Several of its threads have news at once.
class Talkative final : public Crew {
public:
    explicit Talkative(movieconv::Observer& observer) : Crew(observer, {}) {}
    ~Talkative() override { Finish(); }

private:
    Verdict Perform() override {
        std::vector<std::thread> threads;
        for (int i = 0; i < 4; ++i)
            threads.emplace_back([this] {
                for (int told = 0; told < 1000; ++told)
                    News().Warned({});
            });
        for (std::thread& thread : threads)
            thread.join();
        Verdict verdict;
        verdict.outcome = Outcome::kDone;
        return verdict;
    }
    Mood HowToGoOn() const override { return Mood::kBreaksOff; }
    bool HasMore() const override { return false; }
    std::optional<Assignment> Next() override { return std::nullopt; }
    void Take(const std::string&, const Verdict&) override {}
    void Report() override {}
};

/// Lets a test wait until a crew has told its pause.
struct Pause {
    Listener listener;
    std::mutex mutex;
    std::condition_variable told;
    bool paused = false;

    Pause() {
        listener.onProgress = [this](const movieconv::Progress& news) {
            const std::lock_guard lock(mutex);
            paused = paused || news.phase == Phase::kPaused;
            told.notify_all();
        };
    }
    void Await() {
        std::unique_lock lock(mutex);
        told.wait(lock, [this] { return paused; });
    }
};

TEST(ACrew, BeginsNothingDuringAPauseAndAllOfItAfterwards) {
    Pause pause;
    Idle crew(3, pause.listener);
    crew.Pause();
    crew.Start();
    pause.Await();
    EXPECT_EQ(crew.Left(), 3);
    crew.Resume();
    crew.Wait();
    EXPECT_EQ(crew.Left(), 0);
    EXPECT_EQ(crew.Result()->outcome, Outcome::kDone);
}

TEST(ACrew, EndsWhenItIsStoppedDuringAPause) {
    Pause pause;
    Idle crew(3, pause.listener);
    crew.Pause();
    crew.Start();
    pause.Await();
    crew.Stop();
    crew.Wait();
    EXPECT_EQ(crew.Left(), 3);
    EXPECT_EQ(crew.Result()->outcome, Outcome::kStopped);
}

TEST(ACrew, TellsAnObserverWithoutALoopOneNewsAtATime) {
    Listener listener;
    {
        Talkative crew(listener);
        crew.Start();
        crew.Wait();
    }
    EXPECT_EQ(listener.warnings.size(), 4000U);
    EXPECT_EQ(listener.ends, 1);
}

} // namespace
