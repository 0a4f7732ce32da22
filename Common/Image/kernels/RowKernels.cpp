#include "Common/Image/kernels/RowKernels.h"

#include <algorithm>
#include <iterator>

namespace image {

const RowKernels* RowKernelsFor(KernelLevel level) {
    switch (level) {
    case KernelLevel::kPlain:
        return &kPlainKernels;
#ifdef MOVIECONV_X86_KERNELS
    case KernelLevel::kSse41:
        return __builtin_cpu_supports("sse4.1") ? &kSse41Kernels : nullptr;
    case KernelLevel::kAvx2:
        return __builtin_cpu_supports("avx2") ? &kAvx2Kernels : nullptr;
#endif
    default:
        return nullptr;
    }
}

const RowKernels& BestRowKernels() {
    static const RowKernels* const best = [] {
        const auto found = std::find_if(std::rbegin(kKernelLevels), std::rend(kKernelLevels), RowKernelsFor);
        return RowKernelsFor(*found);
    }();
    return *best;
}

} // namespace image
