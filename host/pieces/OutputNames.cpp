#include "host/pieces/OutputNames.h"

#include "host/convert/OutputCheck.h"
#include "host/pieces/Plan.h"
#include "text/Path.h"

#include <charconv>
#include <fmt/format.h>

namespace movieconv {
namespace {

/// Also before one of them is there.
bool IsNamed(const std::string& path, const std::string& name) {
    return AreSame(path, name) ||
           (text::NameOf(path) == text::NameOf(name) && AreSame(text::FolderOf(path), text::FolderOf(name)));
}

/// A piece of the plan, also one in the making.
bool IsNamedAsPiece(const std::string& path, const std::string& planPath) {
    return NumberIn(text::NameOf(path), planPath) && AreSame(text::FolderOf(path), text::FolderOf(planPath));
}

} // namespace

std::string PlanPathFor(const std::string& output) {
    return output + ".plan";
}

std::string LockPathFor(const std::string& planPath) {
    return planPath + ".lock";
}

std::string PiecePath(const std::string& planPath, int number) {
    return fmt::format("{}.{:04}.piece", planPath, number);
}

std::optional<int> NumberIn(const std::string& name, const std::string& planPath) {
    const std::string plan = text::NameOf(planPath) + ".";
    int number = -1;
    if (name.starts_with(plan))
        std::from_chars(name.data() + plan.size(), name.data() + name.size(), number);
    const bool isNumber =
        number >= 0 && number <= kMostPieces && name.starts_with(text::NameOf(PiecePath(planPath, number)));
    return isNumber ? std::optional(number) : std::nullopt;
}

std::string ClipListFor(const std::string& output) {
    return output + ".clips";
}

std::string JournalIn(const std::string& folder) {
    return folder + "/movieconv.journal";
}

const char* RoleAmongOutputs(const std::string& path, const Written& written) {
    const std::string& output = written.request.output;
    const std::string& plan = written.planPath;
    if (!output.empty() && IsOutput(path, written.request))
        return "the output or a part of it";
    const std::string list = ClipListFor(output);
    if (!output.empty() && written.request.split && (IsNamed(path, list) || IsNamed(path, LockPathFor(list))))
        return "the list of the output's clips, or what guards it";
    if (!plan.empty() && (IsNamed(path, plan) || IsNamed(path, LockPathFor(plan))))
        return "the plan of the output's pieces, or what guards it";
    if (!plan.empty() && IsNamedAsPiece(path, plan))
        return "a piece of the output";
    if (!written.folder.empty() && IsNamed(path, JournalIn(written.folder)))
        return "the journal of what is converted into that folder";
    return nullptr;
}

} // namespace movieconv
