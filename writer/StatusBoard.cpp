#include "writer/StatusBoard.h"

#include "log/dyLog.h"
#include "text/Utf8.h"

#include <algorithm>
#include <cstring>

namespace writer {
namespace {

constexpr size_t kRemembered = 64;

/// Copies as much as fits, without leaving half a UTF-8 character, always terminated.
template <size_t Size>
void CopyText(char (&to)[Size], const std::string& text) {
    size_t length = std::min(text.size(), Size - 1);
    while (length < text.size() && length > 0 && (static_cast<unsigned char>(text[length]) & 0xC0) == 0x80)
        --length;
    std::memcpy(to, text.data(), length);
    to[length] = '\0';
}

bool IsOpen(const FileRecord& record) {
    const int state = record.Snapshot().nState;
    return state == kWriterFileWriting || state == kWriterFileFinishing;
}

} // namespace

FileRecord::FileRecord(int sequence, const std::string& path, const WriterOptions& options)
    : options_(options) {
    status_.nSequence = sequence;
    status_.nState = kWriterFileWriting;
    CopyText(status_.szPath, path);
}

WriterStatus FileRecord::Snapshot() const {
    const std::lock_guard lock(mutex_);
    return status_;
}

bool FileRecord::Fail(const WriterFailure& failure) {
    std::string line;
    {
        const std::lock_guard lock(mutex_);
        if (status_.nError != kWriterErrorNone)
            return false;
        status_.nError = failure.Kind();
        status_.nSystemError = failure.SystemError();
        CopyText(status_.szWhat, failure.what());
        line = std::string("Failed: ") + status_.szPath + ": " + failure.what();
    }
    WriteLog(line);
    return true;
}

bool FileRecord::Failed() const {
    const std::lock_guard lock(mutex_);
    return status_.nError != kWriterErrorNone;
}

void FileRecord::SetTemporaryPath(const std::string& path) {
    const std::lock_guard lock(mutex_);
    CopyText(status_.szTemporaryPath, path);
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

std::shared_ptr<FileRecord> StatusBoard::Open(const std::string& path) {
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
        return record->Snapshot().nSequence == sequence;
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
    auto closed = static_cast<size_t>(
        std::count_if(records_.begin(), records_.end(), [](const auto& record) { return !IsOpen(*record); }));
    for (auto record = records_.begin(); closed > kRemembered && record != records_.end();) {
        if (IsOpen(**record)) {
            ++record;
        } else {
            record = records_.erase(record);
            --closed;
        }
    }
}

void WriteLog(const std::string& text) {
    LogEx(L"MediaWriter::%ls\r\n", text::FromUtf8(text).c_str());
}

} // namespace writer
