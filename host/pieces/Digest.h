// SHA-256 of texts and files.
#ifndef MOVIECONV_HOST_PIECES_DIGEST_H
#define MOVIECONV_HOST_PIECES_DIGEST_H

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

struct AVSHA;

namespace movieconv {

class Digest {
public:
    /// Throws std::bad_alloc.
    Digest();

    void Add(const void* data, std::size_t size);
    void Add(std::string_view text) { Add(text.data(), text.size()); }

    /// 64 digits. Once.
    std::string Hex();

private:
    struct Free {
        void operator()(AVSHA* sha) const;
    };
    const std::unique_ptr<AVSHA, Free> sha_;
};

/// Of one text.
std::string DigestOf(std::string_view text);

/// Adds `size` bytes of an open file from `offset` on. False when fewer can be read, with errno set if
/// reading failed.
bool AddFile(Digest& digest, int descriptor, int64_t offset, int64_t size);

} // namespace movieconv

#endif
