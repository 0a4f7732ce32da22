#include "writer/WriterFailure.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstring>
#include <new>
#include <system_error>

namespace writer {

void CopyText(char* to, size_t size, std::string_view text) noexcept {
    size_t length = std::min(text.size(), size - 1);
    while (length < text.size() && length > 0 && (static_cast<unsigned char>(text[length]) & 0xC0) == 0x80)
        --length;
    std::memcpy(to, text.data(), length);
    to[length] = '\0';
}

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
