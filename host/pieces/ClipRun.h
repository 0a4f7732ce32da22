// A conversion into clips that can be gone on with when it breaks off.
#ifndef MOVIECONV_HOST_PIECES_CLIPRUN_H
#define MOVIECONV_HOST_PIECES_CLIPRUN_H

#include "host/convert/Job.h"
#include "host/convert/Outlet.h"
#include "host/convert/Work.h"
#include "host/pieces/ClipJournal.h"
#include "host/pieces/FileLock.h"

#include <optional>

namespace movieconv {

/// Keeps a journal of the finished clips beside the output until all are there.
class ClipRun final : public Work, private Observer {
public:
    /// `request` has a split. `resume`: go on with what an earlier run left. Throws Failure when the output
    /// is refused, or there is something left that cannot be gone on with.
    ClipRun(Request request, bool resume, Observer& observer, Loop loop);

    void Start() override;
    void Pause() override;
    void Resume() override;
    void Stop() override;
    const Verdict* Result() const override;

private:
    void Prepare();
    void TakePlace();
    void TakeOver();
    int FirstNumber() const { return request_.firstClip ? request_.firstClip->number : 0; }

    // News of the conversion, on its thread.
    void Started(const struct Start& news) override;
    void Progressed(const Progress& news) override { outlet_.Progressed(news); }
    void Opened(const OpenedFile& news) override;
    void Closed(const ClosedFile& news) override;
    void Warned(const Warning& news) override { outlet_.Warned(news); }
    void LeftBehind(const NotCarried& news) override { outlet_.LeftBehind(news); }
    void Showed(const std::shared_ptr<const ShownPicture>& news) override { outlet_.Showed(news); }
    void Ended(const Verdict& news) override;

    Request request_;
    const bool resume_;
    Outlet outlet_;
    ClipJournal journal_;
    std::optional<RunLock> lock_;
    bool found_ = false;     // a journal of an earlier run
    bool takesOver_ = false; // that run's clips
    bool isLeft_ = false;    // some are made anew

    // The conversion's thread's.
    bool keeps_ = false; // a journal
    bool begun_ = false; // which is there
    bool worth_ = false; // and lists finished clips
    std::string closed_; // the latest clip

    std::optional<Job> job_; // last: the others hear from it
};

} // namespace movieconv

#endif
