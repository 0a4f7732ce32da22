// The books of a conversion's output files: what was opened, closed, lost.
#ifndef MOVIECONV_HOST_CONVERT_FILELEDGER_H
#define MOVIECONV_HOST_CONVERT_FILELEDGER_H

#include "host/convert/Failure.h"
#include "host/convert/Observer.h"
#include "host/convert/WriterWatch.h"

#include <optional>
#include <string>
#include <vector>

namespace movieconv {

class FileLedger {
public:
    /// `number` files were opened before.
    explicit FileLedger(Observer& observer, int number = 0) : observer_(observer), opened_(number) {}

    /// Where the next clip begins in the source, in media time.
    void BeginsAt(int64_t time) { begin_ = time; }

    /// Enters what the writer told and tells it. False when a file has failed for the first time.
    bool Enter(const WriterWatch::News& news);

    int Opened() const { return opened_; }
    int Complete() const { return static_cast<int>(complete_.size()); }
    int64_t Bytes() const { return bytes_; } ///< Of the complete files.

    /// How much of the last file's finishing is done, 0 to 1; nothing while it takes pictures and sound.
    std::optional<double> Finishing() const { return finishing_; }

    /// Why not everything that was closed stands under its name, a sentence; nothing when it does.
    std::optional<Sentence> FindMissing() const;

    /// The complete files with a track for pictures that none came into.
    const std::vector<std::string>& WithoutPictures() const { return withoutPictures_; }

    /// What went wrong first; nothing when all is well.
    const std::optional<Failure>& FirstFailure() const { return failure_; }

private:
    /// A complete file, and what stood under its name when it was closed.
    struct Entry {
        std::string path;
        FileIdentity identity;
    };

    void EnterClosed(const WriterWatch::News& news);

    Observer& observer_;
    int opened_;
    int64_t begin_ = 0; // of the file opened next
    std::vector<Entry> complete_;
    std::vector<std::string> withoutPictures_;
    int64_t bytes_ = 0;
    std::optional<double> finishing_;
    std::optional<Failure> failure_;
    std::string failed_; ///< The file whose failure it is, if it is one's.
};

} // namespace movieconv

#endif
