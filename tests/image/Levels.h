// For tests that run once for every set of kernels.
#ifndef MOVIECONV_TESTS_IMAGE_LEVELS_H
#define MOVIECONV_TESTS_IMAGE_LEVELS_H

#include "Common/Image/kernels/RowKernels.h"

#include <ostream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

namespace image {
#ifdef MOVIECONV_EMULATED_AVX512
extern const RowKernels kEmulatedAvx512Kernels;
extern const RowKernels kEmulatedAvx512PairsKernels;
#endif
} // namespace image

/// Kernels of a level; null where neither the machine nor an emulation can run them.
struct TestedKernels {
    std::string name;
    const image::RowKernels* kernels;

    friend void PrintTo(const TestedKernels& tested, std::ostream* out) { *out << tested.name; }
};

/// Every level, and both forms of AVX-512, of which a processor uses one: emulated where it has none.
inline std::vector<TestedKernels> AllKernels() {
    using namespace image;
    std::vector<TestedKernels> all;
    for (const auto& [level, name] : kKernelLevels)
        if (level != KernelLevel::kAvx512)
            all.push_back({name, RowKernelsFor(level)});
#ifdef MOVIECONV_EMULATED_AVX512
    const bool hasAvx512 = RowKernelsFor(KernelLevel::kAvx512) != nullptr;
    all.push_back({"avx512", hasAvx512 ? &kAvx512Kernels : &kEmulatedAvx512Kernels});
    all.push_back({"avx512pairs", hasAvx512 ? &kAvx512PairsKernels : &kEmulatedAvx512PairsKernels});
#endif
    return all;
}

/// The name without its dot, which a test's name may not have.
inline std::string KernelsName(const testing::TestParamInfo<TestedKernels>& info) {
    std::string name = info.param.name;
    std::erase(name, '.');
    return name;
}

class LevelTest : public testing::TestWithParam<TestedKernels> {
protected:
    void SetUp() override {
        if (kernels == nullptr)
            GTEST_SKIP() << "this machine lacks the level";
    }

    const image::RowKernels* const kernels = GetParam().kernels;
};

#endif
