#include "host/window/model/TargetBook.h"

namespace movieconv::window {

TargetBook::TargetBook(const std::vector<Entry>& entries) {
    for (const Entry& entry : entries)
        ++counts_[entry.target];
}

void TargetBook::Move(const std::string& from, const std::string& to) {
    if (const auto old = counts_.find(from); old != counts_.end())
        --old->second;
    ++counts_[to];
}

bool TargetBook::IsTaken(const std::string& path, const Entry& entry) const {
    const int own = path == entry.target ? 1 : 0;
    return path == entry.source || CountOf(path) > own;
}

int TargetBook::CountOf(const std::string& path) const {
    const auto found = counts_.find(path);
    return found == counts_.end() ? 0 : found->second;
}

} // namespace movieconv::window
