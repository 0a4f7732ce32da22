// Many movies into one folder, several at once.
#ifndef MOVIECONV_HOST_PIECES_BATCH_H
#define MOVIECONV_HOST_PIECES_BATCH_H

#include "host/convert/Bell.h"
#include "host/convert/Job.h"
#include "host/convert/Outlet.h"
#include "host/convert/SpeedMeter.h"
#include "host/convert/Work.h"
#include "host/convert/WorkClock.h"
#include "host/pieces/BatchJournal.h"

#include <atomic>
#include <deque>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <thread>
#include <vector>

namespace movieconv {

struct BatchOrder {
    std::vector<std::string> inputs;    ///< Files, and folders whose files are meant.
    std::string folder;                 ///< Where the outputs go; made when it is missing.
    std::string names = "{name}.{ext}"; ///< {name}: the input's without its extension; {ext}: the format's.
    Request request;                    ///< Without names.
    int jobs = 1;                       ///< Movies at once; 0: one for every two processors.
};

/// Converts what is not converted already, by the folder's journal. The verdict's failure is the worst.
class Batch final : public Work {
public:
    Batch(BatchOrder order, Observer& observer, Loop loop);
    ~Batch() override;

    void Start() override;
    void Pause() override;
    void Resume() override;
    void Stop() override;
    const Verdict* Result() const override;

private:
    class Task;
    struct Movie {
        std::string input;
        std::string output;
        bool named; ///< By the user, not found in a folder.
    };

    void Run() noexcept;
    Verdict Perform();
    std::vector<Movie> List() const;
    std::string OutputFor(const std::string& input, const std::string& extension) const;
    void StartOne(const Movie& movie, BatchJournal& journal);
    void TakeEnded();
    void Fail(const Movie& movie, const Failure& failure);
    void FollowWishes();
    void Report(std::size_t waiting);
    Verdict Conclude(std::size_t waiting);

    const BatchOrder order_;
    Outlet outlet_;
    std::thread thread_;
    std::atomic<bool> stop_{false};
    std::atomic<bool> pause_{false};
    Bell bell_;

    mutable std::mutex mutex_; // guards these two
    bool ended_ = false;
    Verdict verdict_;

    // The batch's own thread's.
    std::string settings_;
    std::vector<std::unique_ptr<Task>> tasks_;
    WorkClock clock_;
    SpeedMeter speed_;
    bool paused_ = false;
    double converted_ = 0; // seconds, of movies that are done
    int64_t bytes_ = 0;
    int count_ = 0;
    int done_ = 0;
    int skipped_ = 0;
    int failed_ = 0;
    std::optional<Failure> worst_;
};

} // namespace movieconv

#endif
