// A set of the media writer's options.
#ifndef MOVIECONV_HOST_CONVERT_WRITERSET_H
#define MOVIECONV_HOST_CONVERT_WRITERSET_H

#include "writer/WriterStatus.h"

#include <cstdint>
#include <new>

namespace movieconv {

/// Registered for as long as it exists: longer than what writes with it.
class WriterSet {
public:
    explicit WriterSet(const WriterOptions& options) : number_(MWRegisterOptions(&options)) {
        if (number_ == 0)
            throw std::bad_alloc();
    }
    ~WriterSet() { MWUnregisterOptions(number_); }
    WriterSet(const WriterSet&) = delete;
    WriterSet& operator=(const WriterSet&) = delete;

    /// For EncodeParam::nReserved[kWriterSetWord].
    uint32_t Number() const { return number_; }

private:
    uint32_t number_;
};

} // namespace movieconv

#endif
