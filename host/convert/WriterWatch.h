// What the media writer tells about its files, brought from its threads to the conversion's.
#ifndef MOVIECONV_HOST_CONVERT_WRITERWATCH_H
#define MOVIECONV_HOST_CONVERT_WRITERWATCH_H

#include "host/convert/Bell.h"
#include "host/convert/Request.h"
#include "host/convert/WriterSet.h"
#include "host/source/Source.h"
#include "writer/WriterStatus.h"

#include <atomic>
#include <condition_variable>
#include <cstdint>
#include <deque>
#include <mutex>
#include <optional>
#include <string>

namespace movieconv {

/// What stands under a name.
struct FileIdentity {
    bool exists = false;
    uint64_t device = 0;
    uint64_t inode = 0;
    int64_t size = 0;
    bool operator==(const FileIdentity&) const = default;
};

/// Looks at the disk. Needs no memory.
FileIdentity IdentityOf(const std::string& path) noexcept;

/// Registers the writer's options for one conversion, for as long as it exists: longer than the converter.
class WriterWatch {
public:
    struct News {
        int event; ///< kWriterEvent...
        WriterStatus status;
        FileIdentity identity; ///< Of a complete file that is closed.
    };

    /// `bell` is rung whenever there is news.
    WriterWatch(const Request& request, const SourceInfo& source, Bell& bell);
    WriterWatch(const WriterWatch&) = delete;
    WriterWatch& operator=(const WriterWatch&) = delete;

    /// The oldest news that was not taken yet. Throws std::bad_alloc once when there was no memory for some.
    std::optional<News> Take();

    /// For how many bytes of room the writer waits on a full disk; 0 when it does not.
    int64_t WaitsForRoom() const;

    /// The number of the set of options, for EncodeParam::nReserved[kWriterSetWord].
    uint32_t OptionSet() const { return set_.Number(); }

    /// The temporary name of the file that is being written when nothing stands there any more, by its own
    /// removal or the folder's.
    std::optional<std::string> VanishedFile() const;

    /// Ends the waiting for room: the file fails.
    void GiveUp();

    /// Ends the waiting for room: the write is tried again.
    void Retry();

    /// Bytes of all files created since this object was made, as they stand.
    int64_t Bytes() const;

private:
    static void OnEvent(void* context, int event, const WriterStatus* status);
    static int OnFullDisk(void* context, const WriterStatus* status);
    int WaitForRoom(const WriterStatus& status);
    WriterOptions Heard(WriterOptions options, OnFull onFull);

    Bell& bell_;
    mutable std::mutex mutex_;
    std::condition_variable changed_;
    std::deque<News> news_;
    bool newsLost_ = false;
    bool givenUp_ = false;
    bool retry_ = false;
    std::atomic<int64_t> waiting_{0};   // bytes, until they are written
    std::atomic<int64_t> waitingAt_{0}; // where in the file
    std::atomic<bool> asleep_{false};   // until the write is tried again
    std::atomic<int64_t> closedBytes_{0};
    WriterSet set_; // the last, so that the rest is there for as long as events come
};

} // namespace movieconv

#endif
