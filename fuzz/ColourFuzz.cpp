// The colour routines over sizes, pitches, places, flags and contents: every kernel level must leave the
// bytes that the plain one leaves, and touch no byte but those that the routine's description names.
#include "Common/Image/ImageConvert.h"
#include "Common/Image/kernels/RowKernels.h"
#include "fuzz/Fuzz.h"
#include "tests/image/GuardedMemory.h"
#include "tests/image/KernelCases.h"

#include <algorithm>
#include <array>
#include <random>
#include <span>
#include <vector>

namespace {

constexpr int kMostWidth = 200;
constexpr int kMostHeight = 8;
constexpr int kMostPadding = 70;
constexpr size_t kMostBuffers = 12;

/// Rows of a picture or plane from the top. The pitch is negative where the last row lies first in memory.
struct Plane {
    uint8_t* first;
    int pitch;
};

/// The memory of one call. Every level gets the same blocks with the same bytes in them.
class Memory {
public:
    explicit Memory(FuzzedDataProvider& input)
        : seed(input.ConsumeIntegral<uint16_t>()), extremes(input.ConsumeBool()) {
        for (Placement& placement : placements)
            placement = input.PickValueInArray(kPlacements);
    }

    std::span<uint8_t> Source(size_t size) { return Block(size); }
    std::span<uint8_t> Target(size_t size) {
        const std::span<uint8_t> block = Block(size);
        targets.push_back(block);
        return block;
    }

    Plane SourcePlane(int rowBytes, int rows, int pitch) {
        return At(Source(Size(rowBytes, rows, pitch)), rows, pitch);
    }
    Plane TargetPlane(int rowBytes, int rows, int pitch) {
        return At(Target(Size(rowBytes, rows, pitch)), rows, pitch);
    }

    /// Everything that may have been written, once the guards have been found intact; gives the memory back.
    std::vector<uint8_t> Finish() {
        std::vector<uint8_t> written;
        for (const std::span<uint8_t> target : targets)
            written.insert(written.end(), target.begin(), target.end());
        for (size_t i = 0; i < used; ++i)
            FUZZ_CHECK(Arena(i).GuardsIntact());
        used = 0;
        targets.clear();
        return written;
    }

private:
    static GuardedMemory& Arena(size_t index) {
        static std::array<GuardedMemory*, kMostBuffers> arenas{};
        GuardedMemory*& arena = arenas.at(index);
        if (arena == nullptr)
            arena = new GuardedMemory(size_t{4} * (kMostWidth + kMostPadding) * (2 * kMostHeight + 2));
        return *arena;
    }

    static size_t Size(int rowBytes, int rows, int pitch) {
        return rows <= 0 || rowBytes <= 0
                   ? 0
                   : static_cast<size_t>(rows - 1) * static_cast<size_t>(std::abs(pitch)) +
                         static_cast<size_t>(rowBytes);
    }

    static Plane At(std::span<uint8_t> block, int rows, int pitch) {
        return {block.data() + (pitch < 0 && !block.empty() ? static_cast<ptrdiff_t>(rows - 1) * -pitch : 0),
                pitch};
    }

    std::span<uint8_t> Block(size_t size) {
        const std::span<uint8_t> block = Arena(used).Block(size, placements.at(used));
        std::minstd_rand random(seed + static_cast<unsigned>(used) + 1);
        for (uint8_t& byte : block) {
            const auto value = static_cast<uint8_t>(random() >> 13);
            byte = extremes ? static_cast<uint8_t>(value < 128 ? 0 : 255) : value;
        }
        ++used;
        return block;
    }

