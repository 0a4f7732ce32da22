// What a host can learn of one output file; see writer/WriterStatus.h.
#ifndef MOVIECONV_WRITER_FILERECORD_H
#define MOVIECONV_WRITER_FILERECORD_H

#include "writer/Extras.h"
#include "writer/WriterFailure.h"
#include "writer/WriterStatus.h"

#include <cstdint>
#include <memory>
#include <mutex>
#include <string_view>

namespace writer {

/// The status of one file. Thread-safe; the listener is never called under a lock.
class FileRecord {
public:
    FileRecord(uint32_t set, int sequence, std::string_view path, const WriterOptions& options,
               std::shared_ptr<const Extras> extras);

    const WriterOptions& Options() const { return options_; }
    const std::shared_ptr<const Extras>& ExtraParts() const { return extras_; }
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

    /// The close begins.
    void BeginEnd();

    /// The file is closed, in its last kWriterFile... state; true when it is complete.
    bool End(int state);

    /// Calls the listener with a kWriterEvent.
    void Tell(int event) const;

    /// Asks the host what to do about a full disk that has not taken so many bytes; true: try again.
    bool AskAboutFullDisk(int64_t waiting);

private:
    const int sequence_;
    const WriterOptions options_;
    const std::shared_ptr<const Extras> extras_;
    mutable std::mutex mutex_;
    WriterStatus status_{};
};

/// One line to the log, of UTF-8 texts, as printf writes it, at a level of platform/LogRoute.h. Lost when
/// there is no memory.
[[gnu::format(printf, 2, 3)]] void WriteLog(int level, const char* format, ...) noexcept;

} // namespace writer

#endif
