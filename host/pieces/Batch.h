// Many movies into one folder, several at once.
#ifndef MOVIECONV_HOST_PIECES_BATCH_H
#define MOVIECONV_HOST_PIECES_BATCH_H

#include "host/pieces/BatchJournal.h"
#include "host/pieces/Crew.h"
#include "host/pieces/FileLock.h"

#include <atomic>
#include <deque>
#include <optional>
#include <set>
#include <string>
#include <sys/types.h>
#include <utility>
#include <vector>

namespace movieconv {

struct BatchOrder {
    std::vector<std::string> inputs;    ///< Files, and folders whose files are meant.
    std::string folder;                 ///< Where the outputs go; made when it is missing.
    std::string names = "{name}.{ext}"; ///< As NameAfter takes it.
    Request request;                    ///< Without names.
    int jobs = 1;                       ///< Movies at once; 0: one for every two processors.
};

/// Converts what is not converted already, by the folder's journal. The verdict's failure is the worst.
class Batch final : public Crew {
public:
    Batch(BatchOrder order, Observer& observer, Loop loop);
    ~Batch() override { Finish(); }

private:
    using FileId = std::pair<dev_t, ino_t>;

    /// A file that may be a movie, and what it would become.
    struct Candidate {
        std::string input;
        std::string output;
        bool named; ///< By the user, not found in a folder.
    };

    Verdict Perform() override;
    Mood HowToGoOn() const override;
    bool HasMore() const override { return !waiting_.empty(); }
    std::optional<Assignment> Next() override;
    void Take(const std::string& input, const Verdict& ending) override;
    void Report() override;

    void List();
    void RequireOwnOutputs(const std::vector<Candidate>& candidates);
    void NoteSource(const std::string& path);
    bool IsSource(const std::string& path) const;
    void RemoveUnfinished(const std::string& output) const;
    std::string OutputFor(const std::string& input, const std::string& extension) const;
    std::optional<Assignment> Assign(const Candidate& candidate);
    bool IsDone(const Request& request, BatchJournal::State state);
    bool IsMovie(const Request& request);
    Request RequestFor(const Candidate& candidate) const;
    void Fail(const std::string& input, const Failure& failure);
    Verdict Conclude();

    const BatchOrder order_;
    std::optional<FileLock> lock_; // the folder's
    std::optional<BatchJournal> journal_;
    std::string settings_;
    std::atomic<int> opened_{0}; // files

    // The batch's own thread's.
    std::deque<Candidate> waiting_;
    std::set<FileId> sources_; // all that there were in the beginning
    double converted_ = 0;     // seconds, of movies that are done
    int64_t bytes_ = 0;
    int count_ = 0;
    int files_ = 0; // stopped movies give some, too
    int done_ = 0;
    int skipped_ = 0;
    int failed_ = 0;
    std::optional<Failure> worst_;
};

} // namespace movieconv

#endif
