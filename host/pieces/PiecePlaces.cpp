#include "host/pieces/PiecePlaces.h"

#include "host/convert/Failure.h"
#include "host/convert/OutputCheck.h"
#include "host/pieces/OutputNames.h"
#include "host/pieces/PlanText.h"
#include "host/pieces/WholeFile.h"
#include "host/sentence/Say.h"
#include "text/FileNames.h"
#include "text/Path.h"

#include <algorithm>
#include <filesystem>
#include <fmt/format.h>
#include <string_view>
#include <system_error>
#include <vector>

namespace movieconv {
namespace {

constexpr std::string_view kPieceHead = "MCPIECE1"; // with which the media writer begins one

/// The number of the piece whose name a file has.
std::optional<int> PieceNumber(const std::filesystem::path& file, const std::string& planPath) {
    const std::string name = file.filename().string();
    const std::optional<int> number = NumberIn(name, planPath);
    return number && name == text::NameOf(PiecePath(planPath, *number)) ? number : std::nullopt;
}

/// A name without what the media writer puts behind it until the file is complete.
std::string WithoutPartialSuffix(const std::string& name) {
    const std::size_t end = name.rfind(text::kPartialSuffix);
    for (int number = 1; end != std::string::npos && number <= text::kMostPartials; ++number)
        if (name.compare(end, std::string::npos, text::PartialSuffix(number)) == 0)
            return name.substr(0, end);
    return name;
}

/// Whether it is what a process left that was killed while it made a piece.
bool IsUnfinishedPiece(const std::filesystem::path& file, const std::string& planPath) {
    const std::string name = WithoutPartialSuffix(file.filename().string());
    const std::optional<int> number = NumberIn(name, planPath);
    return number && IsInTheMaking(name, PiecePath(planPath, *number)) && BeginsLike(file, kPieceHead);
}

/// The files that belong to a plan of that name, but for itself.
std::vector<std::filesystem::path> FilesOf(const std::string& planPath) {
    std::vector<std::filesystem::path> files = FilesThatBegin(planPath);
    const auto isOther = [&planPath](const std::filesystem::path& file) {
        const bool isPiece = PieceNumber(file, planPath) && BeginsLike(file, kPieceHead);
        return !isPiece && !IsUnfinishedPiece(file, planPath) && !IsPlanInTheMaking(file, planPath);
    };
    files.erase(std::remove_if(files.begin(), files.end(), isOther), files.end());
    return files;
}

} // namespace

void RequirePlaces(const std::string& planPath, const Request& request, std::optional<int> only) {
    for (const std::filesystem::path& file : FilesThatBegin(planPath)) {
        const std::optional<int> number = PieceNumber(file, planPath);
        if (!number || (only && number != only))
            continue;
        if (const Sentence role = WhatIsReadFrom(file.string(), request); !role.IsEmpty())
            throw Failure(Category::kRequest, Say("\"{}\" is {}, and has the name of a piece that is to "
                                                  "be made; rename it, or give the output another name",
                                                  file.string(), role));
        if (!BeginsLike(file, kPieceHead))
            throw Failure(Category::kOutput,
                          fmt::format("a piece would replace another file, \"{}\"; rename or "
                                      "remove it, or give the output another name",
                                      file.string()));
    }
}

int CountPieces(const std::string& planPath) {
    const auto files = FilesOf(planPath);
    return static_cast<int>(std::count_if(files.begin(), files.end(), [&](const std::filesystem::path& file) {
        return PieceNumber(file, planPath).has_value();
    }));
}

void RemovePieces(const std::string& planPath, const Request& request) {
    std::error_code ignored;
    for (const std::filesystem::path& file : FilesOf(planPath))
        if (WhatIsReadFrom(file.string(), request).IsEmpty())
            std::filesystem::remove(file, ignored);
}

} // namespace movieconv
