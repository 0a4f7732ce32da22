// What files consist of: the boxes of MP4 and the elements of Matroska, one behind another and within each
// other.
#ifndef MOVIECONV_HOST_SOURCE_CONTAINERPARTS_H
#define MOVIECONV_HOST_SOURCE_CONTAINERPARTS_H

#include "host/source/InputFile.h"

#include <cstdint>
#include <functional>
#include <optional>
#include <string>

namespace movieconv {

/// What a box or an element says of itself.
struct PartHead {
    static constexpr int64_t kOpen = -1;

    uint64_t name = 0;    ///< As a number, with the marker bits of Matroska.
    int64_t headSize = 0; ///< Bytes.
    int64_t size = 0; ///< With its head, whether the file has so much or not; kOpen: up to the end of what
                      ///< holds it.
};

/// A number of Matroska's: the zeros in front of its first bit tell how many bytes it has.
struct MarkedNumber {
    uint64_t value = 0;
    int length = 0; ///< Bytes; 0 when there are more than allowed.
};

/// `bytes` are as many as are allowed; the first bit is part of the value if `keepMark`.
MarkedNumber ReadMarkedNumber(const uint8_t* bytes, int mostBytes, bool keepMark);

/// Nothing where no head is whole at that place of the file, or it makes no sense.
std::optional<PartHead> ReadBoxHead(const InputFile& file, int64_t at);
std::optional<PartHead> ReadElementHead(const InputFile& file, int64_t at);

/// What is between `begin` and `end` of the file, without its head. Empty where nothing was found.
struct Part {
    uint64_t name = 0;
    int64_t begin = 0;
    int64_t end = 0;
};

/// Looks for parts within parts. Looks at no more of them than any real file has before its packets, so that
/// it comes to its end whatever the file says.
class Parts {
public:
    using ReadHead = std::optional<PartHead> (*)(const InputFile& file, int64_t at);

    Parts(const InputFile& file, ReadHead read) : file_(file), read_(read) {}

    Part Whole() const { return {0, 0, file_.Size()}; }

    /// The part at `at`; an empty one where there is none that ends at `end` or before.
    Part At(int64_t at, int64_t end) const;

    /// Calls `take` with each part of `whole`, until it returns false.
    void ForEach(const Part& whole, const std::function<bool(const Part&)>& take);

    /// The first one of that name that comes before one of the name `last`; an empty one without it.
    Part Find(const Part& whole, uint64_t name, uint64_t last = 0);

    /// What is in a part, but for `skip` bytes, up to a byte of 0; empty when there is more than `most`.
    std::string Text(const Part& part, int64_t skip, int64_t most) const;

    /// The number in a part of 1 to 8 bytes, the highest first; 0 for any other.
    uint64_t Number(const Part& part) const;

private:
    const InputFile& file_;
    const ReadHead read_;
    int left_ = 100'000;
};

} // namespace movieconv

#endif
