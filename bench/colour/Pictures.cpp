#include "bench/colour/Pictures.h"

#include <algorithm>
#include <random>

namespace bench {
namespace {

constexpr std::size_t kCacheLine = 64;
constexpr unsigned char kUntouched = 0xA5;

tagBITMAPINFOHEADER headerOf(int width, int height, int bitCount) {
    tagBITMAPINFOHEADER header{};
    header.biSize = sizeof header;
    header.biWidth = width;
    header.biHeight = height;
    header.biPlanes = 1;
    header.biBitCount = static_cast<decltype(header.biBitCount)>(bitCount);
    return header;
}

std::size_t wholeLines(std::size_t bytes) {
    return (bytes + kCacheLine - 1) / kCacheLine * kCacheLine;
}

} // namespace

Pictures::Pictures(int w, int h)
    : width(w),
      height(h),
      chromaWidth((w + 1) / 2),
      chromaHeight((h + 1) / 2),
      pitch24((3 * w + 3) & ~3),
      pitch32(4 * w),
      pitchPacked(4 * chromaWidth),
      header24(headerOf(w, h, 24)),
      header32(headerOf(w, h, 32)) {
    allocate(sources_, source);
    allocate(targets_, target);
    allocate(betweens_, between);
    fillSources(1);
    clearTargets();
}

void Pictures::allocate(std::vector<unsigned char>& bytes, Layouts& layouts) const {
    // Odd sizes count as the next even ones: some routines write whole groups, and two rows at once.
    const std::size_t columns = 2 * static_cast<std::size_t>(chromaWidth);
    const std::size_t rows = 2 * static_cast<std::size_t>(chromaHeight);
    const std::size_t parts[] = {rows * pitch24, rows * 4 * columns, rows * pitchPacked, rows * columns,
                                 rows * columns * 3 / 2};
    std::size_t total = kCacheLine;
    for (const std::size_t part : parts)
        total += wholeLines(part);
    bytes.assign(total, 0);

    const auto start = reinterpret_cast<std::uintptr_t>(bytes.data());
    unsigned char* next = bytes.data() + (kCacheLine - start % kCacheLine) % kCacheLine;
    auto take = [&next](std::size_t part) {
        unsigned char* taken = next;
        next += wholeLines(part);
        return taken;
    };
    layouts.rgb24 = take(parts[0]);
    layouts.rgb32 = take(parts[1]);
    layouts.packed = take(parts[2]);
    layouts.alpha = take(parts[3]);
    unsigned char* y = take(parts[4]);
    unsigned char* u = y + rows * columns;
    layouts.planes = {y, u, u + rows * columns / 4, 2 * chromaWidth, chromaWidth};
}

void Pictures::fillSources(std::uint32_t seed) {
    std::minstd_rand random(seed);
    for (unsigned char& byte : sources_)
        byte = static_cast<unsigned char>(random() >> 8);
}

void Pictures::clearTargets() {
    std::fill(targets_.begin(), targets_.end(), kUntouched);
}

} // namespace bench
