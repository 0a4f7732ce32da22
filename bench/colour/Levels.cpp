#include "bench/colour/Levels.h"

#include <libyuv/cpu_id.h>

namespace bench {
namespace {

using image::KernelLevel;

constexpr int kUpToSse41 = libyuv::kCpuInitialized | libyuv::kCpuHasX86 | libyuv::kCpuHasSSE2 |
                           libyuv::kCpuHasSSSE3 | libyuv::kCpuHasSSE41;
constexpr int kUpToAvx2 = kUpToSse41 | libyuv::kCpuHasSSE42 | libyuv::kCpuHasAVX | libyuv::kCpuHasAVX2 |
                          libyuv::kCpuHasERMS | libyuv::kCpuHasFMA3 | libyuv::kCpuHasF16C;

constexpr Level kLevels[] = {
    {"plain", KernelLevel::kPlain, libyuv::kCpuInitialized},
    {"SSE4.1", KernelLevel::kSse41, kUpToSse41},
    {"AVX2", KernelLevel::kAvx2, kUpToAvx2},
    {"AVX-512", KernelLevel::kAvx512, -1},
};
static_assert(std::size(kLevels) == std::size(image::kKernelLevels));

} // namespace

std::vector<Level> levels() {
    std::vector<Level> found;
    for (const Level& level : kLevels)
        if (image::RowKernelsFor(level.kernels) != nullptr)
            found.push_back(level);
    return found;
}

void use(const Level& level) {
    image::ForceRowKernels(level.kernels);
    libyuv::MaskCpuFlags(level.libyuvFlags);
}

} // namespace bench
