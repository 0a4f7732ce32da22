// Memory for tests of code that must not touch one byte too many: an inaccessible page on either side, and
// guard bytes between the block in use and the pages.
#ifndef MOVIECONV_TESTS_IMAGE_GUARDEDMEMORY_H
#define MOVIECONV_TESTS_IMAGE_GUARDEDMEMORY_H

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <span>
#include <stdexcept>

#include <sys/mman.h>
#include <unistd.h>

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
    explicit GuardedMemory(size_t capacity) {
        const auto page = static_cast<size_t>(sysconf(_SC_PAGESIZE));
        const size_t inside = (capacity + 2 * kGuardBytes + page - 1) / page * page;
        void* const memory = mmap(nullptr, inside + 2 * page, PROT_NONE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
        if (memory == MAP_FAILED)
            throw std::runtime_error("no memory to guard");
        mapping = {static_cast<uint8_t*>(memory), inside + 2 * page};
        usable = mapping.subspan(page, inside);
        if (mprotect(usable.data(), usable.size(), PROT_READ | PROT_WRITE) != 0)
            throw std::runtime_error("cannot open the guarded memory");
        block = usable.first(0);
    }
    ~GuardedMemory() { munmap(mapping.data(), mapping.size()); }
    GuardedMemory(const GuardedMemory&) = delete;
    GuardedMemory& operator=(const GuardedMemory&) = delete;

    /// A block of `size` bytes, surrounded by guard bytes. One at a time: the next call takes the memory
    /// back.
    std::span<uint8_t> Block(size_t size, Placement placement) {
        if (size + 2 * kGuardBytes > usable.size())
            throw std::length_error("block larger than the guarded memory");
        switch (placement) {
        case Placement::kEndsAtPage:
            block = usable.last(size);
            break;
        case Placement::kStartsAtPage:
            block = usable.first(size);
            break;
        case Placement::kMisaligned:
            block = usable.subspan(kGuardBytes - 1, size);
            break;
        }
        for (const auto guards : {Before(), Behind()})
            std::fill(guards.begin(), guards.end(), kGuard);
        return block;
    }

    /// True while no guard byte around the last block has changed.
    bool GuardsIntact() const {
        const auto intact = [](std::span<uint8_t> guards) {
            return std::all_of(guards.begin(), guards.end(), [](uint8_t byte) { return byte == kGuard; });
        };
        return intact(Before()) && intact(Behind());
    }

private:
    static constexpr size_t kGuardBytes = 128;
    static constexpr uint8_t kGuard = 0xA7;

    std::span<uint8_t> Before() const {
        const auto distance = static_cast<size_t>(block.data() - usable.data());
        const size_t guards = std::min(distance, kGuardBytes);
        return usable.subspan(distance - guards, guards);
    }
    std::span<uint8_t> Behind() const {
        const auto end = static_cast<size_t>(block.data() - usable.data()) + block.size();
        return usable.subspan(end, std::min(usable.size() - end, kGuardBytes));
    }

    std::span<uint8_t> mapping;
    std::span<uint8_t> usable;
    std::span<uint8_t> block;
};

#endif
