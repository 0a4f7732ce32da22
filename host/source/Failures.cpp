#include "host/source/Failures.h"

#include <new>
#include <system_error>
#include <utility>

namespace movieconv {
namespace {

/// Writes what went wrong into `reason`, which stays as it is when there is no memory for it.
void Describe(const std::exception& error, std::string& reason) noexcept {
    try {
        reason = error.what();
    } catch (const std::bad_alloc&) {
    }
}

} // namespace

std::thread NewThread(std::function<void()> work) {
    try {
        return std::thread(std::move(work));
    } catch (const std::system_error& error) {
        throw ThreadError(std::string("no thread can be started: ") + error.what());
    }
}

void Failures::Note(std::string reason) noexcept {
    const std::lock_guard lock(mutex_);
    if (first_.empty())
        first_ = std::move(reason);
}

std::string Failures::First() const {
    const std::lock_guard lock(mutex_);
    return first_;
}

void Failures::Enter(const std::exception_ptr& failure) noexcept {
    std::string reason = "no memory"; // short enough to need none
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
