// What hosts can learn of the process's output files; see writer/WriterStatus.h.
#ifndef MOVIECONV_WRITER_STATUSBOARD_H
#define MOVIECONV_WRITER_STATUSBOARD_H

#include "writer/WriterFailure.h"
#include "writer/WriterStatus.h"

#include <deque>
#include <memory>
#include <mutex>
#include <string>

namespace writer {

/// The status of one file. Thread-safe; the listener is never called under a lock.
class FileRecord {
public:
    FileRecord(int sequence, const std::string& path, const WriterOptions& options);

    const WriterOptions& Options() const { return options_; }

    WriterStatus Snapshot() const;

    /// Changes the status under its lock.
    template <typename Change>
    void Update(Change change) {
        const std::lock_guard lock(mutex_);
        change(status_);
    }

    /// Notes a failure unless there is one already; true when this was the first. Logs it.
    bool Fail(const WriterFailure& failure);
    bool Failed() const;

    void SetTemporaryPath(const std::string& path);

    /// Calls the listener with a kWriterEvent.
    void Tell(int event) const;

    /// Asks the host what to do about a full disk; true: try again.
    bool AskAboutFullDisk() const;

private:
    const WriterOptions options_;
    mutable std::mutex mutex_;
    WriterStatus status_{};
};

/// All files of the process.
class StatusBoard {
public:
    static StatusBoard& Instance();

    void SetOptions(const WriterOptions& options);

    /// Gives the next number to a file named `path`.
    std::shared_ptr<FileRecord> Open(const std::string& path);

    int Count() const;

    /// Null when the number was never given out or the file is forgotten.
    std::shared_ptr<const FileRecord> Find(int sequence) const;

    /// The latest file with an error; null when there is none.
    std::shared_ptr<const FileRecord> LastFailure() const;

private:
    StatusBoard() = default;
    void ForgetOld();

    mutable std::mutex mutex_;
    WriterOptions options_{};
    int count_ = 0;
    std::deque<std::shared_ptr<FileRecord>> records_; ///< Rising numbers.
};

/// One line to the log sink; `text` is UTF-8.
void WriteLog(const std::string& text);

} // namespace writer

#endif
