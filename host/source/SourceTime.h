// How a record tells the media writer its place in the source, past the engine.
#ifndef MOVIECONV_HOST_SOURCE_SOURCETIME_H
#define MOVIECONV_HOST_SOURCE_SOURCETIME_H

#include "writer/WriterStatus.h"

#include <cstdint>
#include <cstring>

namespace movieconv {

/// `reserved` are the bytes of that name in VideoImage or AudioFrame, `time` counts 100 ns units from the
/// start of the source.
inline void TellSourceTime(unsigned char* reserved, int64_t time) {
    const WriterSourceTime told{kWriterSourceTimeTag, time};
    std::memcpy(reserved, &told, sizeof told);
}

} // namespace movieconv

#endif
