// What hosts can learn of the process's output files; see writer/WriterStatus.h.
#ifndef MOVIECONV_WRITER_STATUSBOARD_H
#define MOVIECONV_WRITER_STATUSBOARD_H

#include "writer/WriterFailure.h"
#include "writer/WriterStatus.h"

#include <memory>
#include <mutex>
#include <string_view>
#include <vector>

namespace writer {

/// The status of one file. Thread-safe; the listener is never called under a lock.
class FileRecord {
public:
    FileRecord(int sequence, std::string_view path, const WriterOptions& options);

    const WriterOptions& Options() const { return options_; }
    int Sequence() const { return sequence_; }

    WriterStatus Snapshot() const;
    bool IsOpen() const;

    /// Changes the status under its lock.
    template <typename Change>
    void Update(Change change) {
        const std::lock_guard lock(mutex_);
        change(status_);
    }

    /// Notes a failure unless there is one already; true when this was the first. Logs it.
    bool Fail(const WriterFailure& failure) noexcept;
    bool Failed() const;

    void SetTemporaryPath(std::string_view path);

    /// Calls the listener with a kWriterEvent.
    void Tell(int event) const;

    /// Asks the host what to do about a full disk; true: try again.
    bool AskAboutFullDisk() const;

private:
    const int sequence_;
    const WriterOptions options_;
    mutable std::mutex mutex_;
    WriterStatus status_{};
};

/// All files of the process.
class StatusBoard {
public:
    static StatusBoard& Instance();

    void SetOptions(const WriterOptions& options);
    WriterOptions Options() const;

    /// Gives the next number to a file named `path`.
    std::shared_ptr<FileRecord> Open(std::string_view path);

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
    std::vector<std::shared_ptr<FileRecord>> records_; ///< Rising numbers.
};

/// One line to the log sink, of UTF-8 texts, as printf writes it. Lost when there is no memory.
[[gnu::format(printf, 1, 2)]] void WriteLog(const char* format, ...) noexcept;

} // namespace writer

#endif
