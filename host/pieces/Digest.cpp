#include "host/pieces/Digest.h"

extern "C" {
#include <libavutil/mem.h>
#include <libavutil/sha.h>
}

#include <algorithm>
#include <array>
#include <cerrno>
#include <fmt/format.h>
#include <new>
#include <unistd.h>
#include <vector>

namespace movieconv {
namespace {

constexpr int kBits = 256;

AVSHA* NewSha() {
    AVSHA* sha = av_sha_alloc();
    if (sha == nullptr)
        throw std::bad_alloc();
    av_sha_init(sha, kBits);
    return sha;
}

} // namespace

Digest::Digest() : sha_(NewSha()) {}

void Digest::Free::operator()(AVSHA* sha) const {
    av_free(sha);
}

void Digest::Add(const void* data, std::size_t size) {
    av_sha_update(sha_.get(), static_cast<const uint8_t*>(data), size);
}

std::string Digest::Hex() {
    std::array<uint8_t, kBits / 8> bytes{};
    av_sha_final(sha_.get(), bytes.data());
    std::string digits;
    for (const uint8_t byte : bytes)
        digits += fmt::format("{:02x}", byte);
    return digits;
}

std::string DigestOf(std::string_view text) {
    Digest digest;
    digest.Add(text);
    return digest.Hex();
}

bool AddFile(Digest& digest, int descriptor, int64_t offset, int64_t size) {
    constexpr int64_t kAtOnce = 1 << 20;
    std::vector<uint8_t> buffer(static_cast<std::size_t>(std::clamp<int64_t>(size, 1, kAtOnce)));
    while (size > 0) {
        errno = 0;
        const ssize_t count =
            pread(descriptor, buffer.data(), static_cast<std::size_t>(std::min(size, kAtOnce)),
                  static_cast<off_t>(offset));
        if (count < 0 && errno == EINTR)
            continue;
        if (count <= 0)
            return false;
        digest.Add(buffer.data(), static_cast<std::size_t>(count));
        offset += count;
        size -= count;
    }
    return true;
}

} // namespace movieconv
