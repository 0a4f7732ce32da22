#include "tests/engine/CountingAllocator.h"

#include <atomic>
#include <cstdlib>
#include <new>

namespace {

std::atomic<int64_t> g_allocations{0};
std::atomic<int64_t> g_left{0}; // until the allocation that fails; 0 or less when there is none
std::atomic<bool> g_failed{false};

void* Allocate(size_t size) {
    ++g_allocations;
    if (g_left > 0 && --g_left == 0) {
        g_failed = true;
        return nullptr;
    }
    return std::malloc(size != 0 ? size : 1);
}

void* AllocateOrThrow(size_t size) {
    if (void* memory = Allocate(size))
        return memory;
    throw std::bad_alloc();
}

} // namespace

int64_t Allocations() {
    return g_allocations;
}

bool FailAllocation(int64_t number) {
    g_left = number;
    return g_failed.exchange(false);
}

// In place of the library's own, in the engine too.
void* operator new(size_t size) {
    return AllocateOrThrow(size);
}
void* operator new[](size_t size) {
    return AllocateOrThrow(size);
}
void* operator new(size_t size, const std::nothrow_t&) noexcept {
    return Allocate(size);
}
void* operator new[](size_t size, const std::nothrow_t&) noexcept {
    return Allocate(size);
}
void operator delete(void* memory) noexcept {
    std::free(memory);
}
void operator delete[](void* memory) noexcept {
    std::free(memory);
}
void operator delete(void* memory, size_t) noexcept {
    std::free(memory);
}
void operator delete[](void* memory, size_t) noexcept {
    std::free(memory);
}
