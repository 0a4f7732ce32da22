#include "host/pieces/BatchJournal.h"

#include "host/convert/Failure.h"
#include "host/pieces/Digest.h"
#include "host/pieces/SettingsText.h"
#include "host/pieces/WholeFile.h"

#include <filesystem>
#include <fmt/format.h>
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

std::string NameOf(const std::string& path) {
    return std::filesystem::path(path).filename().string();
}

std::string CheckOf(const std::string& state, const std::string& output, const std::string& task,
                    const std::string& result) {
    return DigestOf(fmt::format("{}\n{}\n{}\n{}", state, output, task, result));
}

} // namespace

BatchJournal::BatchJournal(const std::string& folder) : path_(folder + "/movieconv.journal") {
    if (access(path_.c_str(), F_OK) == 0)
        Read(ReadWhole(path_, kLargestJournal));
}

void BatchJournal::Read(const std::string& text) {
    for (std::size_t at = 0; at < text.size();) {
        const std::size_t end = std::min(text.find('\n', at), text.size());
        const Json line = Json::parse(text.substr(at, end - at), nullptr, false);
        at = end + 1;
        const auto part = [&line](const char* name) {
            return line.is_object() && line.contains(name) && line.at(name).is_string()
                       ? line.at(name).get<std::string>()
                       : std::string();
        };
        const std::string output = part("output");
        const Entry entry{part("state") == "done", part("task"), part("result")};
        if (part("check") == CheckOf(part("state"), output, entry.task, entry.result))
            entries_[output] = entry;
        else
            ++damaged_;
    }
}

BatchJournal::State BatchJournal::StateOf(const std::string& output, const SourceMark& source,
                                          const std::string& settings) const {
    const std::lock_guard lock(mutex_);
    const auto found = entries_.find(NameOf(output));
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
    const std::string name = NameOf(output);
    const std::string state = entry.done ? "done" : "begun";
    const Json line{{"state", state},
                    {"output", name},
                    {"task", entry.task},
                    {"result", entry.result},
                    {"check", CheckOf(state, name, entry.task, entry.result)}};
    const std::lock_guard lock(mutex_);
    // A line that was cut by a crash ends here.
    AppendWhole(path_, (entries_.empty() && damaged_ == 0 ? "" : "\n") +
                           line.dump(-1, ' ', false, Json::error_handler_t::replace) + "\n");
    entries_[name] = entry;
}

} // namespace movieconv
