#include "writer/WriterFailure.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdarg>
#include <cstddef>
#include <cstdio>
#include <cstring>
#include <new>
#include <system_error>

namespace writer {

WriterFailure SystemFailure(int kind, int error, const char* format, ...) noexcept {
    std::array<char, kWriterPathSize> what;
    va_list arguments;
    va_start(arguments, format);
    const int wanted = std::vsnprintf(what.data(), what.size(), format, arguments);
    va_end(arguments);
    const size_t length = std::clamp<size_t>(wanted < 0 ? 0 : wanted, 0, what.size() - 1);
    std::snprintf(what.data() + length, what.size() - length, ": %s.", std::strerror(error));
    return {error == ENOSPC || error == EDQUOT ? static_cast<int>(kWriterErrorNoSpace) : kind, what.data(),
            error};
}

WriterFailure FailureOf(const std::exception_ptr& error) noexcept {
    try {
        std::rethrow_exception(error);
    } catch (const WriterFailure& failure) {
        return failure;
    } catch (const std::bad_alloc&) {
        return {kWriterErrorInternal, "There is not enough memory."};
    } catch (const std::system_error& failure) {
        return SystemFailure(kWriterErrorInternal, failure.code().value(), "No thread can be started");
    } catch (const std::exception& failure) {
        return {kWriterErrorInternal, failure.what()};
    }
}

} // namespace writer
