#include "writer/StatusBoard.h"

#include "log/dyLog.h"
#include "text/Utf8.h"

#include <algorithm>
#include <array>
#include <cstdarg>
#include <cstdio>
#include <exception>

namespace writer {
namespace {

constexpr size_t kRemembered = 64;

} // namespace

FileRecord::FileRecord(int sequence, std::string_view path, const WriterOptions& options)
    : sequence_(sequence), options_(options) {
    status_.nSequence = sequence;
    status_.nState = kWriterFileWriting;
    CopyText(status_.szPath, sizeof status_.szPath, path);
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
        CopyText(status_.szWhat, sizeof status_.szWhat, failure.what());
    }
    WriteLog("Failed: %s: %s", status_.szPath, failure.what());
    return true;
}

bool FileRecord::Failed() const {
    const std::lock_guard lock(mutex_);
    return status_.nError != kWriterErrorNone;
}

void FileRecord::SetTemporaryPath(std::string_view path) {
    const std::lock_guard lock(mutex_);
    CopyText(status_.szTemporaryPath, sizeof status_.szTemporaryPath, path);
}

void FileRecord::Tell(int event) const {
    if (options_.pfnListener == nullptr)
        return;
    const WriterStatus status = Snapshot();
    options_.pfnListener(options_.pContext, event, &status);
}

bool FileRecord::AskAboutFullDisk() const {
    if (options_.pfnFullDisk == nullptr)
        return false;
    const WriterStatus status = Snapshot();
    return options_.pfnFullDisk(options_.pContext, &status) != 0;
}

StatusBoard& StatusBoard::Instance() {
    static StatusBoard board;
    return board;
}

void StatusBoard::SetOptions(const WriterOptions& options) {
    const std::lock_guard lock(mutex_);
    options_ = options;
}

WriterOptions StatusBoard::Options() const {
    const std::lock_guard lock(mutex_);
    return options_;
}

std::shared_ptr<FileRecord> StatusBoard::Open(std::string_view path) {
    const std::lock_guard lock(mutex_);
    auto record = std::make_shared<FileRecord>(count_ + 1, path, options_);
    records_.push_back(record);
    ++count_;
    ForgetOld();
    return record;
}

int StatusBoard::Count() const {
    const std::lock_guard lock(mutex_);
    return count_;
}

std::shared_ptr<const FileRecord> StatusBoard::Find(int sequence) const {
    const std::lock_guard lock(mutex_);
    const auto found = std::find_if(records_.begin(), records_.end(), [sequence](const auto& record) {
        return record->Sequence() == sequence;
    });
    return found == records_.end() ? nullptr : *found;
}

std::shared_ptr<const FileRecord> StatusBoard::LastFailure() const {
    const std::lock_guard lock(mutex_);
    const auto found =
        std::find_if(records_.rbegin(), records_.rend(), [](const auto& record) { return record->Failed(); });
    return found == records_.rend() ? nullptr : *found;
}

void StatusBoard::ForgetOld() {
    auto closed = static_cast<size_t>(std::count_if(records_.begin(), records_.end(),
                                                    [](const auto& record) { return !record->IsOpen(); }));
    for (auto record = records_.begin(); closed > kRemembered && record != records_.end();) {
        if ((*record)->IsOpen()) {
            ++record;
        } else {
            record = records_.erase(record);
            --closed;
        }
    }
}

void WriteLog(const char* format, ...) noexcept {
    std::array<char, kWriterPathSize + kWriterTextSize> text;
    va_list arguments;
    va_start(arguments, format);
    std::vsnprintf(text.data(), text.size(), format, arguments);
    va_end(arguments);
    try {
        LogEx(L"MediaWriter::%ls\r\n", text::FromUtf8(text.data()).c_str());
    } catch (const std::exception&) { // no memory for the line
    }
}

} // namespace writer
