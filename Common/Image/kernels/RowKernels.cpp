#include "Common/Image/kernels/RowKernels.h"

#include <algorithm>
#include <atomic>
#include <cstdlib>
#include <cstring>
#include <iterator>

namespace image {
namespace {

/// What the routines use; null until the first of them asks.
std::atomic<const RowKernels*> g_kernels{nullptr};

#ifdef MOVIECONV_X86_KERNELS
/// Whether the processor has, and the system saves the registers of, everything that the AVX-512 file is
/// compiled for.
bool HasAvx512() {
    return __builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512bw") &&
           __builtin_cpu_supports("avx512vl") && __builtin_cpu_supports("avx512vbmi") &&
           __builtin_cpu_supports("avx512vnni");
}

const RowKernels* Avx512Kernels() {
    return __builtin_cpu_is("amd") ? &kAvx512PairsKernels : &kAvx512Kernels;
}
#endif

/// The kernels that the user asks for; null when nothing is asked, or what this machine has not.
const RowKernels* KernelsAskedFor() {
    const char* const wanted = std::getenv(kLevelVariable);
    if (wanted == nullptr)
        return nullptr;
    const auto* const named =
        std::find_if(std::begin(kKernelLevels), std::end(kKernelLevels),
                     [=](const NamedLevel& each) { return std::strcmp(each.name, wanted) == 0; });
    return named == std::end(kKernelLevels) ? nullptr : RowKernelsFor(named->level);
}

const RowKernels* ChooseKernels() {
    const RowKernels* kernels = KernelsAskedFor();
    for (auto best = std::rbegin(kKernelLevels); kernels == nullptr; ++best)
        kernels = RowKernelsFor(best->level);
    return kernels;
}

} // namespace

const RowKernels* RowKernelsFor(KernelLevel level) {
    switch (level) {
    case KernelLevel::kPlain:
        return &kPlainKernels;
#ifdef MOVIECONV_X86_KERNELS
    case KernelLevel::kSse41:
        return __builtin_cpu_supports("sse4.1") ? &kSse41Kernels : nullptr;
    case KernelLevel::kAvx2:
        return __builtin_cpu_supports("avx2") ? &kAvx2Kernels : nullptr;
    case KernelLevel::kAvx512:
        return HasAvx512() ? Avx512Kernels() : nullptr;
#endif
#ifdef MOVIECONV_NEON_KERNELS
    case KernelLevel::kNeon:
        return &kNeonKernels;
#endif
    default:
        return nullptr;
    }
}

const RowKernels& BestRowKernels() {
    const RowKernels* kernels = g_kernels.load(std::memory_order_relaxed);
    if (kernels == nullptr) {
        kernels = ChooseKernels();
        g_kernels.store(kernels, std::memory_order_relaxed);
    }
    return *kernels;
}

bool WritingPastCachesPays() {
#ifdef MOVIECONV_X86_KERNELS
    return __builtin_cpu_is("amd");
#else
    return false;
#endif
}

void ForceRowKernels(std::optional<KernelLevel> level) {
    g_kernels.store(level ? RowKernelsFor(*level) : nullptr, std::memory_order_relaxed);
}

} // namespace image
