#include "bench/colour/ColourCube.h"

#include <algorithm>

namespace bench {

Triple yuvOf(int b, int g, int r) {
    return {((4211 * r + 8258 * g + 1606 * b) >> 14) + 16, ((7193 * b - 4768 * g - 2425 * r) >> 14) + 128,
            ((7193 * r - 6029 * g - 1163 * b) >> 14) + 128};
}

Triple bgrOf(int y, int u, int v) {
    auto byte = [](int sum) { return std::clamp(sum >> 13, 0, 255); };
    return {byte(9536 * y + 16532 * u - 2268594), byte(9536 * y - 3203 * u - 6660 * v + 1109918),
            byte(9536 * y + 13074 * v - 1826095)};
}

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

} // namespace bench
