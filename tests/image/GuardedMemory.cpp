#include "tests/image/GuardedMemory.h"

#include <algorithm>
#include <stdexcept>

#include <sys/mman.h>
#include <unistd.h>

namespace {

constexpr size_t kGuardBytes = 128;
constexpr uint8_t kGuard = 0xA7;

} // namespace

GuardedMemory::GuardedMemory(size_t capacity) {
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

GuardedMemory::~GuardedMemory() {
    munmap(mapping.data(), mapping.size());
}

std::span<uint8_t> GuardedMemory::Block(size_t size, Placement placement) {
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

bool GuardedMemory::GuardsIntact() const {
    const auto intact = [](std::span<uint8_t> guards) {
        return std::all_of(guards.begin(), guards.end(), [](uint8_t byte) { return byte == kGuard; });
    };
    return intact(Before()) && intact(Behind());
}

std::span<uint8_t> GuardedMemory::Before() const {
    const auto distance = static_cast<size_t>(block.data() - usable.data());
    const size_t guards = std::min(distance, kGuardBytes);
    return usable.subspan(distance - guards, guards);
}

std::span<uint8_t> GuardedMemory::Behind() const {
    const auto end = static_cast<size_t>(block.data() - usable.data()) + block.size();
    return usable.subspan(end, std::min(usable.size() - end, kGuardBytes));
}
