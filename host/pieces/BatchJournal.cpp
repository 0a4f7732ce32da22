#include "host/pieces/BatchJournal.h"

#include "host/convert/Failure.h"
#include "host/pieces/CheckedLine.h"
#include "host/pieces/Digest.h"
#include "host/pieces/WholeFile.h"
#include "text/Path.h"

#include <fmt/format.h>
#include <sstream>
#include <unistd.h>

namespace movieconv {
namespace {

constexpr int64_t kLargestJournal = 256 << 20;

std::string HashOf(const SourceMark& mark) {
    return DigestOf(
        fmt::format("{}\n{}\n{}\n{}\n{}", mark.path, mark.bytes, mark.modified, mark.head, mark.tail));
}

std::string TaskOf(const SourceMark& source, const std::string& settings) {
    return DigestOf(HashOf(source) + "\n" + settings);
}

} // namespace

BatchJournal::BatchJournal(const std::string& folder) : path_(folder + "/movieconv.journal") {
    if (access(path_.c_str(), F_OK) == 0)
        Read(ReadWhole(path_, kLargestJournal));
}

void BatchJournal::Read(const std::string& text) {
    std::istringstream lines(text);
    for (std::string line; std::getline(lines, line);) {
        const std::optional<Json> entry = ObjectOn(line);
        const auto part = [&entry](const char* name) { return entry->at(name).get<std::string>(); };
        if (entry)
            entries_[part("output")] = {part("state") == "done", part("task"), part("result")};
        else if (!line.empty()) // see Note
            ++damaged_;
    }
}

BatchJournal::State BatchJournal::StateOf(const std::string& output, const SourceMark& source,
                                          const std::string& settings) const {
    const std::lock_guard lock(mutex_);
    const auto found = entries_.find(text::NameOf(output));
    if (found == entries_.end() || found->second.task != TaskOf(source, settings))
        return State::kUnknown;
    if (!found->second.done)
        return State::kBegun;
    const bool stands = access(output.c_str(), F_OK) == 0 && HashOf(MarkOf(output)) == found->second.result;
    return stands ? State::kDone : State::kUnknown;
}

void BatchJournal::NoteBegun(const std::string& output, const SourceMark& source,
                             const std::string& settings) {
    Note(output, {false, TaskOf(source, settings), {}});
}

void BatchJournal::NoteDone(const std::string& output, const SourceMark& source,
                            const std::string& settings) {
    Note(output, {true, TaskOf(source, settings), HashOf(MarkOf(output))});
}

void BatchJournal::Note(const std::string& output, const Entry& entry) {
    const std::string name = text::NameOf(output);
    const std::string line = CheckedLine({{"state", entry.done ? "done" : "begun"},
                                          {"output", name},
                                          {"task", entry.task},
                                          {"result", entry.result}});
    const std::lock_guard lock(mutex_);
    // A line that was cut by a crash ends here; behind a whole one it is empty.
    AppendWhole(path_, (entries_.empty() && damaged_ == 0 ? "" : "\n") + line);
    entries_[name] = entry;
}

} // namespace movieconv
