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

/// Skips a level that the machine lacks, unless an emulation was built.
class LevelTest : public testing::TestWithParam<image::KernelLevel> {
protected:
    void SetUp() override {
        kernels = image::RowKernelsFor(GetParam());
#ifdef MOVIECONV_EMULATED_AVX512
        if (kernels == nullptr && GetParam() == image::KernelLevel::kAvx512)
            kernels = &image::kEmulatedAvx512Kernels;
#endif
        if (kernels == nullptr)
            GTEST_SKIP() << "this machine lacks the level";
    }

    const image::RowKernels* kernels = nullptr;
};

#endif
