// Pictures for the tests of the exported routines: random content in guarded memory, beside a copy for the
// expected bytes.
#ifndef MOVIECONV_TESTS_IMAGE_TESTPICTURE_H
#define MOVIECONV_TESTS_IMAGE_TESTPICTURE_H

#include "Common/Image/ImageConvert.h"
#include "tests/image/Equations.h"
#include "tests/image/GuardedMemory.h"

#include <cstdint>
#include <random>
#include <string>
#include <vector>

#include <gtest/gtest.h>

/// Rows of `rowBytes` bytes, `pitch` bytes apart; no byte behind the last row. A source leaves `expected`
/// alone; a routine's target is compared with it, row padding included.
class TestRows {
public:
    TestRows(int rowBytes, int rows, int pitch, Placement placement = Placement::kEndsAtPage)
        : memory(Size(rowBytes, rows, pitch)),
          bytes(memory.Block(Size(rowBytes, rows, pitch), placement)),
          pitch(pitch) {
        static std::mt19937 random(97);
        for (uint8_t& byte : bytes)
            byte = static_cast<uint8_t>(random() >> 11);
        expected.assign(bytes.begin(), bytes.end());
    }

    uint8_t* Data() { return bytes.data(); }
    int Pitch() const { return pitch; }
    uint8_t At(int row, int byte) const { return bytes[Offset(row, byte)]; }
    void Expect(int row, int byte, int value) {
        expected.at(Offset(row, byte)) = static_cast<uint8_t>(value);
    }

    /// The pixel of three or four bytes that begins at `byte`.
    equations::Rgb PixelAt(int row, int byte) const {
        return {At(row, byte + 2), At(row, byte + 1), At(row, byte)};
    }
    void ExpectPixel(int row, int byte, equations::Rgb pixel) {
        Expect(row, byte, pixel.b);
        Expect(row, byte + 1, pixel.g);
        Expect(row, byte + 2, pixel.r);
    }

    void Check(const std::string& what) const {
        ASSERT_TRUE(memory.GuardsIntact()) << what << ": wrote outside";
        for (size_t i = 0; i < expected.size(); ++i)
            ASSERT_EQ(bytes[i], expected[i]) << what << ", row " << i / static_cast<size_t>(pitch)
                                             << ", byte " << i % static_cast<size_t>(pitch);
    }

private:
    static size_t Size(int rowBytes, int rows, int pitch) {
        return rows == 0 ? 0
                         : static_cast<size_t>(rows - 1) * static_cast<size_t>(pitch) +
                               static_cast<size_t>(rowBytes);
    }
    size_t Offset(int row, int byte) const { return static_cast<size_t>(ptrdiff_t{row} * pitch + byte); }

    GuardedMemory memory;
    std::span<uint8_t> bytes;
    int pitch;
    std::vector<uint8_t> expected;
};

/// A planar 4:2:0 picture whose planes have pitches of their own.
struct TestPlanes {
    TestPlanes(int width, int height, int padding)
        : y(width, height, width + padding),
          u((width + 1) / 2, (height + 1) / 2, (width + 1) / 2 + 2 * padding),
          v((width + 1) / 2, (height + 1) / 2, (width + 1) / 2 + 3 * padding) {}

    void Check() const {
        y.Check("Y");
        u.Check("U");
        v.Check("V");
    }

    TestRows y, u, v;
};

// Planes as the routines take them.
#define PLANES(picture) (picture).y.Data(), (picture).u.Data(), (picture).v.Data()
#define PITCHES(picture) (picture).y.Pitch(), (picture).u.Pitch(), (picture).v.Pitch()

inline tagBITMAPINFOHEADER BitmapHeader(int width, int height, int bits) {
    tagBITMAPINFOHEADER header{};
    header.biSize = sizeof header;
    header.biWidth = width;
    header.biHeight = height;
    header.biPlanes = 1;
    header.biBitCount = static_cast<uint16_t>(bits);
    return header;
}

inline int Stride24(int width) {
    return (3 * width + 3) / 4 * 4;
}

struct PictureSize {
    int width, height;
};

/// All small sizes, and widths around whole vectors with an even and an odd height.
inline std::vector<PictureSize> PictureSizes() {
    std::vector<PictureSize> sizes;
    for (int width = 1; width <= 9; ++width)
        for (int height = 1; height <= 5; ++height)
            sizes.push_back({width, height});
    for (const int width : {15, 16, 17, 31, 32, 33, 47, 63, 64, 65, 97, 128, 131})
        for (const int height : {2, 5})
            sizes.push_back({width, height});
    return sizes;
}

#endif
