#include "host/pieces/PlanStore.h"

#include "host/convert/Failure.h"
#include "host/convert/OutputCheck.h"
#include "host/pieces/OutputNames.h"
#include "host/pieces/PiecePlaces.h"
#include "host/pieces/PieceRequest.h"
#include "host/pieces/PlanText.h"
#include "host/pieces/WholeFile.h"
#include "text/FileNames.h"

#include <filesystem>
#include <fmt/format.h>
#include <system_error>

namespace movieconv {

Plan PlanStore::Given(std::optional<int> piece) const {
    Plan plan = ReadPlan(path_);
    if (piece && (*piece < 0 || *piece >= plan.Pieces()))
        throw Failure(Category::kRequest,
                      fmt::format("the plan has the pieces 0 to {}, no piece {}", plan.Pieces() - 1, *piece));
    if (piece)
        RequirePlaces(path_, WholeRequest(plan), piece);
    return plan;
}

void PlanStore::CheckPlaces(const Request& request) const {
    const std::string longest = NameInTheMaking(PiecePath(path_, kMostPieces)) + text::PartialSuffix(1);
    try {
        CheckName(longest);
    } catch (const Failure& failure) {
        throw Failure(failure.Kind(),
                      fmt::format("the name \"{}\" is too long for a conversion in pieces, whose "
                                  "files have longer ones; choose a shorter one",
                                  request.output));
    }
    RequirePlaces(path_, request, std::nullopt);
}

PlanStore::Leftover PlanStore::Take(const Plan& now, const Request& request, IfThere ifThere) const {
    std::error_code unknown;
    const bool planned = exists(std::filesystem::symlink_status(path_, unknown));
    const int pieces = CountPieces(path_);
    const bool resume = ifThere == IfThere::kResume;
    const std::optional<Plan> before = planned ? std::optional(Own()) : std::nullopt;
    const std::string difference = before ? Difference(*before, now) : std::string();
    if (before && resume && !difference.empty())
        throw Failure(Category::kRequest,
                      fmt::format("\"{}\" is of another conversion: {}", path_, difference),
                      Reason::kCannotResume);
    if (before && resume)
        return {before};
    if (before && pieces > 0 && ifThere == IfThere::kRefuse && difference.empty())
        throw Failure(Category::kOutput,
                      fmt::format("{} of {} pieces are left of an earlier run beside \"{}\"", pieces,
                                  before->Pieces(), path_),
                      Reason::kLeftover);
    RemovePieces(path_, request);
    if (std::error_code error; planned && !remove(std::filesystem::path(path_), error) && error)
        throw Failure(Category::kOutput,
                      fmt::format("\"{}\" of an earlier run cannot be removed: {}", path_, error.message()));
    if (resume || (!planned && pieces == 0))
        return {};
    return {std::nullopt,
            fmt::format("\"{}\" with {} pieces was left of an earlier run; it is made anew", path_, pieces)};
}

/// The plan that is there. Throws Failure when that is something else, which must not be lost: nobody has
/// named it, so leave to replace the output is none to replace another file.
Plan PlanStore::Own() const {
    try {
        return ReadPlan(path_);
    } catch (const Failure& failure) {
        throw Failure(Category::kOutput,
                      fmt::format("the plan would replace another file: {}; give the output another name, or "
                                  "remove that file",
                                  failure.Text()));
    }
}

} // namespace movieconv
