// A plan and its pieces, as they lie beside each other on the disk.
#ifndef MOVIECONV_HOST_PIECES_PLANSTORE_H
#define MOVIECONV_HOST_PIECES_PLANSTORE_H

#include "host/pieces/Plan.h"

#include <optional>
#include <string>
#include <utility>

namespace movieconv {

/// What becomes of what an earlier run left.
enum class IfThere {
    kRefuse,  ///< Pieces of the same conversion stay, and nothing is made.
    kReplace, ///< Everything is made anew.
    kResume,  ///< The same conversion is gone on with.
};

class PlanStore {
public:
    explicit PlanStore(std::string path) : path_(std::move(path)) {}

    /// The plan that somebody made, to join its pieces or make one. Throws Failure when that is impossible.
    Plan Given(std::optional<int> piece) const;

    /// Throws Failure, before the source is read, where the pieces of a conversion cannot have their names.
    void CheckPlaces(const Request& request) const;

    struct Leftover {
        std::optional<Plan> plan; ///< To be gone on with.
        std::string removed = {}; ///< A sentence on what else there was.
    };

    /// Makes room for the plan `now` of a conversion, or finds the one to go on with. Throws Failure where
    /// neither may be.
    Leftover Take(const Plan& now, const Request& request, IfThere ifThere) const;

private:
    Plan Own() const;

    const std::string path_;
};

} // namespace movieconv

#endif
