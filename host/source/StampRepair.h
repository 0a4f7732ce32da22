// Makes rising stamps of whatever stamps a picture stream carries.
#ifndef MOVIECONV_HOST_SOURCE_STAMPREPAIR_H
#define MOVIECONV_HOST_SOURCE_STAMPREPAIR_H

#include <cstdint>
#include <optional>

namespace movieconv {

/// Looks one picture ahead: a stamp is judged by its neighbours. Stamps that rise pass unchanged; a missing,
/// equal or falling one, and a single one that jumps ahead of all that follow, is put between its neighbours.
/// Media time.
class StampRepair {
public:
    struct Stamp {
        int64_t time = 0;
        int64_t duration =
            0; ///< To the next picture's stamp; the last one's as it is told, else the usual distance.
    };

    /// `step` is the usual distance between pictures.
    explicit StampRepair(int64_t step) : step_(step) {}

    /// Takes a picture's stamp, nothing when it has none, and gives the stamp of the picture before it;
    /// nothing for the first.
    std::optional<Stamp> Push(std::optional<int64_t> stamp);

    /// The stamp of the last picture; nothing when there was none. `told`: what the source tells of the
    /// picture that it shows last, which counts if that is this one.
    std::optional<Stamp> Finish(std::optional<Stamp> told = std::nullopt);

    /// Stamps that were changed.
    int Repaired() const { return repaired_; }

private:
    struct Held {
        std::optional<int64_t> stamp;
    };

    Stamp Settle(std::optional<int64_t> next);

    const int64_t step_;
    std::optional<Held> held_;
    std::optional<int64_t> last_; // the stamp given out last
    int repaired_ = 0;
};

} // namespace movieconv

#endif
