// The outermost frame of a thread that works: whatever is thrown becomes a verdict.
#ifndef MOVIECONV_HOST_CONVERT_ATTEMPT_H
#define MOVIECONV_HOST_CONVERT_ATTEMPT_H

#include "host/convert/Failure.h"
#include "host/convert/Observer.h"

#include <exception>
#include <new>
#include <utility>

namespace movieconv {

/// Of what a well-kept program does not throw. Without memory for the sentence it is a lack of memory.
inline Failure Unexpected(const std::exception& error) noexcept {
    try {
        return {Category::kInternal, WordsOf(error)};
    } catch (const std::bad_alloc&) {
        return {Category::kInternal, {}, Reason::kNoMemory};
    }
}

/// The verdict of the worker's `perform`, or the failure that it throws.
template <class Worker>
Verdict Attempt(Worker& worker, Verdict (Worker::*perform)()) noexcept {
    Verdict verdict;
    try {
        verdict = (worker.*perform)();
    } catch (Failure& failure) {
        verdict.failure = std::move(failure);
    } catch (const std::bad_alloc&) {
        verdict.failure = Failure(Category::kInternal, {}, Reason::kNoMemory);
    } catch (const std::exception& error) {
        verdict.failure = Unexpected(error);
    }
    return verdict;
}

} // namespace movieconv

#endif
