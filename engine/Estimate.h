// How large an output will be.
#ifndef MOVIECONV_ENGINE_ESTIMATE_H
#define MOVIECONV_ENGINE_ESTIMATE_H

#include "media/EncodeParam.h"

/// Bytes of `seconds` of output; 0 for null and for less than 0.00001 seconds. 32-bit rates, which wrap.
long long EstimateDiskSpace(const EncodeParam* param, double seconds);

#endif
