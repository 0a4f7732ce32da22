// How a movie is converted in pieces: what everybody who makes one of them, or joins them, has to know. It
// depends on the source and the settings only, so that the output does not depend on who does what.
#ifndef MOVIECONV_HOST_PIECES_PLAN_H
#define MOVIECONV_HOST_PIECES_PLAN_H

#include "host/convert/Request.h"
#include "host/pieces/SourceMark.h"

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace movieconv {

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
    int64_t drawnSince = 0;      ///< See PieceCut.
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

} // namespace movieconv

#endif
