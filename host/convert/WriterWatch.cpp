#include "host/convert/WriterWatch.h"

#include "host/convert/Room.h"
#include "text/Path.h"

#include <cerrno>
#include <chrono>
#include <memory>
#include <new>
#include <unistd.h>
#include <utility>

namespace movieconv {
namespace {

constexpr std::chrono::seconds kRetryInterval{1};
constexpr int64_t kEnoughRoom = 4 << 20;

/// How the set's latest file stands; false when there is none.
bool LatestFile(uint32_t set, WriterStatus& status) {
    return MWGetFileStatus(set, MWGetFileCount(set), &status) != 0;
}

} // namespace

WriterWatch::WriterWatch(const Request& request, const SourceInfo& source, Bell& bell) : bell_(bell) {
    WriterOptions writer{};
    if (source.pictures) {
        writer.nSampleAspectNum = source.pictures->pixelAspect.num;
        writer.nSampleAspectDen = source.pictures->pixelAspect.den;
        writer.nColorPrimaries = source.pictures->colorPrimaries;
        writer.nColorTransfer = source.pictures->colorTransfer;
        writer.nColorMatrix = source.pictures->colorMatrix;
    }
    writer.bKeepExisting = request.overwrite ? 0 : 1;
    writer.bRemovePartial = request.keepPartial ? 0 : 1;
    writer.nEncoderThreads = request.encoderThreads;
    writer.bBitExact = request.bitExact ? 1 : 0;
    writer.pfnListener = OnEvent;
    writer.pfnFullDisk = request.onFull == OnFull::kWait ? OnFullDisk : nullptr;
    writer.pContext = this;
    set_ = MWRegisterOptions(&writer);
    if (set_ == 0)
        throw std::bad_alloc();
}

WriterWatch::~WriterWatch() {
    MWUnregisterOptions(set_);
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
    const bool open = LatestFile(set_, *status) &&
                      (status->nState == kWriterFileWriting || status->nState == kWriterFileFinishing);
    return closedBytes_ + (open ? status->llBytesWritten : 0);
}

bool WriterWatch::FileVanished() const {
    const auto before = std::make_unique<WriterStatus>();
    const auto after = std::make_unique<WriterStatus>();
    const auto isWritten = [this](WriterStatus& status) {
        return LatestFile(set_, status) && status.nState == kWriterFileWriting &&
               status.szTemporaryPath[0] != '\0';
    };
    // A close may give the file its name in between.
    return isWritten(*before) && access(before->szTemporaryPath, F_OK) != 0 && errno == ENOENT &&
           isWritten(*after) && before->nSequence == after->nSequence;
}

void WriterWatch::OnEvent(void* context, int event, const WriterStatus* status) {
    auto* watch = static_cast<WriterWatch*>(context);
    {
        const std::lock_guard lock(watch->mutex_);
        try {
            watch->news_.push_back({event, *status});
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

/// Nothing announces free space, so it is asked for every second.
int WriterWatch::WaitForRoom(const WriterStatus& status) {
    const std::string folder = text::FolderOf(status.szPath);
    waiting_ = true;
    bell_.Ring();
    bool givenUp = false;
    bool retry = false;
    do {
        std::unique_lock lock(mutex_);
        changed_.wait_for(lock, kRetryInterval, [&] { return givenUp_ || retry_; });
        givenUp = givenUp_;
        retry = std::exchange(retry_, false);
    } while (!givenUp && !retry && FreeBytes(folder) < kEnoughRoom);
    waiting_ = false;
    bell_.Ring();
    return givenUp ? 0 : 1;
}

} // namespace movieconv
