// Has pieces made, several at once, and joins them: the whole of a conversion in pieces, or a part of it.
#ifndef MOVIECONV_HOST_PIECES_FOREMAN_H
#define MOVIECONV_HOST_PIECES_FOREMAN_H

#include "host/pieces/Crew.h"
#include "host/pieces/FileLock.h"
#include "host/pieces/Joiner.h"
#include "host/pieces/Plan.h"

#include <deque>
#include <mutex>
#include <optional>
#include <set>
#include <string>

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

class Foreman final : public Crew {
public:
    /// `observer` hears of all pieces together as of one conversion, by means of `loop`.
    Foreman(PieceOrder order, Observer& observer, Loop loop);
    ~Foreman() override { Finish(); }

private:
    class PieceErrand;

    Verdict Perform() override;
    Mood HowToGoOn() const override;
    bool HasMore() const override { return !missing_.empty(); }
    std::optional<Assignment> Next() override;
    void Take(const std::string& input, const Verdict& ending) override;
    void Report() override;

    std::optional<Plan> Prepare();
    double LengthOf(int number) const;
    bool GoesOnReading();
    void TellReading(Phase phase);
    bool IsMade(int number);
    std::deque<int> FindMissing();
    std::set<int> TakeLacking();
    void Announce();
    void TellWhatIsMade();
    int JobsFor();
    Going FollowJoining(const Joining& latest);
    void JoinAll();
    void TellWhatStays();
    void TellOf(int number, Warning news);

    const PieceOrder order_;

    // The foreman's thread's, and read by the pieces' threads while pieces are made.
    Plan plan_;

    std::mutex mutex_;           // guards these
    std::set<int> lacking_;      // pieces that lack pictures, so far
    std::set<std::string> told_; // of the source, by pieces

    // The foreman's thread's.
    std::optional<RunLock> lock_;
    std::deque<int> missing_;        // pieces that are to be begun
    std::set<int> fromStart_;        // of these, those for which the source is read from its start
    std::string leftover_;           // what there is to tell of an earlier run
    std::optional<Joining> joining_; // as it was told last
    Phase joiningPhase_ = Phase::kFinishing;
    WorkClock::Time toldAt_;
    Verdict verdict_;
    double length_ = 0;  // seconds of all pictures to be converted
    double done_ = 0;    // of the pieces that are made
    double earlier_ = 0; // of those that were made before
    int64_t bytes_ = 0;
};

} // namespace movieconv

#endif
