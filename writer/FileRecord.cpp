#include "writer/FileRecord.h"

#include "log/dyLog.h"
#include "text/Utf8.h"

#include <array>
#include <cstdarg>
#include <cstdio>
#include <exception>
#include <utility>

namespace writer {

FileRecord::FileRecord(uint32_t set, int sequence, std::string_view path, const WriterOptions& options,
                       std::shared_ptr<const Extras> extras)
    : sequence_(sequence), options_(options), extras_(std::move(extras)) {
    status_.nSet = set;
    status_.nSequence = sequence;
    status_.nState = kWriterFileWriting;
    text::CopyText(status_.szPath, path);
}

WriterStatus FileRecord::Snapshot() const {
    const std::lock_guard lock(mutex_);
    return status_;
}

bool FileRecord::IsOpen() const {
    const std::lock_guard lock(mutex_);
    return status_.nState == kWriterFileWriting || status_.nState == kWriterFileFinishing;
}

bool FileRecord::Fail(const WriterFailure& failure) noexcept {
    {
        const std::lock_guard lock(mutex_);
        if (status_.nError != kWriterErrorNone)
            return false;
        status_.nError = failure.Kind();
        status_.nSystemError = failure.SystemError();
        text::CopyText(status_.szWhat, failure.what());
    }
    WriteLog(kLogError, "Failed: %s: %s", status_.szPath, failure.what());
    return true;
}

bool FileRecord::Failed() const {
    const std::lock_guard lock(mutex_);
    return status_.nError != kWriterErrorNone;
}

void FileRecord::SetTemporaryPath(std::string_view path) {
    const std::lock_guard lock(mutex_);
    text::CopyText(status_.szTemporaryPath, path);
}

void FileRecord::BeginEnd() {
    Update([](WriterStatus& status) { status.nState = kWriterFileFinishing; });
    Tell(kWriterEventFinishing);
}

bool FileRecord::End(int state) {
    const bool complete = state == kWriterFileComplete;
    Update([=](WriterStatus& status) {
        status.nState = state;
        status.dFinished = complete ? 1.0 : status.dFinished;
    });
    Tell(kWriterEventClosed);
    return complete;
}

void FileRecord::Tell(int event) const {
    if (options_.pfnListener == nullptr)
        return;
    const WriterStatus status = Snapshot();
    options_.pfnListener(options_.pContext, event, &status);
}

bool FileRecord::AskAboutFullDisk(int64_t waiting) {
    if (options_.pfnFullDisk == nullptr)
        return false;
    Update([waiting](WriterStatus& status) { status.llBytesWaiting = waiting; });
    const WriterStatus status = Snapshot();
    const bool again = options_.pfnFullDisk(options_.pContext, &status) != 0;
    Update([](WriterStatus& status) { status.llBytesWaiting = 0; });
    return again;
}

void WriteLog(int level, const char* format, ...) noexcept {
    std::array<char, kWriterPathSize + kWriterTextSize> text;
    va_list arguments;
    va_start(arguments, format);
    std::vsnprintf(text.data(), text.size(), format, arguments);
    va_end(arguments);
    try {
        LogAt(level, L"MediaWriter::%ls\r\n", text::FromUtf8(text.data()).c_str());
    } catch (const std::exception&) { // no memory for the line
    }
}

} // namespace writer
