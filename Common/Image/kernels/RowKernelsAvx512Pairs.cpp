// The same kernels as in RowKernelsAvx512.cpp, for processors that permute two registers as fast as one.
#define MOVIECONV_PERMUTE_PAIRS
#undef kAvx512Kernels // another name in the emulation
#define kAvx512Kernels kAvx512PairsKernels
#include "Common/Image/kernels/RowKernelsAvx512.cpp" // NOLINT(bugprone-suspicious-include): once more