    uint16_t seed;
    bool extremes;
    std::array<Placement, kMostBuffers> placements{};
    size_t used = 0;
    std::vector<std::span<uint8_t>> targets;
};

struct Planes420 {
    Plane y, u, v;
};

int Half(int size) {
    return size / 2 + size % 2;
}
int EvenAbove(int size) {
    return size + size % 2;
}
int Stride24(int width) {
    return (3 * width + 3) / 4 * 4;
}

/// The arguments of one call: a whole picture of cx x cy, or a rectangle of that size.
struct Arguments {
    explicit Arguments(FuzzedDataProvider& input)
        : cx(input.ConsumeIntegralInRange(-1, kMostWidth / 2)),
          cy(input.ConsumeIntegralInRange(-1, kMostHeight)),
          xDst(input.ConsumeIntegralInRange(0, kMostWidth / 2 - 4)),
          yDst(input.ConsumeIntegralInRange(0, kMostHeight)),
          xSrc(input.ConsumeIntegralInRange(0, kMostWidth / 2 - 4)),
          ySrc(input.ConsumeIntegralInRange(0, kMostHeight)),
          order(WildInteger<unsigned>(input, input.ConsumeBool() ? 1 : 0)),
          otherOrder(WildInteger<unsigned>(input, order)),
          flag(input.ConsumeBool()) {
        for (int& padding : paddings)
            padding = input.ConsumeBool() ? 0 : input.ConsumeIntegralInRange(0, kMostPadding);
        for (bool& negative : bottomUpPlanes)
            negative = input.ConsumeIntegralInRange(0, 7) == 0;
    }

    int Pitch(size_t index, int rowBytes) const {
        const int pitch = std::max(rowBytes, 0) + paddings[index];
        return bottomUpPlanes[index] ? -pitch : pitch;
    }

