#include "host/source/Failures.h"

#include "host/sentence/Say.h"

#include <new>
#include <system_error>
#include <utility>

namespace movieconv {
namespace {

/// Writes what went wrong into `reason`, which stays as it is when there is no memory for it.
void Describe(const std::exception& error, Sentence& reason) noexcept {
    try {
        reason = WordsOf(error);
    } catch (const std::bad_alloc&) {
    }
}

} // namespace

std::thread NewThread(std::function<void()> work) {
    try {
        return std::thread(std::move(work));
    } catch (const std::system_error& error) {
        throw ThreadError(Say("no thread can be started: {}", error.what()));
    }
}

void Failures::Note(Sentence reason) noexcept {
    const std::lock_guard lock(mutex_);
    if (first_.IsEmpty())
        first_ = std::move(reason);
}

Sentence Failures::First() const {
    const std::lock_guard lock(mutex_);
    return first_;
}

void Failures::Enter(const std::exception_ptr& failure) noexcept {
    Sentence reason = Say("no memory"); // short enough to need none
    try {
        std::rethrow_exception(failure);
    } catch (const std::bad_alloc&) {
    } catch (const std::exception& error) {
        Describe(error, reason);
    }
    Note(std::move(reason));
    stop_();
}

} // namespace movieconv
