#include "bench/colour/Levels.h"

#include <libyuv/cpu_id.h>

namespace bench {
namespace {

using image::KernelLevel;

constexpr int kUpToSse41 = libyuv::kCpuInitialized | libyuv::kCpuHasX86 | libyuv::kCpuHasSSE2 |
                           libyuv::kCpuHasSSSE3 | libyuv::kCpuHasSSE41;
constexpr int kUpToAvx2 = kUpToSse41 | libyuv::kCpuHasSSE42 | libyuv::kCpuHasAVX | libyuv::kCpuHasAVX2 |
                          libyuv::kCpuHasERMS | libyuv::kCpuHasFMA3 | libyuv::kCpuHasF16C;

int libyuvFlags(KernelLevel level) {
    switch (level) {
    case KernelLevel::kPlain:
        return libyuv::kCpuInitialized;
    case KernelLevel::kSse41:
        return kUpToSse41;
    case KernelLevel::kAvx2:
        return kUpToAvx2;
    default:
        return -1;
    }
}

} // namespace

std::vector<Level> levels() {
    std::vector<Level> found;
    for (const auto& [level, name] : image::kKernelLevels)
        if (image::RowKernelsFor(level) != nullptr)
            found.push_back({name, level, libyuvFlags(level)});
    return found;
}

void use(const Level& level) {
    image::ForceRowKernels(level.kernels);
    libyuv::MaskCpuFlags(level.libyuvFlags);
}

} // namespace bench
