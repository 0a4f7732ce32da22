#include "bench/colour/PeerErrors.h"

#include "bench/colour/ColourCube.h"
#include "bench/colour/Families.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <string_view>

namespace bench {
namespace {

struct Real {
    double a, b, c;
};

/// BT.601, studio range, without rounding.
Real realYuvOf(int b, int g, int r) {
    return {16 + (65.481 * r + 128.553 * g + 24.966 * b) / 255,
            128 + (-37.797 * r - 74.203 * g + 112.0 * b) / 255,
            128 + (112.0 * r - 93.786 * g - 18.214 * b) / 255};
}

Real realBgrOf(int y, int u, int v) {
    const double luma = 255.0 / 219 * (y - 16);
    const double cb = 255.0 / 112 * (u - 128);
    const double cr = 255.0 / 112 * (v - 128);
    const auto byte = [](double value) { return std::clamp(value, 0.0, 255.0); };
    return {byte(luma + 0.886 * cb), byte(luma - 0.886 * 0.114 / 0.587 * cb - 0.701 * 0.299 / 0.587 * cr),
            byte(luma + 0.701 * cr)};
}

class Difference {
public:
    void add(double from, double to) {
        const double difference = std::abs(from - to);
        largest_ = std::max(largest_, difference);
        sum_ += difference;
        ++count_;
    }
    void add(Real from, Real to) {
        add(from.a, to.a);
        add(from.b, to.b);
        add(from.c, to.c);
    }
    void print() const { std::printf("%8.2f %6.3f", largest_, sum_ / count_); }

private:
    double largest_ = 0;
    double sum_ = 0;
    double count_ = 0;
};

Real realOf(const Triple& t) {
    return {static_cast<double>(t.a), static_cast<double>(t.b), static_cast<double>(t.c)};
}

/// What a routine has made of the block in column and row of a slice.
using ReadBlock = Triple (*)(const Layouts& target, const Pictures& p, int column, int row);

Triple readPlanes(const Layouts& t, const Pictures&, int column, int row) {
    const int chroma = row * t.planes.pitchChroma + column;
    return {t.planes.y[2 * row * t.planes.pitchY + 2 * column], t.planes.u[chroma], t.planes.v[chroma]};
}
Triple readRgb32(const Layouts& t, const Pictures& p, int column, int row) {
    const unsigned char* pixel = t.rgb32 + 2 * row * p.pitch32 + 8 * column;
    return {pixel[0], pixel[1], pixel[2]};
}
Triple readRgb24(const Layouts& t, const Pictures& p, int column, int row) {
    const unsigned char* pixel = t.rgb24 + 2 * row * p.pitch24 + 6 * column;
    return {pixel[0], pixel[1], pixel[2]};
}
Triple readPacked(const Layouts& t, const Pictures& p, int column, int row) {
    const unsigned char* group = t.packed + 2 * row * p.pitchPacked + 4 * column;
    return {group[0], group[1], group[3]};
}

constexpr struct {
    std::string_view routine;
    ReadBlock read;
} kRoutines[] = {
    {"Rgb32_2_yuv420", readPlanes}, {"Rgb24_2_yuv420", readPlanes}, {"Yuv420_2_Argb", readRgb32},
    {"Yuv420_2_rgb24", readRgb24},  {"YUY2_2_Rgb24", readRgb24},    {"Rgb24_2_YUY2", readPacked},
};

void printErrors(const Family& family, ReadBlock read, Pictures& p) {
    Difference fromEquations, fromReal, equationsFromReal;
    for (int slice = 0; slice < kBlocks; ++slice) {
        paintSlice(p, slice);
        family.peer(p);
        for (int row = 0; row < kBlocks; ++row)
            for (int column = 0; column < kBlocks; ++column) {
                const bool toYuv = family.kind == Kind::RgbToYuv;
                const Real exact = realOf(toYuv ? yuvOf(column, row, slice) : bgrOf(row, column, slice));
                const Real real = toYuv ? realYuvOf(column, row, slice) : realBgrOf(row, column, slice);
                const Real peer = realOf(read(p.target, p, column, row));
                fromEquations.add(peer, exact);
                fromReal.add(peer, real);
                equationsFromReal.add(exact, real);
            }
    }
    std::printf("  %-28s", family.peerName);
    fromEquations.print();
    fromReal.print();
    equationsFromReal.print();
    std::printf("\n");
}

} // namespace

void printPeerErrors() {
    std::printf(
        "\nlargest and mean difference over all colours: libyuv from the equations, libyuv from BT.601 in "
        "real numbers,\nthe equations from that\n");
    Pictures p(kSliceSize, kSliceSize);
    for (const auto& [routine, read] : kRoutines)
        for (const Family& family : families())
            if (family.name == routine)
                printErrors(family, read, p);
}

} // namespace bench
