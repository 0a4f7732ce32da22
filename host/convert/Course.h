// The course of one conversion, from the first look at the output to the verdict. It drives the engine
// through its MC functions; the engine's worker and the media writer's threads tell what happens.
#ifndef MOVIECONV_HOST_CONVERT_COURSE_H
#define MOVIECONV_HOST_CONVERT_COURSE_H

#include "host/convert/Bell.h"
#include "host/convert/CarryOver.h"
#include "host/convert/ClipCutter.h"
#include "host/convert/Engine.h"
#include "host/convert/FileLedger.h"
#include "host/convert/Observer.h"
#include "host/convert/PictureTap.h"
#include "host/convert/Request.h"
#include "host/convert/RoomWatch.h"
#include "host/convert/SpeedMeter.h"
#include "host/convert/WorkClock.h"
#include "host/convert/WriterWatch.h"
#include "host/source/Movie.h"

#include <atomic>
#include <optional>
#include <string>
#include <vector>

namespace movieconv {

/// What the front end wants of a conversion. Set on any thread, and then the bell is rung.
struct Wishes {
    explicit Wishes(PictureTap::Interval preview) : pictures(preview) {}

    std::atomic<bool> stop{false};
    std::atomic<bool> pause{false};
    std::atomic<bool> retryWrite{false};
    std::atomic<bool> giveUpWrite{false};
    PictureTap pictures;
    Bell bell;
};

/// Lives on one thread.
class Course {
public:
    /// Opens nothing yet but the engine. Throws Failure when the request does not fit the movie.
    Course(const Request& request, Movie& movie, Wishes& wishes, Observer& observer);
    Course(const Course&) = delete;
    Course& operator=(const Course&) = delete;

    /// Tells what is to be converted and reads what has to be known of it before: files of subtitles, and of
    /// the source. Throws Failure when that does not go, or was interrupted.
    void Prepare();

    /// Converts and tells. Throws Failure when it cannot begin.
    Verdict Run();

private:
    static constexpr int kNone = -1;

    static unsigned OnProgress(void* context, unsigned kind, unsigned value, uintptr_t info);

    void RunClip();
    void RunEngine(double begin, double length);
    bool GoesOn();
    void AwaitResume();
    void LookAtRoom();
    void WaitForEnd();
    void FollowWishes();
    void TakeNews();
    void Show();
    void LookAfterFile();
    void Stop();
    void SetPaused(bool pause);
    void UpdateClock();
    Progress Figures();
    Phase CurrentPhase() const;
    void ReportProgress();
    Verdict Conclude();
    double Position() const;
    double Converted(double position) const;
    double Reached() const;
    void ReportComplaints();
    void Complain(Warning::Kind kind, const std::vector<Sentence>& complaints);

    const Request request_; // with rates by the greatest size
    Movie& movie_;
    Wishes& wishes_;
    Observer& observer_;
    const double length_;
    ClipCutter clips_;
    WriterWatch watch_;
    FileLedger files_;
    Engine engine_;
    std::vector<SubtitleTrack> subtitles_; // that are in the output
    double earlier_ = 0;                   // seconds, in the clips that are there

    // The engine's worker sets these.
    std::atomic<double> position_{0}; // in the clip, in seconds
    std::atomic<int> outcome_{kNone}; // once the worker has nothing more to say

    WorkClock clock_;
    SpeedMeter speed_;
    RoomWatch room_;
    bool paused_ = false;
    bool userStopped_ = false;
    bool cutShort_ = false;            // by the user, before the engine's end was known
    std::optional<Failure> brokenOff_; // why the program itself ended the conversion
    Phase toldPhase_ = Phase::kConverting;
    WorkClock::Time toldAt_{};
};

} // namespace movieconv

#endif
