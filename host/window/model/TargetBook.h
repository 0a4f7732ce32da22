// Which names the queue's files have, and so which names are taken.
#ifndef MOVIECONV_HOST_WINDOW_MODEL_TARGETBOOK_H
#define MOVIECONV_HOST_WINDOW_MODEL_TARGETBOOK_H

#include "host/window/model/Entry.h"

#include <string>
#include <unordered_map>
#include <vector>

namespace movieconv::window {

/// Knows the entries' targets as they were, and as it is told since. What lies on the disk is not its matter.
class TargetBook {
public:
    explicit TargetBook(const std::vector<Entry>& entries);

    /// An entry goes elsewhere.
    void Move(const std::string& from, const std::string& to);
    /// Whether that name is the entry's source's or another entry's target.
    bool IsTaken(const std::string& path, const Entry& entry) const;
    /// Whether several entries go there.
    bool IsShared(const std::string& path) const { return CountOf(path) > 1; }

private:
    int CountOf(const std::string& path) const;

    std::unordered_map<std::string, int> counts_; // how many entries go there
};

} // namespace movieconv::window

#endif
