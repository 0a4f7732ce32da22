#include "Common/Image/Check.h"

#include <cstdio>
#include <cstdlib>

void image::CheckFailed(unsigned line, const char* condition) {
    std::fprintf(stderr, "%s:%u: failed assertion `%s'\n", "../../Common/Image/ImageConvert.cpp", line,
                 condition);
    std::fflush(stderr);
    std::abort();
}
