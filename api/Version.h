/// \file
/// The version of MovieConv, for the preprocessor. MCGetVersion tells that of the library that runs.
#ifndef MOVIECONV_API_VERSION_H
#define MOVIECONV_API_VERSION_H

#define MC_VERSION_MAJOR 1 ///< Grows when something that programs rely on changes.
#define MC_VERSION_MINOR 1 ///< Grows with additions.
#define MC_VERSION_PATCH 0 ///< Grows with corrections.

/// One number out of the three, which can be compared: MC_VERSION >= MC_MAKE_VERSION(1, 1, 0).
#define MC_MAKE_VERSION(major, minor, patch)                                                                 \
    ((unsigned)(major) << 16 | (unsigned)(minor) << 8 | (unsigned)(patch))
/// The version of these headers.
#define MC_VERSION MC_MAKE_VERSION(MC_VERSION_MAJOR, MC_VERSION_MINOR, MC_VERSION_PATCH)

#endif
