#include "host/convert/WriterWatch.h"

#include "host/convert/CodecPlan.h"
#include "host/convert/EncodePlan.h"
#include "host/convert/Room.h"
#include "host/source/ColourMatrix.h"
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

void TellColours(WriterOptions& writer, const PictureStreamInfo& pictures, bool keepsHdr) {
    constexpr int kBt709 = 1;
    const bool becomesSdr = IsHdr(pictures) && !keepsHdr;
    writer.nColorPrimaries = becomesSdr ? kBt709 : pictures.colorPrimaries;
    writer.nColorTransfer = becomesSdr ? kBt709 : pictures.colorTransfer;
    writer.nColorMatrix = HandedOutMatrix(pictures, keepsHdr);
    if (keepsHdr && pictures.masteringDisplay) {
        const MasteringDisplay& display = *pictures.masteringDisplay;
        writer.bMasteringDisplay = 1;
        std::copy_n(display.red, 2, writer.masteringDisplay.dRed);
        std::copy_n(display.green, 2, writer.masteringDisplay.dGreen);
        std::copy_n(display.blue, 2, writer.masteringDisplay.dBlue);
        std::copy_n(display.white, 2, writer.masteringDisplay.dWhite);
        writer.masteringDisplay.dDarkest = display.darkest;
        writer.masteringDisplay.dBrightest = display.brightest;
    }
    if (keepsHdr && pictures.lightLevel) {
        writer.nBrightestPixel = pictures.lightLevel->brightestPixel;
        writer.nBrightestPicture = pictures.lightLevel->brightestPicture;
    }
}

void SetPiece(WriterOptions& writer, const PieceCut& piece) {
    writer.nPiece = piece.pictures ? kWriterPiecePictures : kWriterPieceRest;
    writer.bPieceContinues = piece.tick ? 1 : 0;
    writer.llPieceTick = piece.tick.value_or(0);
    writer.llPieceBegin = piece.begin - piece.origin;
    writer.llPieceEnd = piece.last ? -1 : piece.end - piece.origin;
}

} // namespace

FileIdentity IdentityOf(const std::string& path) noexcept {
    struct stat status {};
    if (stat(path.c_str(), &status) != 0)
        return {};
    return {true, status.st_dev, status.st_ino, status.st_size};
}

WriterWatch::WriterWatch(const Request& request, const SourceInfo& source, Bell& bell) : bell_(bell) {
    WriterOptions writer{};
    if (source.pictures) {
        writer.nSampleAspectNum = source.pictures->pixelAspect.num;
        writer.nSampleAspectDen = source.pictures->pixelAspect.den;
    }
    if (const FileFormatInfo& format = ChooseFormat(request); source.pictures && format.bHasVideo != 0) {
        const PicturePlan plan = PlanPictures(request, format, *source.pictures);
        writer.bQuality = plan.quality ? 1 : 0;
        writer.dQuality = plan.quality.value_or(0);
        writer.nSpeed = plan.speed ? static_cast<int32_t>(*plan.speed) : 0;
        writer.nProfile = plan.profile ? static_cast<int32_t>(*plan.profile) : 0;
        writer.nDepth = plan.depth;
        writer.bSteadyRate = plan.steadyRate ? 1 : 0;
        TellColours(writer, *source.pictures, plan.keepsHdr);
    }
    writer.bKeepExisting = request.overwrite ? 0 : 1;
    writer.bRemovePartial = request.keepPartial ? 0 : 1;
    writer.nEncoderThreads = request.encoderThreads;
    writer.bBitExact = request.bitExact ? 1 : 0;
    writer.bSoundBeside = request.copySound ? 1 : 0;
    writer.nChannelMask = source.sound ? source.sound->speakers : 0;
    writer.dFileLength = request.split.value_or(request.length.value_or(0));
    if (request.piece)
        SetPiece(writer, *request.piece);
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

std::optional<std::string> WriterWatch::VanishedFile() const {
    const auto before = std::make_unique<WriterStatus>();
    const auto after = std::make_unique<WriterStatus>();
    const auto isWritten = [this](WriterStatus& status) {
        return LatestFile(set_, status) && status.nState == kWriterFileWriting &&
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
    const bool stuck = LatestFile(set_, *status) && status->nError == kWriterErrorNone &&
                       (status->nState == kWriterFileWriting || status->nState == kWriterFileFinishing) &&
                       status->llBytesWritten <= waitingAt_;
    return stuck ? waiting : 0;
}

} // namespace movieconv
