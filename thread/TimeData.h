/// \file
/// A time span split into the parts that a progress display shows.
#ifndef MOVIECONV_THREAD_TIMEDATA_H
#define MOVIECONV_THREAD_TIMEDATA_H

#include <stdint.h>

/// A span of time, the parts added up.
typedef struct TimeData {
    uint32_t nHours;        ///< Not reduced modulo 24.
    uint32_t nMinutes;      ///< 0 to 59.
    uint32_t nSeconds;      ///< 0 to 59.
    uint32_t nMilliseconds; ///< 0 to 999.
} TimeData;

#ifdef __cplusplus
#pragma GCC visibility push(default)

/// Splits a count of milliseconds; only the low 32 bits of `ms` count.
TimeData GetTimeData(unsigned long ms);

#pragma GCC visibility pop
#endif

#endif
