#include "Common/Image/kernels/RowKernels.h"

#include <algorithm>
#include <iterator>

namespace image {

const RowKernels* RowKernelsFor(KernelLevel level) {
    switch (level) {
    case KernelLevel::kPlain:
        return &kPlainKernels;
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
