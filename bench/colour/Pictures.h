// The buffers of one picture size: every layout that the colour routines read and every layout that they
// write.
#ifndef MOVIECONV_BENCH_COLOUR_PICTURES_H
#define MOVIECONV_BENCH_COLOUR_PICTURES_H

#include "Common/Image/ImageConvert.h"

#include <cstddef>
#include <cstdint>
#include <vector>

namespace bench {

/// 4:2:0 planes that follow one another in memory without gaps, but for a column that makes an odd width
/// even.
struct Planes {
    unsigned char* y;
    unsigned char* u;
    unsigned char* v;
    int pitchY;
    int pitchChroma;
};

/// All pictures of one layout in one size. A routine and its peer work on the same ones, so that neither
/// finds its buffers in a nearer cache than the other does.
struct Layouts {
    unsigned char* rgb24;  ///< Rows of `pitch24` bytes; also one plane of full size.
    unsigned char* rgb32;  ///< Rows of `pitch32` bytes.
    unsigned char* packed; ///< 4:2:2 rows of `pitchPacked` bytes.
    unsigned char* alpha;  ///< Rows of `width` bytes.
    Planes planes;
};

/// Sources, destinations and sizes of one picture. Not copied: the layouts point into its own buffers.
class Pictures {
public:
    Pictures(int width, int height);
    Pictures(const Pictures&) = delete;
    Pictures& operator=(const Pictures&) = delete;

    const int width;
    const int height;
    const int chromaWidth;
    const int chromaHeight;
    const int pitch24;     ///< Bytes; a multiple of 4, as bitmaps have it.
    const int pitch32;     ///< Bytes.
    const int pitchPacked; ///< Bytes; whole groups of two pixels.

    tagBITMAPINFOHEADER header24{};
    tagBITMAPINFOHEADER header32{};
    Layouts source{};
    Layouts target{};
    Layouts between{}; ///< Holds what a peer that needs two steps makes in the first.

    double pixels() const { return static_cast<double>(width) * height; }
    void fillSources(std::uint32_t seed);
    void clearTargets();
    /// Every byte that a routine could have written, and those round them.
    const std::vector<unsigned char>& targetBytes() const { return targets_; }

private:
    void allocate(std::vector<unsigned char>& bytes, Layouts& layouts) const;

    std::vector<unsigned char> sources_;
    std::vector<unsigned char> targets_;
    std::vector<unsigned char> betweens_;
};

} // namespace bench

#endif
