#include "bench/colour/Exactness.h"

#include "bench/colour/Families.h"

#include <algorithm>
#include <cstdio>

namespace bench {
namespace {

// A slice of the cube is a picture of 2x2 blocks, one for each pair of values of two components.
constexpr int kBlocks = 256;
constexpr int kSliceSize = 2 * kBlocks;

struct Triple {
    int a, b, c;
    bool operator==(const Triple&) const = default;
};

Triple yuvOf(int b, int g, int r) {
    return {((4211 * r + 8258 * g + 1606 * b) >> 14) + 16, ((7193 * b - 4768 * g - 2425 * r) >> 14) + 128,
            ((7193 * r - 6029 * g - 1163 * b) >> 14) + 128};
}

Triple bgrOf(int y, int u, int v) {
    auto byte = [](int sum) { return std::clamp(sum >> 13, 0, 255); };
    return {byte(9536 * y + 16532 * u - 2268594), byte(9536 * y - 3203 * u - 6660 * v + 1109918),
            byte(9536 * y + 13074 * v - 1826095)};
}

/// Component values of pixel (column, row) of a slice: blue and U grow with the column, green and Y with the
/// row.
void paintSlice(Pictures& p, int slice) {
    const auto third = static_cast<unsigned char>(slice);
    const Planes& planes = p.source.planes;
    for (int row = 0; row < kSliceSize; ++row) {
        const auto second = static_cast<unsigned char>(row / 2);
        for (int column = 0; column < kSliceSize; ++column) {
            const auto first = static_cast<unsigned char>(column / 2);
            unsigned char* pixel32 = p.source.rgb32 + row * p.pitch32 + 4 * column;
            unsigned char* pixel24 = p.source.rgb24 + row * p.pitch24 + 3 * column;
            pixel32[0] = pixel24[0] = first;
            pixel32[1] = pixel24[1] = second;
            pixel32[2] = pixel24[2] = third;
            pixel32[3] = static_cast<unsigned char>(row + column + slice);
            planes.y[row * planes.pitchY + column] = second;
            unsigned char* packed = p.source.packed + row * p.pitchPacked + 2 * column;
            packed[0] = second;
            packed[1] = column % 2 == 0 ? first : third;
            planes.u[row / 2 * planes.pitchChroma + column / 2] = first;
            planes.v[row / 2 * planes.pitchChroma + column / 2] = third;
        }
    }
}

/// Counts the blocks of a slice in which the plain kernels differ from the equations.
int wrongBlocks(Pictures& p, int slice) {
    Argb_2_yuv420(p.target.planes.y, p.target.planes.u, p.target.planes.v, p.target.planes.pitchY,
                  p.target.planes.pitchChroma, p.target.planes.pitchChroma, &p.header32, p.source.rgb32);
    Yuv420_2_Argb(&p.header32, p.target.rgb32, p.source.planes.y, p.source.planes.u, p.source.planes.v,
                  p.source.planes.pitchY, p.source.planes.pitchChroma, p.source.planes.pitchChroma);
    const Planes& t = p.target.planes;
    int wrong = 0;
    for (int row = 0; row < kSliceSize; ++row)
        for (int column = 0; column < kSliceSize; ++column) {
            const int chroma = row / 2 * t.pitchChroma + column / 2;
            const Triple yuv = {t.y[row * t.pitchY + column], t.u[chroma], t.v[chroma]};
            const unsigned char* pixel = p.target.rgb32 + row * p.pitch32 + 4 * column;
            const Triple bgr = {pixel[0], pixel[1], pixel[2]};
            wrong += yuv != yuvOf(column / 2, row / 2, slice) || bgr != bgrOf(row / 2, column / 2, slice);
        }
    return wrong;
}

bool computesColours(Kind kind) {
    return kind == Kind::RgbToYuv || kind == Kind::YuvToRgb;
}

/// What a routine leaves in the targets on a level.
const std::vector<unsigned char>& outcome(const Family& family, Pictures& p, const Level& level) {
    image::ForceRowKernels(level.kernels);
    p.clearTargets();
    family.ours(p);
    return p.targetBytes();
}

/// Whether the routines write the same bytes, and leave the same ones alone, on all levels as with the plain
/// kernels.
bool allAgree(Pictures& p, const std::vector<Level>& levels, bool (*wanted)(Kind)) {
    bool right = true;
    std::vector<unsigned char> expected;
    for (const Family& family : families()) {
        if (!wanted(family.kind))
            continue;
        expected = outcome(family, p, levels.front());
        for (const Level& level : levels)
            if (outcome(family, p, level) != expected) {
                std::fprintf(stderr, "%s on %s differs from the plain kernels at %dx%d\n", family.name,
                             level.name, p.width, p.height);
                right = false;
            }
    }
    return right;
}

} // namespace

bool checkExactness(const std::vector<Level>& levels) {
    bool right = true;
    Pictures cube(kSliceSize, kSliceSize);
    for (int slice = 0; slice < kBlocks; ++slice) {
        paintSlice(cube, slice);
        image::ForceRowKernels(levels.front().kernels);
        if (const int wrong = wrongBlocks(cube, slice); wrong != 0) {
            std::fprintf(stderr, "the plain kernels differ from the equations in %d pixels of slice %d\n",
                         wrong, slice);
            right = false;
        }
        right = allAgree(cube, levels, computesColours) && right;
    }
    constexpr int kOddAndEven[][2] = {{1, 1},  {2, 2},   {3, 3},     {16, 16},
                                      {33, 7}, {130, 5}, {321, 241}, {640, 480}};
    for (const auto& [width, height] : kOddAndEven) {
        Pictures random(width, height);
        right = allAgree(random, levels, [](Kind) { return true; }) && right;
    }
    return right;
}

} // namespace bench
