#include "host/convert/WriterWatch.h"

#include "host/convert/Room.h"
#include "host/convert/WriterPlan.h"
#include "text/Path.h"

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <memory>
#include <new>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

namespace movieconv {
namespace {

constexpr std::chrono::seconds kRetryInterval{1};

/// How the set's latest file stands; false when there is none.
bool LatestFile(uint32_t set, WriterStatus& status) {
    return MWGetFileStatus(set, MWGetFileCount(set), &status) != 0;
}

} // namespace

FileIdentity IdentityOf(const std::string& path) noexcept {
    struct stat status {};
    if (stat(path.c_str(), &status) != 0)
        return {};
    return {true, status.st_dev, status.st_ino, status.st_size};
}

WriterWatch::WriterWatch(const Request& request, const SourceInfo& source, Bell& bell)
    : bell_(bell), set_(Heard(OptionsFor(request, source), request.onFull)) {}

WriterOptions WriterWatch::Heard(WriterOptions options, OnFull onFull) {
    options.pfnListener = OnEvent;
    options.pfnFullDisk = onFull == OnFull::kWait ? OnFullDisk : nullptr;
    options.pContext = this;
    return options;
}

std::optional<WriterWatch::News> WriterWatch::Take() {
    const std::lock_guard lock(mutex_);
    if (std::exchange(newsLost_, false))
        throw std::bad_alloc();
    if (news_.empty())
        return std::nullopt;
    std::optional<News> news(news_.front());
    news_.pop_front();
    return news;
}

void WriterWatch::GiveUp() {
    {
        const std::lock_guard lock(mutex_);
        givenUp_ = true;
    }
    changed_.notify_all();
}

void WriterWatch::Retry() {
    {
        const std::lock_guard lock(mutex_);
        retry_ = true;
    }
    changed_.notify_all();
}

int64_t WriterWatch::Bytes() const {
    const auto status = std::make_unique<WriterStatus>();
    const bool open = LatestFile(set_.Number(), *status) &&
                      (status->nState == kWriterFileWriting || status->nState == kWriterFileFinishing);
    return closedBytes_ + (open ? status->llBytesWritten : 0);
}

std::optional<std::string> WriterWatch::VanishedFile() const {
    const auto before = std::make_unique<WriterStatus>();
    const auto after = std::make_unique<WriterStatus>();
    const auto isWritten = [this](WriterStatus& status) {
        return LatestFile(set_.Number(), status) && status.nState == kWriterFileWriting &&
               status.szTemporaryPath[0] != '\0';
    };
    // A close may give the file its name in between.
    const bool vanished = isWritten(*before) && access(before->szTemporaryPath, F_OK) != 0 &&
                          (errno == ENOENT || errno == ENOTDIR) && isWritten(*after) &&
                          before->nSequence == after->nSequence;
    return vanished ? std::optional<std::string>(before->szTemporaryPath) : std::nullopt;
}

void WriterWatch::OnEvent(void* context, int event, const WriterStatus* status) {
    auto* watch = static_cast<WriterWatch*>(context);
    {
        const std::lock_guard lock(watch->mutex_);
        try {
            const bool complete = event == kWriterEventClosed && status->nState == kWriterFileComplete;
            watch->news_.push_back({event, *status, complete ? IdentityOf(status->szPath) : FileIdentity{}});
        } catch (const std::bad_alloc&) {
            watch->newsLost_ = true;
        }
    }
    if (event == kWriterEventClosed)
        watch->closedBytes_ += status->llBytesWritten;
    watch->bell_.Ring();
}

int WriterWatch::OnFullDisk(void* context, const WriterStatus* status) {
    try {
        return static_cast<WriterWatch*>(context)->WaitForRoom(*status);
    } catch (const std::bad_alloc&) {
        return 0;
    }
}

/// Nothing announces free space, so it is asked for every second. Where the disk does not tell, or has room
/// that this user does not get, the write is tried all the same.
int WriterWatch::WaitForRoom(const WriterStatus& status) {
    const std::string folder = text::FolderOf(status.szPath);
    asleep_ = true;
    waitingAt_ = status.llBytesWritten;
    waiting_ = std::max<int64_t>(status.llBytesWaiting, 1);
    bell_.Ring();
    bool givenUp = false;
    bool retry = false;
    do {
        std::unique_lock lock(mutex_);
        changed_.wait_for(lock, kRetryInterval, [&] { return givenUp_ || retry_; });
        givenUp = givenUp_;
        retry = std::exchange(retry_, false);
        const int64_t free = FreeBytes(folder);
        retry = retry || free < 0 || free >= waiting_;
    } while (!givenUp && !retry);
    asleep_ = false;
    bell_.Ring();
    return givenUp ? 0 : 1;
}

/// A write that is tried again has not succeeded yet.
int64_t WriterWatch::WaitsForRoom() const {
    const int64_t waiting = waiting_;
    if (waiting == 0 || asleep_)
        return waiting;
    const auto status = std::make_unique<WriterStatus>();
    const bool stuck = LatestFile(set_.Number(), *status) && status->nError == kWriterErrorNone &&
                       (status->nState == kWriterFileWriting || status->nState == kWriterFileFinishing) &&
                       status->llBytesWritten <= waitingAt_;
    return stuck ? waiting : 0;
}

} // namespace movieconv
