// For tests that run once for every kernel level.
#ifndef MOVIECONV_TESTS_IMAGE_LEVELS_H
#define MOVIECONV_TESTS_IMAGE_LEVELS_H

#include "Common/Image/kernels/RowKernels.h"

#include <ostream>
#include <string>

#include <gtest/gtest.h>

namespace image {
inline void PrintTo(const NamedLevel& level, std::ostream* out) {
    *out << level.name;
}
} // namespace image

/// The level's name without its dot, which a test's name may not have.
inline std::string LevelName(const testing::TestParamInfo<image::NamedLevel>& info) {
    std::string name = info.param.name;
    std::erase(name, '.');
    return name;
}

#ifdef MOVIECONV_EMULATED_AVX512
namespace image {
extern const RowKernels kEmulatedAvx512Kernels;
}
#endif

/// Skips a level that the machine lacks, unless an emulation was built.
class LevelTest : public testing::TestWithParam<image::NamedLevel> {
protected:
    void SetUp() override {
        kernels = image::RowKernelsFor(GetParam().level);
#ifdef MOVIECONV_EMULATED_AVX512
        if (kernels == nullptr && GetParam().level == image::KernelLevel::kAvx512)
            kernels = &image::kEmulatedAvx512Kernels;
#endif
        if (kernels == nullptr)
            GTEST_SKIP() << "this machine lacks the level";
    }

    const image::RowKernels* kernels = nullptr;
};

#endif
