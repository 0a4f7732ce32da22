// How the writer's own code says that something cannot be done. Never crosses the C interface.
#ifndef MOVIECONV_WRITER_WRITERFAILURE_H
#define MOVIECONV_WRITER_WRITERFAILURE_H

#include <stdexcept>
#include <string>

namespace writer {

/// Why a file could not be created or written, in the terms of writer/WriterStatus.h.
class WriterFailure : public std::runtime_error {
public:
    /// `kind` is a kWriterError code, `what` a sentence for users, `systemError` an errno or 0.
    WriterFailure(int kind, const std::string& what, int systemError = 0)
        : std::runtime_error(what), kind_(kind), systemError_(systemError) {}

    int Kind() const { return kind_; }
    int SystemError() const { return systemError_; }

private:
    int kind_;
    int systemError_;
};

} // namespace writer

#endif
