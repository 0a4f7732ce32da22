// All row kernels as a table: what each may touch and how it is called.
#ifndef MOVIECONV_TESTS_IMAGE_KERNELCASES_H
#define MOVIECONV_TESTS_IMAGE_KERNELCASES_H

#include "Common/Image/kernels/RowKernels.h"

#include <vector>

/// Bytes of a row for a width in pixels.
using Extent = size_t (*)(size_t width);

struct KernelCase {
    const char* name;
    std::vector<Extent> targets;
    std::vector<Extent> sources;
    size_t widthStep; ///< 2: even widths only
    void (*run)(const image::RowKernels& kernels, uint8_t* const* targets, const uint8_t* const* sources,
                ptrdiff_t width);
};

/// Where a kernel has two rows of a kind, they are the entries 0 and 1, of alpha 4 and 5.
const std::vector<KernelCase>& KernelCases();

#endif
