// Work that consists of conversions, any number of them at once: what all such work has in common.
#ifndef MOVIECONV_HOST_PIECES_CREW_H
#define MOVIECONV_HOST_PIECES_CREW_H

#include "host/convert/Bell.h"
#include "host/convert/Ending.h"
#include "host/convert/Job.h"
#include "host/convert/Outlet.h"
#include "host/convert/SpeedMeter.h"
#include "host/convert/Work.h"
#include "host/convert/WorkClock.h"

#include <atomic>
#include <memory>
#include <optional>
#include <string>
#include <thread>
#include <vector>

namespace movieconv {

/// What one of the conversions is for. Hears of it on the conversion's thread; news is not handed on unless
/// this does it.
class Errand : public Observer {
public:
    /// Enters what has been made, unless it failed, into the verdict and wherever else. Throws Failure: that
    /// is how it ends then.
    virtual void Conclude(Verdict& verdict) = 0;

    /// How much of the whole work `latest` stands for, in seconds.
    virtual double Share(const Progress& latest) const { return latest.position; }

    void Ended(const Verdict&) final {} // Conclude is what it is told
};

/// Who derives from it calls Finish in its destructor. Perform and what it calls run on the crew's own
/// thread.
class Crew : public Work {
public:
    ~Crew() override;
    void Start() final;
    void Pause() final;
    void Resume() final;
    void Stop() final;
    const Verdict* Result() const final;

    /// Waits until it has ended. The last news may still wait in the loop.
    void Wait();

protected:
    /// `observer` hears of everything together as of one conversion, by means of `loop`; without one on
    /// whichever thread has news, never on two at once.
    Crew(Observer& observer, Loop loop);

    struct Assignment {
        Request request;
        std::unique_ptr<Errand> errand;
    };

    enum class Mood {
        kGoesOn,
        kBeginsNothing, ///< What has been begun is brought to its end.
        kBreaksOff      ///< It is stopped.
    };

    virtual Verdict Perform() = 0;

    // What WorkOff asks for and tells. Next: nothing when what was left needs no conversion; `input` is that
    // of the request.
    virtual Mood HowToGoOn() const = 0;
    virtual bool HasMore() const = 0;
    virtual std::optional<Assignment> Next() = 0;
    virtual void Take(const std::string& input, const Verdict& ending) = 0;
    virtual void Report() = 0;

    /// Has all conversions made, at most so many at once. Nothing is begun during a pause.
    void WorkOff(int atOnce);

    /// Stops and waits for the end.
    void Finish();

    bool Stopped() const { return stop_; }

    /// Has what is under way, and the clock, heed a pause or its end.
    void FollowWishes();
    bool Paused() const { return paused_; }
    Outlet& News() { return outlet_; }
    double Worked() const { return clock_.Seconds(); }
    /// Unless there is a pause or what is done stands still.
    void TickClock(bool stands = false);
    void SkipClock() { clock_.Skip(WorkClock::Now()); } ///< What was done since then is no work.
    void TickAfterWait() { clock_.TickAfterWait(WorkClock::Now()); }
    Bell& Ringer() { return bell_; } ///< Wakes the crew's thread, as Stop does.

    /// What the conversions under way have come to together; `length` is that of what they have to do.
    Progress UnderWay() const;
    std::size_t Busy() const { return hands_.size(); }

    /// Completes a report that has phase, position, length and bytes, and tells it.
    void Tell(Progress report);

private:
    class Hand;

    void Run() noexcept;
    bool AllWaitForRoom() const;
    void TakeEnded();

    Outlet outlet_;
    std::thread thread_;
    std::atomic<bool> stop_{false};
    std::atomic<bool> pause_{false};
    Bell bell_; // there is something new

    Ending ending_;

    // The crew's own thread's.
    std::vector<std::unique_ptr<Hand>> hands_;
    WorkClock clock_;
    SpeedMeter speed_;
    bool paused_ = false;
    Phase told_ = Phase::kConverting;
};

} // namespace movieconv

#endif
