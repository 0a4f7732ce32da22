#include "tests/engine/CountingAllocator.h"

#include <atomic>
#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <new>

#include <dlfcn.h>

// What really allocates: the sanitizers' runtime, or the C library.
#ifdef MOVIECONV_SANITIZED
#define REAL(function) __interceptor_##function
#else
#define REAL(function) __libc_##function
#endif
extern "C" {
void* REAL(malloc)(size_t size);
void* REAL(calloc)(size_t count, size_t size);
void* REAL(realloc)(void* memory, size_t size);
void* REAL(memalign)(size_t alignment, size_t size);
}

namespace {

std::atomic<int64_t> g_allocations{0};
std::atomic<int64_t> g_left{0}; // until the allocation that fails; 0 or less when there is none
std::atomic<bool> g_lasting{false};
std::atomic<bool> g_failed{false};
void (*g_tell)() = nullptr;

/// Whether what asks for memory is the C library, on behalf of a sanitizer that starts a thread: that cannot
/// fail.
bool IsSpared([[maybe_unused]] const void* caller) {
#ifdef MOVIECONV_SANITIZED
    Dl_info info;
    return dladdr(caller, &info) != 0 && std::strstr(info.dli_fname, "/libc.so") != nullptr;
#else
    return false;
#endif
}

/// Whether the allocation for `caller` fails.
bool Fails(const void* caller) {
    if ((g_left == 1 || (g_failed && g_lasting)) && IsSpared(caller))
        return false;
    if (g_left > 0 && --g_left == 0) {
        g_failed = true;
        if (g_tell)
            g_tell();
    } else if (!g_failed || !g_lasting) {
        return false;
    }
    errno = ENOMEM;
    return true;
}

void* AllocateOrThrow(size_t size) {
    ++g_allocations;
    if (void* memory = std::malloc(size != 0 ? size : 1))
        return memory;
    throw std::bad_alloc();
}

} // namespace

int64_t Allocations() {
    return g_allocations;
}

bool FailAllocation(int64_t number, Lack lack, void (*tell)()) {
    g_left = 0;
    g_tell = tell;
    g_lasting = lack == Lack::kLasting;
    const bool failed = g_failed.exchange(false);
    g_left = number;
    return failed;
}

// In place of the libraries' own, in the engine too.
#pragma GCC visibility push(default)
extern "C" {
void* malloc(size_t size) noexcept {
    return Fails(__builtin_return_address(0)) ? nullptr : REAL(malloc)(size);
}
void* calloc(size_t count, size_t size) noexcept {
    return Fails(__builtin_return_address(0)) ? nullptr : REAL(calloc)(count, size);
}
void* realloc(void* memory, size_t size) noexcept {
    return Fails(__builtin_return_address(0)) ? nullptr : REAL(realloc)(memory, size);
}
void* memalign(size_t alignment, size_t size) noexcept {
    return Fails(__builtin_return_address(0)) ? nullptr : REAL(memalign)(alignment, size);
}
void* aligned_alloc(size_t alignment, size_t size) noexcept {
    return memalign(alignment, size);
}
int posix_memalign(void** memory, size_t alignment, size_t size) noexcept {
    void* made = memalign(alignment, size);
    if (made == nullptr)
        return ENOMEM;
    *memory = made;
    return 0;
}
}
#pragma GCC visibility pop

void* operator new(size_t size) {
    return AllocateOrThrow(size);
}
void* operator new[](size_t size) {
    return AllocateOrThrow(size);
}
void* operator new(size_t size, const std::nothrow_t&) noexcept {
    ++g_allocations;
    return std::malloc(size);
}
void* operator new[](size_t size, const std::nothrow_t&) noexcept {
    ++g_allocations;
    return std::malloc(size);
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
