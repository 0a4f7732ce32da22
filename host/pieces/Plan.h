// How a movie is converted in pieces: what everybody who makes one of them, or joins them, has to know. It
// depends on the source and the settings only, so that the output does not depend on who does what.
#ifndef MOVIECONV_HOST_PIECES_PLAN_H
#define MOVIECONV_HOST_PIECES_PLAN_H

#include "host/convert/Request.h"

#include <cstdint>
#include <filesystem>
#include <functional>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace movieconv {

/// What tells whether a file is still the one that was looked at.
struct SourceMark {
    std::string path; ///< Absolute.
    int64_t bytes = 0;
    int64_t modified = 0; ///< Nanoseconds since 1970.
    std::string head;     ///< SHA-256 of its first 64 KiB,
    std::string tail;     ///< and of its last.
    bool operator==(const SourceMark&) const = default;
};

/// How the pictures are divided; by default into pieces of a minute at least.
struct Division {
    std::optional<int> pieces;    ///< So many with the same number of pictures, 1 to kMostPieces.
    std::optional<double> length; ///< Or by time, in seconds.
    bool operator==(const Division&) const = default;
};

constexpr int kMostPieces = 10000;

/// Times are in media time, from the start of the source.
struct Piece {
    int64_t begin = 0;           ///< Stamp of its first picture.
    int64_t end = 0;             ///< Of the next piece's first; of the last one, where its last picture ends.
    int64_t until = 0;           ///< Where the pictures end that its encoder looks at, `end` or later.
    int64_t pictures = 0;        ///< Of the source.
    std::optional<int64_t> tick; ///< See PieceCut.
    bool operator==(const Piece&) const = default;
};

struct Plan {
    std::map<std::string, std::string> versions; ///< Of the program and of the libraries that matter.
    SourceMark source;
    std::vector<SourceMark> texts; ///< Files of subtitles, which the settings name.
    std::string output;            ///< Absolute.
    Request settings;              ///< Without input, output and piece.
    Division division;
    bool fromStart = false; ///< See PieceCut.
    bool hasRates = false;  ///< The pictures have a bit rate, which begins anew in every piece.
    int64_t memory = 0;     ///< Bytes that making a piece takes at most.
    std::vector<Piece>
        pictures;     ///< Behind them comes one more piece, the sound and whatever else is carried.
    std::string hash; ///< Of all the above; set by what reads and writes plans.

    int Pieces() const { return static_cast<int>(pictures.size()) + 1; }
    bool IsRest(int number) const { return number == static_cast<int>(pictures.size()); }
};

/// Of the program and of the libraries that decide what is in a piece, by name.
std::map<std::string, std::string> CurrentVersions();

/// An absolute path without detours to the same file, wherever the program runs.
std::string AbsolutePath(const std::string& path);

/// Looks at a file. Throws Failure when it cannot be read, or not twice.
SourceMark MarkOf(const std::string& path);

/// Looks at the files of subtitles that a request names, and lets it name them from anywhere. Throws Failure.
std::vector<SourceMark> MarkTexts(Request& request);

/// Throws Failure that says what differs when the source, a file of subtitles or this program is not the one
/// that was planned with.
void CheckAgainst(const Plan& plan);

/// What differs, in words; empty when nothing does. `now` need not be divided yet.
std::string Difference(const Plan& before, const Plan& now);

/// The plan of a request, a conversion of one file with pictures, as far as the source's stamps are not
/// needed. Throws Failure when that is impossible.
Plan BeginPlan(const Request& request, const Division& division);

/// Completes it: reads the source's stamps and divides it. `stopped` is asked now and then. Throws Failure
/// when that is impossible; nothing when it was stopped.
std::optional<Plan> MakePlan(Plan plan, const std::function<bool()>& stopped);

/// What pieces cost where the pictures have a bit rate, a sentence; empty where they do not.
std::string TellBitRate(const Plan& plan);

/// Reads a plan. Throws Failure when there is none of that name, or it is not as it was written.
Plan ReadPlan(const std::string& path);

/// Writes it in one step, and to the disk; sets its hash. Throws Failure.
void WritePlan(const std::string& path, Plan& plan);

/// Whether a file is what WritePlan left of a plan of that name when it was killed.
bool IsPlanInTheMaking(const std::filesystem::path& file, const std::string& path);

/// What names the files that the plan's conversion reads, and its output.
Request WholeRequest(const Plan& plan);

/// The conversion that makes a piece, 0 to Pieces() - 1, into the file `output`.
Request RequestFor(const Plan& plan, int number, const std::string& output);

} // namespace movieconv

#endif
