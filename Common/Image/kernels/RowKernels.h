// The row kernels: everything that touches pixels. A kernel converts the rows of a picture of any size; no
// kernel reads or writes outside the samples that the size covers.
//
// Every instruction set fills one RowKernels table with kernels that give the same bytes as the plain ones. A
// kernel needs no alignment and allows no overlap of source and destination.
#ifndef MOVIECONV_COMMON_IMAGE_KERNELS_ROWKERNELS_H
#define MOVIECONV_COMMON_IMAGE_KERNELS_ROWKERNELS_H

#include "Common/Image/PictureViews.h"

#include <cstddef>
#include <cstdint>
#include <optional>

namespace image {

/// Byte orders of packed 4:2:2, as an index into the table.
enum PackedOrder { kUyvy = 0, kYuy2 = 1, kPackedOrders = 2 };

/// What makes 4:2:0 from a packed picture. U and V have half as many columns and rows, rounded up.
using To420 = void (*)(Planes420 target, Rows packed, Size size);
using To420Alpha = void (*)(Planes420 target, Rows alpha, Rows packed, Size size);
/// What makes a packed picture from 4:2:0.
using From420 = void (*)(Rows packed, Planes420 source, Size size);
/// What makes a packed picture or a plane from another.
using RowsToRows = void (*)(Rows target, Rows source, Size size);

struct RowKernels {
    // RGB to 4:2:0. The pixels missing beyond an odd width or height are the last ones again.
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

    // 4:2:2 from and to RGB. Beyond an odd width a written group repeats its pixel, and a read one has no
    // second pixel.
    RowsToRows packedFromBgr24[kPackedOrders];
    RowsToRows bgr24FromPacked[kPackedOrders];

    // One byte order of 4:2:2 to the other; the width is even.
    RowsToRows swapPacked;

    // Rows as they are, so many bytes each. For rows of less than a kilobyte, which memcpy takes longer for.
    RowsToRows copy;

    // Planes: the size is the source's. Halving averages 2 x 2 samples, truncating; the samples beyond an odd
    // width or height are the last ones again. Doubling writes every sample to two columns of two rows.
    RowsToRows halve;
    RowsToRows doubled;

    /// The same kernels for packed targets that no cache holds: they write past the caches. That pays where
    /// much is read too and one or two rows are written at a time, not where those of planes are. The width
    /// is a multiple of kLargeWidthStep and every target row begins at a multiple of kLargeAlignment. Null:
    /// none.
    const RowKernels* large = nullptr;
};

inline constexpr ptrdiff_t kLargeWidthStep = 32;
inline constexpr ptrdiff_t kLargeAlignment = 16;

enum class KernelLevel { kPlain, kSse41, kAvx2, kAvx512, kNeon };

/// A level with the name by which users know it.
struct NamedLevel {
    KernelLevel level;
    const char* name;
};
inline constexpr NamedLevel kKernelLevels[] = {{KernelLevel::kPlain, "plain"},
                                               {KernelLevel::kSse41, "sse4.1"},
                                               {KernelLevel::kAvx2, "avx2"},
                                               {KernelLevel::kAvx512, "avx512"},
                                               {KernelLevel::kNeon, "neon"}};

/// The kernels of one level; null when the processor or this build lacks it.
const RowKernels* RowKernelsFor(KernelLevel level);

/// The environment variable that names the level to use.
inline constexpr char kLevelVariable[] = "MOVIECONV_COLOUR_LEVEL";

/// The kernels of the level that was forced, else of the one that kLevelVariable names, else of the highest
/// there is. Chosen once; a level that there is not is passed over.
const RowKernels& BestRowKernels();

/// Whether writing past the caches pays for large targets. With AMD's processors it does, also when the
/// result is read at once. Intel's keep a whole picture in their last cache: there a converted picture of
/// 1920x1080 or more takes nearly twice as long until it has been read once, because it comes back from
/// memory.
bool WritingPastCachesPays();

/// Makes every later call of a routine use one level, so that tests and benchmarks can compare levels.
/// Without one, or with one that the processor lacks, the next call chooses anew.
void ForceRowKernels(std::optional<KernelLevel> level);

/// The tables, one a file. Only RowKernelsFor says whether the processor can run them.
extern const RowKernels kPlainKernels;
extern const RowKernels kSse41Kernels;
extern const RowKernels kAvx2Kernels;
extern const RowKernels kAvx512Kernels;
extern const RowKernels kAvx512PairsKernels;
extern const RowKernels kNeonKernels;

} // namespace image

#endif
