// The registered sets of options, and the files that belong to each; see writer/WriterStatus.h.
#ifndef MOVIECONV_WRITER_OPTIONSETS_H
#define MOVIECONV_WRITER_OPTIONSETS_H

#include "media/EncodeParam.h"
#include "writer/Extras.h"
#include "writer/FileRecord.h"
#include "writer/WriterStatus.h"

#include <cstdint>
#include <map>
#include <memory>
#include <mutex>
#include <optional>
#include <string_view>
#include <utility>
#include <vector>

namespace writer {

/// The caller's record, of whatever size its program was built with; what that does not have is 0. Nothing
/// when it is null, smaller than the first version, or asks for what this version does not know.
std::optional<WriterOptions> ReadOptions(const WriterOptions* options);

/// Copies as much of the status as the caller's record has room for. False when that is null or too small.
bool CopyStatus(const WriterStatus& from, WriterStatus* to);

/// One set and its files. Thread-safe. Lives for as long as it is registered or one of its files is open.
class OptionSet {
public:
    OptionSet(uint32_t number, const WriterOptions& options) : number_(number), options_(options) {}

    void SetOptions(const WriterOptions& options);
    WriterOptions Options() const;

    /// Changes what files carry that are opened from now on; `change` tells whether it did.
    template <typename Change>
    bool ChangeExtras(Change change) {
        const std::lock_guard lock(mutex_);
        auto changed = std::make_shared<Extras>(*extras_);
        if (!change(*changed))
            return false;
        extras_ = std::move(changed);
        return true;
    }

    /// What files carry that are opened from now on.
    std::shared_ptr<const Extras> ExtraParts() const;

    /// Gives the next number of this set to a file named `path`.
    std::shared_ptr<FileRecord> Open(std::string_view path);

    /// Told on a record that is in no list, where there is no memory for one that is.
    FileRecord Unlisted() const { return {number_, 0, "", Options(), nullptr}; }

    int Count() const;

    /// Null when the number was never given out or the file is forgotten.
    std::shared_ptr<const FileRecord> Find(int sequence) const;

    /// The latest file with an error; null when there is none.
    std::shared_ptr<const FileRecord> LastFailure() const;

private:
    void ForgetOld();

    const uint32_t number_;
    mutable std::mutex mutex_;
    WriterOptions options_;
    std::shared_ptr<const Extras> extras_ = std::make_shared<Extras>();
    int count_ = 0;
    std::vector<std::shared_ptr<FileRecord>> records_; ///< Rising numbers.
};

/// All sets of the process. Thread-safe.
class OptionSets {
public:
    static OptionSets& Instance();

    /// The number of the new set.
    uint32_t Register(const WriterOptions& options);
    /// False when there is none of that number, or when it is the default set, which always exists.
    bool Unregister(uint32_t number);

    /// Null when there is none of that number.
    std::shared_ptr<OptionSet> Find(uint32_t number) const;

    /// The set that the parameters of a file name: the default one when they name none, null when it is not
    /// registered (any more).
    std::shared_ptr<OptionSet> Named(const EncodeParam* param) const;

private:
    OptionSets();

    mutable std::mutex mutex_;
    uint32_t registered_ = 0;
    std::map<uint32_t, std::shared_ptr<OptionSet>> sets_;
};

} // namespace writer

#endif
