#include "host/pieces/BatchJournal.h"

#include "host/convert/Failure.h"
#include "host/pieces/CheckedLine.h"
#include "host/pieces/Digest.h"
#include "host/pieces/FileBirth.h"
#include "host/pieces/MarkText.h"
#include "host/pieces/OutputNames.h"
#include "host/pieces/WholeFile.h"
#include "text/Path.h"

#include <fmt/format.h>
#include <sstream>
#include <stdexcept>
#include <string_view>
#include <sys/stat.h>
#include <unistd.h>

namespace movieconv {
namespace {

constexpr int64_t kLargestJournal = 256 << 20;
constexpr std::string_view kLineHead = "{\"state\":"; // with which Note begins

std::string TaskOf(const SourceMark& source, const std::string& settings) {
    return DigestOf(HashOf(source) + "\n" + settings);
}

} // namespace

BatchJournal::BatchJournal(const std::string& folder) : path_(JournalIn(folder)) {
    struct stat status {};
    if (lstat(path_.c_str(), &status) != 0)
        return;
    const std::string text = S_ISREG(status.st_mode) ? ReadWhole(path_, kLargestJournal) : std::string();
    Read(text);
    // Of a first line that a crash has cut there may be little.
    const bool ours = !entries_.empty() || text.compare(0, kLineHead.size(), kLineHead, 0, text.size()) == 0;
    if (!S_ISREG(status.st_mode) || !ours)
        throw Failure(
            Category::kOutput,
            fmt::format("\"{}\" is no journal of conversions; choose another folder, or remove it", path_));
}

void BatchJournal::Read(const std::string& text) {
    std::istringstream lines(text);
    for (std::string line; std::getline(lines, line);)
        if (!line.empty() && !Enter(ObjectOn(line))) // empty ones: see Note
            ++damaged_;
}

/// Whether it is of this kind.
bool BatchJournal::Enter(const std::optional<Json>& line) {
    try {
        if (line)
            entries_[NameFromJson(line->at("output"))] = {
                line->at("state").get<std::string>() == "done", line->at("task").get<std::string>(),
                line->at("result").get<std::string>(),
                line->contains("temporary") ? NameFromJson(line->at("temporary")) : ""};
        return line.has_value();
    } catch (const Json::exception&) {
        return false;
    } catch (const std::invalid_argument&) {
        return false;
    }
}

BatchJournal::State BatchJournal::StateOf(const std::string& output, const SourceMark& source,
                                          const std::string& settings) const {
    const std::lock_guard lock(mutex_);
    const auto found = entries_.find(text::NameOf(output));
    if (found == entries_.end() || found->second.task != TaskOf(source, settings))
        return State::kUnknown;
    if (!found->second.done)
        return BirthOf(output) == found->second.result ? State::kBegun : State::kUnknown;
    const bool stands = access(output.c_str(), F_OK) == 0 && HashOf(MarkOf(output)) == found->second.result;
    return stands ? State::kDone : State::kUnknown;
}

/// What stands there under that name can be somebody else's by now.
std::optional<std::string> BatchJournal::Unfinished(const std::string& output) const {
    const std::lock_guard lock(mutex_);
    const auto found = entries_.find(text::NameOf(output));
    if (found == entries_.end() || found->second.temporary.empty())
        return std::nullopt;
    std::string left = text::FolderOf(path_) + "/" + text::NameOf(found->second.temporary);
    const std::string birth = BirthOf(left);
    return !birth.empty() && birth == found->second.result ? std::optional(std::move(left)) : std::nullopt;
}

void BatchJournal::NoteBegun(const std::string& output, const SourceMark& source, const std::string& settings,
                             const std::string& temporary) {
    Note(output, {false, TaskOf(source, settings), BirthOf(temporary, output), text::NameOf(temporary)});
}

void BatchJournal::NoteDone(const std::string& output, const SourceMark& source,
                            const std::string& settings) {
    Note(output, {true, TaskOf(source, settings), HashOf(MarkOf(output))});
}

void BatchJournal::Note(const std::string& output, const Entry& entry) {
    const std::string name = text::NameOf(output);
    Json object{{"state", entry.done ? "done" : "begun"},
                {"output", NameAsJson(name)},
                {"task", entry.task},
                {"result", entry.result}};
    if (!entry.done)
        object["temporary"] = NameAsJson(entry.temporary);
    const std::string line = CheckedLine(object);
    const std::lock_guard lock(mutex_);
    // A line that was cut by a crash ends here; behind a whole one it is empty.
    AppendWhole(path_, (entries_.empty() && damaged_ == 0 ? "" : "\n") + line);
    entries_[name] = entry;
}

} // namespace movieconv
