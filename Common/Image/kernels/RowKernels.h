// The row kernels: everything that touches pixels. A kernel converts one row, or the two rows that share
// chroma, of any width; no kernel reads or writes outside the samples that its width covers.
//
// Every instruction set fills one RowKernels table with kernels that give the same bytes as the plain ones. A
// kernel needs no alignment and allows no overlap of source and destination, but the two rows of a pair may
// be the same row.
#ifndef MOVIECONV_COMMON_IMAGE_KERNELS_ROWKERNELS_H
#define MOVIECONV_COMMON_IMAGE_KERNELS_ROWKERNELS_H

#include <cstddef>
#include <cstdint>

namespace image {

template <class Byte>
struct RowPair {
    Byte* first;
    Byte* second;
};

/// Byte orders of packed 4:2:2, as an index into the table.
enum PackedOrder { kUyvy = 0, kYuy2 = 1, kPackedOrders = 2 };

/// What makes 4:2:0 from two packed rows. Y has `width` samples a row, U and V half as many, rounded up.
using To420 = void (*)(RowPair<uint8_t> y, uint8_t* u, uint8_t* v, RowPair<const uint8_t> packed,
                       ptrdiff_t width);
using To420Alpha = void (*)(RowPair<uint8_t> y, uint8_t* u, uint8_t* v, RowPair<uint8_t> alpha,
                            RowPair<const uint8_t> packed, ptrdiff_t width);
/// What makes two packed rows from 4:2:0.
using From420 = void (*)(RowPair<uint8_t> packed, RowPair<const uint8_t> y, const uint8_t* u,
                         const uint8_t* v, ptrdiff_t width);
using RowToRow = void (*)(uint8_t* target, const uint8_t* source, ptrdiff_t width);
using HalveRows = void (*)(uint8_t* target, RowPair<const uint8_t> source, ptrdiff_t width);
using DoubleRow = void (*)(RowPair<uint8_t> target, const uint8_t* source, ptrdiff_t width);

struct RowKernels {
    // RGB to 4:2:0. The missing pixel beyond an odd width is the last one again.
    To420 bgr32To420;
    To420 bgr24To420;
    To420 bgr24To420Simple;
    To420Alpha bgra32To420;

    // 4:2:0 to RGB. bgrx keeps the fourth bytes of the target, bgra makes them 255.
    From420 bgr24From420;
    From420 bgr24From420Simple;
    From420 bgrxFrom420;
    From420 bgraFrom420;

    // 4:2:2 from and to 4:2:0; the width is even.
    To420 packedTo420[kPackedOrders];
    From420 packedFrom420[kPackedOrders];

    // 4:2:2 from and to RGB, one row. Beyond an odd width a written group repeats its pixel, and a read one
    // has no second pixel.
    RowToRow packedFromBgr24[kPackedOrders];
    RowToRow bgr24FromPacked[kPackedOrders];

    // One byte order of 4:2:2 to the other; the width is even.
    RowToRow swapPacked;

    // Planes: `width` is the source's. Halving averages 2 x 2 samples, truncating; the sample beyond an odd
    // width is the last one again. Doubling writes every sample to two columns of two rows.
    HalveRows halve;
    DoubleRow doubled;

    /// The same kernels for outputs that no cache holds: they write past the caches. That pays where one or
    /// two rows are written, not where those of three or four planes are. The width is a multiple of
    /// kLargeWidthStep and every target row begins at a multiple of kLargeAlignment. Null: none.
    const RowKernels* large = nullptr;
};

inline constexpr ptrdiff_t kLargeWidthStep = 32;
inline constexpr ptrdiff_t kLargeAlignment = 16;

enum class KernelLevel { kPlain, kSse41, kAvx2, kAvx512 };
inline constexpr KernelLevel kKernelLevels[] = {KernelLevel::kPlain, KernelLevel::kSse41, KernelLevel::kAvx2,
                                                KernelLevel::kAvx512};

/// The kernels of one level; null when the processor or this build lacks it.
const RowKernels* RowKernelsFor(KernelLevel level);

/// The kernels of the highest level there is, chosen once, or of the level that was forced.
const RowKernels& BestRowKernels();

/// Makes every later call of a routine use one level, so that tests and benchmarks can compare levels. A
/// level that the processor lacks gives the choice back.
void ForceRowKernels(KernelLevel level);

/// The tables, one a file. Only RowKernelsFor says whether the processor can run them.
extern const RowKernels kPlainKernels;
extern const RowKernels kSse41Kernels;
extern const RowKernels kAvx2Kernels;
extern const RowKernels kAvx512Kernels;

} // namespace image

#endif
