#include "host/terminal/SideFileCheck.h"

#include "host/convert/Failure.h"
#include "host/convert/OutputCheck.h"
#include "host/pieces/OutputNames.h"
#include "host/pieces/PieceRequest.h"
#include "host/pieces/PlanText.h"
#include "host/terminal/Preview.h"
#include "text/FileNames.h"

#include <algorithm>
#include <fmt/format.h>
#include <optional>
#include <string>

namespace movieconv {
namespace {

bool IsOneOfMany(const std::string& path, const Options& options) {
    return std::any_of(options.inputs.begin(), options.inputs.end(),
                       [&](const std::string& input) { return AreSame(path, input); });
}

/// The plan alone tells what a piece, or the joining, reads and makes.
Written WrittenBy(const Options& options) {
    if (options.into)
        return {options.request, {}, *options.into};
    if (options.task == Task::kPiece || options.task == Task::kJoin)
        return {WholeRequest(ReadPlan(options.request.input)), options.request.input, {}};
    return {options.request, options.jobs ? PlanPathFor(options.request.output) : std::string(), {}};
}

void CheckSideFile(const char* option, const std::string& path, const Options& options) {
    const Written written = WrittenBy(options);
    const bool isRead = IsOneOfMany(path, options);
    std::string role = isRead ? "the source itself" : WhatIsReadFrom(path, written.request).Text();
    if (const char* other = RoleAmongOutputs(path, written); role.empty() && other != nullptr)
        role = other;
    if (!role.empty()) {
        throw Failure(Category::kRequest,
                      fmt::format("{} \"{}\" is {}; give it another name", option, path, role));
    }
}

void CheckPair(const char* option, const std::optional<std::string>& path, const char* other,
               const std::optional<std::string>& otherPath) {
    if (path && otherPath && (*path == *otherPath || AreSame(*path, *otherPath)))
        throw Failure(Category::kRequest, fmt::format("{} and {} name the same file", option, other));
}

} // namespace

void CheckSideFiles(const Options& options) {
    if (options.log)
        CheckSideFile("--log", *options.log, options);
    if (options.plan)
        CheckSideFile("--plan", *options.plan, options);
    if (options.preview) {
        CheckSideFile("--preview", *options.preview, options);
        CheckName(*options.preview, text::PartialSuffix(text::kMostPartials));
        CheckPreview(*options.preview, options.request.overwrite);
    }
    CheckPair("--log", options.log, "--preview", options.preview);
    CheckPair("--log", options.log, "--plan", options.plan);
}

} // namespace movieconv
