// Numbers whose first byte is the highest, as most file formats write them.
#ifndef MOVIECONV_WRITER_BIGENDIAN_H
#define MOVIECONV_WRITER_BIGENDIAN_H

#include <cstddef>
#include <cstdint>

namespace writer {

/// The number in `size` bytes, 1 to 8.
inline uint64_t BigEndian(const uint8_t* bytes, size_t size) {
    uint64_t value = 0;
    for (size_t i = 0; i < size; ++i)
        value = value << 8 | bytes[i];
    return value;
}

} // namespace writer

#endif
