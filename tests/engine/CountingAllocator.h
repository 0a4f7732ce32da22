// Counts what the process allocates with new, and can make one allocation fail.
#ifndef MOVIECONV_TESTS_ENGINE_COUNTINGALLOCATOR_H
#define MOVIECONV_TESTS_ENGINE_COUNTINGALLOCATOR_H

#include <cstdint>

/// Allocations so far.
int64_t Allocations();

/// Makes the allocation with that number from now on, from 1, fail; none for 0. True when the one asked for
/// before has failed.
bool FailAllocation(int64_t number);

#endif
