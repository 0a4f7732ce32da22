// Counts what the process allocates with new, and can make allocations fail, whoever asks for them: the C
// library's functions are replaced too.
#ifndef MOVIECONV_TESTS_ENGINE_COUNTINGALLOCATOR_H
#define MOVIECONV_TESTS_ENGINE_COUNTINGALLOCATOR_H

#include <cstdint>

/// Allocations with new so far.
int64_t Allocations();

enum class Lack { kOnce, kLasting };

/// Makes the allocation with that number from now on, from 1, fail, and with kLasting all later ones; none
/// for 0. `tell` is called when it does, and must not allocate. True when the one asked for before has
/// failed.
bool FailAllocation(int64_t number, Lack lack = Lack::kOnce, void (*tell)() = nullptr);

#endif
