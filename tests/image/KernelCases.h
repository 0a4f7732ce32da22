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
    void (*run)(const image::RowKernels& kernels, uint8_t* const* targets, uint8_t* const* sources,
                image::Size size);
};

/// Pictures of one or two rows, each in memory of its own: the entries 0 and 1 are rows of packed pixels or
/// luma, 2 and 3 those of chroma, 4 and 5 those of alpha.
const std::vector<KernelCase>& KernelCases();

#endif
