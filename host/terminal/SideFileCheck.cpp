#include "host/terminal/SideFileCheck.h"

#include "host/convert/Failure.h"
#include "host/convert/OutputCheck.h"
#include "host/pieces/BatchJournal.h"
#include "host/terminal/Preview.h"
#include "text/FileNames.h"
#include "text/Path.h"

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

/// With --into, also before it is there.
bool IsJournal(const std::string& path, const Options& options) {
    return options.into && text::NameOf(path) == BatchJournal::kName &&
           AreSame(text::FolderOf(path), *options.into);
}

void CheckSideFile(const char* option, const std::string& path, const Options& options) {
    const Request& request = options.request;
    const char* other = IsOneOfMany(path, options) ? "the source itself" : WhatIsReadFrom(path, request);
    if (other == nullptr && !request.output.empty() && IsOutput(path, request))
        other = "the output or a part of it";
    if (IsJournal(path, options))
        other = "the journal of what is converted into that folder";
    if (other != nullptr) {
        throw Failure(Category::kRequest,
                      fmt::format("{} \"{}\" is {}; give it another name", option, path, other));
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
