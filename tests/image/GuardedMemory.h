// Memory for tests of code that must not touch one byte too many: an inaccessible page on either side, and
// guard bytes between the block in use and the pages.
#ifndef MOVIECONV_TESTS_IMAGE_GUARDEDMEMORY_H
#define MOVIECONV_TESTS_IMAGE_GUARDEDMEMORY_H

#include <cstddef>
#include <cstdint>
#include <span>

/// Where a block lies between the inaccessible pages.
enum class Placement {
    kEndsAtPage,   ///< its last byte is the last accessible one
    kStartsAtPage, ///< its first byte is the first accessible one
    kMisaligned,   ///< at an odd address, away from both
};
inline constexpr Placement kPlacements[] = {Placement::kEndsAtPage, Placement::kStartsAtPage,
                                            Placement::kMisaligned};

class GuardedMemory {
public:
    /// Room for blocks of up to `capacity` bytes.
    explicit GuardedMemory(size_t capacity);
    ~GuardedMemory();
    GuardedMemory(const GuardedMemory&) = delete;
    GuardedMemory& operator=(const GuardedMemory&) = delete;

    /// A block of `size` bytes, surrounded by guard bytes. One at a time: the next call takes the memory
    /// back.
    std::span<uint8_t> Block(size_t size, Placement placement);

    /// True while no guard byte around the last block has changed.
    bool GuardsIntact() const;

private:
    std::span<uint8_t> Before() const;
    std::span<uint8_t> Behind() const;

    std::span<uint8_t> mapping;
    std::span<uint8_t> usable;
    std::span<uint8_t> block;
};

#endif
