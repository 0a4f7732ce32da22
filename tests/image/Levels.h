// For tests that run once for every kernel level.
#ifndef MOVIECONV_TESTS_IMAGE_LEVELS_H
#define MOVIECONV_TESTS_IMAGE_LEVELS_H

#include "Common/Image/kernels/RowKernels.h"

#include <string>

#include <gtest/gtest.h>

inline std::string LevelName(const testing::TestParamInfo<image::KernelLevel>& info) {
    constexpr const char* kNames[] = {"Plain", "Sse41", "Avx2", "Avx512"};
    return kNames[static_cast<int>(info.param)];
}

#ifdef MOVIECONV_EMULATED_AVX512
namespace image {
extern const RowKernels kEmulatedAvx512Kernels;
}
#endif

/// The kernels of a level, emulated where the machine lacks it and an emulation was built.
inline const image::RowKernels* TestedKernels(image::KernelLevel level) {
    const image::RowKernels* kernels = image::RowKernelsFor(level);
#ifdef MOVIECONV_EMULATED_AVX512
    if (kernels == nullptr && level == image::KernelLevel::kAvx512)
        return &image::kEmulatedAvx512Kernels;
#endif
    return kernels;
}

/// Skips a level that can't be run.
class LevelTest : public testing::TestWithParam<image::KernelLevel> {
protected:
    void SetUp() override {
        kernels = TestedKernels(GetParam());
        if (kernels == nullptr)
            GTEST_SKIP() << "this machine lacks the level";
    }

    const image::RowKernels* kernels = nullptr;
};

#endif
