// Has pieces made, several at once, and joins them: the whole of a conversion in pieces, or a part of it.
#ifndef MOVIECONV_HOST_PIECES_FOREMAN_H
#define MOVIECONV_HOST_PIECES_FOREMAN_H

#include "host/convert/Bell.h"
#include "host/convert/Job.h"
#include "host/convert/Outlet.h"
#include "host/convert/SpeedMeter.h"
#include "host/convert/Work.h"
#include "host/convert/WorkClock.h"
#include "host/pieces/Plan.h"

#include <atomic>
#include <condition_variable>
#include <deque>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <thread>
#include <vector>

namespace movieconv {

struct PieceOrder {
    std::string planPath;
    std::optional<Request> request; ///< Plan this first; else the plan is there.
    Division division;              ///< For that.
    bool resume = false;            ///< Use what is left of the same conversion.
    std::optional<int> only;        ///< Make this piece alone.
    bool join = false;              ///< And when all are there, make the output of them.
    bool replace = false;           ///< The output may replace a file.
    bool keepPieces = false;        ///< Leave them and the plan where they are afterwards.
    OnFull onFull = OnFull::kStop;
    int niceness = 0; ///< See Request.
    int jobs = 1;     ///< Pieces at once; 0: as many as processors and memory allow.
};

/// The plan that a conversion in pieces keeps beside its output.
std::string PlanPathFor(const std::string& output);

class Foreman final : public Work {
public:
    /// `observer` hears of all pieces together as of one conversion, by means of `loop`.
    Foreman(PieceOrder order, Observer& observer, Loop loop);
    ~Foreman() override;

    void Start() override;
    void Pause() override;
    void Resume() override;
    void Stop() override;
    const Verdict* Result() const override;

    /// Waits until it has ended. The last news may still wait in the loop.
    void Wait();

private:
    class Task;

    void Run() noexcept;
    Verdict Perform();
    std::optional<Plan> Prepare();
    std::optional<Plan> Leftover(const Plan& now);
    std::deque<int> Missing(const Plan& plan) const;
    void Announce(const Plan& plan, const std::deque<int>& missing);
    int JobsFor(const Plan& plan);
    Verdict MakeAll(const Plan& plan, std::deque<int> missing);
    void StartTask(const Plan& plan, int number);
    void TakeEnded(Verdict& verdict);
    void FollowWishes();
    Verdict JoinAll(const Plan& plan);
    Progress Figures();
    void Report(Phase phase, double finished = 0);
    void ForAll(void (Job::*tell)());

    const PieceOrder order_;
    Outlet outlet_;
    std::thread thread_;
    std::atomic<bool> stop_{false};
    std::atomic<bool> pause_{false};

    Bell bell_; // there is something new

    mutable std::mutex mutex_;                 // guards what follows
    std::vector<std::unique_ptr<Task>> tasks_; // only the foreman's thread changes the list
    std::condition_variable end_;
    bool ended_ = false;
    Verdict verdict_;

    // The foreman's thread's.
    WorkClock clock_;
    SpeedMeter speed_;
    double length_ = 0; // seconds of all pictures to be converted
    double done_ = 0;   // of the pieces that are made
    int64_t bytes_ = 0;
    bool paused_ = false;
    Phase told_ = Phase::kConverting;
};

} // namespace movieconv

#endif
