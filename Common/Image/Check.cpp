#include "Common/Image/Check.h"

#include <cstdio>
#include <cstdlib>

// The text is part of the interface: the file and the lines are those of the first version.
void image::CheckFailed(unsigned line, const char* condition) {
    std::fprintf(stderr, "%s:%u: failed assertion `%s'\n", "../../Common/Image/ImageConvert.cpp", line,
                 condition);
    std::fflush(stderr);
    std::abort();
}
