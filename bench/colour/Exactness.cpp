#include "bench/colour/Exactness.h"

#include "bench/colour/ColourCube.h"
#include "bench/colour/Families.h"

#include <cstdio>

namespace bench {
namespace {

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
