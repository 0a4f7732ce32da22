// The millisecond clock that waits, estimates and progress pacing share.
#ifndef MOVIECONV_THREAD_CLOCK_H
#define MOVIECONV_THREAD_CLOCK_H

#include <cstdint>

/// Milliseconds in steps of 10, from an arbitrary start. Differences stay right across the 32-bit wrap.
uint32_t MillisecondClock();

/// Reads `source` instead of the system's clock from now on; null restores the system's. For tests.
void SetMillisecondClock(uint32_t (*source)());

#endif
