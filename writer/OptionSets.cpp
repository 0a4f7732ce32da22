#include "writer/OptionSets.h"

#include <algorithm>
#include <cstddef>
#include <cstring>

namespace writer {
namespace {

constexpr size_t kRemembered = 64;

/// Numbers of sets: unlikely to stand in a reserved word by chance.
constexpr uint32_t kFirstNumber = 0x5E700001;
constexpr uint32_t kLastNumber = 0x5E7FFFFF;

/// Sizes of the records in their first version, and what no later one will reach.
constexpr size_t kLeastOptions = offsetof(WriterOptions, pContext) + sizeof(WriterOptions::pContext);
constexpr size_t kMostOptions = 4096;
constexpr size_t kLeastStatus =
    offsetof(WriterStatus, szTemporaryPath) + sizeof(WriterStatus::szTemporaryPath);

} // namespace

std::optional<WriterOptions> ReadOptions(const WriterOptions* options) {
    if (options == nullptr || options->nSize < kLeastOptions || options->nSize > kMostOptions)
        return std::nullopt;
    const auto* bytes = reinterpret_cast<const unsigned char*>(options);
    if (options->nSize > sizeof *options && std::any_of(bytes + sizeof *options, bytes + options->nSize,
                                                        [](unsigned char byte) { return byte != 0; }))
        return std::nullopt;
    WriterOptions known{};
    std::memcpy(&known, options, std::min<size_t>(options->nSize, sizeof known));
    return known;
}

bool CopyStatus(const WriterStatus& from, WriterStatus* to) {
    if (to == nullptr || to->nSize < kLeastStatus)
        return false;
    const uint32_t size = std::min<uint32_t>(to->nSize, sizeof from);
    std::memcpy(to, &from, size);
    to->nSize = size;
    return true;
}

void OptionSet::SetOptions(const WriterOptions& options) {
    const std::lock_guard lock(mutex_);
    options_ = options;
}

WriterOptions OptionSet::Options() const {
    const std::lock_guard lock(mutex_);
    return options_;
}

std::shared_ptr<const Extras> OptionSet::ExtraParts() const {
    const std::lock_guard lock(mutex_);
    return extras_;
}

std::shared_ptr<FileRecord> OptionSet::Open(std::string_view path) {
    const std::lock_guard lock(mutex_);
    auto record = std::make_shared<FileRecord>(number_, count_ + 1, path, options_, extras_);
    records_.push_back(record);
    ++count_;
    ForgetOld();
    return record;
}

int OptionSet::Count() const {
    const std::lock_guard lock(mutex_);
    return count_;
}

std::shared_ptr<const FileRecord> OptionSet::Find(int sequence) const {
    const std::lock_guard lock(mutex_);
    const auto found = std::find_if(records_.begin(), records_.end(), [sequence](const auto& record) {
        return record->Sequence() == sequence;
    });
    return found == records_.end() ? nullptr : *found;
}

std::shared_ptr<const FileRecord> OptionSet::LastFailure() const {
    const std::lock_guard lock(mutex_);
    const auto found =
        std::find_if(records_.rbegin(), records_.rend(), [](const auto& record) { return record->Failed(); });
    return found == records_.rend() ? nullptr : *found;
}

void OptionSet::ForgetOld() {
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

OptionSets::OptionSets() {
    sets_.emplace(kWriterDefaultSet, std::make_shared<OptionSet>(kWriterDefaultSet, WriterOptions{}));
}

OptionSets& OptionSets::Instance() {
    static OptionSets sets;
    return sets;
}

uint32_t OptionSets::Register(const WriterOptions& options) {
    const std::lock_guard lock(mutex_);
    constexpr uint32_t kNumbers = kLastNumber - kFirstNumber + 1;
    uint32_t number;
    do { // a number comes back only after a million others
        number = kFirstNumber + registered_++ % kNumbers;
    } while (sets_.count(number) != 0);
    sets_.emplace(number, std::make_shared<OptionSet>(number, options));
    return number;
}

bool OptionSets::Unregister(uint32_t number) {
    const std::lock_guard lock(mutex_);
    return number != kWriterDefaultSet && sets_.erase(number) != 0;
}

std::shared_ptr<OptionSet> OptionSets::Find(uint32_t number) const {
    const std::lock_guard lock(mutex_);
    const auto found = sets_.find(number);
    return found == sets_.end() ? nullptr : found->second;
}

std::shared_ptr<OptionSet> OptionSets::Named(const EncodeParam* param) const {
    constexpr uint32_t kDefault = kWriterDefaultSet;
    const uint32_t word = param == nullptr ? kDefault : param->nReserved[kWriterSetWord];
    return Find(word >= kFirstNumber && word <= kLastNumber ? word : kDefault);
}

} // namespace writer
