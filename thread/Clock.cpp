#include "thread/Clock.h"

#include <atomic>

#include <sys/times.h>

namespace {

uint32_t SystemClock() {
    struct tms unused;                                 // the kernel wants a place for the process times
    return static_cast<uint32_t>(times(&unused)) * 10; // the kernel counts 100 ticks a second
}

std::atomic<uint32_t (*)()> g_source{SystemClock};

} // namespace

uint32_t MillisecondClock() {
    return g_source.load(std::memory_order_relaxed)();
}

void SetMillisecondClock(uint32_t (*source)()) {
    g_source = source ? source : SystemClock;
}
