// How the writer's own code says that something cannot be done. Never crosses the C interface.
#ifndef MOVIECONV_WRITER_WRITERFAILURE_H
#define MOVIECONV_WRITER_WRITERFAILURE_H

#include "text/Utf8.h"
#include "writer/WriterStatus.h"

#include <exception>
#include <string_view>

namespace writer {

/// Why a file could not be created or written, in the terms of writer/WriterStatus.h. Holds its text itself:
/// that there is no memory has to be said without any.
class WriterFailure : public std::exception {
public:
    /// `kind` is a kWriterError code, `what` a sentence for users, `systemError` an errno or 0.
    WriterFailure(int kind, std::string_view what, int systemError = 0) noexcept
        : kind_(kind), systemError_(systemError) {
        text::CopyText(what_, what);
    }

    const char* what() const noexcept override { return what_; }
    int Kind() const { return kind_; }
    int SystemError() const { return systemError_; }

private:
    int kind_;
    int systemError_;
    char what_[kWriterTextSize];
};

/// What the system's `error` kept from being done; `format` and what follows name that as printf does. A full
/// disk is a kind of its own.
[[gnu::format(printf, 3, 4)]] WriterFailure SystemFailure(int kind, int error, const char* format,
                                                          ...) noexcept;

/// Any exception in the same terms.
WriterFailure FailureOf(const std::exception_ptr& error) noexcept;

} // namespace writer

#endif