    int cx, cy, xDst, yDst, xSrc, ySrc;
    unsigned order, otherOrder;
    bool flag;
    std::array<int, 5> paddings{};
    std::array<bool, 5> bottomUpPlanes{};
};

tagBITMAPINFOHEADER Header(const Arguments& a, int bits) {
    tagBITMAPINFOHEADER header{};
    header.biSize = sizeof header;
    header.biWidth = a.cx;
    header.biHeight = a.cy;
    header.biPlanes = 1;
    header.biBitCount = static_cast<uint16_t>(bits);
    return header;
}

using MakePlane = Plane (Memory::*)(int, int, int);

/// Planes of width x height pixels.
Planes420 MakePlanes(Memory& memory, MakePlane make, const Arguments& a, int width, int height) {
    const int half = Half(std::max(width, 0));
    const int rows = Half(std::max(height, 0));
    return {(memory.*make)(width, height, a.Pitch(0, width)), (memory.*make)(half, rows, a.Pitch(1, half)),
            (memory.*make)(half, rows, a.Pitch(2, half))};
}

size_t BitmapSize(const Arguments& a, int stride) {
    return a.cx <= 0 || a.cy <= 0 ? 0 : static_cast<size_t>(stride) * static_cast<size_t>(a.cy);
}

using ToPlanes = void (*)(unsigned char*, unsigned char*, unsigned char*, int, int, int, tagBITMAPINFOHEADER*,
                          unsigned char*);
using FromPlanes = void (*)(tagBITMAPINFOHEADER*, unsigned char*, unsigned char*, unsigned char*,
                            unsigned char*, int, int, int);

template <ToPlanes convert, int bits>
void BitmapToPlanes(Memory& memory, const Arguments& a) {
    const Planes420 planes = MakePlanes(memory, &Memory::TargetPlane, a, a.cx, a.cy);
    tagBITMAPINFOHEADER header = Header(a, bits);
    const auto source = memory.Source(BitmapSize(a, bits == 24 ? Stride24(a.cx) : 4 * a.cx));
    convert(planes.y.first, planes.u.first, planes.v.first, planes.y.pitch, planes.u.pitch, planes.v.pitch,
            &header, source.data());
}

template <FromPlanes convert, int bits>
void PlanesToBitmap(Memory& memory, const Arguments& a) {
    const Planes420 planes = MakePlanes(memory, &Memory::SourcePlane, a, a.cx, a.cy);
    tagBITMAPINFOHEADER header = Header(a, bits);
    const auto target = memory.Target(BitmapSize(a, bits == 24 ? Stride24(a.cx) : 4 * a.cx));
    convert(&header, target.data(), planes.y.first, planes.u.first, planes.v.first, planes.y.pitch,
            planes.u.pitch, planes.v.pitch);
}

void Rgb32Ex(Memory& memory, const Arguments& a) {
    const int height = std::abs(a.cy);
    const Planes420 planes = MakePlanes(memory, &Memory::TargetPlane, a, a.cx, height);
    const int pitch = 4 * std::max(a.cx, 0) + a.paddings[3];
    const Plane source = memory.SourcePlane(4 * a.cx, height, pitch);
    Rgb32_2_yuv420_Ex(planes.y.first, planes.u.first, planes.v.first, planes.y.pitch, planes.u.pitch,
                      planes.v.pitch, source.first, a.cx, a.flag ? -height : height, pitch);
}

void Rgb32Alpha(Memory& memory, const Arguments& a) {
    const Planes420 planes = MakePlanes(memory, &Memory::TargetPlane, a, a.cx, a.cy);
    const Plane alpha = memory.TargetPlane(a.cx, a.cy, planes.y.pitch);
    tagBITMAPINFOHEADER header = Header(a, 32);
    const auto source = memory.Source(BitmapSize(a, 4 * a.cx));
    Rgb32_2_yuv420A(planes.y.first, planes.u.first, planes.v.first, alpha.first, planes.y.pitch,
                    planes.u.pitch, planes.v.pitch, &header, source.data(), a.flag ? 1 : 0);
}

/// An odd xDst takes a pixel more, and groups are written whole.
void Rgb24ToPacked(Memory& memory, const Arguments& a) {
    const int width = a.cx <= 0 ? 0 : a.cx + a.xDst % 2;
    const int height = std::max(a.cy, 0);
    const int packedBytes = 2 * (a.xDst / 2 * 2 + EvenAbove(width));
    const int sourceBytes = 3 * (a.xSrc + width);
    const int pitchDst = std::max(packedBytes, 2 * a.xDst) + a.paddings[3];
    const int pitchSrc = sourceBytes + a.paddings[4];
    const Plane source = memory.SourcePlane(sourceBytes, a.ySrc + height, pitchSrc);
    const Plane target = memory.TargetPlane(packedBytes, a.yDst + height, pitchDst);
    Rgb24_2_YUY2(target.first, pitchDst, a.xDst, a.yDst, a.cx, a.cy, a.order, source.first, a.ySrc + height,
                 pitchSrc, a.xSrc, a.ySrc);
}

void PackedToRgb24(Memory& memory, const Arguments& a) {
    const int width = std::max(a.cx, 0);
    const int height = std::max(a.cy, 0);
    const int rowBytes = 3 * (a.xDst + width);
    const int packedBytes = 2 * EvenAbove(a.xSrc / 2 * 2 + width);
    const int pitchDst = rowBytes + a.paddings[3];
    const Plane source = memory.SourcePlane(packedBytes, a.ySrc + height, a.Pitch(4, packedBytes));
    const Plane target = memory.TargetPlane(rowBytes, a.yDst + height, pitchDst);
    YUY2_2_Rgb24(target.first, a.yDst + height, pitchDst, a.xDst, a.yDst, a.cx, a.cy, source.first,
                 source.pitch, a.order, a.xSrc, a.ySrc);
}

void PackedToPlanes(Memory& memory, const Arguments& a) {
    const int width = EvenAbove(std::max(a.cx, 0));
    const int height = EvenAbove(std::max(a.cy, 0));
    const int packedBytes = 2 * (a.xSrc / 2 * 2 + width);
    const Plane source = memory.SourcePlane(packedBytes, a.ySrc + height, a.Pitch(4, packedBytes));
    const Planes420 planes = MakePlanes(memory, &Memory::TargetPlane, a, a.xDst + width, a.yDst + height);
    // What fails the routine's check ends the process, which is right.
    const int lastV = (a.yDst / 2 + height / 2 - 1) * planes.v.pitch + a.xDst / 2 + width / 2 - 1;
    if (height > 0 && (planes.v.pitch < 0 || lastV > (a.ySrc + a.cy) * planes.v.pitch))
        return;
    YUY2_2_Yuv420(planes.y.first, planes.u.first, planes.v.first, planes.y.pitch, planes.u.pitch,
                  planes.v.pitch, a.xDst, a.yDst, a.cx, a.cy, source.first, source.pitch, a.order, a.xSrc,
                  a.ySrc);
}

void PlanesToPacked(Memory& memory, const Arguments& a) {
    const int width = EvenAbove(std::max(a.cx, 0));
    const int height = EvenAbove(std::max(a.cy, 0));
    const int packedBytes = 2 * (a.xDst / 2 * 2 + width);
    const Plane target = memory.TargetPlane(packedBytes, a.yDst + height, a.Pitch(4, packedBytes));
    const Planes420 planes = MakePlanes(memory, &Memory::SourcePlane, a, a.xSrc + width, a.ySrc + height);
    Yuv420_2_YUY2(target.first, target.pitch, a.xDst, a.yDst, a.cx, a.cy, a.order, planes.y.first,
                  planes.u.first, planes.v.first, planes.y.pitch, planes.u.pitch, planes.v.pitch, a.xSrc,
                  a.ySrc);
}

/// Planes of a copy: chroma begins at column (x + 1) / 2.
Planes420 CopiedPlanes(Memory& memory, MakePlane make, const Arguments& a, int x, int y) {
    const int width = std::max(a.cx, 0);
    const int height = EvenAbove(std::max(a.cy, 0));
    const int chroma = Half(x) + Half(width);
    return {(memory.*make)(x + width, y + height, a.Pitch(0, x + width)),
            (memory.*make)(chroma, y / 2 + height / 2, a.Pitch(1, chroma)),
            (memory.*make)(chroma, y / 2 + height / 2, a.Pitch(2, chroma))};
}

void CopyPlanes(Memory& memory, const Arguments& a) {
    const Planes420 to = CopiedPlanes(memory, &Memory::TargetPlane, a, a.xDst, a.yDst);
    const Planes420 from = CopiedPlanes(memory, &Memory::SourcePlane, a, a.xSrc, a.ySrc);
    YV12_Blt_fast(to.y.first, to.u.first, to.v.first, to.y.pitch, to.u.pitch, to.v.pitch, a.xDst, a.yDst,
                  a.cx, a.cy, from.y.first, from.u.first, from.v.first, from.y.pitch, from.u.pitch,
                  from.v.pitch, a.xSrc, a.ySrc);
}

void CopyPacked(Memory& memory, const Arguments& a) {
    const int width = a.order == a.otherOrder ? std::max(a.cx, 0) : EvenAbove(std::max(a.cx, 0));
    const int height = std::max(a.cy, 0);
    const int bytesDst = 2 * (a.xDst + width);
    const int bytesSrc = 2 * (a.xSrc + width);
    const Plane to = memory.TargetPlane(bytesDst, a.yDst + height, a.Pitch(3, bytesDst));
    const Plane from = memory.SourcePlane(bytesSrc, a.ySrc + height, a.Pitch(4, bytesSrc));
    YUY2_Blt_fast(to.first, to.pitch, a.xDst, a.yDst, a.cx, a.cy, a.order, from.first, from.pitch,
                  a.otherOrder, a.xSrc, a.ySrc);
}

size_t Area(int width, int height) {
    return width <= 0 || height <= 0 ? 0 : static_cast<size_t>(width) * static_cast<size_t>(height);
}

void Halve(Memory& memory, const Arguments& a) {
    const auto target = memory.Target(Area(Half(std::max(a.cx, 0)), Half(std::max(a.cy, 0))));
    YUV444_2_420(target.data(), memory.Source(Area(a.cx, a.cy)).data(), a.cx, a.cy);
}

void Double(Memory& memory, const Arguments& a) {
    const auto target = memory.Target(4 * Area(a.cx, a.cy));
    YUV420_2_444(target.data(), memory.Source(Area(a.cx, a.cy)).data(), a.cx, a.cy);
}

void DoubleWhole(Memory& memory, const Arguments& a) {
    const auto target = memory.Target(Area(a.cx, a.cy));
    const auto source = memory.Source(Area(Half(std::max(a.cx, 0)), std::max(a.cy, 0) / 2));
    YUV420_2_444Ex(target.data(), source.data(), a.cx, a.cy);
}

constexpr void (*kRoutines[])(Memory&, const Arguments&) = {
    BitmapToPlanes<Rgb32_2_yuv420, 32>,
    BitmapToPlanes<Argb_2_yuv420, 32>,
    BitmapToPlanes<Rgb24_2_yuv420, 24>,
    BitmapToPlanes<Rgb24_2_yuv420Simple, 24>,
    Rgb32Ex,
    Rgb32Alpha,
    PlanesToBitmap<Yuv420_2_rgb24, 24>,
    PlanesToBitmap<Yuv420_2_rgb24Simple, 24>,
    PlanesToBitmap<Yuv420_2_rgb32, 32>,
    PlanesToBitmap<Yuv420_2_Argb, 32>,
    Rgb24ToPacked,
    PackedToRgb24,
    PackedToPlanes,
    PlanesToPacked,
    CopyPlanes,
    CopyPacked,
    Halve,
    Double,
    DoubleWhole,
};

void FuzzRoutine(FuzzedDataProvider& input) {
    const auto routine = input.PickValueInArray(kRoutines);
    const Arguments arguments(input);
    Memory memory(input);
    std::vector<uint8_t> expected;
    for (const auto& [level, name] : image::kKernelLevels) {
        if (image::RowKernelsFor(level) == nullptr)
            continue;
        image::ForceRowKernels(level);
        routine(memory, arguments);
        const std::vector<uint8_t> written = memory.Finish();
        if (level == image::KernelLevel::kPlain)
            expected = written;
        FUZZ_CHECK(written == expected);
    }
}

/// Room for the extents' rows.
std::vector<uint8_t*> MakeRows(Memory& memory, const std::vector<Extent>& extents, size_t width,
                               bool target) {
    std::vector<uint8_t*> rows;
    for (const Extent extent : extents) {
        const size_t size = extent(width);
        rows.push_back((target ? memory.Target(size) : memory.Source(size)).data());
    }
    return rows;
}

/// The rows of the kernels themselves, those for large pictures included, which no picture here is large
/// enough for.
void FuzzKernel(FuzzedDataProvider& input) {
    const std::vector<KernelCase>& cases = KernelCases();
    const KernelCase& kernel = cases[input.ConsumeIntegralInRange<size_t>(0, cases.size() - 1)];
    const bool large = input.ConsumeBool();
    const size_t step = large ? size_t{image::kLargeWidthStep} : kernel.widthStep;
    const size_t width = step * input.ConsumeIntegralInRange<size_t>(0, kMostWidth / step);
    const image::Size size{static_cast<ptrdiff_t>(width), input.ConsumeBool() ? 2 : 1};
    Memory memory(input);
    std::vector<uint8_t> expected;
    for (const auto& [level, name] : image::kKernelLevels) {
        const image::RowKernels* kernels = image::RowKernelsFor(level);
        if (kernels == nullptr)
            continue;
        const std::vector<uint8_t*> targets = MakeRows(memory, kernel.targets, width, true);
        const std::vector<uint8_t*> sources = MakeRows(memory, kernel.sources, width, false);
        const bool aligned = std::all_of(targets.begin(), targets.end(), [](const uint8_t* row) {
            return reinterpret_cast<uintptr_t>(row) % image::kLargeAlignment == 0;
        });
        if (large && aligned && kernels->large != nullptr)
            kernels = kernels->large;
        kernel.run(*kernels, targets.data(), sources.data(), size);
        const std::vector<uint8_t> written = memory.Finish();
        if (level == image::KernelLevel::kPlain)
            expected = written;
        FUZZ_CHECK(written == expected);
    }
}

/// Any values at all are promised a clamped result.
void FuzzPixel(FuzzedDataProvider& input) {
    int values[3];
    for (int& value : values)
        value = WildInteger<int>(input, input.ConsumeIntegral<uint8_t>());
    int result[3];
    PixelYUV_2_RGB(values[0], values[1], values[2], result[0], result[1], result[2]);
    for (const int component : result)
        FUZZ_CHECK(component >= 0 && component <= 255);
    PixelRGB_2_YUV(values[0], values[1], values[2], result[0], result[1], result[2]);
    FUZZ_CHECK(result[0] >= 16 && result[0] <= 235);
    FUZZ_CHECK(result[1] >= 16 && result[1] <= 240 && result[2] >= 16 && result[2] <= 240);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    FuzzedDataProvider input(data, size);
    constexpr void (*kTargets[])(FuzzedDataProvider&) = {FuzzRoutine, FuzzRoutine, FuzzRoutine, FuzzKernel,
                                                         FuzzPixel};
    input.PickValueInArray(kTargets)(input);
    return 0;
}
